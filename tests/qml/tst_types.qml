// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtTest 1.15
import com.marlo.settings.system 1.0

// What QML adds to the types: conversions of values, roles in delegates, bindings, enumerations, and the
// positions of warnings. All else is tested in C++.
TestCase {
    id: test

    readonly property string actionsDirectory: "/usr/share/glimmera/quickactions"
    readonly property string widgetsDirectory: "/usr/share/glimmera/eventswidgets"
    readonly property string vendorDirectory: "/usr/share/vendor-eula"
    readonly property string textDirectory: "/usr/share/texts"
    readonly property string androidDaemon: "/usr/sbin/apkd"
    readonly property string modemFile: "/usr/share/modem-software/features.ini"

    name: "Types"

    Component {
        id: allActions
        QuickActionsModel {
            showPotential: true
        }
    }

    Component {
        id: allWidgets
        EventsWidgetsModel {}
    }

    // Shows a model as a page does, with its roles by their names.
    Component {
        id: page
        Repeater {
            function all(role) {
                return Array.from({ length: count }, (none, i) => itemAt(i)[role]);
            }
            Item {
                readonly property var title: model.title
                readonly property var icon: model.icon
                readonly property var path: model.path
                readonly property var on: model.enabled
                readonly property var description: model.description
                readonly property var available: model.available
            }
        }
    }

    Component {
        id: titlesView
        TitlesView {
            role: "title"
        }
    }

    Component {
        id: emptyList
        ListModel {}
    }

    Component {
        id: person
        QtObject {
            property string name
            property var friend: null
        }
    }

    Component {
        id: card
        MemoryCardFormatter {}
    }

    Component {
        id: location
        LocationConfiguration {
            property var heard: []
            onMlsOnlineStateChanged: heard.push("mls online " + mlsOnlineState)
            onHereStateChanged: heard.push("here " + hereState)
        }
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

    Component {
        id: terms
        TermsOfUseManager {
            readonly property bool shown: hasVendorTermsOfUse
        }
    }

    function create(component, properties) {
        return createTemporaryObject(component, test, properties || {});
    }

    // A list model numbers its roles from 0, in the order in which it first sees them, and a role
    // of number 0 cannot be matched: the other roles come after it.
    function newFruit() {
        const model = create(emptyList);
        model.append([{ number: 1, title: "Apple", color: "red", size: 2, ripe: true },
                      { number: 2, title: "Lime", color: "green", size: 1, ripe: false },
                      { number: 3, title: "Plum", color: "blue", size: 2, ripe: true },
                      { number: 4, title: "Pear", color: "green", size: 3, ripe: false }]);
        return model;
    }

    function viewOf(model, properties) {
        return create(titlesView, Object.assign({ model: model }, properties));
    }

    function newPerson(name, friend) {
        return create(person, { name: name, friend: friend || null });
    }

    function initTestCase() {
        root.recordMessages();
    }

    function init() {
        for (const path of [actionsDirectory, widgetsDirectory, vendorDirectory, textDirectory]) {
            root.removeFile(path);
        }
    }

    function cleanup() {
        compare(root.takeMessages(), []);
    }

    function test_actionsInADelegate() {
        const path = name => actionsDirectory + "/" + name + ".conf";
        root.writeFile(path("a"), "title=A\nicon=i\npriority=1\n");
        root.writeFile(path("b"), "titl=\n");
        const actions = create(allActions);
        const shown = create(page, { model: actions });
        compare(shown.all("title"), ["A", undefined]);
        compare(shown.all("icon"), ["i", undefined]);
        compare(shown.all("path"), ["a", "b"].map(path));
        compare(shown.all("on"), [false, false]);
        compare(actions.get(0), { title: "A", icon: "i", path: path("a"), enabled: false });
        compare(actions.get(1).title, undefined);
    }

    function test_warningsNameTheObjectInItsFile() {
        const actions = create(allActions);
        compare(actions.get(3), {});
        actions.triggerAction(-1);
        const messages = root.takeMessages();
        compare(messages.length, 2);
        const here = "^file:.*tst_types\\.qml:\\d+:\\d+: QML QuickActionsModel: ";
        verify(messages[0].match(here + "get\\(\\) called with invalid index: 3$"), messages[0]);
        verify(messages[1].match(here + "triggerAction\\(\\) called with invalid index: -1$"),
               messages[1]);
    }

    function test_widgetsInADelegate() {
        root.writeFile(widgetsDirectory + "/w.json", JSON.stringify({
            widgets: [{ path: "/a", title: "A", icon: "icon-a", default_enabled: true },
                      { path: "/b", available_path: "/nonexistent" }]
        }));
        const shown = create(page, { model: create(allWidgets) });
        compare(shown.all("title"), ["A", ""]);
        compare(shown.all("description"), ["", ""]);
        compare(shown.all("icon"), ["icon-a", ""]);
        compare(shown.all("path"), ["/a", "/b"]);
        compare(shown.all("on"), [true, false]);
        compare(shown.all("available"), [true, false]);
    }

    function test_aNewViewIsEmpty() {
        const view = create(titlesView, { role: "" });
        compare(view.model, null);
        compare(view.match, undefined);
        compare(view.values, []);
    }

    function test_rolesOfAListModel() {
        const model = newFruit();
        const view = viewOf(model);
        compare(view.model, model);
        compare(view.values, ["Apple", "Lime", "Plum", "Pear"]);
        view.role = "size";
        compare(view.values, ["2", "1", "2", "3"]);
        // An unknown role reads role number 0.
        view.role = "unknown";
        compare(view.values, ["1", "2", "3", "4"]);
    }

    function test_match_data() {
        const all = ["Apple", "Lime", "Plum", "Pear"];
        return [
            { tag: "text", matchRole: "color", match: "green", values: ["Lime", "Pear"] },
            { tag: "texts", matchRole: "color", match: ["red", "blue"], values: ["Apple", "Plum"] },
            { tag: "none", matchRole: "color", match: [], values: [] },
            { tag: "number", matchRole: "size", match: 2, values: ["Apple", "Plum"] },
            { tag: "fraction", matchRole: "size", match: 2.5, values: [] },
            { tag: "numbers", matchRole: "size", match: [1, 3], values: ["Lime", "Pear"] },
            { tag: "false", matchRole: "ripe", match: false, values: ["Lime", "Pear"] },
            { tag: "no role", matchRole: "", match: "green", values: all },
            { tag: "role of number 0", matchRole: "number", match: 2, values: all },
        ];
    }

    function test_match(data) {
        const view = viewOf(newFruit(), { matchRole: data.matchRole });
        view.match = data.match;
        compare(view.match, data.match);
        compare(view.values, data.values);
    }

    // A list of strings is not the array that QML makes of the same texts.
    function test_matchWithTheValuesOfAnotherView() {
        const model = newFruit();
        const colors = viewOf(model, { role: "color", matchRole: "title", match: "Lime" });
        const view = viewOf(model, { matchRole: "color", match: colors.values });
        compare(view.values, ["Lime", "Pear"]);
    }

    function test_aRolePathLeadsIntoObjects() {
        const model = create(emptyList);
        const ann = newPerson("Ann");
        model.append({ number: 1, who: ann, note: "first" });
        model.append({ number: 2, who: newPerson("Bob", ann), note: "second" });
        const view = viewOf(model, { role: "who.name" });
        compare(view.values, ["Ann", "Bob"]);
        // Ann has no friend, so the path leads to no name.
        view.role = "who.friend.name";
        compare(view.values, ["", "Ann"]);

        view.role = "note";
        view.matchRole = "who.name";
        view.match = ["Bob"];
        compare(view.values, ["second"]);
        view.matchRole = "who";
        view.match = ann;
        compare(view.values, ["first"]);
        // QML sees a destroyed object as null.
        ann.destroy();
        tryCompare(view, "match", null);
    }

    function test_otherObjectsAreNoModels_data() {
        return [
            { tag: "null", model: null, message: /^Unsupported model type QObject\(0x0\)$/ },
            { tag: "item", model: test, message: /^Unsupported model type .*TestCase/ },
        ];
    }

    function test_otherObjectsAreNoModels(data) {
        const model = newFruit();
        const view = viewOf(model);
        view.model = data.model;
        const messages = root.takeMessages();
        compare(messages.length, 1);
        verify(data.message.test(messages[0]), messages[0]);
        compare(view.model, model);
    }

    function test_joinedTakesAnArray() {
        const view = create(titlesView);
        compare(view.joined([]), "");
        compare(view.joined(["a", "", "b"]), "a, , b");
    }

    function test_supportedFormatTypesIsAnArray() {
        root.removeFile("/sbin/mkfs.vfat");
        root.writeFile("/sbin/mkfs.vfat", "");
        root.removeFile("/sbin/mkfs.ext4");
        const types = create(card).supportedFormatTypes;
        compare(types.map(type => type), []);
        compare(types.length, 0);
    }

    function test_statesAreNumbersAndConstants() {
        const page = create(location, { mlsOnlineState: 0, hereState: 0 });
        page.heard = [];
        page.mlsOnlineState = LocationConfiguration.OnlineAGpsDisabled;
        page.hereState = LocationConfiguration.OnlineAGpsEnabled;
        compare(page.heard, ["mls online 1", "here 2"]);
    }

    function test_bindingsOfConstantsAreNotUpdated_data() {
        return [
            { tag: "android", component: android, property: "dataDirectoriesVisible",
              file: androidDaemon, content: "", before: false, after: true },
            { tag: "modem", component: modem, property: "variant",
              file: modemFile, content: "variant=global\n", before: "", after: "global" },
        ];
    }

    function test_bindingsOfConstantsAreNotUpdated(data) {
        const object = create(data.component);
        compare(object.shown, data.before);
        root.writeFile(data.file, data.content);
        compare(object[data.property], data.after);
        compare(object.shown, data.before);
        compare(create(data.component).shown, data.after);
    }

    function test_vendorPathUpdatesBindings() {
        const manager = create(terms, { vendorPath: vendorDirectory });
        root.writeFile(vendorDirectory + "/full/fi.txt", "");
        compare(manager.hasVendorTermsOfUse, true);
        // No change signal has been emitted yet.
        compare(manager.shown, false);
        manager.vendorPath = vendorDirectory + "/full";
        compare(manager.shown, true);
    }

    function test_termsAreListsOfTitleAndBody() {
        root.writeFile(vendorDirectory + "/full/fi.txt", "Ehdot\nKaikki");
        const manager = create(terms, { vendorPath: vendorDirectory });
        const parts = list => list.map(part => part);
        compare(parts(manager.vendorTermsOfUse("fi_FI")), ["Ehdot", "Kaikki"]);
        compare(parts(manager.vendorTermsSummary("en_GB")), []);
        compare(root.takeMessages(), ["TermsOfUseManager: unable to load either the specified "
                                      + "locale or the English terms"]);
    }

    function test_textFiles() {
        root.writeFile(textDirectory + "/2", "B\n");
        root.writeFile(textDirectory + "/1", "Hyvää\n✓");
        compare(TextFileReader.readContent(textDirectory + "/1"), "Hyvää✓");
        // A URL may be a string.
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
