// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Layouts 1.15

/*
    An explanation.
*/
Label {
    Layout.fillWidth: true
    opacity: 0.7
    wrapMode: Text.Wrap
}
