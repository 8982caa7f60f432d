// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Window 2.15
import "screen.js" as Screen

/*
    Takes a picture of a page, without a display:

        QT_QPA_PLATFORM=offscreen QT_QUICK_BACKEND=software qml PagePicture.qml -- [--click TEXT]...
            [--wait MS] "$PWD/PAGE.qml" PICTURE.png

    Clicks the buttons, switches and the like that show the texts, in this order, as soon as each of them
    is there and enabled. The picture shows the page in a window of 360 by 640, one second or MS
    milliseconds later.
*/
Window {
    id: window

    property var clicks: []
    property int pause: 1000
    property int looks: 0 // for the control to be clicked next
    readonly property int enoughLooks: 100
    property var files: []

    function fail(problem) {
        console.error("PagePicture: " + problem);
        Qt.exit(1);
    }

    function readArguments() {
        const words = Qt.application.arguments.slice(Qt.application.arguments.indexOf("--") + 1);
        while (words.length > 2) {
            const option = words.shift();
            if (option === "--click") {
                clicks.push(words.shift());
            } else if (option === "--wait" && /^\d+$/.test(words[0])) {
                pause = words.shift();
            } else {
                fail("unknown option " + option);
                return;
            }
        }
        if (words.length < 2) {
            fail("usage: [--click TEXT]... [--wait MS] PAGE PICTURE");
            return;
        }
        files = words;
        loader.source = "file://" + files[0];
    }

    function click() {
        const control = Screen.control(contentItem, clicks[0]);
        if (!control || !control.enabled) {
            if (++looks === enoughLooks) {
                fail("nothing to click shows \"" + clicks[0] + "\", but there is: "
                     + Screen.texts(contentItem).map(item => item.text).join("; "));
            }
            return;
        }
        looks = 0;
        clicks.shift();
        if (control.checkable) {
            control.toggle();
            control.toggled();
        }
        control.clicked();
    }

    width: 360
    height: 640
    visible: true

    Component.onCompleted: readArguments()

    Loader {
        id: loader
        anchors.fill: parent
        onStatusChanged: {
            if (status === Loader.Error) {
                Qt.exit(1);
            }
        }
    }

    Timer {
        interval: 50
        repeat: true
        running: loader.status === Loader.Ready
        onTriggered: {
            if (clicks.length > 0) {
                click();
            } else {
                stop();
                shutter.start();
            }
        }
    }

    Timer {
        id: shutter
        interval: pause
        onTriggered: window.contentItem.grabToImage(image => {
            if (image.saveToFile(files[1])) {
                Qt.quit();
            } else {
                fail("cannot save " + files[1]);
            }
        })
    }
}
