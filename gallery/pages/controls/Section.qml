// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Controls.Universal 2.15
import QtQuick.Layouts 1.15

/*
    A part of a page, under a title. All sections of a page have the same width, and sections in a row
    the same height.
*/
Pane {
    property alias heading: heading.text
    default property alias content: column.data

    Layout.fillWidth: true
    Layout.fillHeight: true
    Layout.preferredWidth: 1
    padding: 12
    background: Card {}

    contentItem: ColumnLayout {
        spacing: 8

        Label {
            id: heading
            Layout.fillWidth: true
            color: Universal.accent
            font.weight: Font.Medium
            elide: Text.ElideRight
        }
        ColumnLayout {
            id: column
            Layout.fillHeight: false
            spacing: 8
        }
        // Takes the rest of the height.
        Item {
            Layout.fillHeight: true
        }
    }
}
