// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtTest 1.15
import com.marlo.settings.system 1.0

TestCase {
    id: test

    readonly property string directory: "/usr/share/glimmera/quickactions"
    readonly property string home: "/desktop/glimmera-marlo-home/"

    property int serial: 0

    name: "QuickActions"

    Component {
        id: enabledActions
        QuickActionsModel {}
    }

    Component {
        id: allActions
        QuickActionsModel {
            showPotential: true
        }
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
                readonly property bool on: model.enabled
            }
        }
    }

    // No other test uses the same path: the module may still see what an earlier test stored.
    function path(name) {
        return directory + "/" + name + "-" + serial + ".conf";
    }

    function add(name, content) {
        root.writeFile(path(name), content || "title=" + name + "\n");
        return path(name);
    }

    function pageOf(actions) {
        return createTemporaryObject(page, test, { model: actions });
    }

    // The module has a dconf client of its own, so what it stores arrives here later.
    function tryStored(name, value) {
        tryVerify(() => String(root.key(home + name)) === String(value));
    }

    function initTestCase() {
        root.recordMessages();
    }

    function init() {
        ++serial;
        root.removeFile(directory);
        root.installCatalog("maps_eng_en");
        root.installCatalog("maps-fi");
        root.setLocale("fi_FI");
        root.unsetKey(home + "events_screen_actions");
        root.unsetKey(home + "blocked_actions");
        root.unsetKey(home + "events_screen_actions_user");
        root.waitUntilStored();
    }

    function cleanup() {
        root.disownService();
        compare(root.takeMessages(), []);
    }

    function test_rolesByTheirNames() {
        const a = add("a", "title=maps-title\nicon=i\ntranslation-catalog=maps\n");
        const b = add("b", "title=\n");
        root.setStringList(home + "events_screen_actions", [b, a]);
        const actions = createTemporaryObject(enabledActions, test);
        tryCompare(actions, "count", 2);
        const shown = pageOf(actions);
        compare(shown.all("title"), [undefined, "Kartat"]);
        compare(shown.all("on"), [true, true]);
        compare(actions.get(0).title, undefined);
        compare(actions.get(1), { title: "Kartat", icon: "i", path: a, enabled: true });
    }

    function test_choosingOnAPage() {
        const a = add("a");
        const b = add("b");
        const actions = createTemporaryObject(allActions, test);
        const enabled = createTemporaryObject(enabledActions, test);
        const shown = pageOf(actions);
        const enabledPaths = () => Array.from({ length: enabled.count },
                                              (none, i) => enabled.get(i).path);
        compare(shown.all("on"), [false, false]);

        actions.enableAction(b);
        actions.enableAction(a);
        compare(shown.all("on"), [true, true]);
        compare(enabledPaths(), [b, a]);
        enabled.move(1, 0);
        compare(enabledPaths(), [a, b]);
        tryStored("events_screen_actions", [a, b]);

        actions.disableAction(a);
        compare(shown.all("on"), [false, true]);
        compare(enabledPaths(), [b]);
        tryStored("events_screen_actions", b);
        tryStored("events_screen_actions_user", true);
    }

    function test_showPotentialIsAProperty() {
        add("a");
        const actions = createTemporaryObject(enabledActions, test);
        let changes = 0;
        actions.countChanged.connect(() => ++changes);
        compare(actions.showPotential, false);
        compare(actions.count, 0);
        actions.showPotential = true;
        compare(actions.count, 1);
        compare(changes, 1);
    }

    function test_warningsNameTheObjectInItsFile() {
        const actions = createTemporaryObject(allActions, test);
        compare(actions.get(3), {});
        actions.triggerAction(-1);
        const messages = root.takeMessages();
        compare(messages.length, 2);
        const here = "^file:.*tst_quickactions\\.qml:\\d+:\\d+: QML QuickActionsModel: ";
        verify(messages[0].match(here + "get\\(\\) called with invalid index: 3$"), messages[0]);
        verify(messages[1].match(here + "triggerAction\\(\\) called with invalid index: -1$"),
               messages[1]);
    }

    function test_aTapSendsTheCall() {
        root.ownService("org.example.lamp");
        add("a", "remote-service=org.example.lamp\nremote-path=/lamp\n"
                 + "remote-interface=org.example.Lamp\nremote-method=toggle\n"
                 + "[remote-arguments]\nsize=2\n1\\argument=1\n2\\argument=true\n");
        createTemporaryObject(allActions, test).triggerAction(0);
        tryVerify(() => root.receivedCalls().length === 1);
        compare(root.receivedCalls()[0], { path: "/lamp", interface: "org.example.Lamp",
                                           method: "toggle", arguments: ["1", "true"] });
    }

    function test_followsPackages() {
        const actions = createTemporaryObject(allActions, test);
        compare(actions.count, 0);
        add("a");
        tryCompare(actions, "count", 1);
        root.removeFile(path("a"));
        tryCompare(actions, "count", 0);
    }

    function test_handlersMayCallBack() {
        const a = add("a");
        const b = add("b");
        const actions = createTemporaryObject(allActions, test);
        const shown = pageOf(actions);
        actions.rowsInserted.connect(() => actions.enableAction(b));
        actions.rowsRemoved.connect(() => actions.showPotential = true);
        actions.dataChanged.connect(() => actions.get(0));
        actions.countChanged.connect(() => actions.move(0, 0));
        add("c");
        tryCompare(actions, "count", 3);
        root.setStringList(home + "blocked_actions", [a]);
        tryCompare(actions, "count", 2);
        tryCompare(shown, "count", 2);
        tryStored("events_screen_actions", b);
    }
}
