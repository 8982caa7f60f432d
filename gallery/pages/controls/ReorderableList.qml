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

    implicitHeight: count * rowHeight
    interactive: false
    // A current row takes the focus from its buttons when it is moved.
    currentIndex: -1

    delegate: ItemDelegate {
        id: row

        // The row keeps the focus at the end of the list, where the button is disabled.
        function moveBy(step, button) {
            list.moved(index, index + step);
            if (!button.enabled) {
                forceActiveFocus(Qt.TabFocusReason);
            }
        }

        focusPolicy: Qt.StrongFocus
        width: ListView.view.width
        height: list.rowHeight
        leftPadding: 0
        rightPadding: buttons.width
        icon.width: 24
        icon.height: 24
        icon.source: Display.url(model.icon)
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
                onClicked: row.moveBy(-1, upButton)
            }
            ToolButton {
                id: downButton
                height: parent.height
                width: 40
                icon.source: "down.svg"
                enabled: index < list.count - 1
                Accessible.name: list.downText.arg(row.text)
                onClicked: row.moveBy(1, downButton)
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
