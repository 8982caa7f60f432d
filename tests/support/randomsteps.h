// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef RANDOMSTEPS_H
#define RANDOMSTEPS_H

#include <QAbstractItemModel>
#include <QRandomGenerator>
#include <QtTest>

#include <algorithm>
#include <atomic>
#include <iostream>
#include <thread>
#include <vector>

/*
    What the tests share that run a model next to a naive second one for many random steps. The
    environment variable RANDOM_STEPS sets the number of steps per seed.
*/
namespace RandomSteps {

// Keeps all processors busy while it lives, so that threads of dconf are interrupted anywhere.
class BusyMachine
{
public:
    BusyMachine()
    {
        const unsigned count = 2 * std::max(1U, std::thread::hardware_concurrency());
        for (unsigned i = 0; i < count; ++i) {
            m_threads.emplace_back([this] {
                while (!m_stop) { }
            });
        }
    }
    ~BusyMachine()
    {
        m_stop = true;
        for (std::thread &thread : m_threads) {
            thread.join();
        }
    }
    Q_DISABLE_COPY_MOVE(BusyMachine)

private:
    std::atomic<bool> m_stop{false};
    std::vector<std::thread> m_threads;
};

inline int count()
{
    bool isSet = false;
    const int steps = qEnvironmentVariableIntValue("RANDOM_STEPS", &isSet);
    return isSet ? steps : 300;
}

inline void addRows()
{
    QTest::addColumn<quint32>("seed");
    QTest::addColumn<bool>("busy");
    QTest::newRow("seed 1") << 1U << false;
    QTest::newRow("seed 2") << 2U << false;
    QTest::newRow("seed 3, busy machine") << 3U << true;
    QTest::newRow("seed 4, busy machine") << 4U << true;
}

// True in so many of a hundred cases.
inline bool chance(QRandomGenerator *random, int percent)
{
    return random->bounded(100) < percent;
}

template<typename List> typename List::value_type anyOf(QRandomGenerator *random, const List &list)
{
    return list.at(random->bounded(list.size()));
}

// Appends a line to the events for each signal that the model emits about its rows.
inline void record(const QAbstractItemModel *model, QStringList *events)
{
    using Model = QAbstractItemModel;
    const auto rows = [events](const char *what, int first, int last) {
        events->append(QStringLiteral("%1 %2").arg(QLatin1String(what)).arg(first));
        QCOMPARE(first, last);
    };
    QObject::connect(
        model, &Model::rowsInserted, model,
        [=](const QModelIndex &, int first, int last) { rows("inserted", first, last); });
    QObject::connect(
        model, &Model::rowsRemoved, model,
        [=](const QModelIndex &, int first, int last) { rows("removed", first, last); });
    QObject::connect(
        model, &Model::rowsMoved, model,
        [=](const QModelIndex &, int first, int last, const QModelIndex &, int destination) {
            rows("moved", first, last);
            const int row = destination > first ? destination - 1 : destination;
            events->last() += QStringLiteral(" %1").arg(row);
        });
    QObject::connect(
        model, &Model::dataChanged, model,
        [=](const QModelIndex &top, const QModelIndex &bottom, const QVector<int> &roles) {
            rows("changed", top.row(), bottom.row());
            for (const int role : roles) {
                events->last() += QStringLiteral(" (%1)").arg(role);
            }
        });
    QObject::connect(model, &Model::modelReset, model,
                     [=] { events->append(QStringLiteral("reset")); });
    QObject::connect(model, &Model::layoutChanged, model,
                     [=] { events->append(QStringLiteral("layout")); });
}

// How the models differ, and the last steps before that. QFAIL() would cut the steps off.
inline QString report(const QString &difference, const QStringList &steps)
{
    std::cerr << "after step " << steps.size() << ":\n"
              << qPrintable(steps.mid(qMax(0, steps.size() - 20)).join(QLatin1Char('\n'))) << '\n';
    return difference;
}

} // namespace RandomSteps

#endif
