// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15

/*
    The weather of the next hours.
*/
Column {
    id: weather

    spacing: 4

    Label {
        text: qsTrId("outdoors-weather")
        font.weight: Font.Medium
    }
    Row {
        Repeater {
            model: [
                { time: "12", temperature: 4 }, { time: "15", temperature: 6 },
                { time: "18", temperature: 3 }, { time: "21", temperature: -1 },
            ]
            Column {
                width: weather.width / 4

                Label {
                    text: modelData.time
                    opacity: 0.7
                }
                Label {
                    text: modelData.temperature + " °C"
                }
            }
        }
    }
}
