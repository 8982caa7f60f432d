// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Layouts 1.15
import gallery.simulation 1.0
import ".."
import "../pages/controls"

/*
    The card, its disk service and the helper program.
*/
ColumnLayout {
    spacing: 8

    property var page

    Binding {
        target: page
        property: "cardName"
        value: SimulatedCard.inserted ? SimulatedCard.name : ""
    }
    Binding {
        target: page
        property: "helperInstalled"
        value: helper.checked
    }

    Paragraph {
        text: SimulatedCard.real ? qsTrId("gallery-card-real").arg(SimulatedCard.name)
                              : qsTrId("gallery-card-simulated")
        font.weight: Font.Medium
    }
    Note {
        text: SimulatedCard.mounted ? qsTrId("gallery-card-files").arg(SimulatedCard.fileCount)
                                 : qsTrId("gallery-card-is-unmounted")
    }
    SimulationButton {
        text: qsTrId("gallery-card-fill")
        enabled: SimulatedCard.mounted
        onClicked: SimulatedCard.fill()
    }
    TextSwitch {
        text: qsTrId("gallery-card-in-use")
        enabled: SimulatedCard.mounted || SimulatedCard.inUse
        checked: SimulatedCard.inUse
        onToggled: SimulatedCard.inUse = checked
    }
    TextSwitch {
        text: qsTrId("gallery-card-inserted")
        checked: SimulatedCard.inserted
        onToggled: SimulatedCard.inserted = checked
    }
    SimulatedFilesSwitch {
        id: helper
        text: qsTrId("gallery-card-helper")
        path: "/usr/libexec/sdcardhelper"
    }
    SimulatedFilesSwitch {
        text: qsTrId("gallery-card-helper-waits")
        path: "/usr/libexec/sdcardhelper-waits"
        content: "\n"
    }
    Paragraph {
        text: qsTrId("gallery-card-service")
        font.weight: Font.Medium
    }
    Repeater {
        model: [
            { service: SimulatedCard.Working, text: qsTrId("gallery-card-service-works") },
            { service: SimulatedCard.Forbidding, text: qsTrId("gallery-card-service-forbids") },
            { service: SimulatedCard.Silent, text: qsTrId("gallery-card-service-silent") },
            { service: SimulatedCard.Absent, text: qsTrId("gallery-card-service-absent") },
        ]
        Choice {
            text: modelData.text
            checked: SimulatedCard.diskService === modelData.service
            onToggled: SimulatedCard.diskService = modelData.service
        }
    }
}
