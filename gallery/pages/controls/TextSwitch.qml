// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Controls.impl 2.15
import QtQuick.Layouts 1.15

/*
    A switch whose text may be long, with an optional description and remark below it.
*/
SwitchDelegate {
    id: control

    property string description
    property string remark

    Layout.fillWidth: true
    Accessible.description: [description, remark].filter(text => text).join(" ")
    // Delegates are made for lists and get no focus by default.
    focusPolicy: Qt.StrongFocus
    horizontalPadding: 0

    contentItem: RowLayout {
        spacing: control.spacing

        IconImage {
            visible: control.icon.source.toString() !== ""
            source: control.icon.source
            sourceSize: Qt.size(24, 24)
            color: control.icon.color
        }
        ColumnLayout {
            Layout.fillWidth: true
            Layout.rightMargin: control.indicator.width + control.spacing
            spacing: 0

            Label {
                Layout.fillWidth: true
                text: control.text
                wrapMode: Text.Wrap
            }
            Label {
                Layout.fillWidth: true
                visible: text !== ""
                text: control.description
                font.pixelSize: 12
                opacity: 0.7
                wrapMode: Text.Wrap
            }
            Label {
                Layout.fillWidth: true
                visible: text !== ""
                text: control.remark
                font.pixelSize: 12
                font.italic: true
                wrapMode: Text.Wrap
            }
        }
    }
}
