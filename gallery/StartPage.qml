// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
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
