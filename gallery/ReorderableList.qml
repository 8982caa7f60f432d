// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Controls.impl 2.15

/*
    A list whose rows are dragged by a handle, or moved with Ctrl and the arrow keys; its model has
    the roles title and icon.
*/
ListView {
    id: list

    readonly property int rowHeight: 48

    // A row was dragged from one place to another: the model is to follow.
    signal moved(int from, int to)

    implicitHeight: count * rowHeight
    interactive: false

    delegate: ItemDelegate {
        id: row
        focusPolicy: Qt.StrongFocus
        width: ListView.view.width
        height: list.rowHeight
        leftPadding: 0
        rightPadding: handle.width
        icon.width: 24
        icon.height: 24
        text: model.title || model.path
        icon.source: model.icon ? "file://" + model.icon : ""
        highlighted: handle.pressed
        Keys.onPressed: {
            const to = event.key === Qt.Key_Up ? index - 1
                     : event.key === Qt.Key_Down ? index + 1 : -1;
            if (event.modifiers & Qt.ControlModifier && to >= 0 && to < list.count) {
                event.accepted = true;
                list.moved(index, to);
            }
        }

        MouseArea {
            id: handle
            anchors.right: parent.right
            width: height
            height: parent.height
            preventStealing: true
            cursorShape: Qt.SizeVerCursor
            onPositionChanged: {
                const y = mapToItem(list.contentItem, mouse.x, mouse.y).y;
                const row = Math.max(0, Math.min(list.count - 1, Math.floor(y / list.rowHeight)));
                if (row !== index) {
                    list.moved(index, row);
                }
            }

            IconImage {
                anchors.centerIn: parent
                source: "icons/drag.svg"
                sourceSize: Qt.size(24, 24)
                color: row.icon.color
                opacity: 0.5
            }
        }
    }

    moveDisplaced: Transition {
        NumberAnimation {
            property: "y"
            duration: 150
            easing.type: Easing.OutCubic
        }
    }
}
