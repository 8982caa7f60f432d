// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Layouts 1.15
import ".."
import "../pages/controls"

/*
    The packages of the platform's and of the vendor's terms.
*/
ColumnLayout {
    spacing: 8

    SimulatedFilesSwitch {
        text: qsTrId("gallery-terms-platform-installed")
        path: "/usr/share/marlo-settings/platform-eula/*.txt"
    }
    SimulatedFilesSwitch {
        text: qsTrId("gallery-terms-vendor-installed")
        path: "/usr/share/marlo-settings/vendor-eula"
    }
    Note {
        text: qsTrId("gallery-simulation-constant")
    }
}
