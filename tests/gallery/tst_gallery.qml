// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtTest 1.15
import com.marlo.settings.system 1.0
import gallery.simulation 1.0
import "../../gallery"
import "../../gallery/screen.js" as Screen

// Drives every page of the gallery with the pointer and the keys, and looks at the screen for the
// results.
TestCase {
    id: test

    readonly property int patience: 20000
    readonly property var pages: pageList.list.map(page => page.name)
    property var gallery: null
    readonly property var surface: gallery ? gallery.surface : null
    readonly property string enabledActions: "/desktop/glimmera-marlo-home/events_screen_actions"

    name: "Gallery"

    Pages {
        id: pageList
    }

    Component {
        id: galleryComponent
        Gallery {}
    }

    function initTestCase() {
        root.recordMessages();
    }

    function init() {
        gallery = createTemporaryObject(galleryComponent, null);
        verify(gallery);
        Messages.clear();
        gallery.requestActivate();
        tryCompare(gallery, "active", true);
    }

    function cleanup() {
        Simulation.language = "en";
        Simulation.cover = Simulation.NoCover;
        gallery.destroy();
        gallery = null;
        wait(0);
        compare(root.takeMessages(), []);
    }

    // Like tryVerify(), but with pauses shorter than 50 ms.
    function until(condition, otherwise) {
        const end = Date.now() + patience;
        while (!condition()) {
            verify(Date.now() < end, typeof otherwise === "function" ? otherwise() : otherwise);
            wait(10);
        }
    }

    // The place on the screen where a finger would touch an item.
    function place(item) {
        const part = Screen.seenPart(surface, item);
        return part.width > 4 && part.height > 4
            ? { x: part.x + part.width / 2, y: part.y + part.height / 2 } : null;
    }

    // A moving item cannot be hit.
    function waitUntilStill(item) {
        let before = null;
        until(() => {
            const now = item.mapToItem(surface, 0, 0);
            const still = before !== null && before.x === now.x && before.y === now.y
                          && !gallery.currentPage.scrolling;
            before = now;
            return still;
        }, "does not stand still: " + item.text);
    }

    // Scrolls with the page keys until an item can be touched.
    function scrollTo(item) {
        const page = gallery.currentPage;
        const inPage = () => Screen.seenPart(surface, item).height >= Math.min(item.height, 40);
        waitUntilStill(item);
        for (let i = 0; i < 50 && !inPage(); ++i) {
            const step = page.mapFromItem(item, 0, item.height).y > page.height ? 1 : -1;
            page.forceActiveFocus();
            keyClick(step > 0 ? Qt.Key_PageDown : Qt.Key_PageUp);
            waitUntilStill(item);
        }
        verify(inPage(), "cannot be scrolled to: " + item.text);
    }

    function findControl(text) {
        until(() => Screen.control(surface, text), "no control " + text);
        return Screen.control(surface, text);
    }

    function tap(text) {
        tapItem(findControl(text));
    }

    function tapItem(item) {
        until(() => item.enabled, "not enabled: " + item.text);
        if (!Screen.inPopup(surface, item)) {
            scrollTo(item);
        }
        waitUntilStill(item);
        until(() => place(item), "not to be seen: " + item.text);
        const at = place(item);
        mouseClick(surface, at.x, at.y);
    }

    function shows(text) {
        return count(text) > 0;
    }

    function count(text) {
        return Screen.texts(surface).filter(item => item.text === text).length;
    }

    function see(text) {
        until(() => shows(text), "not on the screen: " + text);
        const item = Screen.texts(surface).find(item => item.text === text);
        if (!Screen.inPopup(surface, item)) {
            scrollTo(item);
        }
    }

    function seeNot(text) {
        until(() => !shows(text), "still on the screen: " + text);
    }

    function seeSwitch(text, checked) {
        tryCompare(findControl(text), "checked", checked, patience);
    }

    // Opens a page from the start page.
    function openPage(name) {
        const page = gallery.pages.find(page => page.name === name);
        tap(page.title);
        see(page.title);
        until(() => gallery.currentPage.page !== undefined);
    }

    function goBack() {
        mouseClick(surface, 20, 20);
        see("Settings gallery");
    }

    // Expects messages that contain these texts. The log of the gallery has them, too.
    function expectMessages(parts) {
        const messages = [];
        until(() => {
            root.takeMessages().forEach(message => messages.push(message));
            return messages.length >= parts.length;
        }, "no message");
        compare(messages.length, parts.length, messages.join("\n"));
        parts.forEach((part, i) => verify(messages[i].includes(part), messages[i]));
        const latest = messages[messages.length - 1];
        tryCompare(Messages, "latest", latest);
        see(latest.replace(/^file:\S+ /, ""));
    }

    function test_startPageListsEachPage() {
        gallery.pages.forEach(page => {
            see(page.title);
            see(page.type);
            verify(/^[A-Z].*\.$/.test(page.about), page.about);
            see(page.about);
        });
    }

    function test_everyPageFitsEveryScreen_data() {
        return ["start"].concat(pages).map(name => ({ tag: name }));
    }

    function test_everyPageFitsEveryScreen(data) {
        if (data.tag !== "start") {
            gallery.openPage(data.tag);
        }
        compare(root.takeMessages(), []);
        for (const [width, height] of [[360, 640], [640, 360], [800, 600], [1280, 800], [1920, 1080]]) {
            for (const language of ["fi", "en"]) {
                Simulation.language = language;
                gallery.width = width;
                gallery.height = height;
                until(() => Screen.flaw(surface) === "", () => Screen.flaw(surface));
                compare(Screen.untranslated(surface), "");
                verify(gallery.currentPage.height >= 200, "the page has no room");
            }
        }
        // Some terms are not available in every language.
        compare(root.takeMessages().filter(text => !/^(No agreement|TermsOfUseManager)/.test(text)), []);
    }

    function test_keysScrollAndToggle() {
        gallery.openPage("titles");
        const page = gallery.currentPage;
        keyClick(Qt.Key_PageDown);
        until(() => page.scrollY > 100);
        keyClick(Qt.Key_PageUp);
        tryCompare(page, "scrollY", 0);
        keyClick(Qt.Key_Down);
        until(() => page.scrollY > 0);

        seeSwitch("Weather", true);
        findControl("Weather").forceActiveFocus(Qt.TabFocusReason);
        keyClick(Qt.Key_Space);
        seeSwitch("Weather", false);
        keyClick(Qt.Key_Return);
        seeSwitch("Weather", true);
    }

    function focusOn(text) {
        findControl(text).forceActiveFocus(Qt.TabFocusReason);
    }

    function test_language() {
        openPage("location");
        const button = text => Screen.visibleItems(surface).find(item => item.text === text);
        tapItem(button("EN"));
        tap("Suomi");
        see("Sijainti");
        tapItem(button("FI"));
        tap("English");
        see("Location");

        // By keys, too.
        button("EN").forceActiveFocus(Qt.TabFocusReason);
        keyClick(Qt.Key_Return);
        see("Suomi");
        keyClick(Qt.Key_Down);
        keyClick(Qt.Key_Down);
        keyClick(Qt.Key_Return);
        see("Sijainti");
        // HERE and MLS have no terms in Finnish.
        root.takeMessages();
    }

    // The keys do not reach the page behind a question.
    function test_questionsTakeTheKeys() {
        gallery.openPage("memory-card");
        waitForCard();
        focusOn("Format as ext4");
        keyClick(Qt.Key_Space);
        see("Erase the card?");
        tryVerify(() => gallery.activeFocusItem.text === "Cancel");
        const reached = new Set();
        [Qt.Key_Tab, Qt.Key_Tab, Qt.Key_Tab, Qt.Key_Backtab, Qt.Key_Backtab].forEach(key => {
            keyClick(key);
            reached.add(gallery.activeFocusItem.text);
        });
        compare(Array.from(reached).sort(), ["Cancel", "Erase"]);
        keyClick(Qt.Key_Escape);
        seeNot("Erase the card?");
        compare(gallery.currentPage.title, "Memory card");

        focusOn("Format as ext4");
        keyClick(Qt.Key_Return);
        see("Erase the card?");
        tryVerify(() => gallery.activeFocusItem.text === "Cancel");
        keyClick(Qt.Key_Return);
        seeNot("Erase the card?");
        see("1. Detecting the file system");
        see("Ready");

        // The card is not mounted.
        focusOn("Format as ext4");
        keyClick(Qt.Key_Space);
        see("Erase the card?");
        tryVerify(() => gallery.activeFocusItem.text === "Cancel");
        keyClick(Qt.Key_Tab);
        keyClick(Qt.Key_Space);
        see("1. Unmounting: the card is not mounted");
        expectMessages(["NotMounted"]);
    }

    function test_wheelAndTouchScrollAPage() {
        const page = gallery.currentPage;
        mouseWheel(page, page.width / 2, page.height / 2, 0, -120);
        until(() => page.scrollY > 10);
        page.scrollTo(0);
        const touch = touchEvent(page);
        touch.press(0, page, 100, 400).commit();
        for (let y = 380; y >= 100; y -= 20) {
            touch.move(0, page, 100, y).commit();
        }
        touch.release(0, page, 100, 100).commit();
        until(() => page.scrollY > 50);
    }

    function test_quickActions() {
        openPage("quick-actions");
        see("Nothing yet: tap an action.");
        tap("Take a photo");
        see("showViewfinder()");
        see("com.marlo.camera");
        tap("Torch");
        see("toggle()");
        // No service has this name, so the model calls the store.
        tap("Navigate home");
        see("showApp(\"marlo-maps\")");
        see("com.marlo.marlostore");
        expectMessages(["ServiceUnknown"]);

        // The log opens, and can be cleared.
        see("▴ Log: 1");
        tap("Log: 1");
        see("▾ Log: 1");
        see(Messages.latest);
        tap("Clear");
        see("▾ Log: 0");
        tap("Log: 0");
        see("▴ Log: 0");

        tap("Services answer with an error");
        tap("Take a photo");
        expectMessages(["com.marlo.camera"]);
        tap("Services answer with an error");

        tap("Quick actions are installed");
        see("No quick action is enabled.");
        seeNot("Take a photo");
        tap("Quick actions are installed");
        see("Take a photo");
    }

    function actionPath(name) {
        return "/usr/share/glimmera/quickactions/%1.conf".arg(name);
    }

    function rowsOf(list) {
        return Screen.visibleItems(list.contentItem)
                     .filter(item => typeof item.clicked === "function" && item.text)
                     .sort((a, b) => a.y - b.y).map(item => item.text);
    }

    // The list that the user orders, and its rows.
    function orderedList() {
        return Screen.visibleItems(surface).find(item => item.rowHeight);
    }

    function seeRows(titles) {
        until(() => rowsOf(orderedList()).join() === titles, () => rowsOf(orderedList()).join());
    }

    // Presses a button of a row with a key.
    function press(name, key) {
        Screen.visibleItems(orderedList()).find(item => item.Accessible.name === name)
              .forceActiveFocus(Qt.TabFocusReason);
        keyClick(key);
    }

    function test_quickActionsSettings() {
        openPage("quick-actions-settings");
        see("Take a photo");
        const list = orderedList();
        const before = "Take a photo,Torch,Navigate home,New alarm";
        seeRows(before);

        // Drags a row by its handle from the first place to the third.
        const x = list.width - list.rowHeight / 2;
        mousePress(list, x, list.rowHeight * 0.5);
        for (let y = list.rowHeight * 0.5; y <= list.rowHeight * 2.5; y += 8) {
            mouseMove(list, x, y, -1, Qt.LeftButton);
        }
        mouseRelease(list, x, list.rowHeight * 2.5);
        seeRows("Torch,Navigate home,Take a photo,New alarm");
        until(() => root.key(enabledActions)[2] === actionPath("camera"), "kept");

        // Moves it back with keys.
        Screen.visibleItems(list.contentItem).find(item => item.text === "Take a photo"
                                                           && item.forceActiveFocus)
              .forceActiveFocus(Qt.TabFocusReason);
        keyClick(Qt.Key_Up, Qt.ControlModifier);
        seeRows("Torch,Take a photo,Navigate home,New alarm");
        keyClick(Qt.Key_Up, Qt.ControlModifier);
        seeRows(before);

        // The buttons of a row move along with it, and the row keeps the focus at the end of the list.
        press("Move up: Torch", Qt.Key_Return);
        seeRows("Torch,Take a photo,Navigate home,New alarm");
        tryVerify(() => gallery.activeFocusItem.text === "Torch");
        press("Move down: Torch", Qt.Key_Space);
        seeRows(before);
        tryVerify(() => gallery.activeFocusItem.Accessible.name === "Move down: Torch");

        seeSwitch("New note", false);
        tap("New note");
        seeRows(before + ",New note");
        seeSwitch("New note", true);
        tapItem(Screen.visibleItems(surface).reverse().find(
            item => item.text === "New note" && item.checkable));
        seeRows(before);

        // An action without a title is shown with the name of its file.
        tap("An empty definition file is there");
        see("empty.conf");
        tap("An empty definition file is there");
        seeNot("empty.conf");
        tap("Quick actions are installed");
        see("No quick action is installed.");
        see("No quick action is enabled.");
        tap("Quick actions are installed");
        see("Take a photo");
    }

    Component {
        id: actionFile
        SimulatedFiles {}
    }

    Component {
        id: otherActions
        QuickActionsModel {}
    }

    // The rows are what the user ordered, although the list has an action that is not installed, and
    // although another model has changed the order.
    function test_orderWhileTheListDiffers() {
        const torch = createTemporaryObject(actionFile, test, { path: actionPath("torch") });
        const other = createTemporaryObject(otherActions, test);
        const stored = () => root.key(enabledActions).map(path => path.replace(/^.*\/|\.conf$/g, "")).join();
        const before = stored();
        openPage("quick-actions-settings");
        see("Take a photo");
        torch.present = false;
        seeRows("Take a photo,Navigate home,New alarm");
        press("Move up: Navigate home", Qt.Key_Return);
        seeRows("Navigate home,Take a photo,New alarm");
        until(() => stored() === "torch,navigate-home,camera,new-alarm", stored);
        torch.present = true;
        seeRows("Torch,Navigate home,Take a photo,New alarm");

        tryCompare(other, "count", 4);
        other.move(3, 0);
        until(() => /^new-alarm/.test(stored()), stored);
        press("Move up: Take a photo", Qt.Key_Return);
        seeRows("Torch,Take a photo,Navigate home,New alarm");
        until(() => stored() === "torch,camera,navigate-home,new-alarm", stored);
        press("Move up: Take a photo", Qt.Key_Return);
        until(() => stored() === before, stored);
    }

    function test_eventsWidgets() {
        openPage("events-widgets");
        see("Not available on this device");
        tap("Step counter");
        see("Not available on this device");
        tap("Check what is available");
        seeNot("Not available on this device");
        tap("Step counter");
        tap("Check what is available");
        see("Not available on this device");

        // The widgets themselves are below the switches.
        see("Lunch with Aino");
        seeNot("6400 of 10000 steps");
        seeNot("Aino turns 30 on Sunday.");
        seeSwitch("Birthdays", false);
        tap("Weather");
        seeSwitch("Weather", false);
        seeSwitch("Birthdays", true);
        see("Aino turns 30 on Sunday.");
        seeNot("4 °C");
        tap("Weather");
        seeSwitch("Weather", true);

        tap("A broken definition file is there");
        expectMessages(["Invalid Events Widget"]);
        tap("A broken definition file is there");
        tap("Widgets are installed");
        see("No widget is installed.");
        see("No widget is enabled and available.");
        seeNot("Weather");
        tap("Widgets are installed");
        see("Weather");
        root.takeMessages();
    }

    function test_titles() {
        openPage("titles");
        see("Take a photo, Torch, Navigate home and New alarm");
        tap("Torch");
        see("Take a photo, Navigate home and New alarm");
        tap("Torch");
        see("Take a photo, Torch, Navigate home and New alarm");
        tap("Quick actions are installed");
        see("None is enabled.");
        tap("Quick actions are installed");
        see("Take a photo, Navigate home, New alarm and Torch");
    }

    function waitForCard() {
        tryCompare(SimulatedCard, "ready", true, patience);
        until(() => Screen.control(surface, "Mount").enabled && shows("Ready"));
    }

    function test_memoryCard() {
        openPage("memory-card");
        see(SimulatedCard.real ? "A real card: %1, an ext4 file system in memory, and the real disk "
                              .arg(SimulatedCard.name) + "service"
                            : "The card and the disk service are simulated. Unmounting the card "
                              + "removes its files.");
        waitForCard();
        until(() => shows("ext4") || shows("vfat"), "probed");

        tap("Mount");
        tryCompare(SimulatedCard, "mounted", true, patience);
        see("The card is mounted. Files and directories at its top: " + SimulatedCard.fileCount);
        see("Ready");
        tap("Put files on the card");
        until(() => SimulatedCard.fileCount >= 2, "filled");
        tap("Mount");
        see("1. Mounting: the card was already mounted");
        see("2. Detecting the file system");
        see("Ready");
        expectMessages(["AlreadyMounted"]);

        // The page asks first. Cancel keeps the files.
        const files = SimulatedCard.fileCount;
        tap("Remove all files");
        see("Remove all files?");
        const cancel = findControl("Cancel");
        // "No" comes first, and a thumb does not hit both.
        until(() => findControl("Remove").mapToItem(cancel, 0, 0).x >= cancel.width + 8, "order");
        tap("Cancel");
        seeNot("Remove all files?");
        compare(SimulatedCard.fileCount, files);
        tap("Remove all files");
        tap("Remove");
        tryCompare(SimulatedCard, "fileCount", 0, patience);
        see("2. Removing files");
        see("Ready");
        expectMessages(["AlreadyMounted"]);

        tap("A program has a file on it open");
        tap("Unmount");
        see("1. Unmounting: the card is in use. Close what uses it, and try again.");
        expectMessages(["DeviceBusy"]);
        tap("A program has a file on it open");

        tap("The helper program takes its time");
        tap("Format as ext4");
        see("Everything on the card will be lost. It will have an empty ext4 file system.");
        tap("Erase");
        see("2. Formatting");
        verify(Screen.visibleItems(surface).some(item => item.visualPosition > 0
                                                         && item.to === 4));
        compare(Screen.control(surface, "Mount").enabled, false);
        tap("The helper program takes its time");
        see("4. Detecting the file system");
        see("Ready");
        see("ext4");
        tap("Unmount");
        see("The card is not mounted.");
        see("Ready");

        tap("Format as ext4");
        tap("Erase");
        see("Failed");
        see("1. Unmounting: the card is not mounted");
        expectMessages(["NotMounted"]);

        tap("Forbids everything");
        tap("Mount");
        see("1. Mounting: not allowed");
        // Nothing has changed on the card.
        see("ext4");
        expectMessages(["NotAuthorized"]);
        tap("Is not there");
        // The page also shows the second failure.
        for (let i = 0; i < 2; ++i) {
            tap("Mount");
            see("1. Mounting: the disk service is missing or gave no valid answer");
            expectMessages(["ServiceUnknown"]);
        }
        tap("Does not answer");
        tap("Mount");
        see("Waiting for the disk service");
        compare(Screen.control(surface, "Unmount").enabled, false);
        tap("Works");
        expectMessages(["DBus.Error."]);
        tryCompare(SimulatedCard, "ready", true, patience);
        tap("Mount");
        tryCompare(SimulatedCard, "mounted", true, patience);
        tap("Unmount");
        tryCompare(SimulatedCard, "mounted", false, patience);
        waitForCard();

        tap("The helper program is installed");
        tap("Open the page again");
        see("1. Detecting the file system: the helper program is missing");
        expectMessages(["Cannot start \"/usr/libexec/sdcardhelper\""]);
        see("Unknown");
        tap("The helper program is installed");
        tap("The card is inserted");
        see("No card is inserted.");
        tap("The card is inserted");
        waitForCard();
        until(() => shows("ext4"), "probed again");
    }

    function test_location() {
        openPage("location");
        seeSwitch("Satellite positioning (GPS)", false);
        tap("Satellite positioning (GPS)");
        seeSwitch("Satellite positioning (GPS)", true);
        tap("Network positioning (MLS)");
        seeSwitch("Network positioning (MLS)", true);
        compare(findControl("MLS online assistance").enabled, false);

        // The first tap agrees to the terms of MLS.
        tap("I agree");
        tap("I agree");
        until(() => shows("Withdraw consent") && !shows("I agree"), "agreed");
        seeNot("An online service can be switched once its terms are agreed to.");
        seeSwitch("MLS online assistance", true);
        tap("MLS online assistance");
        seeSwitch("MLS online assistance", false);

        tap("Save");
        tap("Satellite positioning (GPS)");
        tap("MLS online assistance");
        seeSwitch("MLS online assistance", true);
        tap("Restore");
        seeSwitch("Satellite positioning (GPS)", true);
        seeSwitch("MLS online assistance", false);
        tap("Use custom settings");
        seeSwitch("Use custom settings", true);

        tap("The terms of MLS are installed");
        tap("Open the page again");
        see("The terms of this service could not be found.");
        expectMessages(["No agreement found"]);
        // Consent can be withdrawn without the terms, too.
        compare(count("Withdraw consent"), 2);
        tapItem(Screen.visibleItems(surface).find(item => item.text === "Withdraw consent"
                                                          && typeof item.clicked === "function"));
        until(() => count("Withdraw consent") === 1, "withdrawn");
        compare(findControl("MLS online assistance").enabled, false);
        until(() => !root.key("/settings/location/mls_online_state"), "stored");
        tap("The terms of MLS are installed");
        tap("Open the page again");
        seeNot("The terms of this service could not be found.");
        see("I agree");
        tap("Withdraw consent");
        until(() => count("I agree") === 2, "both withdrawn");
        compare(findControl("HERE positioning").enabled, false);
        seeSwitch("Use custom settings", true);
    }

    function test_cover() {
        openPage("cover");
        see("None");
        tap("A cover, while recognition is not ready");
        see("MARLO-COVER-07");
        see("Not ready yet");
        tap("A cover");
        see("Ready");
        tap("Nothing answers");
        tap("Open the page again");
        until(() => count("Unknown") === 2, "unknown");
        // The service starts while the page is open.
        tap("A cover");
        see("MARLO-COVER-07");
        see("Ready");
        tap("No cover");
        see("None");
    }

    function test_pagesShowWhatIsInstalled_data() {
        return [
            { tag: "bluetooth", switches: ["The platform has an address file"],
              shown: "00:1a:7d:da:71:13", missing: "Unknown", messages: ["Unable to open file"] },
            { tag: "android", switches: ["Android support is installed"],
              shown: "Shown: Android support is installed", missing: "Hidden: no Android support" },
            { tag: "modem", switches: ["The modem software is installed"], missing: "Unknown" },
            { tag: "terms", switches: ["The vendor has terms", "The platform has terms"],
              shown: "Platform terms of use", missing: "No terms", messages: ["unable to load"] },
            { tag: "text-files", switches: ["The file is there", "The directory is there"],
              missing: "Nothing to read.", times: 2 },
        ];
    }

    function test_pagesShowWhatIsInstalled(data) {
        const seeInstalled = () => {
            seeNot(data.missing);
            if (data.shown) {
                see(data.shown);
            }
        };
        openPage(data.tag);
        seeInstalled();
        data.switches.forEach(tap);
        tap("Open the page again");
        until(() => count(data.missing) >= (data.times || 1), data.missing);
        if (data.messages) {
            expectMessages(data.messages);
        }
        data.switches.forEach(tap);
        tap("Open the page again");
        seeInstalled();
        goBack();
    }

    function test_terms() {
        openPage("terms");
        see("Platform terms of use");
        const locale = Screen.visibleItems(surface).find(item => item.displayText === "en_GB");
        tapItem(locale);
        tap("fi_FI.UTF-8");
        see("Alustan käyttöehdot");
        seeNot("Platform terms of use");
        tapItem(locale);
        tap("de_DE.UTF-8");
        see("Platform terms of use");
        expectMessages(["de_DE", "de_DE", "de_DE"]);
    }
}
