// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Layouts 1.15
import com.marlo.settings.system 1.0
import "controls"
import "controls/display.js" as Display

/*
    The page on which a user chooses the widgets of the events screen, and the widgets themselves.
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
                icon.source: Display.url(model.icon)
                description: model.description
                remark: model.available ? "" : qsTrId("gallery-events-widgets-unavailable")
                // Needs "model.", because an item has a property `enabled` of its own.
                checked: model.enabled
                onToggled: checked ? widgets.enableWidget(model.path) : widgets.disableWidget(model.path)
            }
        }
        Note {
            text: list.count === 0 ? qsTrId("gallery-events-widgets-none")
                                   : qsTrId("gallery-events-widgets-first-choice")
        }
        // The model does not watch the paths that make widgets available.
        PushButton {
            text: qsTrId("gallery-events-widgets-check")
            onClicked: widgets.updateAvailable()
        }
    }

    // As the events screen shows them: each file is loaded, and gets a width.
    Section {
        heading: qsTrId("gallery-events-widgets-live")

        ColumnLayout {
            id: live
            Layout.fillHeight: false
            spacing: 16

            Repeater {
                model: widgets
                Loader {
                    Layout.fillWidth: true
                    visible: active
                    active: model.enabled && model.available
                    source: Display.url(model.path)
                }
            }
        }
        Note {
            visible: live.implicitHeight === 0
            text: qsTrId("gallery-events-widgets-live-none")
        }
    }
}
