// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtTest 1.15
import com.marlo.settings.system 1.0

TestCase {
    id: test

    readonly property string file: "/usr/share/glimmera/eventswidgets/w.json"
    readonly property string enabledKey: "/desktop/glimmera-marlo-home/events_screen_widgets"

    name: "TitlesView"

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

    // The sentence as a page shows it.
    Component {
        id: enabledTitles
        Text {
            property alias model: titles.model
            text: titles.value
            TitlesView {
                id: titles
                role: "title"
                matchRole: "enabled"
                match: true
            }
        }
    }

    Component {
        id: allWidgets
        EventsWidgetsModel {}
    }

    Component {
        id: spy
        SignalSpy {}
    }

    // A list model numbers its roles from 0, in the order in which it first sees them, and a role
    // of number 0 cannot be matched: the other roles come after it.
    function newFruit() {
        const model = createTemporaryObject(emptyList, test);
        model.append([{ number: 1, title: "Apple", color: "red", size: 2, ripe: true },
                      { number: 2, title: "Lime", color: "green", size: 1, ripe: false },
                      { number: 3, title: "Plum", color: "blue", size: 2, ripe: true },
                      { number: 4, title: "Pear", color: "green", size: 3, ripe: false }]);
        return model;
    }

    function viewOf(model, properties) {
        return createTemporaryObject(titlesView, test, Object.assign({ model: model }, properties));
    }

    function spyOn(target, signalName) {
        return createTemporaryObject(spy, test, { target: target, signalName: signalName });
    }

    function newPerson(name, friend) {
        return createTemporaryObject(person, test, { name: name, friend: friend || null });
    }

    function initTestCase() {
        root.recordMessages();
    }

    function init() {
        root.setLocale("en_US");
    }

    function cleanup() {
        compare(root.takeMessages(), []);
    }

    function test_aNewViewIsEmpty() {
        const view = createTemporaryObject(titlesView, test, { role: "" });
        compare(view.model, null);
        compare(view.role, "");
        compare(view.matchRole, "");
        compare(view.match, undefined);
        compare(view.values, []);
        compare(view.value, "");
    }

    function test_aRoleOfAllRows() {
        const model = newFruit();
        const view = viewOf(model);
        compare(view.model, model);
        compare(view.values, ["Apple", "Lime", "Plum", "Pear"]);
        compare(view.value, "Apple, Lime, Plum, and Pear");
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

    function test_followsAListModel() {
        const model = newFruit();
        const view = viewOf(model, { matchRole: "ripe", match: true });
        const changes = spyOn(view, "valueChanged");
        compare(view.value, "Apple and Plum");
        model.setProperty(1, "ripe", true);
        compare(view.value, "Apple, Lime, and Plum");
        model.remove(0);
        compare(view.value, "Lime and Plum");
        model.insert(0, { number: 5, title: "Fig", color: "blue", size: 1, ripe: true });
        compare(view.value, "Fig, Lime, and Plum");
        compare(changes.count, 3);
        // The view does not show this role.
        model.setProperty(0, "size", 7);
        compare(changes.count, 3);
        // Moved rows are read when requested.
        model.move(2, 0, 1);
        view.update();
        compare(view.values, ["Plum", "Fig", "Lime"]);
        model.clear();
        compare(view.values, []);
        compare(changes.count, 5);
    }

    function test_aRolePathLeadsIntoObjects() {
        const model = createTemporaryObject(emptyList, test);
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
    }

    function test_anObjectToMatchMayBeDestroyed() {
        const ann = person.createObject(test, { name: "Ann" });
        const view = viewOf(newFruit(), { matchRole: "color", match: ann });
        compare(view.match, ann);
        const changes = spyOn(view, "matchChanged");
        ann.destroy();
        tryCompare(view, "match", null);
        compare(changes.count, 1);
        compare(view.values, []);
    }

    function test_aModelMayBeDestroyed() {
        const model = emptyList.createObject(test);
        model.append({ title: "Leek" });
        const view = viewOf(model);
        compare(view.value, "Leek");
        const changes = spyOn(view, "modelChanged");
        model.destroy();
        tryCompare(view, "model", null);
        compare(changes.count, 1);
        compare(view.value, "");
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
        const view = createTemporaryObject(titlesView, test);
        compare(view.joined([]), "");
        compare(view.joined(["a", "", "b"]), "a, , and b");
        root.setLocale("fi_FI");
        compare(view.joined(["a", "b", "c"]), "a, b ja c");
    }

    function test_aPageShowsTheEnabledWidgets() {
        const path = name => "/usr/share/widgets/titles-" + name + ".qml";
        root.writeFile(file, JSON.stringify({
            widgets: ["Clock", "Weather", "Calendar"].map(name => ({ path: path(name),
                                                                     title: name }))
        }));
        root.setStringList(enabledKey, [path("Clock"), path("Calendar")]);
        const widgets = createTemporaryObject(allWidgets, test);
        const label = createTemporaryObject(enabledTitles, test, { model: widgets });
        tryCompare(label, "text", "Clock and Calendar");
        widgets.enableWidget(path("Weather"));
        tryCompare(label, "text", "Clock, Weather, and Calendar");
        widgets.disableWidget(path("Clock"));
        tryCompare(label, "text", "Weather and Calendar");
        root.removeFile(file);
        tryCompare(label, "text", "");
    }

    function test_handlersMayCallBack() {
        const other = createTemporaryObject(emptyList, test);
        const view = viewOf(newFruit());
        view.matchRoleChanged.connect(() => view.match = true);
        view.matchChanged.connect(() => view.update());
        view.modelChanged.connect(() => view.role = "name");
        view.valueChanged.connect(() => view.model = other);
        other.append({ number: 1, name: "Leek", ripe: true });
        view.matchRole = "ripe";
        compare(view.model, other);
        compare(view.values, ["Leek"]);
    }
}
