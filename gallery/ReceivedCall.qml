// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Layouts 1.15

/*
    A D-Bus call that a service received.
*/
ColumnLayout {
    property alias service: serviceLabel.text
    property alias call: callLabel.text

    Layout.fillWidth: true
    spacing: 0

    Label {
        id: callLabel
        Layout.fillWidth: true
        elide: Text.ElideRight
    }
    Label {
        id: serviceLabel
        Layout.fillWidth: true
        font.pixelSize: 12
        opacity: 0.7
        elide: Text.ElideRight
    }
}
