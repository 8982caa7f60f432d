// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Controls.Universal 2.15
import QtQuick.Layouts 1.15
import "pages/controls"

/*
    Lists the pages, with the type that each of them shows and its purpose.
*/
ScrollingPage {
    id: start

    property var pages
    signal opened(var page)

    title: qsTrId("gallery-title")
    columns: Math.max(1, Math.floor(width / 320))

    Note {
        Layout.columnSpan: start.columns
        Layout.margins: 8
        text: qsTrId("gallery-simulation-note")
    }

    Repeater {
        model: start.pages

        ItemDelegate {
            id: entry
            Layout.fillWidth: true
            Layout.fillHeight: true
            Layout.preferredWidth: 1
            focusPolicy: Qt.StrongFocus
            text: modelData.title
            onClicked: start.opened(modelData)

            padding: 12
            background: Card {
                color: entry.down ? "#e0e5e5" : entry.hovered ? "#f8fafa" : "white"
                border.color: entry.visualFocus ? Universal.accent : "#d5dada"
                border.width: entry.visualFocus ? 2 : 1
            }
            contentItem: ColumnLayout {
                spacing: 2

                Label {
                    Layout.fillWidth: true
                    text: entry.text
                    font.pixelSize: 16
                    font.weight: Font.Medium
                    wrapMode: Text.Wrap
                }
                Label {
                    Layout.fillWidth: true
                    text: modelData.type
                    color: Universal.accent
                    font.pixelSize: 12
                    wrapMode: Text.Wrap
                }
                Label {
                    Layout.fillWidth: true
                    Layout.fillHeight: true
                    text: modelData.about
                    opacity: 0.7
                    wrapMode: Text.Wrap
                }
            }
        }
    }
}
