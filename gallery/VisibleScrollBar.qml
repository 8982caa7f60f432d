// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls.Universal 2.15
import QtQuick.Templates 2.15 as T

/*
    A scroll bar that is visible whenever there is something to scroll. It looks like the style's, which
    fades in: every screenshot would wait for that.
*/
T.ScrollBar {
    id: bar

    width: 6
    minimumSize: width / height
    policy: T.ScrollBar.AlwaysOn
    visible: size < 1

    contentItem: Rectangle {
        color: bar.pressed ? bar.Universal.baseMediumColor
             : bar.hovered ? bar.Universal.baseMediumLowColor : bar.Universal.chromeHighColor
    }
    background: Rectangle {
        color: bar.Universal.chromeLowColor
    }
}
