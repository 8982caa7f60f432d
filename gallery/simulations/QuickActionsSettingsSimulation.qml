// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Layouts 1.15
import ".."
import "../pages/controls"

/*
    The packages that offer quick actions.
*/
ColumnLayout {
    spacing: 8

    SimulatedFilesSwitch {
        text: qsTrId("gallery-quick-actions-installed")
        path: "/usr/share/glimmera/quickactions/*.conf"
    }
    SimulatedFilesSwitch {
        text: qsTrId("gallery-quick-actions-broken")
        path: "/usr/share/glimmera/quickactions/empty.conf"
        content: "\n"
    }
    Note {
        text: qsTrId("gallery-quick-actions-keys")
    }
}
