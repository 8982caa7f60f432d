// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import ".."

/*
    The packages of the platform's and of the vendor's terms.
*/
ConstantFiles {
    SimulatedFilesSwitch {
        text: qsTrId("gallery-terms-platform-installed")
        path: "/usr/share/marlo-settings/platform-eula/*.txt"
    }
    SimulatedFilesSwitch {
        text: qsTrId("gallery-terms-vendor-installed")
        path: "/usr/share/marlo-settings/vendor-eula"
    }
}
