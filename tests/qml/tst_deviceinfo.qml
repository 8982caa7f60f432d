// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtTest 1.15
import com.marlo.settings.system 1.0

TestCase {
    id: test

    readonly property string location: "/settings/location/"
    readonly property string mlsConsent: "/usr/share/geoclue-provider-mlsdb/agreements/mls_consent_"
    readonly property string hereConsent: "/usr/share/libherepositioning/agreements/here_consent_"
    readonly property string noText: "settings_location-la-no_agreement_text_found"
    readonly property string addressFile: "/var/lib/bluetooth/board-address"
    readonly property string androidDaemon: "/usr/sbin/apkd"
    readonly property string modemFile: "/usr/share/modem-software/features.ini"

    name: "DeviceInfo"

    Component {
        id: locationPage
        LocationConfiguration {
            property var heard: []
            onGpsEnabledChanged: heard.push("gps " + gpsEnabled)
            onMlsEnabledChanged: heard.push("mls " + mlsEnabled)
            onMlsOnlineStateChanged: heard.push("mls online " + mlsOnlineState)
            onHereStateChanged: heard.push("here " + hereState)
            onCustomSettingsEnabledChanged: heard.push("custom " + customSettingsEnabled)
        }
    }

    Component {
        id: agreementPage
        LocationConfiguration {
            readonly property string here: hereAgreementText
            readonly property string mls: mlsOnlineAgreementText
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

    // What the module stores arrives here in its time. A key that was never stored is as good as
    // one that is off.
    function tryStored(name, value) {
        tryVerify(() => (root.key(location + name) || value * 0) == value, 5000,
                  name + " is stored as " + value);
    }

    // Sets the switches and waits for them to be stored, so that nothing of it is on its way when
    // the next one writes.
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

    function initTestCase() {
        root.recordMessages();
    }

    function init() {
        const page = createTemporaryObject(locationPage, test);
        set(page, false, false, 0, 0);
        page.customSettingsEnabled = false;
        tryStored("custom_settings_enabled", false);
        root.setLocale("fi_FI");
        root.removeFile("/usr/share/geoclue-provider-mlsdb/agreements");
        root.removeFile("/usr/share/libherepositioning/agreements");
        root.removeFile(addressFile);
        root.removeFile(androidDaemon);
        root.removeFile(modemFile);
    }

    function cleanup() {
        compare(root.takeMessages(), []);
    }

    function test_switchesAreWrittenReadAndFollowed() {
        const page = createTemporaryObject(locationPage, test);
        const other = createTemporaryObject(locationPage, test);
        compare(switches(page), [false, false, 0, 0]);
        set(page, true, true, 2, 1);
        compare(switches(page), [true, true, 2, 1]);
        compare(page.heard, ["gps true", "mls true", "mls online 2", "here 1"]);
        compare(switches(other), [true, true, 2, 1]);
        compare(other.heard, page.heard);
    }

    function test_switchesFollowOtherProcesses() {
        const page = createTemporaryObject(locationPage, test);
        root.setKey(location + "gps_enabled", true);
        tryCompare(page, "heard", ["gps true"]);
        root.setKey(location + "here_state", 2);
        tryCompare(page, "heard", ["gps true", "here 2"]);
        compare(switches(page), [true, false, 0, 2]);
    }

    function test_aNumberThatIsNoStateIsRefused() {
        const page = createTemporaryObject(locationPage, test);
        set(page, false, false, 1, 2);
        page.heard = [];
        page.mlsOnlineState = 3;
        page.hereState = -1;
        compare(switches(page), [false, false, 1, 2]);
        compare(page.heard, []);
        compare(root.takeMessages(), ["LocationSettings: 3 is no state of an online service",
                                      "LocationSettings: -1 is no state of an online service"]);
    }

    function test_customSettingsEnabled() {
        const page = createTemporaryObject(locationPage, test);
        compare(page.customSettingsEnabled, false);
        page.customSettingsEnabled = false;
        compare(page.heard, []);
        page.customSettingsEnabled = true;
        page.customSettingsEnabled = true;
        compare(page.heard, ["custom true"]);
        tryStored("custom_settings_enabled", true);
        compare(createTemporaryObject(locationPage, test).customSettingsEnabled, true);
    }

    function test_saving_data() {
        return [
            { tag: "all on", set: [true, true, 2, 2], saved: [true, true, true, true] },
            { tag: "disabled", set: [true, false, 1, 1], saved: [true, false, false, false] },
            { tag: "not agreed to", set: [false, true, 0, 2], saved: [false, true, false, true] },
        ];
    }

    function test_saving(data) {
        const page = createTemporaryObject(locationPage, test);
        set(page, ...data.set);
        page.heard = [];
        page.saveCustomSettings();
        const saved = () => {
            const map = root.key(location + "custom_settings") || {};
            return [map["gps/enabled"], map["mls/enabled"], map["mls/online_enabled"],
                    map["here/enabled"]];
        };
        tryVerify(() => saved().toString() === data.saved.toString());
        compare(Object.keys(root.key(location + "custom_settings")).length, 4);
        compare(page.heard, []);
        compare(page.customSettingsEnabled, false);
    }

    function test_restoring_data() {
        return [
            { tag: "all on", saved: [true, true, 2, 2], set: [false, false, 1, 1],
              restored: [true, true, 2, 2] },
            { tag: "all off", saved: [false, false, 1, 1], set: [true, true, 2, 2],
              restored: [false, false, 1, 1] },
            { tag: "saved before the terms were agreed to", saved: [true, false, 0, 0],
              set: [false, true, 2, 1], restored: [true, false, 1, 1] },
            { tag: "not agreed to", saved: [true, true, 2, 2], set: [false, false, 0, 0],
              restored: [true, true, 0, 0] },
        ];
    }

    function test_restoring(data) {
        const page = createTemporaryObject(locationPage, test);
        set(page, ...data.saved);
        page.saveCustomSettings();
        // Later, elsewhere.
        const later = createTemporaryObject(locationPage, test);
        set(later, ...data.set);
        later.restoreCustomSettings();
        compare(switches(later), data.restored);
        compare(switches(page), data.restored);
        compare(later.customSettingsEnabled, false);
        set(later, ...data.restored);
    }

    function test_restoringWithNothingSaved_data() {
        return [
            { tag: "nothing", spoil: () => root.unsetKey(location + "custom_settings") },
            { tag: "no map", spoil: () => root.setKey(location + "custom_settings", "on") },
        ];
    }

    function test_restoringWithNothingSaved(data) {
        const page = createTemporaryObject(locationPage, test);
        // The value changes, so it is not left over from an earlier test.
        for (const here of [1, 2]) {
            set(page, true, true, 2, here);
            page.saveCustomSettings();
            tryVerify(() => {
                const saved = root.key(location + "custom_settings") || {};
                return saved["here/enabled"] === (here === 2);
            });
        }
        set(page, true, true, 2, 0);
        data.spoil();
        // Until that arrives what was saved is restored.
        tryVerify(() => {
            page.restoreCustomSettings();
            return switches(page).toString() === "false,false,1,0";
        });
        set(page, false, false, 1, 0);
    }

    function test_agreementTexts() {
        root.writeFile(hereConsent + "fi_FI.txt", "HERE\nHyväksyn ✓\n");
        root.writeFile(mlsConsent + "fi_FI.txt", "MLS\n");
        root.writeFile(mlsConsent + "en_GB.txt", "English\n");
        const page = createTemporaryObject(agreementPage, test);
        compare(page.here, "HERE\nHyväksyn ✓\n");
        compare(page.mls, "MLS\n");
    }

    function test_agreementTextsFallBackToEnglish() {
        root.writeFile(hereConsent + "en_GB.txt", "HERE");
        root.writeFile(mlsConsent + "en_GB.txt", "");
        const page = createTemporaryObject(locationPage, test);
        compare(page.hereAgreementText, "HERE");
        compare(root.takeMessages(), ['No agreement found for "fi_FI" , falling back to english']);
        compare(page.mlsOnlineAgreementText, "");
        compare(root.takeMessages(), ['No agreement found for "fi_FI" , falling back to english']);
    }

    function test_missingAgreementTexts() {
        root.setLocale("de_DE");
        const page = createTemporaryObject(locationPage, test);
        compare(page.hereAgreementText, noText);
        compare(page.mlsOnlineAgreementText, noText);
        compare(root.takeMessages(), ['No agreement found for "de_DE" , falling back to english',
                                      'No agreement found for "de_DE" , falling back to english']);
    }

    function test_noCoverDaemon() {
        const info = createTemporaryObject(cover, test);
        compare(info.kivId, "");
        compare(info.kivReady, false);
        // The bus answers that there is no daemon, and nothing comes of it.
        wait(300);
        compare(info.kivId, "");
        compare(info.kivReady, false);
        compare(info.changes, 0);
    }

    function test_bluetoothAddress_data() {
        return [
            { tag: "upper case", content: "00:1A:7D:DA:71:13\n", address: "00:1a:7d:da:71:13" },
            { tag: "blanks", content: "  00:1A:7D:DA:71:13\r\n", address: "00:1a:7d:da:71:13" },
            { tag: "lines", content: "first\nsecond\n", address: "first" },
            { tag: "empty", content: "", address: "" },
        ];
    }

    function test_bluetoothAddress(data) {
        root.writeFile(addressFile, data.content);
        const info = createTemporaryObject(bluetooth, test);
        root.removeFile(addressFile);
        // Read once.
        compare(info.adapterAddress, data.address);
    }

    function test_noBluetoothAddress() {
        const info = createTemporaryObject(bluetooth, test);
        compare(info.adapterAddress, "");
        compare(root.takeMessages(), ['Unable to open file: "' + addressFile + '"']);
    }

    function test_androidSupport() {
        const support = createTemporaryObject(android, test);
        compare(support.dataDirectoriesVisible, false);
        root.writeFile(androidDaemon, "");
        compare(support.dataDirectoriesVisible, true);
        // The property is a constant, so bindings to it are not updated.
        compare(support.shown, false);
        compare(createTemporaryObject(android, test).shown, true);
    }

    function test_modemFeatures_data() {
        return [
            { tag: "no section", content: "variant=global\n", variant: "global" },
            { tag: "general section", content: "[General]\nvariant=eu\n", variant: "eu" },
            { tag: "other section", content: "[modem]\nvariant=eu\n", variant: "" },
            { tag: "list", content: "variant=a,b\n", variant: "" },
            { tag: "no variant", content: "other=a\n", variant: "" },
        ];
    }

    function test_modemFeatures(data) {
        const features = createTemporaryObject(modem, test);
        compare(features.variant, "");
        root.writeFile(modemFile, data.content);
        compare(features.variant, data.variant);
        compare(features.shown, "");
        compare(createTemporaryObject(modem, test).shown, data.variant);
    }
}
