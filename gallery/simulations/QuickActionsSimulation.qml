// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Layouts 1.15
import gallery.simulation 1.0
import ".."
import "../pages/controls"

/*
    The packages that offer quick actions, and the services that the actions call.
*/
ColumnLayout {
    spacing: 8

    SimulatedFilesSwitch {
        text: qsTrId("gallery-quick-actions-installed")
        path: "/usr/share/glimmera/quickactions/*.conf"
    }
    SimulatedFilesSwitch {
        text: qsTrId("gallery-quick-actions-fail")
        path: "/usr/libexec/gallery-services-fail"
        content: "\n"
    }
    Note {
        text: qsTrId("gallery-quick-actions-absent")
    }
    Note {
        text: qsTrId("gallery-quick-actions-language")
    }
    Paragraph {
        text: qsTrId("gallery-received-calls")
        font.weight: Font.Medium
    }
    Note {
        visible: calls.count === 0
        text: qsTrId("gallery-received-calls-none")
    }
    Repeater {
        model: calls
        Value {
            name: model.service
            value: model.call
        }
    }

    ListModel {
        id: calls
    }

    Connections {
        target: (Simulation) // in parentheses, because qmllint crashes without them
        function onCallReceived(service, method, args) {
            const list = args.map(argument => '"' + argument + '"').join(", ");
            calls.insert(0, { service: service, call: method + "(" + list + ")" });
        }
    }
}
