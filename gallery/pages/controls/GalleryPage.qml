// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Layouts 1.15

/*
    A page of the gallery: sections in one column, or in two if there is room.
*/
GridLayout {
    columns: width >= 640 && visibleChildren.length > 1 ? 2 : 1
    columnSpacing: 8
    rowSpacing: 8
}
