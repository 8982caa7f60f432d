// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Layouts 1.15
import gallery.stage 1.0
import ".."

/*
    The card, its disk service and the program that formats.
*/
ColumnLayout {
    property var page

    Binding {
        target: page
        property: "cardName"
        value: StagedCard.inserted ? StagedCard.name : ""
    }

    Paragraph {
        text: StagedCard.real ? qsTrId("gallery-card-real").arg(StagedCard.name)
                              : qsTrId("gallery-card-played")
        font.weight: Font.Medium
    }
    Note {
        text: StagedCard.mounted ? qsTrId("gallery-card-files").arg(StagedCard.fileCount)
                                 : qsTrId("gallery-card-is-unmounted")
    }
    Button {
        text: qsTrId("gallery-card-fill")
        enabled: StagedCard.mounted
        onClicked: StagedCard.fill()
    }
    TextSwitch {
        text: qsTrId("gallery-card-in-use")
        enabled: StagedCard.mounted || StagedCard.inUse
        checked: StagedCard.inUse
        onToggled: StagedCard.inUse = checked
    }
    TextSwitch {
        text: qsTrId("gallery-card-inserted")
        checked: StagedCard.inserted
        onToggled: StagedCard.inserted = checked
    }
    StagedSwitch {
        text: qsTrId("gallery-card-helper")
        path: "/usr/libexec/sdcardhelper"
    }
    StagedSwitch {
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
            { service: StagedCard.Working, text: qsTrId("gallery-card-service-works") },
            { service: StagedCard.Forbidding, text: qsTrId("gallery-card-service-forbids") },
            { service: StagedCard.Silent, text: qsTrId("gallery-card-service-silent") },
            { service: StagedCard.Absent, text: qsTrId("gallery-card-service-absent") },
        ]
        RadioDelegate {
            Layout.fillWidth: true
            focusPolicy: Qt.StrongFocus
            horizontalPadding: 0
            text: modelData.text
            checked: StagedCard.diskService === modelData.service
            onToggled: StagedCard.diskService = modelData.service
        }
    }
}
