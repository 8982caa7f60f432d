// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtTest 1.15
import com.marlo.settings.system 1.0

TestCase {
    id: test

    readonly property string directory: "/usr/share/glimmera/eventswidgets"
    readonly property string feature: "/usr/share/glimmera/features/clock"
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

    // No other test uses the same path: the module may still see what an earlier test stored.
    function path(name) {
        return "/usr/share/widgets/" + name + "-" + serial + ".qml";
    }

    function widget(name, more) {
        return Object.assign({ path: path(name), title: name }, more);
    }

    function add(name, widgets, catalog) {
        root.writeFile(directory + "/" + name + ".json",
                       JSON.stringify({ translation_catalog: catalog || "", widgets: widgets }));
    }

    function newModel() {
        return createTemporaryObject(allWidgets, test);
    }

    function pageOf(widgets) {
        return createTemporaryObject(page, test, { model: widgets });
    }

    // The module has a dconf client of its own, so what it stores arrives here later, and what is
    // stored here arrives there later.
    function tryStored(names) {
        tryVerify(() => String(root.key(enabledKey)) === String(names.map(path)));
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
        root.removeFile(feature);
        root.installCatalog("maps_eng_en");
        root.installCatalog("maps-fi");
        root.setLocale("fi_FI");
        root.unsetKey(enabledKey);
        root.waitUntilStored();
    }

    function cleanup() {
        compare(root.takeMessages(), []);
    }

    function test_rolesByTheirNames() {
        add("maps", [{ path: path("a"), title: "A", translation_id: "maps-title",
                       description_id: "maps-english", icon: "icon-a" },
                     { path: path("b"), available_path: feature }], "maps");
        const shown = pageOf(newModel());
        compare(shown.all("title"), ["Kartat", ""]);
        compare(shown.all("description"), ["Maps, English only", ""]);
        compare(shown.all("icon"), ["icon-a", ""]);
        compare(shown.all("path"), ["a", "b"].map(path));
        compare(shown.all("on"), [false, false]);
        compare(shown.all("available"), [true, false]);
    }

    function test_choosingOnTwoPages() {
        add("w", [widget("a", { default_enabled: true }), widget("b")]);
        const settings = newModel();
        const choice = pageOf(settings);
        const shown = pageOf(newModel());
        tryAll(shown, "on", [true, false]);
        // The first choice also enables and stores all other widgets.
        settings.enableWidget(path("b"));
        tryStored(["a", "b", "b"]);
        settings.disableWidget(path("a"));
        tryStored(["b", "b"]);
        tryAll(shown, "on", [false, true]);
        tryAll(choice, "on", [false, true]);
        root.setStringList(enabledKey, []);
        tryAll(shown, "on", [false, false]);
        root.unsetKey(enabledKey);
        tryAll(shown, "on", [true, false]);
    }

    function test_availableIsLookedForWhenRequested() {
        add("w", [widget("a", { available_path: feature }), widget("b")]);
        const widgets = newModel();
        const shown = pageOf(widgets);
        const changes = [];
        widgets.dataChanged.connect((first, last) => changes.push([first.row, last.row]));
        root.writeFile(feature, "");
        compare(shown.all("available"), [false, true]);
        widgets.updateAvailable();
        compare(shown.all("available"), [true, true]);
        compare(changes, [[0, 0]]);
    }

    function test_followsPackages() {
        const shown = pageOf(newModel());
        compare(shown.count, 0);
        add("a", [widget("a", { order: 2 })]);
        tryAll(shown, "title", ["a"]);
        add("b", [widget("b", { order: 3 }), widget("c", { order: 1 })]);
        tryAll(shown, "title", ["c", "a", "b"]);
        add("b", [widget("b", { title: "B", icon: "icon-b" })]);
        tryAll(shown, "title", ["a", "B"]);
        compare(shown.all("icon"), ["", "icon-b"]);
        root.removeFile(directory + "/a.json");
        tryAll(shown, "title", ["B"]);
    }

    function test_handlersMayCallBack() {
        add("w", [widget("a")]);
        root.setStringList(enabledKey, [path("a")]);
        const widgets = newModel();
        const shown = pageOf(widgets);
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
        tryStored(["a", "b", "c"]);
        root.removeFile(directory + "/w.json");
        tryAll(shown, "title", ["b", "c"]);
        tryStored(["b", "c"]);
        compare(shown.all("on"), [true, true]);
    }

    function test_aHandlerMayRemoveTheWidgetsBeingListed() {
        add("w", [widget("a")]);
        const widgets = newModel();
        const shown = pageOf(widgets);
        widgets.rowsInserted.connect(() => {
            root.removeFile(directory + "/x.json");
            widgets.directoryChanged();
        });
        let removed = 0;
        widgets.rowsRemoved.connect(() => ++removed);
        add("x", [widget("b"), widget("c")]);
        tryVerify(() => removed === 2);
        compare(shown.all("title"), ["a"]);
    }
}
