// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15

/*
    The background of a section.
*/
Rectangle {
    radius: 8
    color: "white"
    border.color: "#d5dada"
}
