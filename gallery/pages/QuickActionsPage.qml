// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Layouts 1.15
import com.marlo.settings.system 1.0
import gallery.stage 1.0
import ".."

/*
    The quick actions as a home screen shows them: the enabled ones, in the user's order.
*/
GalleryPage {
    title: qsTrId("gallery-quick-actions")
    ready: actions.count > 0 && calls.count === actions.count

    function demonstrate() {
        for (let row = 0; row < actions.count; ++row) {
            actions.triggerAction(row);
        }
    }

    QuickActionsModel {
        id: actions
    }

    ListModel {
        id: calls
    }

    Connections {
        target: Stage
        function onCallReceived(service, method, args) {
            const list = args.map(argument => '"' + argument + '"').join(", ");
            calls.insert(0, { service: service, call: method + "(" + list + ")" });
        }
    }

    Section {
        heading: qsTrId("gallery-quick-actions-home")

        Flow {
            Layout.fillWidth: true
            spacing: 8

            Repeater {
                model: actions
                Tile {
                    text: model.title || model.path
                    icon.source: model.icon ? "file://" + model.icon : ""
                    onClicked: actions.triggerAction(index)
                }
            }
        }
        Note {
            visible: actions.count === 0
            text: qsTrId("gallery-quick-actions-none")
        }
        Note {
            text: qsTrId("gallery-quick-actions-language")
        }
    }

    Section {
        heading: qsTrId("gallery-received-calls")

        Note {
            visible: calls.count === 0
            text: qsTrId("gallery-received-calls-none")
        }
        Repeater {
            model: calls
            ReceivedCall {
                service: model.service
                call: model.call
            }
        }
    }
}
