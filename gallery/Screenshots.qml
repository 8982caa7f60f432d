// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import gallery.simulation 1.0
import "screen.js" as Screen

/*
    Takes screenshots of every page as it opens, without a display:

        QT_QPA_PLATFORM=offscreen QT_QUICK_BACKEND=software qml Screenshots.qml -- DIRECTORY

    A page that is longer than the screen takes several screenshots. The program prints a line for each
    page. It ends with status 0, or at the first problem with another status and a line that names the
    problem: a page that does not load, any warning of QML, a text without translation, a text that is cut
    off or overlaps another, an image that cannot be saved.
*/
Gallery {
    id: gallery

    readonly property string directory: Qt.application.arguments[Qt.application.arguments.length - 1]
    // Every page is shown in each view.
    readonly property var views: [
        { language: "en", width: 360, height: 640 },
        { language: "en", width: 1280, height: 800 },
        { language: "fi", width: 360, height: 640 },
        { language: "fi", width: 1280, height: 800 },
    ]
    readonly property var names: ["start"].concat(pages.map(page => page.name))

    property int pageNumber: -1
    property int viewNumber: views.length - 1
    property int part: 0
    property int looks: 0
    readonly property int enoughLooks: 100
    property var files: []
    property bool grabbing: true

    function next() {
        if (++viewNumber === views.length) {
            viewNumber = 0;
            if (pageNumber >= 0) {
                console.log("%1: %2".arg(names[pageNumber]).arg(files.join(" ")));
            }
            files = [];
            if (++pageNumber === names.length) {
                Qt.quit();
                return;
            }
        }
        const shown = views[viewNumber];
        Simulation.language = shown.language;
        width = shown.width;
        height = shown.height;
        close();
        if (names[pageNumber] !== "start" && !openPage(names[pageNumber])) {
            fail("does not load");
            return;
        }
        part = 0;
        grabbing = false;
        still.restart();
        watchdog.restart();
    }

    function isAnswered() {
        const unknown = qsTrId("gallery-unknown");
        return names[pageNumber] === "start"
            || !currentPage.page.running && !Screen.texts(surface).some(item => item.text === unknown);
    }

    function grab() {
        // A service may still have to answer the page.
        if (!isAnswered()) {
            return;
        }
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
        const shown = views[viewNumber];
        const name = [names[pageNumber], shown.width + "x" + shown.height, shown.language, part ? part + 1 : ""]
                     .filter(word => word).join("-") + ".png";
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
                next();
            }
        });
        if (!begun) {
            fail("cannot be grabbed");
        }
    }

    function fail(problem) {
        grabbing = true;
        console.error("screenshots: %1 (%2): %3".arg(pageNumber < 0 ? "gallery" : names[pageNumber])
                          .arg(views[viewNumber].language).arg(problem));
        Qt.exit(1);
    }

    Component.onCompleted: next()
    // Moving items cause new frames. The screenshot is taken when no new frame comes.
    onFrameSwapped: still.restart()

    Timer {
        id: still
        interval: 30
        repeat: true
        onTriggered: {
            if (!gallery.grabbing) {
                gallery.grab();
            }
        }
    }

    Timer {
        id: watchdog
        interval: 60000
        onTriggered: gallery.fail("unfinished: " + Screen.texts(gallery.surface).map(item => item.text).join("; "))
    }

    Connections {
        target: (Simulation) // in parentheses, because qmllint crashes without them
        function onWarning(text) {
            gallery.fail(text);
        }
    }
}
