// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Layouts 1.15

/*
    A page of pages/ and the panel that simulates the device around it, a file of simulations/. The panel
    is next to the page if there is room, and below it otherwise.
*/
ScrollingPage {
    id: frame

    // An entry of Pages. A change of the language replaces it.
    property var entry
    readonly property Item page: pageLoader.item
    readonly property Item simulation: simulationLoader.item

    function reload() {
        pageLoader.active = false;
        pageLoader.active = true;
    }

    title: entry.title
    columns: width >= 900 ? 2 : 1

    Loader {
        id: pageLoader
        Layout.fillWidth: true
        Layout.alignment: Qt.AlignTop
        source: "pages/" + frame.entry.file
    }

    SimulationPanel {
        Layout.fillWidth: true
        Layout.maximumWidth: frame.columns === 2 ? 340 : -1
        Layout.alignment: Qt.AlignTop
        onReloadRequested: frame.reload()

        Loader {
            id: simulationLoader
            Layout.fillWidth: true
            source: "simulations/" + frame.entry.file.replace("Page", "Simulation")
            onLoaded: {
                // Some simulations control the page, as the application around it would.
                if (item.hasOwnProperty("page")) {
                    item.page = Qt.binding(() => frame.page);
                }
            }
        }
    }
}
