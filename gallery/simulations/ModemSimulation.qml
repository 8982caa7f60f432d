// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import ".."

/*
    The file that is installed with the modem software.
*/
ConstantFiles {
    SimulatedFilesSwitch {
        text: qsTrId("gallery-modem-installed")
        path: "/usr/share/modem-software/features.ini"
    }
}
