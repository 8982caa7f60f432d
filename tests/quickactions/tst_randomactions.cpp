// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "files.h"
#include "mgconfitem.h"
#include "naivecatalogs.h"
#include "places.h"
#include "quickactions/quickactionsmodel.h"
#include "randommodeltest.h"
#include "texts.h"
#include "words.h"

#include <QDir>
#include <QSettings>
#include <QtTest>

#include <algorithm>
#include <optional>

namespace {

struct Action {
    QString path;
    QVariantMap config;
    bool enabled = false;

    bool operator!=(const Action &other) const
    {
        return path != other.path || config != other.config || enabled != other.enabled;
    }
    QString title() const { return config.value("title"_s).toString(); }
    QString catalog() const { return config.value("translation-catalog"_s).toString(); }
    std::optional<int> priority() const
    {
        bool isInteger = false;
        const int priority = config.value("priority"_s).toString().toInt(&isInteger);
        return isInteger ? std::make_optional(priority) : std::nullopt;
    }
};

class NaiveActions : public NaiveRows<Action>
{
public:
    NaiveActions()
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

    void setShowPotential(bool show)
    {
        if (showPotential != show) {
            showPotential = show;
            load();
            events.append("potential"_s);
        }
    }

    void load()
    {
        const int countBefore = rows.size();
        QStringList selected;
        const QStringList names = QDir(Places::quickActions).entryList({"*.conf"_s});
        for (const QString &name : names) {
            const QString path = Places::quickActions + QLatin1Char('/') + name;
            if ((showPotential || enabledList.contains(path)) && !m_blockedList.contains(path)) {
                selected.append(path);
            }
        }
        const QList<Action> removed = removeAllBut(selected);
        for (const Action &action : removed) {
            m_catalogs.remove(action.path, action.catalog());
        }
        // Any order is correct. This one is: actions with a row, other enabled actions, all other
        // actions.
        QStringList order;
        for (const Action &action : qAsConst(rows)) {
            order.append(action.path);
        }
        order += enabledList + selected;
        order.removeDuplicates();
        for (const QString &path : qAsConst(order)) {
            if (selected.contains(path)) {
                addOrUpdate({path, read(path), enabledList.contains(path)});
            }
        }
        if (rows.size() != countBefore) {
            events.append("count"_s);
        }
    }

    // False for an index outside the list. The model writes the list, and the caller records the
    // write.
    bool move(int index, int newIndex)
    {
        const int size = enabledList.size();
        if (index < 0 || newIndex < 0 || index >= size || newIndex >= size) {
            return false;
        }
        if (index != newIndex && index < rows.size() && newIndex < rows.size()) {
            rows.move(index, newIndex);
            events.append("moved %1 %2"_s.arg(index).arg(newIndex));
        }
        enabledList.move(index, newIndex);
        return true;
    }

    QVariantList shown(int row) const override
    {
        const Action &action = rows.at(row);
        const QVariant title =
            action.title().isEmpty() ? QVariant() : QVariant(m_catalogs.text(action.title()));
        return {title, action.config.value("icon"_s), action.path, action.enabled};
    }

    bool showPotential = false;
    bool moving = false;

private:
    void readEnabled() { enabledList = m_enabledItem.value().toStringList(); }
    void readBlocked() { m_blockedList = m_blockedItem.value().toStringList(); }

    QVariantMap read(const QString &path)
    {
        // QSettings reports a broken file only when it reads it for the first time.
        QFile file(path);
        if (file.open(QIODevice::ReadOnly) && file.readAll().contains("[broken")) {
            warnings.append("Unable to open action file"_s);
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

    void addOrUpdate(const Action &action)
    {
        const int row = find(action.path);
        if (row < 0) {
            m_catalogs.add(action.path, action.catalog());
            insert(insertionIndex(action), action);
        } else if (rows.at(row) != action) {
            if (rows.at(row).catalog() != action.catalog()) {
                m_catalogs.add(action.path, action.catalog());
            }
            change(row, action);
        }
    }

    int insertionIndex(const Action &action) const
    {
        if (action.enabled) {
            QStringList before = enabledList.mid(0, enabledList.indexOf(action.path));
            before.removeDuplicates();
            return int(std::count_if(before.cbegin(), before.cend(),
                                     [this](const QString &path) { return find(path) >= 0; }));
        }
        if (action.priority().value_or(-1) < 0) {
            return rows.size();
        }
        for (int row = 0; row < rows.size(); ++row) {
            const std::optional<int> priority = rows.at(row).priority();
            if (!priority || *priority > *action.priority()) {
                return row;
            }
        }
        return rows.size();
    }

    MGConfItem m_enabledItem{Places::enabledActions};
    MGConfItem m_blockedItem{Places::blockedActions};
    QStringList m_blockedList;
    NaiveCatalogs m_catalogs;
};

} // namespace

class TestRandomActions : public RandomModelTest
{
    Q_OBJECT

public:
    TestRandomActions();

private:
    void reset() override;
    void makeModels() override;
    void removeModels() override;
    QAbstractListModel *model() const override { return m_model.get(); }
    NaiveModel *naive() const override { return m_naive.get(); }
    QString step() override;
    QString difference() override;
    void changeFile(const QString &path);

    QStringList m_paths;
    std::unique_ptr<NaiveActions> m_naive;
    std::unique_ptr<QuickActionsModel> m_model;
    bool m_userHasChosen = false;
};

TestRandomActions::TestRandomActions()
    : RandomModelTest(Places::quickActions, Places::enabledActions, "Action")
{
    for (const QString &name : words("a b c D e f g h")) {
        m_paths.append("%1/%2.conf"_s.arg(Places::quickActions, name));
    }
}

void TestRandomActions::reset()
{
    MGConfItem(Places::blockedActions).unset();
    MGConfItem(Places::userActions).unset();
    m_userHasChosen = false;
}

void TestRandomActions::makeModels()
{
    const bool showPotential = m_naive != nullptr && m_naive->showPotential;
    removeModels();
    m_reloads = 0;
    m_model = std::make_unique<QuickActionsModel>();
    m_naive = std::make_unique<NaiveActions>();
    // The delay itself has tests of its own.
    auto *timer = m_model->findChild<QTimer *>();
    timer->setInterval(0);
    connect(timer, &QTimer::timeout, m_naive.get(), [this] {
        // The model loads once more for every earlier timeout, on purpose.
        ++m_reloads;
        for (int i = 0; i < m_reloads; ++i) {
            m_naive->load();
        }
    });
    m_model->setShowPotential(showPotential);
    m_naive->showPotential = showPotential;
    m_events = std::make_unique<RowEvents>(m_model.get());
    m_events->record(m_model.get(), &QuickActionsModel::countChanged, "count"_s);
    m_events->record(m_model.get(), &QuickActionsModel::showPotentialChanged, "potential"_s);
    m_model->componentComplete();
    m_naive->load();
}

void TestRandomActions::removeModels()
{
    m_model.reset();
    m_naive.reset();
}

void TestRandomActions::changeFile(const QString &path)
{
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

QString TestRandomActions::step()
{
    const QString path = anyOf(m_paths);
    const int kind = m_random.bounded(1000);
    if (kind < 300) {
        m_userHasChosen = true;
        return choose(kind < 150 ? "enable" : "disable", path);
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
        return "move %1 %2"_s.arg(from).arg(to);
    }
    if (kind < 580) {
        const bool show = chance(50);
        m_model->setShowPotential(show);
        m_naive->setShowPotential(show);
        return "show potential %1"_s.arg(show);
    }
    if (kind < 660) {
        return store(listOf(m_paths, 7));
    }
    if (kind < 670) {
        return storeNothing();
    }
    if (kind < 740) {
        const QStringList list = listOf(m_paths, 3);
        MGConfItem(Places::blockedActions).set(list);
        return "block "_s + list.join(QLatin1Char(' '));
    }
    if (kind < 760) {
        MGConfItem(Places::blockedActions).unset();
        return "block nothing"_s;
    }
    if (kind < 880) {
        changeFile(path);
        waitForReload();
        return "write "_s + path;
    }
    if (kind < 950) {
        if (QFile::remove(path)) {
            waitForReload();
        }
        return "remove "_s + path;
    }
    if (kind < 955) {
        Files::remove(m_directory);
        waitForReload();
        Files::makeDirectory(m_directory);
        waitForReload();
        return "another directory"_s;
    }
    if (kind < 958) {
        return storeInAnotherProcess(listOf(m_paths, 7));
    }
    if (kind < 980) {
        makeModels();
        return "new models"_s;
    }
    MGConfItem(Places::userActions).unset();
    m_userHasChosen = false;
    return "no choice of the user"_s;
}

QString TestRandomActions::difference()
{
    if (m_model->showPotential() != m_naive->showPotential) {
        return "showPotential"_s;
    }
    if (m_naive->enabledList != m_stored.toStringList()) {
        return "the list that the naive model read: "_s + m_naive->enabledList.join(" "_s);
    }
    if (MGConfItem(Places::userActions).value().toBool() != m_userHasChosen) {
        return "the note that the user has chosen"_s;
    }
    return RandomModelTest::difference();
}

QTEST_GUILESS_MAIN(TestRandomActions)

#include "tst_randomactions.moc"
