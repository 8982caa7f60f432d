// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15

/*
    The terms of an online service, to which the user agrees or from which the user withdraws. Consent
    can be withdrawn without the terms, too.
*/
Section {
    id: agreement

    property string terms
    property bool agreed
    signal chosen(bool agrees)

    Paragraph {
        text: terms.trim()
    }
    PushButton {
        // The text of a service whose terms are not installed.
        visible: agreed || terms !== qsTrId("settings_location-la-no_agreement_text_found")
        highlighted: !agreed
        text: agreed ? qsTrId("gallery-location-withdraw") : qsTrId("gallery-location-agree")
        onClicked: agreement.chosen(!agreed)
    }
}
