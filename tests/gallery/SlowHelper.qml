// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import gallery.simulation 1.0
import "../../gallery"

/*
    The gallery while its card is formatted by a helper program that does not end. It quits normally
    when the file gallery-quits exists.
*/
Gallery {
    id: gallery

    property bool mounted

    SimulatedFiles {
        id: waits
        path: "/usr/libexec/sdcardhelper-waits"
        content: "\n"
    }
    SimulatedFiles {
        id: quits
        path: "/usr/libexec/gallery-quits"
    }
    Timer {
        interval: 20
        repeat: true
        running: true
        onTriggered: {
            const page = gallery.currentPage.page || gallery.openPage("memory-card");
            if (quits.present) {
                Qt.quit();
            } else if (waits.present || !page || page.running) {
                return;
            } else if (!gallery.mounted) {
                gallery.mounted = true;
                page.mount();
            } else {
                waits.present = true;
                page.format("ext4");
            }
        }
    }
}
