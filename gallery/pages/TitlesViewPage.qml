// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import com.marlo.settings.system 1.0
import "controls"
import "controls/display.js" as Display

/*
    Sentences that join the titles of the enabled rows. They follow the switches.
*/
GalleryPage {
    EventsWidgetsModel {
        id: widgets
    }
    TitlesView {
        id: widgetTitles
        model: widgets
        role: "title"
        matchRole: "enabled"
        match: true
    }

    QuickActionsModel {
        id: actions
        showPotential: true
    }
    TitlesView {
        id: actionTitles
        model: actions
        role: "title"
        matchRole: "enabled"
        match: true
    }

    Section {
        heading: qsTrId("gallery-titles-widgets")

        Paragraph {
            text: widgetTitles.value || qsTrId("gallery-titles-none")
        }
        Repeater {
            model: widgets
            TextSwitch {
                text: Display.title(model.title, model.path)
                checked: model.enabled
                onToggled: checked ? widgets.enableWidget(model.path) : widgets.disableWidget(model.path)
            }
        }
    }

    Section {
        heading: qsTrId("gallery-titles-actions")

        Paragraph {
            text: actionTitles.value || qsTrId("gallery-titles-none")
        }
        Repeater {
            model: actions
            TextSwitch {
                text: Display.title(model.title, model.path)
                checked: model.enabled
                onToggled: checked ? actions.enableAction(model.path) : actions.disableAction(model.path)
            }
        }
    }
}
