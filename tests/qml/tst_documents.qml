// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtTest 1.15
import com.marlo.settings.system 1.0

TestCase {
    id: test

    readonly property string platformTerms: "/usr/share/marlo-settings/platform-eula/tarnwick_termsofuse-"
    readonly property string vendorDirectory: "/usr/share/vendor-eula"
    readonly property string textDirectory: "/usr/share/texts"

    name: "Documents"

    Component {
        id: terms
        TermsOfUseManager {
            readonly property bool shown: hasVendorTermsOfUse
            property int changes: 0
            onVendorPathChanged: ++changes
        }
    }

    function initTestCase() {
        root.recordMessages();
    }

    function init() {
        root.removeFile(vendorDirectory);
        root.removeFile(textDirectory);
    }

    function cleanup() {
        compare(root.takeMessages(), []);
    }

    function test_termsAreListsOfTitleAndBody() {
        root.writeFile(platformTerms + "fi.txt", " Käyttöehdot \n\n Yksi\nKaksi\n\n");
        root.writeFile(vendorDirectory + "/full/fi.txt", "Ehdot\nKaikki");
        root.writeFile(vendorDirectory + "/summary/fi.txt", "Ehdot");
        const manager = createTemporaryObject(terms, test, { vendorPath: vendorDirectory });
        const parts = list => list.map(part => part);
        compare(parts(manager.platformTermsOfUse("fi_FI")), ["Käyttöehdot", "Yksi\nKaksi"]);
        compare(parts(manager.vendorTermsOfUse("fi_FI")), ["Ehdot", "Kaikki"]);
        compare(parts(manager.vendorTermsSummary("fi_FI")), ["Ehdot", ""]);
        root.removeFile(vendorDirectory);
        compare(parts(manager.vendorTermsOfUse("en_GB")), []);
        compare(root.takeMessages(), ["TermsOfUseManager: unable to load either the specified "
                                      + "locale or the English terms"]);
    }

    function test_vendorPath() {
        const manager = createTemporaryObject(terms, test);
        compare(manager.vendorPath, "");
        compare(manager.shown, false);
        manager.vendorPath = vendorDirectory;
        root.writeFile(vendorDirectory + "/full/fi.txt", "");
        compare(manager.hasVendorTermsOfUse, true);
        // No change signal has been emitted yet.
        compare(manager.shown, false);
        manager.vendorPath = vendorDirectory;
        compare(manager.changes, 1);
        manager.vendorPath = vendorDirectory + "/full";
        compare(manager.changes, 2);
        compare(manager.shown, true);
    }

    function test_textFiles() {
        root.writeFile(textDirectory + "/2", "B\n");
        root.writeFile(textDirectory + "/1", "Hyvää\n✓");
        compare(TextFileReader.readContent(textDirectory + "/1"), "Hyvää✓");
        compare(TextFileReader.collate("file://" + textDirectory, ",", ":"), ":Hyvää✓,B");
    }

    // QML sees a null string as an empty one, neither null nor undefined: pages bind texts to it.
    function test_whatCannotBeReadIsEmpty() {
        verify(TextFileReader.readContent(textDirectory + "/missing") === "");
        verify(TextFileReader.readContent("") === "");
        verify(TextFileReader.collate("file://" + textDirectory + "/missing", ",", ":") === "");
        verify(TextFileReader.collate("https://example.org" + textDirectory, ",", ":") === "");
        verify(TextFileReader.collate("", ",", ":") === "");
    }
}
