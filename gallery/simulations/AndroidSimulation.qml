// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Layouts 1.15
import ".."
import "../pages/controls"

/*
    The daemon of the Android runtime.
*/
ColumnLayout {
    spacing: 8

    SimulatedFilesSwitch {
        text: qsTrId("gallery-android-installed")
        path: "/usr/sbin/apkd"
    }
    Note {
        text: qsTrId("gallery-simulation-constant")
    }
}
