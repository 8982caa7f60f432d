// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Window 2.15

/*
    Takes a picture of a page, without a display:

        QT_QPA_PLATFORM=offscreen QT_QUICK_BACKEND=software qml PagePicture.qml -- "$PWD/PAGE.qml" PICTURE.png

    The picture shows the page one second after it was opened, in a window of 360 by 640.
*/
Window {
    id: window

    readonly property var files: Qt.application.arguments.slice(-2)

    width: 360
    height: 640
    visible: true

    Loader {
        id: loader
        anchors.fill: parent
        source: "file://" + files[0]
        onStatusChanged: {
            if (status === Loader.Error) {
                Qt.exit(1);
            }
        }
    }

    Timer {
        interval: 1000
        running: true
        onTriggered: window.contentItem.grabToImage(image => Qt.exit(image.saveToFile(files[1]) ? 0 : 1))
    }
}
