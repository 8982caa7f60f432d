// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15

/*
    Asks before something is done that cannot be undone.
*/
Dialog {
    id: question

    property alias text: label.text
    property alias yes: yesButton.text
    property alias no: noButton.text

    parent: Overlay.overlay
    anchors.centerIn: parent
    width: Math.min(parent.width - 32, 400)
    modal: true
    // Without it, keys reach the page behind the dialog.
    focus: true
    // The button that changes nothing.
    onOpened: noButton.forceActiveFocus(Qt.TabFocusReason)

    // A label with a width of its own has its final height at once.
    Label {
        id: label
        width: question.availableWidth
        wrapMode: Text.Wrap
    }
    footer: DialogButtonBox {
        spacing: 8
        // The same order on every platform: "no" first.
        buttonLayout: DialogButtonBox.GnomeLayout

        PushButton {
            id: noButton
            DialogButtonBox.buttonRole: DialogButtonBox.RejectRole
        }
        PushButton {
            id: yesButton
            DialogButtonBox.buttonRole: DialogButtonBox.AcceptRole
            highlighted: true
            tint: "#b00020"
        }
    }
}
