// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Layouts 1.15
import com.marlo.settings.system 1.0
import "controls"

/*
    The location services: their switches, saving and restoring the switches, and the terms that the user
    agrees to before an online service can be switched.
*/
GalleryPage {
    // The numbers of the states. Platforms have different names for them.
    enum OnlineState { NotAgreed, Disabled, Enabled }

    readonly property bool mlsAgreed: location.mlsOnlineState !== LocationPage.OnlineState.NotAgreed
    readonly property bool hereAgreed: location.hereState !== LocationPage.OnlineState.NotAgreed

    LocationConfiguration {
        id: location
    }

    Section {
        heading: qsTrId("gallery-location-services")

        TextSwitch {
            text: qsTrId("gallery-location-gps")
            checked: location.gpsEnabled
            onToggled: location.gpsEnabled = checked
        }
        TextSwitch {
            text: qsTrId("gallery-location-mls")
            checked: location.mlsEnabled
            onToggled: location.mlsEnabled = checked
        }
        TextSwitch {
            text: qsTrId("gallery-location-mls-online")
            enabled: mlsAgreed
            checked: location.mlsOnlineState === LocationPage.OnlineState.Enabled
            onToggled: location.mlsOnlineState = checked ? LocationPage.OnlineState.Enabled
                                                         : LocationPage.OnlineState.Disabled
        }
        TextSwitch {
            text: qsTrId("gallery-location-here")
            enabled: hereAgreed
            checked: location.hereState === LocationPage.OnlineState.Enabled
            onToggled: location.hereState = checked ? LocationPage.OnlineState.Enabled
                                                    : LocationPage.OnlineState.Disabled
        }
        Note {
            visible: !mlsAgreed || !hereAgreed
            text: qsTrId("gallery-location-agree-first")
        }
    }

    Section {
        heading: qsTrId("gallery-location-custom")

        TextSwitch {
            text: qsTrId("gallery-location-custom-enabled")
            checked: location.customSettingsEnabled
            onToggled: location.customSettingsEnabled = checked
        }
        RowLayout {
            spacing: 8

            PushButton {
                Layout.fillWidth: true
                Layout.preferredWidth: 1
                text: qsTrId("gallery-location-save")
                onClicked: location.saveCustomSettings()
            }
            PushButton {
                Layout.fillWidth: true
                Layout.preferredWidth: 1
                text: qsTrId("gallery-location-restore")
                onClicked: location.restoreCustomSettings()
            }
        }
        Note {
            text: qsTrId("gallery-location-custom-note")
        }
    }

    Agreement {
        heading: qsTrId("gallery-location-mls-terms")
        terms: location.mlsOnlineAgreementText
        agreed: mlsAgreed
        onChosen: location.mlsOnlineState = agrees ? LocationPage.OnlineState.Enabled
                                                   : LocationPage.OnlineState.NotAgreed
    }

    Agreement {
        heading: qsTrId("gallery-location-here-terms")
        terms: location.hereAgreementText
        agreed: hereAgreed
        onChosen: location.hereState = agrees ? LocationPage.OnlineState.Enabled
                                              : LocationPage.OnlineState.NotAgreed
    }
}
