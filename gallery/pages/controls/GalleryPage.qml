// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Layouts 1.15

/*
    What a page of the gallery consists of: sections in one column, in two where there is room.
*/
GridLayout {
    columns: width >= 640 ? 2 : 1
    columnSpacing: 8
    rowSpacing: 8
}
