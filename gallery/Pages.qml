// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQml 2.15

/*
    The pages of the gallery. A new page is a file in pages/ and an entry here.
*/
QtObject {
    readonly property var list: [
        { name: "quick-actions", file: "QuickActionsPage.qml",
          title: qsTrId("gallery-quick-actions"),
          about: qsTrId("gallery-quick-actions-about") },
        { name: "quick-actions-settings", file: "QuickActionsSettingsPage.qml",
          title: qsTrId("gallery-quick-actions-settings"),
          about: qsTrId("gallery-quick-actions-settings-about") },
        { name: "events-widgets", file: "EventsWidgetsPage.qml",
          title: qsTrId("gallery-events-widgets"),
          about: qsTrId("gallery-events-widgets-about") },
        { name: "titles", file: "TitlesViewPage.qml",
          title: qsTrId("gallery-titles"),
          about: qsTrId("gallery-titles-about") },
        { name: "memory-card", file: "MemoryCardPage.qml",
          title: qsTrId("gallery-card"),
          about: qsTrId("gallery-card-about") },
        { name: "location", file: "LocationPage.qml",
          title: qsTrId("gallery-location"),
          about: qsTrId("gallery-location-about") },
        { name: "cover", file: "CoverPage.qml",
          title: qsTrId("gallery-cover"),
          about: qsTrId("gallery-cover-about") },
        { name: "device", file: "DevicePage.qml",
          title: qsTrId("gallery-device"),
          about: qsTrId("gallery-device-about") },
        { name: "terms", file: "TermsOfUsePage.qml",
          title: qsTrId("gallery-terms"),
          about: qsTrId("gallery-terms-about") },
        { name: "text-files", file: "TextFilesPage.qml",
          title: qsTrId("gallery-text-files"),
          about: qsTrId("gallery-text-files-about") },
    ]
}
