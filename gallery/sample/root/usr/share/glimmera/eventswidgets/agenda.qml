// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15

/*
    The appointments of the day.
*/
Column {
    spacing: 4

    Label {
        text: qsTrId("calendar-agenda")
        font.weight: Font.Medium
    }
    Repeater {
        model: [
            { time: "9:30", text: qsTrId("calendar-agenda-dentist") },
            { time: "12:00", text: qsTrId("calendar-agenda-lunch") },
        ]
        Row {
            spacing: 8

            Label {
                width: 48
                text: modelData.time
                opacity: 0.7
            }
            Label {
                text: modelData.text
            }
        }
    }
}
