// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Controls.impl 2.15
import "display.js" as Display

/*
    A list whose rows can be dragged by a handle, moved by two buttons, or moved with Ctrl and the
    arrow keys. Its model has the roles title, icon and path.
*/
ListView {
    id: list

    readonly property int rowHeight: 48
    property string upText
    property string downText

    // The user moved a row. The model has to follow.
    signal moved(int from, int to)

    function moveFocused(from, to, button) {
        moved(from, to);
        // The row has kept its delegate; a button at the end of the list is disabled now.
        if (button && !button.enabled) {
            itemAtIndex(to).forceActiveFocus(Qt.TabFocusReason);
        }
    }

    implicitHeight: count * rowHeight
    interactive: false

    delegate: ItemDelegate {
        id: row
        focusPolicy: Qt.StrongFocus
        width: ListView.view.width
        height: list.rowHeight
        leftPadding: 0
        rightPadding: buttons.width
        icon.width: 24
        icon.height: 24
        icon.source: Display.icon(model.icon)
        text: Display.title(model.title, model.path)
        highlighted: handle.pressed
        Keys.onPressed: {
            const to = event.key === Qt.Key_Up ? index - 1
                     : event.key === Qt.Key_Down ? index + 1 : -1;
            if (event.modifiers & Qt.ControlModifier && to >= 0 && to < list.count) {
                event.accepted = true;
                list.moved(index, to);
            }
        }

        Row {
            id: buttons
            anchors.right: parent.right
            height: parent.height

            ToolButton {
                id: upButton
                height: parent.height
                width: 40
                icon.source: "up.svg"
                enabled: index > 0
                Accessible.name: list.upText.arg(row.text)
                onClicked: list.moveFocused(index, index - 1, this)
            }
            ToolButton {
                id: downButton
                height: parent.height
                width: 40
                icon.source: "down.svg"
                enabled: index < list.count - 1
                Accessible.name: list.downText.arg(row.text)
                onClicked: list.moveFocused(index, index + 1, this)
            }
            MouseArea {
                id: handle
                width: height
                height: parent.height
                preventStealing: true
                cursorShape: Qt.SizeVerCursor
                onPositionChanged: {
                    const y = mapToItem(list.contentItem, mouse.x, mouse.y).y;
                    const to = Math.max(0, Math.min(list.count - 1, Math.floor(y / list.rowHeight)));
                    if (to !== index) {
                        list.moved(index, to);
                    }
                }

                IconImage {
                    anchors.centerIn: parent
                    source: "drag.svg"
                    sourceSize: Qt.size(24, 24)
                    color: row.icon.color
                    opacity: 0.5
                }
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
