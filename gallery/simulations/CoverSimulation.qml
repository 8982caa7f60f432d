// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Layouts 1.15
import gallery.simulation 1.0
import ".."
import "../pages/controls"

/*
    The service on the system bus that recognizes covers, and the cover that it sees.
*/
ColumnLayout {
    spacing: 8

    Repeater {
        model: [
            { cover: Simulation.NoDaemon, text: qsTrId("gallery-cover-no-daemon") },
            { cover: Simulation.NoCover, text: qsTrId("gallery-cover-removed") },
            { cover: Simulation.CoverStarting, text: qsTrId("gallery-cover-attached") },
            { cover: Simulation.CoverReady, text: qsTrId("gallery-cover-attached-ready") },
        ]
        Choice {
            text: modelData.text
            checked: Simulation.cover === modelData.cover
            onToggled: Simulation.cover = modelData.cover
        }
    }
    Note {
        text: qsTrId("gallery-cover-note")
    }
}
