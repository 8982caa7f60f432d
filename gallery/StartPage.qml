// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Controls.Universal 2.15
import QtQuick.Layouts 1.15

/*
    Lists the pages with a sentence each.
*/
GalleryPage {
    id: start

    property var pages
    signal opened(var page)

    title: qsTrId("gallery-title")

    Repeater {
        model: start.pages

        ItemDelegate {
            id: entry
            Layout.fillWidth: true
            Layout.preferredWidth: 1
            Layout.alignment: Qt.AlignTop
            text: modelData.title
            onClicked: start.opened(modelData)

            padding: 12
            background: Card {
                color: entry.down ? "#e0e5e5" : entry.hovered ? "#f8fafa" : "white"
                border.color: entry.visualFocus ? Universal.accent : "#d5dada"
            }
            contentItem: ColumnLayout {
                Label {
                    Layout.fillWidth: true
                    text: entry.text
                    font.pixelSize: 16
                    font.weight: Font.Medium
                    elide: Text.ElideRight
                }
                Label {
                    Layout.fillWidth: true
                    text: modelData.about
                    opacity: 0.7
                    wrapMode: Text.Wrap
                }
            }
        }
    }
}
