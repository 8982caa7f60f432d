// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Layouts 1.15
import ".."
import "../pages/controls"

/*
    The file that is installed with the modem software.
*/
ColumnLayout {
    spacing: 8

    SimulatedFilesSwitch {
        text: qsTrId("gallery-modem-installed")
        path: "/usr/share/modem-software/features.ini"
    }
    Note {
        text: qsTrId("gallery-simulation-constant")
    }
}
