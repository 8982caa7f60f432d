// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include <QtQuickTest>

QUICK_TEST_MAIN(devicelibraries)
