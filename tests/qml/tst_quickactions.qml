// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtTest 1.15
import com.marlo.settings.system 1.0

TestCase {
    id: test

    readonly property string directory: "/usr/share/glimmera/quickactions"
    readonly property string enabledKey: "/desktop/glimmera-marlo-home/events_screen_actions"
    readonly property string call: "remote-service=org.example.lamp\nremote-path=/lamp\n"
                                   + "remote-interface=org.example.Lamp\nremote-method=toggle\n"

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
        Item {
            property alias model: repeater.model
            property alias count: repeater.count
            function rows() {
                const list = [];
                for (let i = 0; i < repeater.count; ++i) {
                    list.push(repeater.itemAt(i));
                }
                return list;
            }
            function titles() {
                return rows().map(row => row.title);
            }
            function states() {
                return rows().map(row => row.on);
            }
            Repeater {
                id: repeater
                Item {
                    readonly property var title: model.title
                    readonly property bool on: model.enabled
                }
            }
        }
    }

    // A name that no other test used: the module may yet see what that one stored.
    function path(name) {
        return directory + "/" + name + "-" + serial + ".conf";
    }

    function add(name, content) {
        root.writeFile(path(name), content || "title=" + name + "\n");
        return path(name);
    }

    // The module has a dconf client of its own, so what it stores arrives here in its time.
    function stored(key) {
        return String(root.key(key));
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
        root.unsetKey(enabledKey);
        root.unsetKey("/desktop/glimmera-marlo-home/blocked_actions");
        root.unsetKey("/desktop/glimmera-marlo-home/events_screen_actions_user");
    }

    function cleanup() {
        root.disownService();
        compare(root.takeMessages(), []);
    }

    function test_aPageShowsTheEnabledActions() {
        root.setStringList(enabledKey, [add("b"), add("a", "title=maps-title\n"
                                                           + "translation-catalog=maps\n")]);
        add("c");
        const actions = createTemporaryObject(enabledActions, test);
        const shown = createTemporaryObject(page, test, { model: actions });
        tryCompare(actions, "count", 2);
        compare(shown.titles(), ["b", "Kartat"]);
        compare(shown.states(), [true, true]);
    }

    function test_anActionWithoutTitleHasNone() {
        add("a", "title=\n");
        const actions = createTemporaryObject(allActions, test);
        const shown = createTemporaryObject(page, test, { model: actions });
        compare(shown.titles(), [undefined]);
        compare(actions.get(0).title, undefined);
    }

    function test_choosingOnAPage() {
        const a = add("a");
        const b = add("b");
        const actions = createTemporaryObject(allActions, test);
        const home = createTemporaryObject(enabledActions, test);
        const shown = createTemporaryObject(page, test, { model: actions });
        compare(shown.states(), [false, false]);

        actions.enableAction(b);
        actions.enableAction(a);
        compare(shown.states(), [true, true]);
        compare(home.count, 2);
        compare(home.get(0).path, b);
        compare(home.get(1).path, a);

        home.move(1, 0);
        compare(home.get(0).path, a);
        tryVerify(() => stored(enabledKey) === [a, b].toString());

        actions.disableAction(a);
        compare(shown.states(), [false, true]);
        compare(home.count, 1);
        tryVerify(() => stored(enabledKey) === b);
        compare(stored("/desktop/glimmera-marlo-home/events_screen_actions_user"), "true");
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

    function test_getGivesTheRolesByTheirNames() {
        const a = add("a", "title=maps-title\nicon=i\ntranslation-catalog=maps\n");
        const actions = createTemporaryObject(allActions, test);
        compare(actions.get(0), { title: "Kartat", icon: "i", path: a, enabled: false });
    }

    function test_invalidIndexesWarn() {
        const actions = createTemporaryObject(allActions, test);
        compare(actions.get(3), {});
        actions.triggerAction(-1);
        const messages = root.takeMessages();
        compare(messages.length, 2);
        verify(/QML QuickActionsModel: get\(\) called with invalid index: 3$/.test(messages[0]));
        verify(/QML QuickActionsModel: triggerAction\(\) called with invalid index: -1$/
               .test(messages[1]));
        // Where it is: the file and line of the object.
        verify(/^file:.*tst_quickactions\.qml:\d+:\d+: /.test(messages[0]), messages[0]);
    }

    function test_aTapSendsTheCall() {
        root.ownService("org.example.lamp");
        add("a", call + "[remote-arguments]\nsize=2\n1\\argument=1\n2\\argument=true\n");
        const actions = createTemporaryObject(allActions, test);
        actions.triggerAction(0);
        tryVerify(() => root.receivedCalls().length === 1);
        compare(root.receivedCalls()[0], { path: "/lamp", interface: "org.example.Lamp",
                                           method: "toggle", arguments: ["1", "true"] });
    }

    function test_aMissingServiceLeadsToTheStore() {
        root.ownService("com.marlo.marlostore");
        add("a", call + "requires-package=lamp-daemon\n");
        const actions = createTemporaryObject(allActions, test);
        actions.triggerAction(0);
        tryVerify(() => root.receivedCalls().length === 1);
        compare(root.receivedCalls()[0],
                { path: "/StoreClient", interface: "com.marlo.marlostore",
                  method: "showApp", arguments: ["lamp-daemon"] });
        const messages = root.takeMessages();
        compare(messages.length, 1);
        verify(/Failed to send dbus call to: service=org.example.lamp /.test(messages[0]));
    }

    function test_followsPackages() {
        const actions = createTemporaryObject(allActions, test);
        compare(actions.count, 0);
        add("a");
        tryCompare(actions, "count", 1);
        root.removeFile(path("a"));
        tryCompare(actions, "count", 0);
    }

    // Signals are answered in the middle of what they announce.
    function test_handlersMayCallBack() {
        const a = add("a");
        const b = add("b");
        const actions = createTemporaryObject(allActions, test);
        const shown = createTemporaryObject(page, test, { model: actions });
        actions.rowsInserted.connect(() => actions.enableAction(b));
        actions.rowsRemoved.connect(() => actions.showPotential = true);
        actions.dataChanged.connect(() => actions.get(0));
        actions.countChanged.connect(() => actions.move(0, 0));
        add("c");
        tryCompare(actions, "count", 3);
        root.setStringList("/desktop/glimmera-marlo-home/blocked_actions", [a]);
        tryCompare(actions, "count", 2);
        tryVerify(() => shown.count === 2);
        tryVerify(() => stored(enabledKey) === b);
    }
}
