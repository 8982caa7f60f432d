// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Layouts 1.15
import "pages/controls"

/*
    The panel of a simulation. It looks different from the page, to which it does not belong.
*/
Pane {
    id: pane

    default property alias content: column.data
    signal reloadRequested()

    padding: 12
    background: Rectangle {
        radius: 8
        color: "#fff6e0"
        border.color: "#e0b050"
    }

    contentItem: ColumnLayout {
        spacing: 8

        Label {
            Layout.fillWidth: true
            text: qsTrId("gallery-simulation")
            color: "#8a5a00"
            font.weight: Font.Medium
            wrapMode: Text.Wrap
        }
        ColumnLayout {
            id: column
            spacing: 8
        }
        SimulationButton {
            text: qsTrId("gallery-simulation-reload")
            onClicked: pane.reloadRequested()
        }
    }
}
