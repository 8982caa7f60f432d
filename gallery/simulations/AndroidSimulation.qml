// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import ".."

/*
    The daemon of the Android runtime.
*/
ConstantFiles {
    SimulatedFilesSwitch {
        text: qsTrId("gallery-android-installed")
        path: "/usr/sbin/apkd"
    }
}
