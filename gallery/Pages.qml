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
    ]
}
