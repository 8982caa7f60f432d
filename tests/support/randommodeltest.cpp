// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "randommodeltest.h"

#include "dconftool.h"
#include "files.h"
#include "mgconfitem.h"
#include "patience.h"
#include "texts.h"
#include "words.h"

#include <QtTest>

#include <algorithm>
#include <atomic>
#include <iostream>
#include <thread>
#include <utility>
#include <vector>

namespace {

// Keeps all processors busy while it lives, so that threads of dconf are interrupted at any point.
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

template<typename Value>
QString differs(const QString &what, const Value &value, const Value &expected)
{
    QString text;
    if (value != expected) {
        QDebug(&text) << qPrintable(what) << value << "expected:" << expected;
    }
    return text;
}

// The values of a row, in the order of the roles.
QVariantList shown(const QAbstractListModel &model, int row)
{
    QList<int> roles = model.roleNames().keys();
    std::sort(roles.begin(), roles.end());
    QVariantList values;
    for (const int role : qAsConst(roles)) {
        values.append(model.data(model.index(row), role));
    }
    return values;
}

} // namespace

RandomModelTest::RandomModelTest(QString directory, QString key, QByteArray kind)
    : m_directory(std::move(directory)), m_key(std::move(key)), m_kind(std::move(kind))
{
}

void RandomModelTest::initTestCase()
{
    Files::installCatalogs(words("maps_eng_en maps-fi atlas_eng_en"));
    QLocale::setDefault(QLocale("fi_FI"_s));
}

void RandomModelTest::steps_data()
{
    QTest::addColumn<quint32>("seed");
    QTest::addColumn<bool>("busy");
    QTest::newRow("seed 1") << 1U << false;
    QTest::newRow("seed 2") << 2U << false;
    QTest::newRow("seed 3, busy machine") << 3U << true;
    QTest::newRow("seed 4, busy machine") << 4U << true;
}

void RandomModelTest::steps()
{
    QFETCH(quint32, seed);
    QFETCH(bool, busy);
    const auto load = busy ? std::make_unique<BusyMachine>() : nullptr;
    bool isSet = false;
    const int requested = qEnvironmentVariableIntValue("RANDOM_STEPS", &isSet);
    const int count = isSet ? requested : 300;
    Files::remove(m_directory);
    Files::makeDirectory(m_directory);
    storeNothing();
    reset();
    m_random.seed(seed);
    m_log = std::make_unique<MessageLog>();
    makeModels();

    QStringList done;
    for (int i = 0; i < count && !QTest::currentTestFailed(); ++i) {
        done.append(step());
        QCoreApplication::processEvents();
        const QString different = difference();
        if (!different.isEmpty()) {
            // QFAIL() would truncate such a long message.
            std::cerr << "after step " << done.size() << ":\n"
                      << qPrintable(done.mid(qMax(0, done.size() - 20)).join(QLatin1Char('\n')))
                      << '\n';
            QFAIL(qPrintable(different));
        }
    }
    removeModels();
    m_log.reset();
}

QString RandomModelTest::difference()
{
    NaiveModel *naive = this->naive();
    QStringList differences{
        differs("signals:"_s, m_events->take(), naive->events.join(", "_s)),
        differs("rows:"_s, model()->rowCount(), naive->count()),
        differs("stored:"_s, MGConfItem(m_key).value(), m_stored),
        differs("messages:"_s, m_log->takeTexts(), naive->warnings),
    };
    for (int row = 0; row < qMin(model()->rowCount(), naive->count()); ++row) {
        differences.append(differs("row %1:"_s.arg(row), shown(*model(), row), naive->shown(row)));
    }
    differences.removeAll(QString());
    naive->events.clear();
    naive->warnings.clear();
    return differences.join(QLatin1Char('\n'));
}

QString RandomModelTest::choose(const QByteArray &verb, const QString &path)
{
    QStringList list = naive()->enabledList;
    if (verb == "enable") {
        list.append(path);
    } else {
        list.removeAll(path);
    }
    m_stored = list;
    QMetaObject::invokeMethod(model(), verb + m_kind, Q_ARG(QString, path));
    return QString::fromLatin1(verb) + " "_s + path;
}

QString RandomModelTest::store(const QStringList &list)
{
    m_stored = list;
    MGConfItem(m_key).set(list);
    return "list "_s + list.join(QLatin1Char(' '));
}

QString RandomModelTest::storeNothing()
{
    m_stored = QVariant();
    MGConfItem(m_key).unset();
    return "no list"_s;
}

QString RandomModelTest::storeInAnotherProcess(const QStringList &list)
{
    const bool changes = m_stored != QVariant(list);
    m_stored = list;
    DconfTool::waitUntilStored();
    DconfTool::write(m_key, list);
    const auto isKnown = [&] { return naive()->enabledList == list; };
    if (changes && !becomesTrue(isKnown)) {
        QTest::qFail("the change of another process is not seen", __FILE__, __LINE__);
    }
    return "another process: list "_s + list.join(QLatin1Char(' '));
}

void RandomModelTest::waitForReload()
{
    const int before = m_reloads;
    if (!becomesTrue([&] { return m_reloads > before; })) {
        qFatal("the model does not reload");
    }
}

QStringList RandomModelTest::listOf(const QStringList &paths, int size)
{
    QStringList list;
    for (int count = m_random.bounded(size); count > 0; --count) {
        list.append(anyOf(paths));
    }
    return list;
}
