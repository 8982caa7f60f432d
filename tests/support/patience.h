// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef PATIENCE_H
#define PATIENCE_H

#include <QTest>

// How long a test waits for a condition on a very busy machine, in milliseconds.
constexpr int patience = 60000;

#define TRY(condition) QTRY_VERIFY_WITH_TIMEOUT(condition, patience)
#define TRY_COMPARE(actual, expected) QTRY_COMPARE_WITH_TIMEOUT(actual, expected, patience)

#endif
