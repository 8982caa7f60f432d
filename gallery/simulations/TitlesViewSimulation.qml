// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Layouts 1.15
import ".."
import "../pages/controls"

/*
    The packages that offer widgets and quick actions.
*/
ColumnLayout {
    spacing: 8

    SimulatedFilesSwitch {
        text: qsTrId("gallery-events-widgets-installed")
        path: "/usr/share/glimmera/eventswidgets/*.json"
    }
    SimulatedFilesSwitch {
        text: qsTrId("gallery-quick-actions-installed")
        path: "/usr/share/glimmera/quickactions/*.conf"
    }
    Note {
        text: qsTrId("gallery-titles-language")
    }
}
