// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import gallery.stage 1.0

/*
    Takes screenshots of every page, without a display:

        QT_QPA_PLATFORM=offscreen QT_QUICK_BACKEND=software qml Screenshots.qml -- FOLDER

    Prints a line for each page and ends with status 0, or at the first problem with another and a
    line that names it: a page that does not load or never is ready, any warning of QML, a text
    without translation, an image that cannot be saved.
*/
Gallery {
    id: gallery

    readonly property string folder: Qt.application.arguments[Qt.application.arguments.length - 1]
    readonly property var views: [
        { language: "en", width: 360, height: 640 },
        { language: "en", width: 1280, height: 800 },
        { language: "fi", width: 360, height: 640 },
        { language: "de", width: 360, height: 640 },
    ]
    // The start page has a name only.
    readonly property var shots: [{ name: "start" }].concat(pages)

    property int shot: -1
    property int view: views.length - 1
    property var files: []
    property bool demonstrated: false
    property bool grabbing: true
    property bool failed: false

    function next() {
        if (++view === views.length) {
            view = 0;
            if (++shot === shots.length) {
                Qt.quit();
                return;
            }
            files = [];
        }
        close();
        Stage.language = views[view].language;
        width = views[view].width;
        height = views[view].height;
        if (shots[shot].file && !open(shots[shot])) {
            fail("does not load");
            return;
        }
        demonstrated = false;
        grabbing = false;
        still.restart();
    }

    function grab() {
        grabbing = true;
        const untranslated = findUntranslated(contentItem.parent);
        if (untranslated) {
            fail("no translation of " + untranslated);
            return;
        }
        const shown = views[view];
        const file = "%1-%2x%3-%4.png".arg(shots[shot].name).arg(shown.width).arg(shown.height)
                                      .arg(shown.language);
        const begun = contentItem.parent.grabToImage(result => {
            if (!result.saveToFile(folder + "/" + file)) {
                fail("cannot save " + folder + "/" + file);
                return;
            }
            files.push(file);
            if (view === views.length - 1) {
                console.log(shots[shot].name + ": " + files.join(" "));
            }
            next();
        });
        if (!begun) {
            fail("cannot be grabbed");
        }
    }

    // A text that the catalogs lack shows as its identifier.
    function findUntranslated(item) {
        if (/^gallery-/.test(item.text) || /^gallery-/.test(item.title)) {
            return item.text || item.title;
        }
        for (let i = 0; i < item.children.length; ++i) {
            const found = findUntranslated(item.children[i]);
            if (found) {
                return found;
            }
        }
        return "";
    }

    function fail(problem) {
        if (failed) {
            return;
        }
        failed = true;
        const page = shot < 0 ? "gallery" : shots[shot].name;
        console.error("screenshots: " + page + " (" + views[view].language + "): " + problem);
        Qt.exit(1);
    }

    Component.onCompleted: next()
    // While anything moves there are new frames: an image is taken when nothing does any more.
    onFrameSwapped: still.restart()

    Timer {
        id: still
        interval: 100
        repeat: true
        onTriggered: {
            if (gallery.grabbing || gallery.failed) {
                return;
            }
            // As a user would: once the page is there.
            if (!gallery.demonstrated) {
                gallery.demonstrated = true;
                gallery.currentPage.demonstrate();
            } else if (gallery.currentPage.ready) {
                gallery.grab();
            }
        }
    }

    Timer {
        id: watchdog
        interval: 60000
        running: true
        onTriggered: gallery.fail("not ready in time")
    }

    Connections {
        target: Stage
        function onWarning(text) {
            gallery.fail(text);
        }
    }
}
