// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Layouts 1.15
import QtQuick.Window 2.15

/*
    A page that scrolls by touch, by wheel and by keys, and to the item that gets the focus.
*/
Page {
    id: page

    default property alias content: grid.data
    property alias columns: grid.columns
    property alias scrollY: flickable.contentY
    readonly property alias scrolling: flickable.moving
    readonly property alias scrollHeight: flickable.contentHeight

    readonly property Item focused: Window.activeFocusItem
    onFocusedChanged: {
        if (focused && contains(focused)) {
            show(focused);
        }
    }

    function scrollTo(y) {
        flickable.contentY = Math.max(0, Math.min(y, flickable.contentHeight - flickable.height));
    }

    function show(item) {
        const y = item.mapToItem(flickable.contentItem, 0, 0).y;
        if (y < flickable.contentY) {
            scrollTo(y - 8);
        } else if (y + item.height > flickable.contentY + flickable.height) {
            scrollTo(y + item.height + 8 - flickable.height);
        }
    }

    function contains(item) {
        while (item && item !== grid) {
            item = item.parent;
        }
        return item === grid;
    }

    background: null

    Flickable {
        id: flickable
        anchors.fill: parent
        contentHeight: grid.height + 2 * grid.y
        boundsBehavior: Flickable.StopAtBounds
        clip: true
        focus: true
        // Qt starts at the header when Tab is pressed in an item that is not a tab stop itself.
        activeFocusOnTab: true
        Accessible.role: Accessible.Grouping
        Accessible.name: page.title
        ScrollBar.vertical: VisibleScrollBar {}

        Keys.onUpPressed: page.scrollTo(contentY - 48)
        Keys.onDownPressed: page.scrollTo(contentY + 48)
        Keys.onPressed: {
            if (event.key === Qt.Key_PageUp || event.key === Qt.Key_PageDown) {
                const step = event.key === Qt.Key_PageUp ? -height : height;
                page.scrollTo(contentY + step * 0.9);
                event.accepted = true;
            }
        }

        GridLayout {
            id: grid
            x: (flickable.width - width) / 2
            y: 8
            width: Math.min(flickable.width - 16, 1400)
            columnSpacing: 8
            rowSpacing: 8
        }
    }
}
