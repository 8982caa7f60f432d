// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Controls.Universal 2.15
import gallery.simulation 1.0

/*
    Shows the language and lets the user choose another.
*/
ToolButton {
    id: button

    readonly property var languages: ({ "en": "English", "fi": "Suomi" })

    text: Simulation.language.toUpperCase()
    icon.source: "icons/language.svg"
    Accessible.name: qsTrId("gallery-language")
    onClicked: menu.open()

    Menu {
        id: menu
        Universal.theme: Universal.Light
        y: button.height

        Repeater {
            model: Object.keys(button.languages)
            MenuItem {
                text: button.languages[modelData]
                checkable: true
                checked: Simulation.language === modelData
                onTriggered: Simulation.language = modelData
            }
        }
    }
}
