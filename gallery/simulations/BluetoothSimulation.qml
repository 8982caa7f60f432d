// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import ".."

/*
    The file in which the platform stores the address.
*/
ConstantFiles {
    SimulatedFilesSwitch {
        text: qsTrId("gallery-bluetooth-installed")
        path: "/var/lib/bluetooth/board-address"
    }
}
