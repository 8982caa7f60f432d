// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Controls.Material 2.15
import QtQuick.Layouts 1.15

/*
    A part of a page, under a title. All sections of a page are of the same width.
*/
ColumnLayout {
    property alias title: heading.text

    Layout.fillWidth: true
    Layout.preferredWidth: 1
    Layout.alignment: Qt.AlignTop
    spacing: 8

    Label {
        id: heading
        Layout.fillWidth: true
        color: Material.accent
        font.weight: Font.Medium
        elide: Text.ElideRight
    }
}
