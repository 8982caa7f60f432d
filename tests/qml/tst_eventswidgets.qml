// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtTest 1.15
import com.marlo.settings.system 1.0

TestCase {
    id: test

    readonly property string directory: "/usr/share/glimmera/eventswidgets"
    readonly property string features: "/usr/share/glimmera/features"
    readonly property string enabledKey: "/desktop/glimmera-marlo-home/events_screen_widgets"
    readonly property int pathRole: 258

    property int serial: 0

    name: "EventsWidgets"

    Component {
        id: allWidgets
        EventsWidgetsModel {}
    }

    // Shows a model as a page does, with its roles by their names.
    Component {
        id: page
        Item {
            property alias model: repeater.model
            property alias count: repeater.count
            function all(role) {
                const list = [];
                for (let i = 0; i < repeater.count; ++i) {
                    list.push(repeater.itemAt(i)[role]);
                }
                return list;
            }
            Repeater {
                id: repeater
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
    }

    // A name that no other test used: the module may yet see what that one stored.
    function path(name) {
        return "/usr/share/widgets/" + name + "-" + serial + ".qml";
    }

    function paths(names) {
        return names.map(path);
    }

    function file(name) {
        return directory + "/" + name + ".json";
    }

    function widget(name, more) {
        return Object.assign({ path: path(name), title: name }, more);
    }

    function add(name, widgets, catalog) {
        root.writeFile(file(name), JSON.stringify({ translation_catalog: catalog || "",
                                                    widgets: widgets }));
    }

    // The module has a dconf client of its own, so what it stores arrives here in its time, and
    // what is stored here arrives there in its.
    function stored() {
        return String(root.key(enabledKey));
    }

    function tryStored(list) {
        tryVerify(() => stored() === String(list));
    }

    function tryAll(shown, role, list) {
        tryVerify(() => JSON.stringify(shown.all(role)) === JSON.stringify(list));
    }

    function initTestCase() {
        root.recordMessages();
    }

    function init() {
        ++serial;
        root.removeFile(directory);
        root.removeFile(features);
        root.installCatalog("maps_eng_en");
        root.installCatalog("maps-fi");
        root.setLocale("fi_FI");
        root.unsetKey(enabledKey);
    }

    function cleanup() {
        compare(root.takeMessages(), []);
    }

    function test_aPageShowsTheRolesByTheirNames() {
        add("maps", [{ path: path("a"), title: "A", translation_id: "maps-title",
                       description_id: "maps-english", icon: "icon-a" },
                     { path: path("b"), title: "B", translation_id: "maps-unknown",
                       description_id: "maps-unknown" },
                     { path: path("c") }], "maps");
        const widgets = createTemporaryObject(allWidgets, test);
        const shown = createTemporaryObject(page, test, { model: widgets });
        compare(shown.all("title"), ["Kartat", "B", ""]);
        compare(shown.all("description"), ["Maps, English only", "", ""]);
        compare(shown.all("icon"), ["icon-a", "", ""]);
        compare(shown.all("path"), paths(["a", "b", "c"]));
        compare(shown.all("on"), [false, false, false]);
        compare(shown.all("available"), [true, true, true]);
    }

    function test_valuesOfAnotherTypeAreNone() {
        add("odd", [widget("a", { order: 1 }),
                    { path: path("b"), title: 1, icon: true, order: "0", default_enabled: "true",
                      available_path: 7 }]);
        const widgets = createTemporaryObject(allWidgets, test);
        const shown = createTemporaryObject(page, test, { model: widgets });
        compare(shown.all("path"), paths(["a", "b"]));
        compare(shown.all("title"), ["a", ""]);
        compare(shown.all("icon"), ["", ""]);
        compare(shown.all("on"), [false, false]);
        compare(shown.all("available"), [true, true]);
    }

    function test_withoutADirectoryThereAreNoWidgets() {
        const widgets = createTemporaryObject(allWidgets, test);
        compare(widgets.rowCount(), 0);
        add("a", [widget("a")]);
        tryVerify(() => widgets.rowCount() === 1);
    }

    function test_theFirstChoiceEnablesAllOthers() {
        add("w", [widget("a", { default_enabled: true }), widget("b"), widget("c")]);
        const widgets = createTemporaryObject(allWidgets, test);
        const shown = createTemporaryObject(page, test, { model: widgets });
        tryAll(shown, "on", [true, false, false]);
        widgets.disableWidget(path("c"));
        tryAll(shown, "on", [true, true, false]);
        tryStored(paths(["a", "b"]));
    }

    function test_theFirstChoiceMayBeToEnable() {
        add("w", [widget("a", { default_enabled: true }), widget("b")]);
        const widgets = createTemporaryObject(allWidgets, test);
        const shown = createTemporaryObject(page, test, { model: widgets });
        tryAll(shown, "on", [true, false]);
        widgets.enableWidget(path("b"));
        tryAll(shown, "on", [true, true]);
        tryStored(paths(["a", "b", "b"]));
    }

    function test_anEmptyListEnablesNothing() {
        add("w", [widget("a", { default_enabled: true }), widget("b")]);
        const widgets = createTemporaryObject(allWidgets, test);
        const shown = createTemporaryObject(page, test, { model: widgets });
        tryAll(shown, "on", [true, false]);
        root.setStringList(enabledKey, []);
        tryAll(shown, "on", [false, false]);
        widgets.enableWidget(path("b"));
        tryAll(shown, "on", [false, true]);
        tryStored(paths(["b"]));
    }

    function test_followsTheList() {
        add("w", [widget("a", { default_enabled: true }), widget("b")]);
        const widgets = createTemporaryObject(allWidgets, test);
        const shown = createTemporaryObject(page, test, { model: widgets });
        root.setStringList(enabledKey, paths(["b", "A", "elsewhere"]));
        tryAll(shown, "on", [false, true]);
        root.setStringList(enabledKey, paths(["a", "b"]));
        tryAll(shown, "on", [true, true]);
        root.unsetKey(enabledKey);
        tryAll(shown, "on", [true, false]);
    }

    function test_anEnabledWidgetIsEnabledTwiceAndDisabledOnce() {
        add("w", [widget("a"), widget("b")]);
        root.setStringList(enabledKey, paths(["a", "b"]));
        const widgets = createTemporaryObject(allWidgets, test);
        const shown = createTemporaryObject(page, test, { model: widgets });
        tryAll(shown, "on", [true, true]);
        widgets.enableWidget(path("a"));
        tryStored(paths(["a", "b", "a"]));
        compare(shown.all("on"), [true, true]);
        widgets.disableWidget(path("a"));
        tryAll(shown, "on", [false, true]);
        tryStored(paths(["b"]));
    }

    function test_twoModelsAgree() {
        add("w", [widget("a"), widget("b")]);
        root.setStringList(enabledKey, paths(["a"]));
        const settings = createTemporaryObject(allWidgets, test);
        const home = createTemporaryObject(allWidgets, test);
        const shown = createTemporaryObject(page, test, { model: home });
        const choice = createTemporaryObject(page, test, { model: settings });
        tryAll(shown, "on", [true, false]);
        tryAll(choice, "on", [true, false]);
        settings.enableWidget(path("b"));
        tryAll(shown, "on", [true, true]);
        settings.disableWidget(path("a"));
        tryAll(shown, "on", [false, true]);
        tryStored(paths(["b"]));
    }

    function test_availableIsLookedForWhenAsked() {
        const feature = features + "/clock";
        add("w", [widget("a", { available_path: feature }), widget("b")]);
        const widgets = createTemporaryObject(allWidgets, test);
        const shown = createTemporaryObject(page, test, { model: widgets });
        compare(shown.all("available"), [false, true]);

        const changes = [];
        widgets.dataChanged.connect((first, last) => changes.push([first.row, last.row]));
        root.writeFile(feature, "");
        compare(shown.all("available"), [false, true]);
        widgets.updateAvailable();
        compare(shown.all("available"), [true, true]);
        compare(changes, [[0, 0]]);
        widgets.updateAvailable();
        compare(changes.length, 1);
        root.removeFile(feature);
        widgets.updateAvailable();
        compare(shown.all("available"), [false, true]);
        compare(changes.length, 2);
    }

    function test_followsPackages() {
        add("a", [widget("a")]);
        const widgets = createTemporaryObject(allWidgets, test);
        const shown = createTemporaryObject(page, test, { model: widgets });
        compare(shown.all("title"), ["a"]);
        add("b", [widget("b"), widget("c")]);
        tryAll(shown, "title", ["a", "b", "c"]);
        add("b", [widget("b", { title: "B", icon: "icon-b" })]);
        tryAll(shown, "title", ["a", "B"]);
        compare(shown.all("icon"), ["", "icon-b"]);
        root.removeFile(file("a"));
        tryAll(shown, "title", ["B"]);
        root.writeFile(directory + "/c.txt", JSON.stringify({ widgets: [widget("c")] }));
        add("d", [widget("d")]);
        tryAll(shown, "title", ["B", "d"]);
    }

    function test_catalogsStay() {
        add("maps", [widget("a")], "maps");
        add("other", [widget("b", { translation_id: "maps-title" })]);
        const widgets = createTemporaryObject(allWidgets, test);
        root.removeFile(file("maps"));
        tryVerify(() => widgets.rowCount() === 1);
        const shown = createTemporaryObject(page, test, { model: widgets });
        compare(shown.all("title"), ["Kartat"]);
    }

    function test_widgetsTakeTheirPlaceByOrder() {
        add("w", [widget("none"), widget("seven", { order: 7 }), widget("one", { order: 1 }),
                  widget("three", { order: 3 })]);
        const widgets = createTemporaryObject(allWidgets, test);
        const shown = createTemporaryObject(page, test, { model: widgets });
        // What has no order is lower than any, and none is placed before it.
        compare(shown.all("title"), ["none", "one", "three", "seven"]);
        add("x", [widget("three-too", { order: 3 })]);
        tryAll(shown, "title", ["none", "one", "three", "three-too", "seven"]);
        add("y", [widget("last", { order: -5 })]);
        tryAll(shown, "title", ["none", "one", "three", "three-too", "seven", "last"]);
    }

    function test_aPlaceIsKept() {
        add("a", [widget("a", { order: 3 })]);
        add("b", [widget("b", { order: 5 })]);
        const widgets = createTemporaryObject(allWidgets, test);
        const shown = createTemporaryObject(page, test, { model: widgets });
        compare(shown.all("title"), ["a", "b"]);
        add("b", [widget("b", { order: 1, title: "B" })]);
        tryAll(shown, "title", ["a", "B"]);
        root.removeFile(file("b"));
        tryAll(shown, "title", ["a"]);
        add("b", [widget("b", { order: 1, title: "B" })]);
        tryAll(shown, "title", ["B", "a"]);
    }

    function test_aRepeatedPathIsOneWidget() {
        add("w", [widget("a", { title: "first" }), widget("b"), widget("a", { title: "second" })]);
        const widgets = createTemporaryObject(allWidgets, test);
        const shown = createTemporaryObject(page, test, { model: widgets });
        compare(shown.all("title"), ["second", "b"]);
    }

    function test_whatIsNoDefinitionWarns_data() {
        return [
            { tag: "array", content: "[]" },
            { tag: "text", content: "title=a" },
            { tag: "cut off", content: "{\"widgets\":[{\"path\":\"/a\"}" },
            { tag: "empty", content: "" }
        ];
    }

    function test_whatIsNoDefinitionWarns(data) {
        root.writeFile(file("bad"), data.content);
        add("good", [widget("a")]);
        const widgets = createTemporaryObject(allWidgets, test);
        compare(root.takeMessages(), ["Invalid Events Widget \"" + file("bad") + "\""]);
        compare(widgets.rowCount(), 1);
    }

    function test_entriesThatAreNoWidgetsWarn() {
        add("w", ["text", { path: "" }, { title: "without path" }, widget("a")]);
        const widgets = createTemporaryObject(allWidgets, test);
        const shown = createTemporaryObject(page, test, { model: widgets });
        const message = "Invalid widget defined in \"" + file("w") + "\"";
        compare(root.takeMessages(), [message, message, message]);
        compare(shown.all("title"), ["a"]);
    }

    // Signals are answered in the middle of what they announce.
    function test_handlersMayCallBack() {
        add("w", [widget("a")]);
        root.setStringList(enabledKey, paths(["a"]));
        const widgets = createTemporaryObject(allWidgets, test);
        const shown = createTemporaryObject(page, test, { model: widgets });
        tryAll(shown, "on", [true]);

        widgets.rowsInserted.connect((parent, first) => {
            widgets.enableWidget(widgets.data(widgets.index(first, 0), pathRole));
            widgets.directoryChanged();
        });
        widgets.rowsRemoved.connect(() => {
            widgets.disableWidget(path("a"));
            widgets.directoryChanged();
        });
        widgets.dataChanged.connect(() => {
            widgets.enabledWidgetsChanged();
            widgets.updateAvailable();
        });
        add("x", [widget("b"), widget("c")]);
        tryAll(shown, "on", [true, true, true]);
        tryStored(paths(["a", "b", "c"]));
        root.removeFile(file("w"));
        tryAll(shown, "title", ["b", "c"]);
        tryStored(paths(["b", "c"]));
        compare(shown.all("on"), [true, true]);
    }

    function test_aHandlerMayRemoveWhatIsBeingListed() {
        add("w", [widget("a")]);
        const widgets = createTemporaryObject(allWidgets, test);
        const shown = createTemporaryObject(page, test, { model: widgets });
        widgets.rowsInserted.connect(() => {
            root.removeFile(file("x"));
            widgets.directoryChanged();
        });
        let removed = 0;
        widgets.rowsRemoved.connect(() => ++removed);
        add("x", [widget("b"), widget("c")]);
        tryVerify(() => removed === 2);
        compare(shown.all("title"), ["a"]);
    }
}
