// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import com.marlo.settings.system 1.0
import "controls"

/*
    The address of the Bluetooth adapter.
*/
GalleryPage {
    BluetoothInfo {
        id: bluetooth
    }

    Section {
        heading: qsTrId("gallery-bluetooth")

        Value {
            name: qsTrId("gallery-bluetooth-address")
            value: bluetooth.adapterAddress || qsTrId("gallery-unknown")
        }
    }
}
