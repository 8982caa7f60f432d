// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Layouts 1.15
import "pages/controls"

/*
    The panel of a page that reads the simulated files only when it is opened.
*/
ColumnLayout {
    default property alias content: column.data

    spacing: 8

    ColumnLayout {
        id: column
        spacing: 8
    }
    Note {
        text: qsTrId("gallery-simulation-constant")
    }
}
