// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtTest 1.15
import com.marlo.settings.system 1.0

TestCase {
    id: test

    readonly property string directory: "/usr/share/glimmera/eventswidgets"
    readonly property string enabledKey: "/desktop/glimmera-marlo-home/events_screen_widgets"

    property int serial: 0

    name: "TitlesView"

    Component {
        id: titlesView
        TitlesView {}
    }

    TitlesView {
        id: noListModel
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

    // The sentence as a page says it.
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

    // A list model numbers its roles from 0, in the order in which it meets them, and by the role of
    // that number there is no matching: the others come behind it.
    function fill(model) {
        model.append([{ number: 1, title: "Apple", color: "red", size: 2, ripe: true },
                      { number: 2, title: "Lime", color: "green", size: 1, ripe: false },
                      { number: 3, title: "Plum", color: "blue", size: 2, ripe: true },
                      { number: 4, title: "Pear", color: "green", size: 3, ripe: false }]);
        return model;
    }

    function newFruit() {
        return fill(createTemporaryObject(emptyList, test));
    }

    function viewOf(model, properties) {
        return createTemporaryObject(titlesView, test,
                                     Object.assign({ model: model, role: "title" }, properties));
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
        ++serial;
        root.removeFile(directory);
        root.unsetKey(enabledKey);
        root.setLocale("en_US");
    }

    function cleanup() {
        compare(root.takeMessages(), []);
    }

    function test_aNewViewIsEmpty() {
        const view = createTemporaryObject(titlesView, test);
        compare(view.model, null);
        compare(view.role, "");
        compare(view.matchRole, "");
        compare(view.match, undefined);
        compare(view.values, []);
        compare(view.value, "");
        view.role = "title";
        compare(view.values, []);
    }

    function test_aRoleOfAllRows() {
        const model = newFruit();
        const view = viewOf(model);
        compare(view.model, model);
        compare(view.values, ["Apple", "Lime", "Plum", "Pear"]);
        compare(view.value, "Apple, Lime, Plum, and Pear");
        view.role = "size";
        compare(view.values, ["2", "1", "2", "3"]);
        view.role = "";
        compare(view.values, []);
        compare(view.value, "");
        // Read as the role of number 0.
        view.role = "unknown";
        compare(view.values, ["1", "2", "3", "4"]);
    }

    function test_match_data() {
        return [
            { tag: "text", matchRole: "color", match: "green", values: ["Lime", "Pear"] },
            { tag: "text in another case", matchRole: "color", match: "Green", values: [] },
            { tag: "texts", matchRole: "color", match: ["red", "blue"], values: ["Apple", "Plum"] },
            { tag: "one of the texts", matchRole: "color", match: ["red"], values: ["Apple"] },
            { tag: "none", matchRole: "color", match: [], values: [] },
            { tag: "number", matchRole: "size", match: 2, values: ["Apple", "Plum"] },
            { tag: "fraction", matchRole: "size", match: 2.5, values: [] },
            { tag: "numbers", matchRole: "size", match: [1, 3], values: ["Lime", "Pear"] },
            { tag: "true", matchRole: "ripe", match: true, values: ["Apple", "Plum"] },
            { tag: "false", matchRole: "ripe", match: false, values: ["Lime", "Pear"] },
            { tag: "no role", matchRole: "", match: "green",
              values: ["Apple", "Lime", "Plum", "Pear"] },
            { tag: "unknown role", matchRole: "taste", match: "green",
              values: ["Apple", "Lime", "Plum", "Pear"] },
            { tag: "role of number 0", matchRole: "number", match: 2,
              values: ["Apple", "Lime", "Plum", "Pear"] }
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
        colors.match = ["Apple", "Plum"];
        view.match = colors.values;
        compare(view.values, ["Apple", "Plum"]);
    }

    function test_followsTheModel() {
        const model = newFruit();
        const view = viewOf(model, { matchRole: "ripe", match: true });
        const changes = spyOn(view, "valueChanged");
        compare(view.value, "Apple and Plum");
        model.setProperty(1, "ripe", true);
        compare(view.value, "Apple, Lime, and Plum");
        compare(changes.count, 1);
        model.remove(0);
        compare(view.value, "Lime and Plum");
        model.insert(0, { number: 5, title: "Fig", color: "blue", size: 1, ripe: true });
        compare(view.value, "Fig, Lime, and Plum");
        compare(changes.count, 3);
        // Nothing that is shown.
        model.setProperty(0, "size", 7);
        model.append({ number: 6, title: "Sloe", color: "blue", size: 1, ripe: false });
        compare(changes.count, 3);
        model.clear();
        compare(view.values, []);
        compare(view.value, "");
        compare(changes.count, 4);
    }

    function test_rowsThatMoveAreReadWhenAsked() {
        const model = newFruit();
        const view = viewOf(model, { matchRole: "ripe", match: true });
        model.move(2, 0, 1);
        compare(view.values, ["Apple", "Plum"]);
        view.update();
        compare(view.values, ["Plum", "Apple"]);
    }

    function test_signals() {
        const model = newFruit();
        const view = createTemporaryObject(titlesView, test);
        const spies = ["modelChanged", "matchRoleChanged", "matchChanged", "roleChanged",
                       "valueChanged"].map(name => spyOn(view, name));
        const counts = () => spies.map(each => each.count);
        view.model = model;
        compare(counts(), [1, 0, 0, 0, 0]);
        view.role = "title";
        compare(counts(), [1, 0, 0, 1, 1]);
        view.matchRole = "color";
        view.match = ["green"];
        // Nothing matches what is not set yet, then two rows do.
        compare(counts(), [1, 1, 1, 1, 3]);
        view.model = model;
        view.role = "title";
        view.matchRole = "color";
        view.match = ["green"];
        compare(counts(), [1, 1, 1, 1, 3]);
    }

    function test_anEmptyModel() {
        const view = viewOf(createTemporaryObject(emptyList, test));
        compare(view.values, []);
        compare(view.value, "");
    }

    function test_anotherModel() {
        const first = newFruit();
        const second = createTemporaryObject(emptyList, test);
        const view = viewOf(first);
        view.model = second;
        compare(view.values, []);
        const changes = spyOn(view, "valueChanged");
        first.remove(0);
        compare(changes.count, 0);
        second.append({ title: "Leek" });
        compare(view.value, "Leek");
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
        view.role = "who.age";
        compare(view.values, ["", ""]);
        // Steps from what is no object are left out, and so are empty ones.
        view.role = "note.name";
        compare(view.values, ["first", "second"]);
        view.role = ".who..name.length.";
        compare(view.values, ["Ann", "Bob"]);

        view.role = "note";
        view.matchRole = "who.name";
        view.match = "Bob";
        compare(view.values, ["second"]);
        view.match = ["Ann", "Bob"];
        compare(view.values, ["first", "second"]);
        view.matchRole = "who";
        view.match = ann;
        compare(view.values, ["first"]);
    }

    function test_anObjectToMatchMayGo() {
        const model = newFruit();
        const ann = person.createObject(test, { name: "Ann" });
        const view = viewOf(model, { matchRole: "color", match: ann });
        compare(view.match, ann);
        const changes = spyOn(view, "matchChanged");
        ann.destroy();
        tryCompare(view, "match", null);
        compare(changes.count, 1);
        compare(view.values, []);
    }

    function test_whatIsNoListModelIsRejected_data() {
        return [
            { tag: "null", model: null, type: /QObject\(0x0\)$/ },
            { tag: "item", model: test, type: /TestCase/ },
            { tag: "view", model: noListModel, type: /TitlesView/ }
        ];
    }

    function test_whatIsNoListModelIsRejected(data) {
        const model = newFruit();
        const view = viewOf(model);
        const changes = spyOn(view, "modelChanged");
        view.model = data.model;
        const messages = root.takeMessages();
        compare(messages.length, 1);
        verify(/^Unsupported model type /.test(messages[0]), messages[0]);
        verify(data.type.test(messages[0]), messages[0]);
        compare(view.model, model);
        compare(changes.count, 0);
        model.remove(0, 3);
        compare(view.values, ["Pear"]);
    }

    function test_aModelMayGo() {
        const model = fill(emptyList.createObject(test));
        const view = viewOf(model);
        const changes = spyOn(view, "modelChanged");
        model.destroy();
        tryCompare(view, "model", null);
        compare(changes.count, 1);
        compare(view.values, []);
        compare(view.value, "");
        view.model = newFruit();
        compare(view.values.length, 4);
    }

    function test_theLanguageIsThatOfTheReading() {
        const view = viewOf(newFruit());
        const changes = spyOn(view, "valueChanged");
        compare(view.value, "Apple, Lime, Plum, and Pear");
        root.setLocale("fi_FI");
        compare(view.value, "Apple, Lime, Plum ja Pear");
        root.setLocale("de_DE");
        compare(view.value, "Apple, Lime, Plum und Pear");
        compare(changes.count, 0);
    }

    function test_joined() {
        const view = createTemporaryObject(titlesView, test);
        compare(view.joined([]), "");
        compare(view.joined(["a"]), "a");
        compare(view.joined(["a", "b"]), "a and b");
        compare(view.joined(["a", "", "b"]), "a, , and b");
        root.setLocale("fi_FI");
        compare(view.joined(["a", "b", "c"]), "a, b ja c");
        compare(view.values, []);
    }

    function test_aPageSaysWhatIsEnabled() {
        // Names that no other test used: the module may yet see what that one stored.
        const path = name => "/usr/share/widgets/titles-" + name + "-" + serial + ".qml";
        root.writeFile(directory + "/w.json", JSON.stringify({
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
        tryVerify(() => String(root.key(enabledKey))
                        === [path("Calendar"), path("Weather")].toString());
        root.removeFile(directory + "/w.json");
        tryCompare(label, "text", "");
    }

    // Signals are answered in the middle of what they announce.
    function test_handlersMayCallBack() {
        const model = newFruit();
        const other = createTemporaryObject(emptyList, test);
        const view = viewOf(model);
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
