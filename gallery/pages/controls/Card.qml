// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15

/*
    What a section of a page stands on.
*/
Rectangle {
    radius: 8
    color: "white"
    border.color: "#d5dada"
}
