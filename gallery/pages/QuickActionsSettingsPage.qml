// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Layouts 1.15
import com.marlo.settings.system 1.0
import ".."

/*
    The page on which a user chooses quick actions and drags them into order.
*/
GalleryPage {
    // Its rows are the user's list, entry by entry: what move() works on.
    QuickActionsModel {
        id: enabledActions
    }

    QuickActionsModel {
        id: allActions
        showPotential: true
    }

    Section {
        heading: qsTrId("gallery-quick-actions-order")

        ReorderableList {
            Layout.fillWidth: true
            model: enabledActions
            onMoved: enabledActions.move(from, to)
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
                text: model.title || model.path
                icon.source: /^\//.test(model.icon) ? "file://" + model.icon : model.icon || ""
                // An item has an `enabled` of its own, so the role is asked of the model.
                checked: model.enabled
                onToggled: {
                    if (checked) {
                        allActions.enableAction(model.path);
                    } else {
                        allActions.disableAction(model.path);
                    }
                }
            }
        }
        Note {
            visible: allActions.count === 0
            text: qsTrId("gallery-quick-actions-not-installed")
        }
    }
}
