// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import gallery.simulation 1.0
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
        { language: "fi", width: 1280, height: 800 },
    ]
    // A page without states of its own is shown as it opens.
    readonly property var shots: ownShots.concat(
        pages.filter(page => !ownShots.some(shot => shot.page === page.name))
             .map(page => ({ page: page.name, steps: [] })))
    // The steps of a user. A step is repeated until it returns true.
    readonly property var ownShots: [
        { page: "start" },

        { page: "quick-actions", steps: [showing("camera-take-photo")] },
        { page: "quick-actions", state: "called", steps: [
            pressing("camera-take-photo"), pressing("torch-toggle"),
            pressing("gallery-sample-new-alarm"), pressing("maps-navigate-home"),
            () => ["camera", "torch", "alarms", "marlostore"]
                  .every(name => shows("com.marlo." + name))] },
        { page: "quick-actions", state: "failing", log: true, steps: [
            simulating("gallery-quick-actions-fail"), pressing("camera-take-photo"),
            () => Messages.count > 0] },
        { page: "quick-actions", state: "none", steps: [
            simulating("gallery-quick-actions-installed"),
            showing("gallery-quick-actions-none")] },

        { page: "quick-actions-settings", steps: [showing("notes-search")] },
        { page: "quick-actions-settings", state: "broken", steps: [
            simulating("gallery-quick-actions-broken"), () => shows("empty.conf")] },
        { page: "quick-actions-settings", state: "none", steps: [
            simulating("gallery-quick-actions-installed"),
            showing("gallery-quick-actions-not-installed")] },

        { page: "events-widgets", steps: [showing("outdoors-steps")] },
        { page: "events-widgets", state: "available", steps: [
            simulating("gallery-events-widgets-step-counter"),
            pressing("gallery-events-widgets-check"),
            notShowing("gallery-events-widgets-unavailable")] },
        { page: "events-widgets", state: "broken", steps: [
            simulating("gallery-events-widgets-broken"), () => Messages.count > 0] },
        { page: "events-widgets", state: "none", steps: [
            simulating("gallery-events-widgets-installed"),
            showing("gallery-events-widgets-none")] },

        { page: "titles", steps: [showing("notes-search")] },
        { page: "titles", state: "none", steps: [
            simulating("gallery-events-widgets-installed"),
            simulating("gallery-quick-actions-installed"),
            notShowing("notes-search"), notShowing("outdoors-steps"),
            showing("gallery-titles-none")] },

        { page: "memory-card", steps: [probed] },
        { page: "memory-card", state: "no-card", steps: [
            probed, simulating("gallery-card-inserted"),
            () => shows(qsTrId("gallery-card-none")) && cardIsIdle()] },
        { page: "memory-card", state: "asks-to-format", steps: [
            probed, pressing("gallery-card-format", "ext4"), showing("gallery-card-question")] },
        { page: "memory-card", state: "asks-to-empty", steps: [
            probed, pressing("gallery-card-empty"), showing("gallery-card-empty-question")] },
        { page: "memory-card", state: "mounted", steps: [
            probed, pressing("gallery-card-mount"), () => SimulatedCard.mounted && succeeded(),
            pressing("gallery-card-fill")] },
        { page: "memory-card", state: "mounted-again", steps: [
            probed, pressing("gallery-card-mount"), () => succeeded() && shows("2. "
                + qsTrId("gallery-card-probing"))] },
        { page: "memory-card", state: "in-use", steps: [
            probed, simulating("gallery-card-in-use"), pressing("gallery-card-unmount"),
            failing("unmounting", "device-busy")] },
        { page: "memory-card", state: "emptied", steps: [
            probed, pressing("gallery-card-empty"), pressing("gallery-card-remove"),
            () => SimulatedCard.fileCount === 0 && succeeded()] },
        { page: "memory-card", state: "formatted", steps: [
            probed, () => SimulatedCard.mounted || press(qsTrId("gallery-card-mount")),
            () => SimulatedCard.mounted && succeeded(), pressing("gallery-card-format", "ext4"),
            pressing("gallery-card-erase"), () => succeeded() && shows("ext4")] },
        { page: "memory-card", state: "unmounted", steps: [
            probed, pressing("gallery-card-unmount"),
            () => !SimulatedCard.mounted && succeeded()] },
        { page: "memory-card", state: "not-mounted", steps: [
            probed, pressing("gallery-card-unmount"), failing("unmounting", "not-mounted")] },
        { page: "memory-card", state: "forbidden", steps: [
            probed, pressing("gallery-card-service-forbids"), pressing("gallery-card-mount"),
            failing("mounting", "not-authorized")] },
        { page: "memory-card", state: "silent", steps: [
            probed, pressing("gallery-card-service-silent"), pressing("gallery-card-mount"),
            showing("gallery-card-waiting")] },
        { page: "memory-card", state: "absent", steps: [
            probed, pressing("gallery-card-service-absent"), pressing("gallery-card-mount"),
            failing("mounting", "no-answer")] },
        { page: "memory-card", state: "without-helper", steps: [
            probed, simulating("gallery-card-helper"), reload,
            failing("probing", "helper-missing")] },
        // The last state of the card: the helper program outlives the page, and meanwhile no other page
        // may mount the card.
        { page: "memory-card", state: "busy", moving: true, steps: [
            probed, () => SimulatedCard.mounted || press(qsTrId("gallery-card-mount")),
            () => SimulatedCard.mounted && succeeded(), simulating("gallery-card-helper-waits"),
            pressing("gallery-card-format", "ext4"), pressing("gallery-card-erase"),
            () => shows("2. " + qsTrId("gallery-card-formatting"))] },

        { page: "location", steps: [] },
        { page: "location", state: "agreed", steps: [
            pressing("gallery-location-gps"), pressing("gallery-location-agree"),
            pressing("gallery-location-agree"), notShowing("gallery-location-agree-first")] },
        { page: "location", state: "none", steps: [
            simulating("gallery-location-mls-installed"),
            simulating("gallery-location-here-installed"), reload,
            showing("settings_location-la-no_agreement_text_found")] },

        { page: "cover", steps: [showing("gallery-cover-none")] },
        { page: "cover", state: "attached", steps: [
            pressing("gallery-cover-attached"),
            () => shows("MARLO-COVER-07") && shows(qsTrId("gallery-cover-not-ready"))] },
        { page: "cover", state: "ready", steps: [
            pressing("gallery-cover-attached-ready"),
            () => shows("MARLO-COVER-07") && shows(qsTrId("gallery-cover-ready"))] },
        { page: "cover", state: "absent", steps: [
            pressing("gallery-cover-no-daemon"), reload, showing("gallery-unknown")] },

        { page: "bluetooth", steps: [notShowing("gallery-unknown")] },
        { page: "bluetooth", state: "unknown", steps: [
            simulating("gallery-bluetooth-installed"), reload, showing("gallery-unknown")] },
        { page: "android", steps: [showing("gallery-android-shown")] },
        { page: "android", state: "hidden", steps: [
            simulating("gallery-android-installed"), reload, showing("gallery-android-hidden")] },
        { page: "modem", steps: [notShowing("gallery-unknown")] },
        { page: "modem", state: "unknown", steps: [
            simulating("gallery-modem-installed"), reload, showing("gallery-unknown")] },

        { page: "terms", steps: [notShowing("gallery-terms-none")] },
        { page: "terms", state: "none", steps: [
            simulating("gallery-terms-platform-installed"),
            simulating("gallery-terms-vendor-installed"), reload, showing("gallery-terms-none")] },

        { page: "text-files", steps: [notShowing("gallery-text-files-none")] },
        { page: "text-files", state: "none", steps: [
            simulating("gallery-text-files-file-installed"),
            simulating("gallery-text-files-directory-installed"), reload,
            showing("gallery-text-files-none")] },
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

    // Each of these returns a step.
    function showing(id) {
        return () => shows(qsTrId(id));
    }

    function notShowing(id) {
        return () => !shows(qsTrId(id));
    }

    function pressing(id, argument) {
        return () => press(argument ? qsTrId(id).arg(argument) : qsTrId(id));
    }

    function simulating(id) {
        return () => simulate(qsTrId(id));
    }

    function failing(step, cause) {
        return () => shows("1. " + qsTrId("gallery-card-" + step) + ": "
                           + qsTrId("gallery-card-" + cause));
    }

    function reload() {
        return press(qsTrId("gallery-simulation-reload"));
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

    // Shows the page in its current state.
    function present() {
        const shown = views[view];
        Simulation.language = shown.language;
        width = shown.width;
        height = shown.height;
        logOpen = shots[shot].log === true;
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
        interval: 60000
        running: true
        onTriggered: gallery.fail("step %1 is not reached, there is %2".arg(gallery.step + 1).arg(
                                      Screen.texts(gallery.surface).map(item => item.text).join("; ")))
    }

    Connections {
        target: (Simulation) // in parentheses, because qmllint crashes without them
        function onWarning(text) {
            gallery.fail(text);
        }
    }
}
