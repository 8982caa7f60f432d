// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15

/*
    The birthdays of the week.
*/
Column {
    spacing: 4

    Label {
        text: qsTrId("calendar-birthdays")
        font.weight: Font.Medium
    }
    Label {
        width: parent.width
        text: qsTrId("calendar-birthdays-sunday")
        wrapMode: Text.Wrap
    }
}
