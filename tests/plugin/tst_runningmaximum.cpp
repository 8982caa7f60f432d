// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "plugin/runningmaximum.h"

#include <QRandomGenerator>
#include <QtTest>

#include <limits>

class TestRunningMaximum : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void empty();
    void sortedRows();
    void rowsThatAreNotSorted();
    void numbersThatFall();
    void limits();
    void asIfEveryRowWereCompared();
};

namespace {

RunningMaximum filled(const QVector<uint> &numbers)
{
    RunningMaximum maximum;
    for (const uint number : numbers) {
        maximum.insert(maximum.firstAbove(std::numeric_limits<uint>::max()), number);
    }
    return maximum;
}

int firstAbove(const QVector<uint> &numbers, uint number)
{
    int row = 0;
    while (row < numbers.size() && numbers.at(row) <= number) {
        ++row;
    }
    return row;
}

} // namespace

void TestRunningMaximum::empty()
{
    RunningMaximum maximum;
    QCOMPARE(maximum.firstAbove(0), 0);
    maximum.insert(0, 7);
    QCOMPARE(maximum.firstAbove(7), 1);
    maximum.clear();
    QCOMPARE(maximum.firstAbove(0), 0);
    QCOMPARE(maximum.firstAbove(7), 0);
}

void TestRunningMaximum::sortedRows()
{
    const RunningMaximum maximum = filled({1, 3, 3, 5});
    QCOMPARE(maximum.firstAbove(0), 0);
    QCOMPARE(maximum.firstAbove(1), 1);
    QCOMPARE(maximum.firstAbove(2), 1);
    QCOMPARE(maximum.firstAbove(3), 3);
    QCOMPARE(maximum.firstAbove(5), 4);
}

void TestRunningMaximum::rowsThatAreNotSorted()
{
    RunningMaximum maximum = filled({4, 2, 9, 1});
    QCOMPARE(maximum.firstAbove(3), 0);
    QCOMPARE(maximum.firstAbove(4), 2);
    QCOMPARE(maximum.firstAbove(9), 4);
    maximum.insert(1, 6);
    QCOMPARE(maximum.firstAbove(4), 1);
    QCOMPARE(maximum.firstAbove(6), 3);
}

void TestRunningMaximum::numbersThatFall()
{
    RunningMaximum maximum = filled({1, 8, 2, 5});
    maximum.replace(1, 0);
    QCOMPARE(maximum.firstAbove(1), 2);
    QCOMPARE(maximum.firstAbove(2), 3);
    QCOMPARE(maximum.firstAbove(5), 4);
    maximum.replace(0, 6);
    QCOMPARE(maximum.firstAbove(5), 0);
}

void TestRunningMaximum::limits()
{
    constexpr uint highest = std::numeric_limits<uint>::max();
    const RunningMaximum maximum = filled({0, highest});
    QCOMPARE(maximum.firstAbove(0), 1);
    QCOMPARE(maximum.firstAbove(highest - 1), 1);
    QCOMPARE(maximum.firstAbove(highest), 2);
}

void TestRunningMaximum::asIfEveryRowWereCompared()
{
    QRandomGenerator random(1);
    for (int round = 0; round < 200; ++round) {
        RunningMaximum maximum;
        QVector<uint> numbers;
        for (int step = 0; step < 60; ++step) {
            const uint number = random.bounded(20U);
            if (numbers.isEmpty() || random.bounded(3) > 0) {
                const int row = random.bounded(numbers.size() + 1);
                numbers.insert(row, number);
                maximum.insert(row, number);
            } else {
                const int row = random.bounded(numbers.size());
                numbers[row] = number;
                maximum.replace(row, number);
            }
            for (uint each = 0; each <= 20; ++each) {
                QCOMPARE(maximum.firstAbove(each), firstAbove(numbers, each));
            }
        }
    }
}

QTEST_APPLESS_MAIN(TestRunningMaximum)

#include "tst_runningmaximum.moc"
