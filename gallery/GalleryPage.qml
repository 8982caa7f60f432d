// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Layouts 1.15

/*
    A page of the gallery: what is put into it stands in one column, in two where there is room, and
    scrolls.
*/
Page {
    id: page

    // For screenshots: does what a user would do first; ready tells when all of it can be seen.
    property bool ready: true
    function demonstrate() {}

    default property alias content: grid.data

    background: null

    Flickable {
        id: flickable
        anchors.fill: parent
        contentHeight: grid.height + 2 * grid.y
        boundsBehavior: Flickable.StopAtBounds
        ScrollBar.vertical: ScrollBar {}

        GridLayout {
            id: grid
            x: (flickable.width - width) / 2
            y: 8
            width: Math.min(flickable.width - 16, 1040)
            columns: width >= 640 ? 2 : 1
            columnSpacing: 8
            rowSpacing: 8
        }
    }
}
