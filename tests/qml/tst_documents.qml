// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtTest 1.15
import com.marlo.settings.system 1.0

TestCase {
    id: test

    readonly property string platformDirectory: "/usr/share/marlo-settings/platform-eula"
    readonly property string vendorDirectory: "/usr/share/vendor-eula"
    readonly property string textDirectory: "/usr/share/texts"
    readonly property string noTerms: "TermsOfUseManager: unable to load either the specified "
                                      + "locale or the English terms"

    name: "Documents"

    Component {
        id: terms
        TermsOfUseManager {
            readonly property bool shown: hasVendorTermsOfUse
            property int changes: 0
            onVendorPathChanged: ++changes
        }
    }

    function writePlatform(locale, content) {
        root.writeFile(platformDirectory + "/tarnwick_termsofuse-" + locale + ".txt", content);
    }

    function noLocale(name) {
        return 'TermsOfUseManager: unable to load locale-specific terms for locale "' + name + '"';
    }

    // A list as a page takes it apart.
    function parts(list) {
        const copy = [];
        for (let i = 0; i < list.length; ++i) {
            copy.push(list[i]);
        }
        return copy;
    }

    function initTestCase() {
        root.recordMessages();
    }

    function init() {
        root.removeFile(platformDirectory);
        root.removeFile(vendorDirectory);
        root.removeFile(textDirectory);
    }

    function cleanup() {
        compare(root.takeMessages(), []);
    }

    function test_titleAndBody_data() {
        return [
            { tag: "lines", content: " Käyttöehdot \n\n Yksi\nKaksi\n\n",
              terms: ["Käyttöehdot", "Yksi\nKaksi"] },
            { tag: "title only", content: "Terms", terms: ["Terms", ""] },
            { tag: "empty", content: "", terms: ["", ""] },
        ];
    }

    function test_titleAndBody(data) {
        writePlatform("fi", data.content);
        const manager = createTemporaryObject(terms, test);
        compare(parts(manager.platformTermsOfUse("fi_FI")), data.terms);
    }

    function test_locale_data() {
        return [
            { tag: "exact", files: ["fi_FI.UTF-8", "fi", "fi_FI"], used: "fi_FI.UTF-8" },
            { tag: "language before country", files: ["fi", "fi_FI", "en_GB"], used: "fi" },
            { tag: "country", files: ["fi_FI", "en_GB"], used: "fi_FI" },
        ];
    }

    function test_locale(data) {
        data.files.forEach(name => writePlatform(name, name));
        const manager = createTemporaryObject(terms, test);
        compare(parts(manager.platformTermsOfUse("fi_FI.UTF-8")), [data.used, ""]);
    }

    function test_englishInPlaceOfTheLocale() {
        writePlatform("en_GB", "Terms\nBody");
        const manager = createTemporaryObject(terms, test);
        compare(parts(manager.platformTermsOfUse("de_DE")), ["Terms", "Body"]);
        compare(root.takeMessages(), [noLocale("de_DE")]);
    }

    function test_noTerms() {
        const manager = createTemporaryObject(terms, test);
        compare(manager.platformTermsOfUse("de_DE").length, 0);
        compare(root.takeMessages(), [noLocale("de_DE"), noTerms]);
        compare(manager.platformTermsOfUse("en_GB").length, 0);
        compare(root.takeMessages(), [noTerms]);
        compare(manager.vendorTermsOfUse("en_GB").length, 0);
        compare(root.takeMessages(), [noTerms]);
    }

    function test_vendorPath() {
        const manager = createTemporaryObject(terms, test);
        compare(manager.vendorPath, "");
        compare(manager.shown, false);
        manager.vendorPath = vendorDirectory;
        compare(manager.shown, false);
        root.writeFile(vendorDirectory + "/full/fi.txt", "");
        compare(manager.hasVendorTermsOfUse, true);
        // No change signal has been emitted yet.
        compare(manager.shown, false);
        manager.vendorPath = vendorDirectory;
        compare(manager.changes, 1);
        manager.vendorPath = vendorDirectory + "/full";
        compare(manager.changes, 2);
        compare(manager.shown, true);
        manager.vendorPath = "";
        compare(manager.shown, false);
    }

    function test_vendorTerms() {
        root.writeFile(vendorDirectory + "/full/fi.txt", "Ehdot\nKaikki");
        root.writeFile(vendorDirectory + "/summary/fi.txt", "Ehdot\nLyhyesti");
        const manager = createTemporaryObject(terms, test, { vendorPath: vendorDirectory });
        compare(parts(manager.vendorTermsOfUse("fi_FI")), ["Ehdot", "Kaikki"]);
        compare(parts(manager.vendorTermsSummary("fi_FI")), ["Ehdot", "Lyhyesti"]);
    }

    function test_readContent_data() {
        return [
            { tag: "lines run together", content: "a\nb", text: "ab" },
            { tag: "line breaks only", content: "\n\r\n", text: "" },
            { tag: "other languages", content: "Hyvää\n✓\n", text: "Hyvää✓" },
            { tag: "empty", content: "", text: "" },
        ];
    }

    function test_readContent(data) {
        root.writeFile(textDirectory + "/a", data.content);
        compare(TextFileReader.readContent(textDirectory + "/a"), data.text);
    }

    // A null string is an empty one to QML, neither null nor undefined: pages bind texts to it.
    function test_whatCannotBeReadIsEmpty() {
        root.writeFile(textDirectory + "/empty", "\n");
        verify(TextFileReader.readContent(textDirectory + "/missing") === "");
        verify(TextFileReader.readContent(textDirectory) === "");
        verify(TextFileReader.readContent("") === "");
        verify(TextFileReader.collate("file://" + textDirectory, ",", ":") === "");
        verify(TextFileReader.collate("file://" + textDirectory + "/missing", ",", ":") === "");
        verify(TextFileReader.collate("https://example.org" + textDirectory, ",", ":") === "");
        verify(TextFileReader.collate("", ",", ":") === "");
    }

    function test_collate() {
        root.writeFile(textDirectory + "/2", "B\n");
        root.writeFile(textDirectory + "/1", "A");
        root.writeFile(textDirectory + "/b", "lower");
        root.writeFile(textDirectory + "/C", "upper");
        root.writeFile(textDirectory + "/3", "\n");
        root.writeFile(textDirectory + "/.hidden", "hidden");
        root.writeFile(textDirectory + "/directory/4", "deeper");
        compare(TextFileReader.collate("file://" + textDirectory, ",", ":"), ":A,B,upper,lower");
        compare(TextFileReader.collate("file://" + textDirectory + "/directory", ",", ":"),
                ":deeper");
    }
}
