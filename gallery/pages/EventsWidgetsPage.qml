// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Layouts 1.15
import com.marlo.settings.system 1.0
import gallery.stage 1.0
import ".."

/*
    The page on which a user chooses the widgets of the events screen.
*/
GalleryPage {
    title: qsTrId("gallery-events-widgets")
    ready: list.count > 0

    EventsWidgetsModel {
        id: widgets
    }

    Section {
        heading: qsTrId("gallery-events-widgets-available")

        Repeater {
            id: list
            model: widgets
            DescribedSwitch {
                text: model.title
                icon.source: model.icon ? "file://" + model.icon : ""
                description: model.description
                remark: model.available ? "" : qsTrId("gallery-events-widgets-unavailable")
                // An item has an `enabled` of its own, so the role is asked of the model.
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
            text: qsTrId("gallery-events-widgets-first-choice")
        }
    }

    Section {
        heading: qsTrId("gallery-events-widgets-device")

        SwitchDelegate {
            Layout.fillWidth: true
            text: qsTrId("gallery-events-widgets-step-counter")
            checked: Stage.stepCounterInstalled
            onToggled: {
                Stage.stepCounterInstalled = checked;
                // Nobody else tells the model that a widget's file has come or gone.
                widgets.updateAvailable();
            }
        }
        Note {
            text: qsTrId("gallery-events-widgets-step-counter-note")
        }
    }
}
