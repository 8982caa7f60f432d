// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Layouts 1.15

/*
    A value below its name.
*/
ColumnLayout {
    property alias name: nameLabel.text
    property alias value: valueLabel.text

    Layout.fillWidth: true
    spacing: 0

    Label {
        id: nameLabel
        Layout.fillWidth: true
        font.pixelSize: 12
        opacity: 0.7
        elide: Text.ElideRight
    }
    Paragraph {
        id: valueLabel
    }
}
