// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import com.marlo.settings.system 1.0
import "controls"
import "controls/display.js" as Display

/*
    The page on which a user chooses the widgets of the events screen.
*/
GalleryPage {
    EventsWidgetsModel {
        id: widgets
    }

    Section {
        heading: qsTrId("gallery-events-widgets-available")

        Repeater {
            id: list
            model: widgets
            TextSwitch {
                text: Display.title(model.title, model.path)
                icon.source: Display.icon(model.icon)
                description: model.description
                remark: model.available ? "" : qsTrId("gallery-events-widgets-unavailable")
                // Needs "model.", because an item has a property `enabled` of its own.
                checked: model.enabled
                onToggled: {
                    if (checked) {
                        widgets.enableWidget(model.path);
                    } else {
                        widgets.disableWidget(model.path);
                    }
                }
            }
        }
        Note {
            text: list.count === 0 ? qsTrId("gallery-events-widgets-none")
                                   : qsTrId("gallery-events-widgets-first-choice")
        }
        // The model does not watch the paths that make widgets available.
        Button {
            text: qsTrId("gallery-events-widgets-check")
            onClicked: widgets.updateAvailable()
        }
    }
}
