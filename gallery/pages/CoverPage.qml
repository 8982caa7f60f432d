// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import com.marlo.settings.system 1.0
import "controls"

/*
    The smart back cover. Without an identifier, no cover is attached if the service that recognizes
    covers is ready. Otherwise nothing is known.
*/
GalleryPage {
    KivInfo {
        id: cover
    }

    Section {
        heading: qsTrId("gallery-cover")

        Value {
            name: qsTrId("gallery-cover-id")
            value: cover.kivId || (cover.kivReady ? qsTrId("gallery-cover-none") : qsTrId("gallery-unknown"))
        }
        Value {
            name: qsTrId("gallery-cover-recognition")
            value: cover.kivReady ? qsTrId("gallery-cover-ready")
                 : cover.kivId ? qsTrId("gallery-cover-not-ready") : qsTrId("gallery-unknown")
        }
    }
}
