// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Layouts 1.15
import com.marlo.settings.system 1.0
import gallery.stage 1.0
import ".."

/*
    Sentences of the titles of what is enabled, which follow the switches and the language.
*/
GalleryPage {
    id: page

    // Models keep the language in which they were made: another language takes new ones.
    readonly property var languages: [Stage.language]

    title: qsTrId("gallery-titles")
    ready: widgetsSection.ready && actionsSection.ready

    Repeater {
        id: widgetsSection
        readonly property bool ready: count > 0 && itemAt(0).ready

        model: page.languages
        Section {
            readonly property bool ready: widgetTitles.values.length > 0

            heading: qsTrId("gallery-titles-widgets")

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

            Paragraph {
                text: widgetTitles.value || qsTrId("gallery-titles-none")
            }
            Repeater {
                model: widgets
                SwitchDelegate {
                    Layout.fillWidth: true
                    text: model.title
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
        }
    }

    Repeater {
        id: actionsSection
        readonly property bool ready: count > 0 && itemAt(0).ready

        model: page.languages
        Section {
            readonly property bool ready: actionTitles.values.length > 0

            heading: qsTrId("gallery-titles-actions")

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

            Paragraph {
                text: actionTitles.value || qsTrId("gallery-titles-none")
            }
            Repeater {
                model: actions
                SwitchDelegate {
                    Layout.fillWidth: true
                    text: model.title || model.path
                    checked: model.enabled
                    onToggled: {
                        if (checked) {
                            actions.enableAction(model.path);
                        } else {
                            actions.disableAction(model.path);
                        }
                    }
                }
            }
        }
    }
}
