// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import com.marlo.settings.system 1.0
import "controls"

/*
    Whether to show the data directories of Android applications.
*/
GalleryPage {
    AndroidSupport {
        id: android
    }

    Section {
        heading: qsTrId("gallery-android")

        Value {
            name: qsTrId("gallery-android-directories")
            value: android.dataDirectoriesVisible ? qsTrId("gallery-android-shown")
                                                  : qsTrId("gallery-android-hidden")
        }
    }
}
