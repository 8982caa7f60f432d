// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import com.marlo.settings.system 1.0
import "controls"

/*
    The variant of the modem software.
*/
GalleryPage {
    ModemFeatures {
        id: modem
    }

    Section {
        heading: qsTrId("gallery-modem")

        Value {
            name: qsTrId("gallery-modem-variant")
            value: modem.variant || qsTrId("gallery-unknown")
        }
    }
}
