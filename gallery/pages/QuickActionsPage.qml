// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Layouts 1.15
import com.marlo.settings.system 1.0
import "controls"
import "controls/display.js" as Display

/*
    The enabled quick actions in the user's order, as a home screen shows them.
*/
GalleryPage {
    QuickActionsModel {
        id: actions
    }

    Section {
        heading: qsTrId("gallery-quick-actions-home")

        Flow {
            Layout.fillWidth: true
            visible: actions.count > 0
            spacing: 8

            Repeater {
                model: actions
                Tile {
                    text: Display.title(model.title, model.path)
                    icon.source: Display.url(model.icon)
                    onClicked: actions.triggerAction(index)
                }
            }
        }
        Note {
            visible: actions.count === 0
            text: qsTrId("gallery-quick-actions-none")
        }
    }
}
