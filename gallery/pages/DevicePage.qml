// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import com.marlo.settings.system 1.0
import ".."

/*
    What the device is made of, as files of its software tell.
*/
GalleryPage {
    title: qsTrId("gallery-device")
    ready: bluetooth.adapterAddress !== "" && android.dataDirectoriesVisible && modem.variant !== ""

    BluetoothInfo {
        id: bluetooth
    }

    AndroidSupport {
        id: android
    }

    ModemFeatures {
        id: modem
    }

    Section {
        heading: qsTrId("gallery-device-radio")

        Value {
            name: qsTrId("gallery-device-bluetooth")
            value: bluetooth.adapterAddress || qsTrId("gallery-device-unknown")
        }
        Value {
            name: qsTrId("gallery-device-modem")
            value: modem.variant || qsTrId("gallery-device-unknown")
        }
    }

    Section {
        heading: qsTrId("gallery-device-storage")

        Value {
            name: qsTrId("gallery-device-android")
            value: android.dataDirectoriesVisible ? qsTrId("gallery-device-android-shown")
                                                  : qsTrId("gallery-device-android-hidden")
        }
    }
}
