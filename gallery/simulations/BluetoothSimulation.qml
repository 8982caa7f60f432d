// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Layouts 1.15
import ".."
import "../pages/controls"

/*
    The file in which the platform stores the address.
*/
ColumnLayout {
    spacing: 8

    SimulatedFilesSwitch {
        text: qsTrId("gallery-bluetooth-installed")
        path: "/var/lib/bluetooth/board-address"
    }
    Note {
        text: qsTrId("gallery-simulation-constant")
    }
}
