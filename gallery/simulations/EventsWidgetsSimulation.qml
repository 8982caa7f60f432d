// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Layouts 1.15
import ".."
import "../pages/controls"

/*
    The packages that offer widgets, and the program that one widget needs.
*/
ColumnLayout {
    spacing: 8

    SimulatedFilesSwitch {
        text: qsTrId("gallery-events-widgets-installed")
        path: "/usr/share/glimmera/eventswidgets/*.json"
    }
    SimulatedFilesSwitch {
        text: qsTrId("gallery-events-widgets-broken")
        path: "/usr/share/glimmera/eventswidgets/broken.json"
        content: "{ \"widgets\": [ {} ]"
    }
    SimulatedFilesSwitch {
        text: qsTrId("gallery-events-widgets-step-counter")
        description: qsTrId("gallery-events-widgets-step-counter-note")
        path: "/usr/libexec/step-counter"
        content: "\n"
    }
}
