// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Layouts 1.15
import com.marlo.settings.system 1.0
import "controls"

/*
    The terms of use of the platform and of the vendor, in a language that the user chooses.
*/
GalleryPage {
    readonly property var localeNames: ["en_GB", "fi_FI.UTF-8", "de_DE.UTF-8"]
    readonly property string language: Qt.locale().name.substring(0, 2)
    property string localeName: localeNames.find(name => name.startsWith(language)) || "en_GB"

    // Each is a list of a title and a body, or an empty list.
    readonly property var platformTerms: manager.platformTermsOfUse(localeName)
    readonly property var vendorSummary: vendorTermsOf(() => manager.vendorTermsSummary(localeName))
    readonly property var vendorTerms: vendorTermsOf(() => manager.vendorTermsOfUse(localeName))

    // Without vendor terms, reading them would only log warnings.
    function vendorTermsOf(read) {
        return manager.hasVendorTermsOfUse ? read() : [];
    }

    TermsOfUseManager {
        id: manager
        vendorPath: "/usr/share/marlo-settings/vendor-eula"
    }

    Section {
        heading: qsTrId("gallery-terms-locale")

        ComboBox {
            Layout.fillWidth: true
            model: localeNames
            Accessible.name: qsTrId("gallery-terms-locale")
            currentIndex: localeNames.indexOf(localeName)
            onActivated: localeName = localeNames[index]
        }
        Note {
            text: qsTrId("gallery-terms-locale-note")
        }
    }

    Section {
        heading: platformTerms[0] || qsTrId("gallery-terms-none")

        Paragraph {
            visible: text !== ""
            text: platformTerms[1] || ""
        }
    }

    Section {
        visible: manager.hasVendorTermsOfUse
        heading: vendorSummary[0] || qsTrId("gallery-terms-none")

        Paragraph {
            visible: text !== ""
            text: vendorSummary[1] || ""
        }
    }

    Section {
        visible: manager.hasVendorTermsOfUse
        heading: vendorTerms[0] || qsTrId("gallery-terms-none")

        Paragraph {
            visible: text !== ""
            text: vendorTerms[1] || ""
        }
    }
}
