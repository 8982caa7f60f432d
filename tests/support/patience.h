// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef PATIENCE_H
#define PATIENCE_H

#include <QDeadlineTimer>
#include <QTest>

// How long a test waits for a condition on a very busy machine, in milliseconds.
constexpr int patience = 60000;

// Unlike QTRY_VERIFY and QTRY_COMPARE, which look every 50 ms, these look every 2 ms.
#define TRY(condition) QVERIFY2(becomesTrue([&] { return bool(condition); }), #condition)
#define TRY_COMPARE(actual, expected)                                                              \
    do {                                                                                           \
        becomesTrue([&] { return (actual) == (expected); });                                       \
        QCOMPARE(actual, expected);                                                                \
    } while (false)

// Whether a condition is met in time.
template<typename Condition> bool becomesTrue(Condition condition)
{
    const QDeadlineTimer deadline(patience);
    bool met = false;
    while (!(met = condition()) && !deadline.hasExpired()) {
        QTest::qWait(2);
    }
    return met;
}

#endif
