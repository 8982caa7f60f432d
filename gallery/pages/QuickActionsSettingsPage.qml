// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Layouts 1.15
import com.marlo.settings.system 1.0
import "controls"
import "controls/display.js" as Display

/*
    The page on which a user chooses quick actions and puts them in order.
*/
GalleryPage {
    id: page

    // Ordering needs a model of its own: move() expects that the rows are the user's list. With
    // showPotential, they are not.
    property QuickActionsModel enabledActions: QuickActionsModel {}

    function paths(model) {
        return Array.from({ length: model.count }, (none, i) => model.get(i).path);
    }

    // The list differs from the rows if it names an action that is not installed, or after another
    // program has changed it. Then move() moves other entries, so the page enables the actions again
    // in the order of its rows.
    function move(from, to) {
        const rows = paths(enabledActions);
        rows.splice(to, 0, rows.splice(from, 1)[0]);
        enabledActions.move(from, to);
        const stored = enabledActionsComponent.createObject(page);
        if (String(paths(stored)) === String(rows)) {
            stored.destroy();
            return;
        }
        rows.forEach(path => {
            stored.disableAction(path);
            stored.enableAction(path);
        });
        enabledActions = stored;
    }

    Component {
        id: enabledActionsComponent
        QuickActionsModel {}
    }

    QuickActionsModel {
        id: allActions
        showPotential: true
    }

    Section {
        heading: qsTrId("gallery-quick-actions-order")

        ReorderableList {
            Layout.fillWidth: true
            visible: count > 0
            model: enabledActions
            upText: qsTrId("gallery-move-up")
            downText: qsTrId("gallery-move-down")
            onMoved: page.move(from, to)
        }
        Note {
            visible: enabledActions.count === 0
            text: qsTrId("gallery-quick-actions-none")
        }
    }

    Section {
        heading: qsTrId("gallery-quick-actions-available")

        Repeater {
            model: allActions
            TextSwitch {
                text: Display.title(model.title, model.path)
                description: model.title ? "" : qsTrId("gallery-untitled")
                icon.source: Display.url(model.icon)
                // Needs "model.", because an item has a property `enabled` of its own.
                checked: model.enabled
                onToggled: checked ? allActions.enableAction(model.path) : allActions.disableAction(model.path)
            }
        }
        Note {
            visible: allActions.count === 0
            text: qsTrId("gallery-quick-actions-not-installed")
        }
    }
}
