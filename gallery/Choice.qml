// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Layouts 1.15

/*
    One of several states of the simulated device.
*/
RadioDelegate {
    Layout.fillWidth: true
    focusPolicy: Qt.StrongFocus
    horizontalPadding: 0
}
