// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Controls.Universal 2.15

/*
    A button in the style of the sections: filled if it is highlighted, outlined otherwise. Its tint
    shows its weight.
*/
Button {
    id: button

    property color tint: Universal.accent

    implicitHeight: 36
    horizontalPadding: 14
    verticalPadding: 6
    Keys.onReturnPressed: clicked()
    Keys.onEnterPressed: clicked()

    background: Rectangle {
        radius: 8
        opacity: button.enabled ? 1 : 0.4
        color: button.highlighted ? Qt.darker(button.tint, button.down ? 1.3 : 1)
             : Qt.rgba(button.tint.r, button.tint.g, button.tint.b,
                       button.down ? 0.25 : button.hovered ? 0.15 : 0.08)
        border.color: button.visualFocus ? "black" : button.tint
        border.width: button.visualFocus ? 2 : 1
    }
    contentItem: Label {
        text: button.text
        opacity: button.enabled ? 1 : 0.4
        color: button.highlighted ? "white" : button.tint
        font.weight: Font.Medium
        horizontalAlignment: Text.AlignHCenter
        verticalAlignment: Text.AlignVCenter
        elide: Text.ElideRight
    }
}
