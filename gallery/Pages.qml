// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQml 2.15

/*
    The pages of the gallery. A new page needs a file in pages/, one in simulations/, and an entry here.
*/
QtObject {
    readonly property var list: [
        { name: "quick-actions", file: "QuickActionsPage.qml", type: "QuickActionsModel",
          title: qsTrId("gallery-quick-actions"),
          about: qsTrId("gallery-quick-actions-about") },
        { name: "quick-actions-settings", file: "QuickActionsSettingsPage.qml",
          type: "QuickActionsModel",
          title: qsTrId("gallery-quick-actions-settings"),
          about: qsTrId("gallery-quick-actions-settings-about") },
        { name: "events-widgets", file: "EventsWidgetsPage.qml", type: "EventsWidgetsModel",
          title: qsTrId("gallery-events-widgets"),
          about: qsTrId("gallery-events-widgets-about") },
        { name: "titles", file: "TitlesViewPage.qml", type: "TitlesView",
          title: qsTrId("gallery-titles"),
          about: qsTrId("gallery-titles-about") },
        { name: "memory-card", file: "MemoryCardPage.qml", type: "MemoryCardFormatter",
          title: qsTrId("gallery-card"),
          about: qsTrId("gallery-card-about") },
        { name: "location", file: "LocationPage.qml", type: "LocationConfiguration",
          title: qsTrId("gallery-location"),
          about: qsTrId("gallery-location-about") },
        { name: "cover", file: "CoverPage.qml", type: "KivInfo",
          title: qsTrId("gallery-cover"),
          about: qsTrId("gallery-cover-about") },
        { name: "bluetooth", file: "BluetoothPage.qml", type: "BluetoothInfo",
          title: qsTrId("gallery-bluetooth"),
          about: qsTrId("gallery-bluetooth-about") },
        { name: "android", file: "AndroidPage.qml", type: "AndroidSupport",
          title: qsTrId("gallery-android"),
          about: qsTrId("gallery-android-about") },
        { name: "modem", file: "ModemPage.qml", type: "ModemFeatures",
          title: qsTrId("gallery-modem"),
          about: qsTrId("gallery-modem-about") },
        { name: "terms", file: "TermsOfUsePage.qml", type: "TermsOfUseManager",
          title: qsTrId("gallery-terms"),
          about: qsTrId("gallery-terms-about") },
        { name: "text-files", file: "TextFilesPage.qml", type: "TextFileReader",
          title: qsTrId("gallery-text-files"),
          about: qsTrId("gallery-text-files-about") },
    ]
}
