// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The model next to a naive second one, through many random changes of files and settings. After
// each step both have the same rows, have emitted the same signals and agree on what is stored.

#include "dconftool.h"
#include "files.h"
#include "messagelog.h"
#include "mgconfitem.h"
#include "naivecatalogs.h"
#include "quickactions/quickactionsmodel.h"
#include "randomsteps.h"

#include <QDir>
#include <QSettings>
#include <QtTest>

namespace {

const QString directory = QStringLiteral("/usr/share/glimmera/quickactions");
const QString enabledKey = QStringLiteral("/desktop/glimmera-marlo-home/events_screen_actions");
const QString blockedKey = QStringLiteral("/desktop/glimmera-marlo-home/blocked_actions");
const QString userKey = QStringLiteral("/desktop/glimmera-marlo-home/events_screen_actions_user");

constexpr int patience = 60000; // ms, of a machine that is very busy

struct Action {
    QString path;
    QVariantMap config;
    bool enabled = false;

    bool operator!=(const Action &other) const
    {
        return path != other.path || config != other.config || enabled != other.enabled;
    }
    QString title() const { return config.value(QStringLiteral("title")).toString(); }
    QString catalog() const
    {
        return config.value(QStringLiteral("translation-catalog")).toString();
    }
    // Negative for none.
    int priority() const
    {
        bool isInteger = false;
        const int priority = config.value(QStringLiteral("priority")).toString().toInt(&isInteger);
        return isInteger ? priority : -1;
    }
};

} // namespace

// Does everything one by one and looks for everything from the top.
class NaiveModel : public QObject
{
public:
    NaiveModel()
    {
        connect(&m_enabledItem, &MGConfItem::valueChanged, this, [this] {
            if (!moving) {
                readEnabled();
                load();
            }
        });
        connect(&m_blockedItem, &MGConfItem::valueChanged, this, [this] {
            readBlocked();
            load();
        });
        readEnabled();
        readBlocked();
    }

    void readEnabled() { enabledList = m_enabledItem.value().toStringList(); }
    void readBlocked() { m_blockedList = m_blockedItem.value().toStringList(); }

    void setShowPotential(bool show)
    {
        if (showPotential != show) {
            showPotential = show;
            load();
            events.append(QStringLiteral("potential"));
        }
    }

    void load()
    {
        const int countBefore = rows.size();
        QStringList selected;
        const QStringList names = QDir(directory).entryList({QStringLiteral("*.conf")});
        for (const QString &name : names) {
            const QString path = directory + QLatin1Char('/') + name;
            if (showPotential || enabledList.contains(path)) {
                selected.append(path);
            }
        }
        int row = 0;
        while (row < rows.size()) {
            const Action action = rows.at(row);
            if (selected.contains(action.path) && !m_blockedList.contains(action.path)) {
                ++row;
            } else {
                m_catalogs.remove(action.path, action.catalog());
                rows.removeAt(row);
                events.append(QStringLiteral("removed %1").arg(row));
            }
        }
        // The order does not matter. Here it is: actions with a row, other enabled actions, the
        // rest.
        QStringList order;
        for (const Action &action : qAsConst(rows)) {
            order.append(action.path);
        }
        for (const QString &path : enabledList + selected) {
            if (selected.contains(path) && !order.contains(path)) {
                order.append(path);
            }
        }
        for (const QString &path : qAsConst(order)) {
            if (!m_blockedList.contains(path)) {
                addOrUpdate({path, read(path), enabledList.contains(path)});
            }
        }
        if (rows.size() != countBefore) {
            events.append(QStringLiteral("count"));
        }
    }

    // False for an index outside the list. The model writes the list, the caller notes that.
    bool move(int index, int newIndex)
    {
        if (index < 0 || newIndex < 0 || index >= enabledList.size()
            || newIndex >= enabledList.size()) {
            return false;
        }
        if (index != newIndex && index < rows.size() && newIndex < rows.size()) {
            rows.move(index, newIndex);
            events.append(QStringLiteral("moved %1 %2").arg(index).arg(newIndex));
        }
        enabledList.move(index, newIndex);
        return true;
    }

    QVariantMap shown(int row) const
    {
        const Action &action = rows.at(row);
        const QVariant title =
            action.title().isEmpty() ? QVariant() : QVariant(m_catalogs.text(action.title()));
        return {{QStringLiteral("title"), title},
                {QStringLiteral("icon"), action.config.value(QStringLiteral("icon"))},
                {QStringLiteral("path"), action.path},
                {QStringLiteral("enabled"), action.enabled}};
    }

    QList<Action> rows;
    QStringList events;
    QStringList enabledList;
    bool showPotential = false;
    bool moving = false;
    int warnings = 0;

private:
    QVariantMap read(const QString &path)
    {
        // QSettings reports a broken file only when it reads it for the first time.
        QFile file(path);
        if (file.open(QIODevice::ReadOnly) && file.readAll().contains("[broken")) {
            ++warnings;
            return {};
        }
        const QSettings settings(path, QSettings::IniFormat);
        QVariantMap config;
        const QStringList keys = settings.childKeys();
        for (const QString &key : keys) {
            config.insert(key, settings.value(key));
        }
        return config;
    }

    int find(const QString &path) const
    {
        for (int row = 0; row < rows.size(); ++row) {
            if (rows.at(row).path == path) {
                return row;
            }
        }
        return -1;
    }

    void addOrUpdate(const Action &action)
    {
        const int row = find(action.path);
        if (row < 0) {
            const int place = insertionIndex(action);
            m_catalogs.add(action.path, action.catalog());
            rows.insert(place, action);
            events.append(QStringLiteral("inserted %1").arg(place));
        } else if (rows.at(row) != action) {
            if (rows.at(row).catalog() != action.catalog()) {
                m_catalogs.add(action.path, action.catalog());
            }
            rows[row] = action;
            events.append(QStringLiteral("changed %1").arg(row));
        }
    }

    int insertionIndex(const Action &action) const
    {
        if (action.enabled) {
            QStringList before = enabledList.mid(0, enabledList.indexOf(action.path));
            before.removeDuplicates();
            int place = before.size();
            for (const QString &path : qAsConst(before)) {
                place -= find(path) < 0 ? 1 : 0;
            }
            return place;
        }
        if (action.priority() < 0) {
            return rows.size();
        }
        for (int row = 0; row < rows.size(); ++row) {
            bool isInteger = false;
            const int priority =
                rows.at(row).config.value(QStringLiteral("priority")).toString().toInt(&isInteger);
            if (!isInteger || priority > action.priority()) {
                return row;
            }
        }
        return rows.size();
    }

    MGConfItem m_enabledItem{enabledKey};
    MGConfItem m_blockedItem{blockedKey};
    QStringList m_blockedList;
    NaiveCatalogs m_catalogs;
};

class TestRandomActions : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void steps_data();
    void steps();

private:
    void makeModels(bool showPotential);
    void recordEvents();
    QString step();
    void changeFile(const QString &path);
    void waitForReload();
    QStringList randomList();
    QString difference();

    std::unique_ptr<MessageLog> m_log;
    QRandomGenerator m_random;
    QStringList m_paths;
    std::unique_ptr<NaiveModel> m_naive;
    std::unique_ptr<QuickActionsModel> m_model;
    QStringList m_events;
    QVariant m_stored; // what the key of the enabled list should hold
    bool m_userHasChosen = false;
    int m_timeouts = 0; // of the timer of this model
};

void TestRandomActions::initTestCase()
{
    for (const auto *name : {"maps_eng_en", "maps-fi", "atlas_eng_en"}) {
        Files::installCatalog(QString::fromLatin1(name));
    }
    QLocale::setDefault(QLocale(QStringLiteral("fi_FI")));
    for (const char *name : {"a", "b", "c", "D", "e", "f", "g", "h"}) {
        m_paths.append(directory + QLatin1Char('/') + QLatin1String(name)
                       + QStringLiteral(".conf"));
    }
}

void TestRandomActions::makeModels(bool showPotential)
{
    m_model.reset();
    m_naive.reset();
    m_timeouts = 0;

    m_model = std::make_unique<QuickActionsModel>();
    m_naive = std::make_unique<NaiveModel>();
    recordEvents();
    // The delay itself has tests of its own.
    auto *timer = m_model->findChild<QTimer *>();
    timer->setInterval(0);
    connect(timer, &QTimer::timeout, m_naive.get(), [this] {
        // One more load for every earlier timeout, as is intended.
        ++m_timeouts;
        for (int i = 0; i < m_timeouts; ++i) {
            m_naive->load();
        }
    });
    m_model->setShowPotential(showPotential);
    m_naive->showPotential = showPotential;
    m_events.clear();
    m_model->componentComplete();
    m_naive->load();
}

void TestRandomActions::recordEvents()
{
    m_events.clear();
    RandomSteps::record(m_model.get(), &m_events);
    connect(m_model.get(), &QuickActionsModel::countChanged, this,
            [this] { m_events.append(QStringLiteral("count")); });
    connect(m_model.get(), &QuickActionsModel::showPotentialChanged, this,
            [this] { m_events.append(QStringLiteral("potential")); });
}

QStringList TestRandomActions::randomList()
{
    QStringList list;
    for (int size = m_random.bounded(7); size > 0; --size) {
        list.append(RandomSteps::anyOf(&m_random, m_paths));
    }
    return list;
}

void TestRandomActions::changeFile(const QString &path)
{
    const auto oneOf = [this](const QByteArrayList &texts) {
        return RandomSteps::anyOf(&m_random, texts);
    };
    Files::write(path,
                 oneOf({"title=maps-title\n", "title=maps-english\n", "title=plain\n", "title=\n",
                        "", "title=one, two\n"})
                     + oneOf({"", "icon=one\n", "icon=two\n"})
                     + oneOf({"", "", "priority=5\n", "priority=10\n", "priority=0\n",
                              "priority=-1\n", "priority=high\n"})
                     + oneOf({"", "", "translation-catalog=maps\n", "translation-catalog=atlas\n",
                              "translation-catalog=none\n"})
                     + oneOf({"", "", "", "", "", "", "[broken\n"}));
}

void TestRandomActions::waitForReload()
{
    const int before = m_timeouts;
    QTRY_VERIFY_WITH_TIMEOUT(m_timeouts > before, patience);
}

// Takes one random step and returns its description.
QString TestRandomActions::step()
{
    const QString path = RandomSteps::anyOf(&m_random, m_paths);
    const int kind = m_random.bounded(1000);
    if (kind < 150) {
        m_stored = m_naive->enabledList + QStringList(path);
        m_userHasChosen = true;
        m_model->enableAction(path);
        return QStringLiteral("enable ") + path;
    }
    if (kind < 300) {
        QStringList list = m_naive->enabledList;
        list.removeAll(path);
        m_stored = list;
        m_userHasChosen = true;
        m_model->disableAction(path);
        return QStringLiteral("disable ") + path;
    }
    if (kind < 500) {
        const int size = m_naive->enabledList.size();
        const int from = m_random.bounded(-1, size + 1);
        const int to = m_random.bounded(-1, size + 1);
        m_naive->moving = true;
        m_model->move(from, to);
        m_naive->moving = false;
        if (m_naive->move(from, to)) {
            m_stored = m_naive->enabledList;
            m_userHasChosen = true;
        }
        return QStringLiteral("move %1 %2").arg(from).arg(to);
    }
    if (kind < 580) {
        const bool show = RandomSteps::chance(&m_random, 50);
        m_model->setShowPotential(show);
        m_naive->setShowPotential(show);
        return QStringLiteral("show potential %1").arg(show);
    }
    if (kind < 660) {
        const QStringList list = randomList();
        m_stored = list;
        MGConfItem(enabledKey).set(list);
        return QStringLiteral("list ") + list.join(QLatin1Char(' '));
    }
    if (kind < 670) {
        m_stored = QVariant();
        MGConfItem(enabledKey).unset();
        return QStringLiteral("no list");
    }
    if (kind < 740) {
        const QStringList list = randomList().mid(0, 2);
        MGConfItem(blockedKey).set(list);
        return QStringLiteral("block ") + list.join(QLatin1Char(' '));
    }
    if (kind < 760) {
        MGConfItem(blockedKey).unset();
        return QStringLiteral("block nothing");
    }
    if (kind < 880) {
        changeFile(path);
        waitForReload();
        return QStringLiteral("write ") + path;
    }
    if (kind < 950) {
        if (QFile::remove(path)) {
            waitForReload();
        }
        return QStringLiteral("remove ") + path;
    }
    if (kind < 955) {
        Files::remove(directory);
        waitForReload();
        Files::makeDirectory(directory);
        waitForReload();
        return QStringLiteral("another directory");
    }
    if (kind < 958) {
        const QStringList list = randomList();
        const bool changes = m_stored != QVariant(list);
        DconfTool::waitUntilStored();
        DconfTool::write(enabledKey,
                         list.isEmpty() ? QByteArray("@as []")
                                        : "['" + list.join(QStringLiteral("','")).toUtf8() + "']");
        m_stored = list;
        const auto isKnown = [&] { return m_naive->enabledList == list; };
        if (changes && !QTest::qWaitFor(isKnown, patience)) {
            QTest::qFail("the change of another process is not seen", __FILE__, __LINE__);
        }
        return QStringLiteral("another process: list ") + list.join(QLatin1Char(' '));
    }
    if (kind < 980) {
        makeModels(m_naive->showPotential);
        return QStringLiteral("new models");
    }
    MGConfItem(userKey).unset();
    m_userHasChosen = false;
    return QStringLiteral("no choice of the user");
}

// Empty if the models agree.
QString TestRandomActions::difference()
{
    const auto lines = [](const QStringList &list) { return list.join(QStringLiteral(", ")); };
    if (m_events != m_naive->events) {
        return QStringLiteral("signals: %1\nexpected: %2")
            .arg(lines(m_events), lines(m_naive->events));
    }
    if (m_model->count() != m_naive->rows.size()) {
        return QStringLiteral("%1 rows instead of %2")
            .arg(m_model->count())
            .arg(m_naive->rows.size());
    }
    for (int row = 0; row < m_model->count(); ++row) {
        if (m_model->get(row) != m_naive->shown(row)) {
            QString text;
            QDebug(&text) << row << m_model->get(row) << "expected:" << m_naive->shown(row);
            return text;
        }
    }
    if (m_model->showPotential() != m_naive->showPotential) {
        return QStringLiteral("showPotential");
    }
    const QVariant stored = MGConfItem(enabledKey).value();
    if (stored != m_stored || m_naive->enabledList != m_stored.toStringList()) {
        QString text;
        QDebug(&text) << "stored:" << stored << "expected:" << m_stored
                      << "read by the naive model:" << m_naive->enabledList;
        return text;
    }
    if (MGConfItem(userKey).value().toBool() != m_userHasChosen) {
        return QStringLiteral("the note that the user has chosen");
    }
    QStringList expected;
    for (; m_naive->warnings > 0; --m_naive->warnings) {
        expected.append(QStringLiteral("Unable to open action file"));
    }
    const QStringList messages = m_log->takeTexts();
    if (messages != expected) {
        return QStringLiteral("%1 instead of %2 messages: %3")
            .arg(messages.size())
            .arg(expected.size())
            .arg(lines(messages));
    }
    m_events.clear();
    m_naive->events.clear();
    return {};
}

void TestRandomActions::steps_data()
{
    RandomSteps::addRows();
}

void TestRandomActions::steps()
{
    QFETCH(quint32, seed);
    QFETCH(bool, busy);
    const auto load = busy ? std::make_unique<RandomSteps::BusyMachine>() : nullptr;
    Files::remove(directory);
    Files::makeDirectory(directory);
    for (const QString &key : {enabledKey, blockedKey, userKey}) {
        MGConfItem(key).unset();
    }
    m_stored = QVariant();
    m_userHasChosen = false;
    m_random.seed(seed);
    m_log = std::make_unique<MessageLog>();
    makeModels(false);

    QStringList done;
    for (int i = 0; i < RandomSteps::count() && !QTest::currentTestFailed(); ++i) {
        done.append(step());
        QCoreApplication::processEvents();
        const QString different = difference();
        if (!different.isEmpty()) {
            QFAIL(qPrintable(RandomSteps::report(different, done)));
        }
    }
    m_model.reset();
    m_naive.reset();
    m_log.reset();
}

QTEST_GUILESS_MAIN(TestRandomActions)

#include "tst_randomactions.moc"
