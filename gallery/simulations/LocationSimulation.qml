// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import ".."

/*
    The packages of the online services, with their terms.
*/
ConstantFiles {
    SimulatedFilesSwitch {
        text: qsTrId("gallery-location-mls-installed")
        path: "/usr/share/geoclue-provider-mlsdb/agreements/*.txt"
    }
    SimulatedFilesSwitch {
        text: qsTrId("gallery-location-here-installed")
        path: "/usr/share/libherepositioning/agreements/*.txt"
    }
}
