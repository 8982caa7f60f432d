// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import gallery.simulation 1.0
import "../../gallery"
import "screen.js" as Screen

/*
    Takes screenshots of every page in each of its states, without a display:

        QT_QPA_PLATFORM=offscreen QT_QUICK_BACKEND=software qml Screenshots.qml -- DIRECTORY

    A page that is longer than the screen takes several screenshots. The program prints a line for each
    state. It ends with status 0, or at the first problem with another status and a line that names the
    problem: a page that does not load, a state that is not reached, any warning of QML, a text without
    translation, a text that is cut off or overlaps another, an image that cannot be saved.
*/
Gallery {
    id: gallery

    readonly property string directory: Qt.application.arguments[Qt.application.arguments.length - 1]
    // Every page is shown in each view. A state is reached and shown in English; in Finnish only its
    // layout is checked.
    readonly property var views: [
        { language: "en", width: 360, height: 640 },
        { language: "en", width: 1280, height: 800 },
        { language: "fi", width: 360, height: 640 },
    ]
    // The steps of a user. A step is repeated until it returns true.
    readonly property var shots: [
        { page: "start" },

        { page: "quick-actions", steps: [() => shows(qsTrId("camera-take-photo"))] },
        { page: "quick-actions", state: "called", steps: [
            () => press(qsTrId("camera-take-photo")),
            () => press(qsTrId("torch-toggle")),
            () => press(qsTrId("gallery-sample-new-alarm")),
            () => press(qsTrId("maps-navigate-home")),
            () => ["camera", "torch", "alarms", "marlostore"].every(
                      name => shows("com.marlo." + name))] },
        { page: "quick-actions", state: "failing", steps: [
            () => simulate(qsTrId("gallery-quick-actions-fail")),
            () => press(qsTrId("camera-take-photo")),
            () => Messages.count > 0,
            () => logOpen = true] },
        { page: "quick-actions", state: "none", steps: [
            () => simulate(qsTrId("gallery-quick-actions-installed")),
            () => shows(qsTrId("gallery-quick-actions-none"))] },

        { page: "quick-actions-settings", steps: [() => shows(qsTrId("notes-search"))] },
        { page: "quick-actions-settings", state: "broken", steps: [
            () => simulate(qsTrId("gallery-quick-actions-broken")),
            () => shows("empty.conf")] },
        { page: "quick-actions-settings", state: "none", steps: [
            () => simulate(qsTrId("gallery-quick-actions-installed")),
            () => shows(qsTrId("gallery-quick-actions-not-installed"))] },

        { page: "events-widgets", steps: [() => shows(qsTrId("outdoors-steps"))] },
        { page: "events-widgets", state: "available", steps: [
            () => simulate(qsTrId("gallery-events-widgets-step-counter")),
            () => press(qsTrId("gallery-events-widgets-check")),
            () => !shows(qsTrId("gallery-events-widgets-unavailable"))] },
        { page: "events-widgets", state: "broken", steps: [
            () => simulate(qsTrId("gallery-events-widgets-broken")),
            () => Messages.count > 0] },
        { page: "events-widgets", state: "none", steps: [
            () => simulate(qsTrId("gallery-events-widgets-installed")),
            () => shows(qsTrId("gallery-events-widgets-none"))] },

        { page: "titles", steps: [() => shows(qsTrId("notes-search"))] },
        { page: "titles", state: "none", steps: [
            () => simulate(qsTrId("gallery-events-widgets-installed")),
            () => simulate(qsTrId("gallery-quick-actions-installed")),
            () => !shows(qsTrId("notes-search")) && !shows(qsTrId("outdoors-steps")),
            () => shows(qsTrId("gallery-titles-none"))] },

        { page: "memory-card", steps: [() => probed()] },
        { page: "memory-card", state: "no-card", steps: [
            () => probed(),
            () => simulate(qsTrId("gallery-card-inserted")),
            () => shows(qsTrId("gallery-card-none")) && cardIsIdle()] },
        { page: "memory-card", state: "asks-to-format", steps: [
            () => probed(),
            () => press(qsTrId("gallery-card-format").arg("ext4")),
            () => shows(qsTrId("gallery-card-question"))] },
        { page: "memory-card", state: "asks-to-empty", steps: [
            () => probed(),
            () => press(qsTrId("gallery-card-empty")),
            () => shows(qsTrId("gallery-card-empty-question"))] },
        { page: "memory-card", state: "mounted", steps: [
            () => probed(),
            () => press(qsTrId("gallery-card-mount")),
            () => SimulatedCard.mounted && succeeded(),
            () => press(qsTrId("gallery-card-fill"))] },
        { page: "memory-card", state: "in-use", steps: [
            () => probed(),
            () => simulate(qsTrId("gallery-card-in-use")),
            () => press(qsTrId("gallery-card-unmount")),
            () => shows(qsTrId("gallery-card-device-busy"))] },
        { page: "memory-card", state: "emptied", steps: [
            () => probed(),
            () => press(qsTrId("gallery-card-empty")),
            () => press(qsTrId("gallery-card-remove")),
            () => SimulatedCard.fileCount === 0 && succeeded()] },
        { page: "memory-card", state: "formatted", steps: [
            () => probed(),
            () => SimulatedCard.mounted || press(qsTrId("gallery-card-mount")),
            () => SimulatedCard.mounted && succeeded(),
            () => press(qsTrId("gallery-card-format").arg("ext4")),
            () => press(qsTrId("gallery-card-erase")),
            () => succeeded() && shows("ext4")] },
        { page: "memory-card", state: "unmounted", steps: [
            () => probed(),
            () => press(qsTrId("gallery-card-unmount")),
            () => !SimulatedCard.mounted && succeeded()] },
        { page: "memory-card", state: "not-mounted", steps: [
            () => probed(),
            () => press(qsTrId("gallery-card-unmount")),
            () => shows(qsTrId("gallery-card-not-mounted"))] },
        { page: "memory-card", state: "forbidden", steps: [
            () => probed(),
            () => press(qsTrId("gallery-card-service-forbids")),
            () => press(qsTrId("gallery-card-mount")),
            () => shows(qsTrId("gallery-card-not-authorized"))] },
        { page: "memory-card", state: "silent", steps: [
            () => probed(),
            () => press(qsTrId("gallery-card-service-silent")),
            () => press(qsTrId("gallery-card-mount")),
            () => shows(qsTrId("gallery-card-waiting"))] },
        { page: "memory-card", state: "absent", steps: [
            () => probed(),
            () => press(qsTrId("gallery-card-service-absent")),
            () => press(qsTrId("gallery-card-mount")),
            () => shows(qsTrId("gallery-card-no-answer"))] },
        { page: "memory-card", state: "without-helper", steps: [
            () => probed(),
            () => simulate(qsTrId("gallery-card-helper")),
            () => press(qsTrId("gallery-simulation-reload")),
            () => shows(qsTrId("gallery-card-probing-failed"))] },
        // The last state of the card: the helper program outlives the page, and meanwhile no other page
        // may mount the card.
        { page: "memory-card", state: "busy", moving: true, steps: [
            () => probed(),
            () => SimulatedCard.mounted || press(qsTrId("gallery-card-mount")),
            () => SimulatedCard.mounted && succeeded(),
            () => simulate(qsTrId("gallery-card-helper-waits")),
            () => press(qsTrId("gallery-card-format").arg("ext4")),
            () => press(qsTrId("gallery-card-erase")),
            () => shows("2. " + qsTrId("gallery-card-formatting"))] },

        { page: "location", steps: [] },
        { page: "location", state: "agreed", steps: [
            () => press(qsTrId("gallery-location-gps")),
            () => press(qsTrId("gallery-location-agree")),
            () => press(qsTrId("gallery-location-agree")),
            () => !shows(qsTrId("gallery-location-agree-first"))] },
        { page: "location", state: "none", steps: [
            () => simulate(qsTrId("gallery-location-mls-installed")),
            () => simulate(qsTrId("gallery-location-here-installed")),
            () => press(qsTrId("gallery-simulation-reload")),
            () => shows(qsTrId("settings_location-la-no_agreement_text_found"))] },

        { page: "cover", steps: [() => shows(qsTrId("gallery-cover-none"))] },
        { page: "cover", state: "attached", steps: [
            () => press(qsTrId("gallery-cover-attached")),
            () => shows("MARLO-COVER-07") && shows(qsTrId("gallery-cover-not-ready"))] },
        { page: "cover", state: "ready", steps: [
            () => press(qsTrId("gallery-cover-attached-ready")),
            () => shows("MARLO-COVER-07") && shows(qsTrId("gallery-cover-ready"))] },
        { page: "cover", state: "absent", steps: [
            () => press(qsTrId("gallery-cover-no-daemon")),
            () => press(qsTrId("gallery-simulation-reload")),
            () => shows(qsTrId("gallery-cover-none"))] },

        { page: "bluetooth", steps: [() => !shows(qsTrId("gallery-unknown"))] },
        { page: "bluetooth", state: "unknown", steps: [
            () => simulate(qsTrId("gallery-bluetooth-installed")),
            () => press(qsTrId("gallery-simulation-reload")),
            () => shows(qsTrId("gallery-unknown"))] },
        { page: "android", steps: [() => shows(qsTrId("gallery-android-shown"))] },
        { page: "android", state: "hidden", steps: [
            () => simulate(qsTrId("gallery-android-installed")),
            () => press(qsTrId("gallery-simulation-reload")),
            () => shows(qsTrId("gallery-android-hidden"))] },
        { page: "modem", steps: [() => !shows(qsTrId("gallery-unknown"))] },
        { page: "modem", state: "unknown", steps: [
            () => simulate(qsTrId("gallery-modem-installed")),
            () => press(qsTrId("gallery-simulation-reload")),
            () => shows(qsTrId("gallery-unknown"))] },

        { page: "terms", steps: [() => !shows(qsTrId("gallery-terms-none"))] },
        { page: "terms", state: "none", steps: [
            () => simulate(qsTrId("gallery-terms-platform-installed")),
            () => simulate(qsTrId("gallery-terms-vendor-installed")),
            () => press(qsTrId("gallery-simulation-reload")),
            () => shows(qsTrId("gallery-terms-none"))] },

        { page: "text-files", steps: [() => !shows(qsTrId("gallery-text-files-none"))] },
        { page: "text-files", state: "none", steps: [
            () => simulate(qsTrId("gallery-text-files-file-installed")),
            () => simulate(qsTrId("gallery-text-files-folder-installed")),
            () => press(qsTrId("gallery-simulation-reload")),
            () => shows(qsTrId("gallery-text-files-none"))] },
    ]

    property int shot: -1
    property int view: -1
    property int step: 0
    property int part: 0
    property int looks: 0
    readonly property int enoughLooks: 100
    property var simulated: []
    property var files: []
    property bool grabbing: true
    property bool failed: false
    property bool finished: false

    function shows(text) {
        return Screen.texts(surface).some(item => item.text === text);
    }

    function press(text) {
        const control = Screen.control(surface, text);
        if (!control || !control.enabled) {
            return false;
        }
        if (control.checkable) {
            control.toggle();
            control.toggled();
        }
        control.clicked();
        return true;
    }

    // Presses a switch. It is pressed again after the screenshot.
    function simulate(text) {
        if (!press(text)) {
            return false;
        }
        simulated.push(text);
        return true;
    }

    function probed() {
        return SimulatedCard.ready && cardIsIdle() && (shows("ext4") || shows("vfat"));
    }

    function cardIsIdle() {
        return !currentPage.page.running;
    }

    function succeeded() {
        return cardIsIdle() && shows(qsTrId("gallery-card-idle"));
    }

    function nextShot() {
        Simulation.language = views[0].language;
        simulated.reverse().forEach(press);
        simulated = [];
        if (files.length > 0) {
            const state = shots[shot].state || "open";
            console.log("%1 (%2): %3".arg(shots[shot].page).arg(state).arg(files.join(" ")));
        }
        files = [];
        view = 0;
        if (shot + 1 === shots.length) {
            finished = true;
            Qt.quit();
            return;
        }
        ++shot;
        open();
    }

    function nextView() {
        if (++view === views.length) {
            nextShot();
        } else if (shots[shot].state) {
            present();
        } else {
            open();
        }
    }

    function open() {
        close();
        SimulatedCard.diskService = SimulatedCard.Working;
        Simulation.cover = Simulation.NoCover;
        Messages.clear();
        present();
        if (shots[shot].page !== "start" && !openPage(shots[shot].page)) {
            fail("does not load");
            return;
        }
        step = 0;
    }

    // Shows the page in its present state.
    function present() {
        const shown = views[view];
        Simulation.language = shown.language;
        width = shown.width;
        height = shown.height;
        logOpen = Qt.binding(() => width >= 900 && Messages.count > 0);
        part = 0;
        grabbing = false;
        still.restart();
    }

    function grab() {
        const untranslated = Screen.untranslated(surface);
        const flaw = untranslated ? "no translation of " + untranslated : Screen.flaw(surface);
        if (flaw) {
            // The layout may not be up to date yet.
            if (++looks === enoughLooks) {
                fail(flaw);
            }
            return;
        }
        looks = 0;
        grabbing = true;
        if (shots[shot].state && views[view].language !== "en") {
            nextView();
            return;
        }
        const shown = views[view];
        const name = [shots[shot].page, shots[shot].state, shown.width + "x" + shown.height,
                      shown.language, part ? part + 1 : ""].filter(word => word).join("-") + ".png";
        const begun = surface.grabToImage(result => {
            if (!result.saveToFile(directory + "/" + name)) {
                fail("cannot save " + directory + "/" + name);
                return;
            }
            files.push(name);
            const seen = currentPage.scrollY + currentPage.height;
            if (seen < currentPage.scrollHeight - 8) {
                ++part;
                currentPage.scrollTo(seen - 16);
                grabbing = false;
                still.restart();
            } else {
                currentPage.scrollTo(0);
                nextView();
            }
        });
        if (!begun) {
            fail("cannot be grabbed");
        }
    }

    function fail(problem) {
        if (failed) {
            return;
        }
        failed = true;
        const name = shot < 0 ? "gallery" : shots[shot].page;
        const state = shots[shot] && shots[shot].state ? " " + shots[shot].state : "";
        console.error("screenshots: %1%2 (%3): %4".arg(name).arg(state)
                          .arg(view < 0 ? "" : views[view].language).arg(problem));
        Qt.exit(1);
    }

    Component.onCompleted: nextShot()
    // Moving items cause new frames. The screenshot is taken when no new frame comes.
    onFrameSwapped: {
        if (step === (shots[shot].steps || []).length && !shots[shot].moving) {
            still.restart();
        }
    }

    Timer {
        id: still
        interval: 30
        repeat: true
        onTriggered: {
            if (gallery.grabbing || gallery.failed || gallery.finished) {
                return;
            }
            const steps = gallery.shots[gallery.shot].steps || [];
            if (gallery.step === steps.length) {
                gallery.grab();
            } else if (steps[gallery.step]()) {
                ++gallery.step;
                watchdog.restart();
            }
        }
    }

    Timer {
        id: watchdog
        interval: 30000
        running: true
        onTriggered: gallery.fail("step %1 is not reached, there is %2".arg(gallery.step + 1).arg(
                                      Screen.texts(gallery.surface).map(item => item.text).join("; ")))
    }

    Connections {
        target: (Simulation) // qmllint crashes at a singleton here, in parentheses it does not
        function onWarning(text) {
            gallery.fail(text);
        }
    }
}
