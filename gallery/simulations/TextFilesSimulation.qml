// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import ".."

/*
    The file and the directory.
*/
ConstantFiles {
    SimulatedFilesSwitch {
        text: qsTrId("gallery-text-files-file-installed")
        path: "/usr/share/marlo-settings/about-*.html"
    }
    SimulatedFilesSwitch {
        text: qsTrId("gallery-text-files-directory-installed")
        path: "/usr/share/marlo-settings/licenses"
    }
}
