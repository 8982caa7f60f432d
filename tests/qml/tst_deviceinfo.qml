// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtTest 1.15
import com.marlo.settings.system 1.0

TestCase {
    id: test

    readonly property string location: "/settings/location/"
    readonly property string hereConsent: "/usr/share/libherepositioning/agreements/here_consent_"
    readonly property string mlsConsent: "/usr/share/geoclue-provider-mlsdb/agreements/mls_consent_"
    readonly property string addressFile: "/var/lib/bluetooth/board-address"
    readonly property string androidDaemon: "/usr/sbin/apkd"
    readonly property string modemFile: "/usr/share/modem-software/features.ini"

    name: "DeviceInfo"

    Component {
        id: locationPage
        LocationConfiguration {
            readonly property string here: hereAgreementText
            readonly property string mls: mlsOnlineAgreementText
            property var heard: []
            onGpsEnabledChanged: heard.push("gps " + gpsEnabled)
            onMlsEnabledChanged: heard.push("mls " + mlsEnabled)
            onMlsOnlineStateChanged: heard.push("mls online " + mlsOnlineState)
            onHereStateChanged: heard.push("here " + hereState)
            onCustomSettingsEnabledChanged: heard.push("custom " + customSettingsEnabled)
        }
    }

    Component {
        id: cover
        KivInfo {
            property int changes: 0
            onKivIdChanged: ++changes
            onKivReadyChanged: ++changes
        }
    }

    Component {
        id: bluetooth
        BluetoothInfo {}
    }

    Component {
        id: android
        AndroidSupport {
            readonly property bool shown: dataDirectoriesVisible
        }
    }

    Component {
        id: modem
        ModemFeatures {
            readonly property string shown: variant
        }
    }

    // A key that was never stored counts as off.
    function tryStored(name, value) {
        tryVerify(() => (root.key(location + name) || value * 0) == value, 5000,
                  name + " is stored as " + value);
    }

    // Sets the switches and waits until they are stored, so that no write is pending when the next
    // test starts.
    function set(page, gps, mls, mlsOnline, here) {
        page.gpsEnabled = gps;
        page.mlsEnabled = mls;
        page.mlsOnlineState = mlsOnline;
        page.hereState = here;
        tryStored("gps_enabled", gps);
        tryStored("mls_enabled", mls);
        tryStored("mls_online_state", mlsOnline);
        tryStored("here_state", here);
    }

    function switches(page) {
        return [page.gpsEnabled, page.mlsEnabled, page.mlsOnlineState, page.hereState];
    }

    function newPage() {
        const page = createTemporaryObject(locationPage, test);
        page.heard = [];
        return page;
    }

    function initTestCase() {
        root.setLocale("fi_FI");
        root.writeFile(hereConsent + "fi_FI.txt", "HERE\nHyväksyn ✓\n");
        root.writeFile(mlsConsent + "fi_FI.txt", "MLS\n");
        root.recordMessages();
    }

    function init() {
        const page = newPage();
        set(page, false, false, 0, 0);
        page.customSettingsEnabled = false;
        tryStored("custom_settings_enabled", false);
    }

    function cleanup() {
        compare(root.takeMessages(), []);
    }

    function test_switchesAreWrittenReadAndFollowed() {
        const page = newPage();
        const other = newPage();
        compare(switches(page), [false, false, 0, 0]);
        set(page, true, true, 2, 1);
        compare(switches(page), [true, true, 2, 1]);
        compare(page.heard, ["gps true", "mls true", "mls online 2", "here 1"]);
        compare(switches(other), [true, true, 2, 1]);
        compare(other.heard, page.heard);
        // Another client of dconf.
        root.setKey(location + "gps_enabled", false);
        tryCompare(other, "heard", page.heard.concat("gps false"));
    }

    function test_statesAreNumbersAndConstants() {
        const page = newPage();
        set(page, false, false, LocationConfiguration.OnlineAGpsDisabled,
            LocationConfiguration.OnlineAGpsEnabled);
        compare(switches(page), [false, false, 1, 2]);
        page.heard = [];
        page.mlsOnlineState = 3;
        page.hereState = -1;
        compare(switches(page), [false, false, 1, 2]);
        compare(page.heard, []);
        compare(root.takeMessages(), ["LocationSettings: 3 is not a state of an online service",
                                      "LocationSettings: -1 is not a state of an online service"]);
    }

    function test_customSettings() {
        const page = newPage();
        page.customSettingsEnabled = true;
        page.customSettingsEnabled = true;
        compare(page.heard, ["custom true"]);
        tryStored("custom_settings_enabled", true);

        set(page, true, false, 2, 0);
        page.saveCustomSettings();
        const later = newPage();
        compare(later.customSettingsEnabled, true);
        set(later, false, true, 1, 2);
        later.restoreCustomSettings();
        compare(switches(page), [true, false, 2, 1]);
        set(later, true, false, 2, 1);
    }

    function test_agreementTexts() {
        const page = newPage();
        compare(page.here, "HERE\nHyväksyn ✓\n");
        compare(page.mls, "MLS\n");
    }

    function test_noCoverDaemon() {
        const info = createTemporaryObject(cover, test);
        // The bus answers that there is no daemon, which changes nothing.
        wait(300);
        compare(info.kivId, "");
        compare(info.kivReady, false);
        compare(info.changes, 0);
    }

    function test_bluetoothAddress() {
        root.writeFile(addressFile, "00:1A:7D:DA:71:13\n");
        compare(createTemporaryObject(bluetooth, test).adapterAddress, "00:1a:7d:da:71:13");
        root.removeFile(addressFile);
        compare(createTemporaryObject(bluetooth, test).adapterAddress, "");
        compare(root.takeMessages(), ['Unable to open file: "' + addressFile + '"']);
    }

    function test_constantsAreReadAgainButBindingsAreNotUpdated_data() {
        return [
            { tag: "android", component: android, property: "dataDirectoriesVisible",
              file: androidDaemon, content: "", before: false, after: true },
            { tag: "modem", component: modem, property: "variant",
              file: modemFile, content: "variant=global\n", before: "", after: "global" },
        ];
    }

    function test_constantsAreReadAgainButBindingsAreNotUpdated(data) {
        const object = createTemporaryObject(data.component, test);
        compare(object[data.property], data.before);
        root.writeFile(data.file, data.content);
        compare(object[data.property], data.after);
        compare(object.shown, data.before);
        compare(createTemporaryObject(data.component, test).shown, data.after);
    }
}
