// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Controls.impl 2.15
import QtQuick.Controls.Universal 2.15

/*
    A button of a home screen: an icon above a text of at most two lines.
*/
ItemDelegate {
    id: tile

    focusPolicy: Qt.StrongFocus
    width: 100
    height: 96
    horizontalPadding: 2
    verticalPadding: 8
    icon.width: 36
    icon.height: 36
    icon.color: Universal.accent

    contentItem: Column {
        spacing: 4

        IconImage {
            anchors.horizontalCenter: parent.horizontalCenter
            source: tile.icon.source
            color: tile.icon.color
            sourceSize: Qt.size(tile.icon.width, tile.icon.height)
        }
        Label {
            width: parent.width
            text: tile.text
            font.pixelSize: 14
            horizontalAlignment: Text.AlignHCenter
            wrapMode: Text.Wrap
            maximumLineCount: 2
            elide: Text.ElideRight
        }
    }
}
