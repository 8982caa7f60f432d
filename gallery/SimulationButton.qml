// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import "pages/controls"

/*
    A button of the simulation's panel.
*/
PushButton {
    tint: "#8a5a00"
}
