// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15

/*
    The steps of the day, and how many are left.
*/
Column {
    spacing: 4

    Label {
        text: qsTrId("outdoors-steps")
        font.weight: Font.Medium
    }
    ProgressBar {
        id: bar
        width: parent.width
        to: 10000
        value: 6400
        Accessible.name: qsTrId("outdoors-steps")
    }
    Label {
        text: qsTrId("outdoors-steps-done").arg(bar.value).arg(bar.to)
    }
}
