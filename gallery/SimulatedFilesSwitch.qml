// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import gallery.simulation 1.0
import "pages/controls"

/*
    Hides sample files and shows them again.
*/
TextSwitch {
    property alias path: files.path
    property alias content: files.content

    checked: files.present
    onToggled: files.present = checked

    SimulatedFiles {
        id: files
    }
}
