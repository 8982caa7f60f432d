// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import com.marlo.settings.system 1.0
import "controls"

/*
    The smart back cover, as the cover daemon reports it.
*/
GalleryPage {
    KivInfo {
        id: cover
    }

    Section {
        heading: qsTrId("gallery-cover-info")

        Value {
            name: qsTrId("gallery-cover-id")
            value: cover.kivId || qsTrId("gallery-cover-none")
        }
        Value {
            name: qsTrId("gallery-cover-daemon")
            value: cover.kivReady ? qsTrId("gallery-cover-ready") : qsTrId("gallery-cover-not-ready")
        }
    }
}
