// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "dconftool.h"
#include "files.h"
#include "listmodeltest.h"
#include "mgconfitem.h"
#include "openings.h"
#include "patience.h"
#include "places.h"
#include "quickactions/quickactionsmodel.h"
#include "texts.h"
#include "words.h"

#include <QRegularExpression>
#include <QtTest>

using Model = QuickActionsModel;
using Answer = std::function<void()>;
Q_DECLARE_METATYPE(Answer)

namespace {

const QString unreadableWarning = "warning [default] Unable to open action file"_s;

bool userHasChosen()
{
    return MGConfItem(Places::userActions).value() == QVariant(true);
}

} // namespace

class TestQuickActionsModel : public ListModelTest
{
    Q_OBJECT

public:
    TestQuickActionsModel()
        : ListModelTest(Places::quickActions, ".conf"_s, Places::enabledActions, "Action")
    {
    }

private Q_SLOTS:
    void init();

    // tst_randomactions compares rows, signals and the stored list after any changes.

    // Which actions have a row, and where
    void isEmptyUntilComplete();
    void listsActions_data();
    void listsActions();
    void listsOfOtherTypes();

    // What a row shows
    void roles();
    void titles();
    void get();
    void dataOutside();
    void catalogsOfARowChangeWithIt();

    // The user's choices
    void choicesAreNoted();
    void move_data();
    void move();
    void moveBeforeCompletion();
    void moveIsNotReloaded();
    void requestsDuringAMove_data();
    void requestsDuringAMove();

    // Definition files
    void firstChangeStartsTheDelay();
    void reloadsAccumulate();
    void reloadsOfUnchangedFiles();
    void irregularDefinitionsAreListed();
    void definitionFilter();

    // Re-entrant calls
    void showPotentialSetInAHandler();
    void movesWaitForTheRows();
    void moveFollowsTheStoredList();
    void moveFollowsAChoiceInAHandler();

private:
    void makeModel(bool showPotential);
    void loadModel(bool showPotential = false);
    // Defines and enables these actions and loads a model.
    void loadEnabled(const QString &enabled);
    void add(const QString &name, const QByteArray &content) const;
    void setBlocked(const QString &names) const;
    QVariant data(int row, Model::Role role) const;

    void makeModel() override { makeModel(true); }
    void removeModel() override { m_model.reset(); }
    void complete() override { m_model->componentComplete(); }
    void reload() override;
    QByteArray definition(const QString &name, const QByteArray &catalog) const override;
    QString path(const QString &name) const override;
    QStringList newMessages() override;

    std::unique_ptr<QuickActionsModel> m_model;
};

void TestQuickActionsModel::init()
{
    MGConfItem(Places::blockedActions).unset();
    MGConfItem(Places::userActions).unset();
    ListModelTest::init();
}

void TestQuickActionsModel::makeModel(bool showPotential)
{
    m_model = std::make_unique<QuickActionsModel>();
    watch(m_model.get());
    record(m_model.get(), &Model::countChanged, "count"_s);
    record(m_model.get(), &Model::showPotentialChanged, "potential"_s);
    m_model->classBegin();
    m_model->setShowPotential(showPotential);
}

void TestQuickActionsModel::loadModel(bool showPotential)
{
    makeModel(showPotential);
    m_model->componentComplete();
    events();
}

void TestQuickActionsModel::loadEnabled(const QString &enabled)
{
    define(enabled);
    store(enabled);
    loadModel();
}

void TestQuickActionsModel::reload()
{
    QVERIFY(QMetaObject::invokeMethod(m_watched, "loadActions"));
}

void TestQuickActionsModel::add(const QString &name, const QByteArray &content) const
{
    Files::write(path(name), content);
}

void TestQuickActionsModel::setBlocked(const QString &names) const
{
    MGConfItem(Places::blockedActions).set(paths(names));
}

QVariant TestQuickActionsModel::data(int row, Model::Role role) const
{
    return m_model->data(m_model->index(row), role);
}

QByteArray TestQuickActionsModel::definition(const QString &, const QByteArray &catalog) const
{
    return "title=maps-title\ntranslation-catalog=" + catalog + '\n';
}

QString TestQuickActionsModel::path(const QString &name) const
{
    return inDirectory(name + ".conf"_s);
}

QStringList TestQuickActionsModel::newMessages()
{
    // The only expected complaint of the model tester: rowCount() ignores its parent on purpose.
    static const QRegularExpression complaint(
        QLatin1Char('^')
        + QRegularExpression::escape("warning [qt.modeltest] FAIL! "
                                     "childIndex.isValid() () returned FALSE"_s));
    return m_log->takeLinesWithout(complaint);
}

void TestQuickActionsModel::isEmptyUntilComplete()
{
    define("a"_s);
    store("a"_s);
    makeModel(false);
    m_model->setShowPotential(true);
    m_model->setShowPotential(false);
    store(QString());
    store("a"_s);
    setBlocked("b"_s);
    QCOMPARE(m_model->count(), 0);
    QCOMPARE(events(), "potential, potential"_s);

    m_model->componentComplete();
    QCOMPARE(m_model->count(), 1);
    QCOMPARE(m_model->rowCount(), 1);
    QCOMPARE(events(), "inserted 0, count"_s);
}

void TestQuickActionsModel::listsActions_data()
{
    QTest::addColumn<bool>("showPotential");
    QTest::addColumn<QString>("enabled");
    QTest::addColumn<QString>("blocked");
    QTest::addColumn<QString>("rows");
    const auto row = [](const char *name, bool showPotential, const char *enabled,
                        const char *blocked, const char *rows) {
        QTest::newRow(name) << showPotential << enabled << blocked << rows;
    };
    row("in the user's order", false, "c a", "", "c a");
    row("repeated entries", false, "a a b", "", "a b");
    row("entries without a definition", false, "missing a more c ../../../../etc/passwd", "",
        "a c");
    row("blocked", false, "a b", "a", "b");
    row("all, without enabled ones", true, "", "", "a b c");
    row("all, enabled ones first", true, "c b", "", "c b a");
    row("all but a blocked one", true, "a b", "a", "b c");
}

void TestQuickActionsModel::listsActions()
{
    QFETCH(bool, showPotential);
    QFETCH(QString, enabled);
    QFETCH(QString, blocked);
    define("a b c"_s);
    store(enabled);
    setBlocked(blocked);
    loadModel(showPotential);
    QTEST(rows(), "rows");
    for (int row = 0; row < m_model->count(); ++row) {
        const QString path = data(row, Model::PathRole).toString();
        QCOMPARE(data(row, Model::EnabledRole), QVariant(paths(enabled).contains(path)));
    }
}

void TestQuickActionsModel::listsOfOtherTypes()
{
    define("a"_s);
    for (const QByteArray value : {"7", "true", "{'a': <1>}", "[<1>, <2>]", "'a'"}) {
        for (const QString &key : {Places::enabledActions, Places::blockedActions}) {
            MGConfItem(key).unset();
            DconfTool::waitUntilStored();
            DconfTool::write(key, value);
            TRY(MGConfItem(key).value().isValid());
        }
        loadModel();
        QVERIFY2(rows().isEmpty(), value.constData());
        m_model->setShowPotential(true);
        QCOMPARE(rows(), "a"_s);
        QCOMPARE(enabledRows(), QString());
    }
}

void TestQuickActionsModel::roles()
{
    const QHash<int, QByteArray> expected{{0, "title"}, {1, "icon"}, {2, "path"}, {3, "enabled"}};
    QCOMPARE(QuickActionsModel().roleNames(), expected);
}

void TestQuickActionsModel::titles()
{
    add("a"_s, "title=maps-title\ntranslation-catalog=maps\n");
    add("b"_s, "title=maps-english\n");
    add("c"_s, "title=\n");
    add("d"_s, "title=one, two\n");
    add("e"_s, "title=\"no such, identifier\"\nicon=i\n");
    loadModel(true);
    const QVariantList expected{"Kartat"_s, "Maps, English only"_s, QVariant(), QVariant(),
                                "no such, identifier"_s};
    for (int row = 0; row < 5; ++row) {
        QCOMPARE(data(row, Model::TitleRole), expected.at(row));
        QCOMPARE(data(row, Model::IconRole), row == 4 ? QVariant("i"_s) : QVariant());
    }
    QCOMPARE(m_model->findChildren<QTranslator *>().size(), 2);
}

void TestQuickActionsModel::get()
{
    add("a"_s, "title=maps-title\nicon=i\ntranslation-catalog=maps\n");
    store("a"_s);
    loadModel();
    const QVariantMap expected{
        {"title"_s, "Kartat"_s}, {"icon"_s, "i"_s}, {"path"_s, path("a"_s)}, {"enabled"_s, true}};
    QCOMPARE(m_model->get(0), expected);
    for (const int index : {-1, 1}) {
        QCOMPARE(m_model->get(index), QVariantMap());
        QCOMPARE(takeMessages(),
                 QStringList("info [default] <Unknown File>: QML QuickActionsModel: "
                             "get() called with invalid index: %1"_s.arg(index)));
    }
}

void TestQuickActionsModel::dataOutside()
{
    loadEnabled("a"_s);
    QCOMPARE(m_model->data(m_model->index(0)), QVariant("maps-title"_s));
    for (const int role : {4, -1, int(Qt::UserRole)}) {
        QVERIFY(!m_model->data(m_model->index(0), role).isValid());
    }
    QVERIFY(!m_model->data(QModelIndex(), 0).isValid());
    // rowCount() ignores its parent.
    QCOMPARE(m_model->rowCount(m_model->index(0)), 1);
}

void TestQuickActionsModel::catalogsOfARowChangeWithIt()
{
    define("a b"_s, "maps");
    loadModel();
    QStringList texts;
    const auto note = [&] { texts.append(qtTrId("maps-title")); };
    connect(m_model.get(), &Model::rowsAboutToBeInserted, this, note);
    connect(m_model.get(), &Model::rowsInserted, this, note);
    connect(m_model.get(), &Model::rowsAboutToBeRemoved, this, note);
    connect(m_model.get(), &Model::rowsRemoved, this, note);
    store("a"_s);
    QCOMPARE(texts, words("maps-title Kartat"));
    // The catalog stays until its last row goes.
    store("a b"_s);
    store("b"_s);
    QCOMPARE(texts.mid(2), words("Kartat Kartat Kartat Kartat"));
    store(QString());
    QCOMPARE(texts.mid(6), words("Kartat maps-title"));
    // A changed row has the texts of its new catalog when views learn of it.
    store("a"_s);
    QString changed;
    once(m_model.get(), &Model::dataChanged, [&] { changed = qtTrId("maps-title"); });
    define("a"_s, "atlas");
    reload();
    QCOMPARE(changed, "Atlas"_s);
}

void TestQuickActionsModel::choicesAreNoted()
{
    loadEnabled("a"_s);
    const MGConfItem user(Places::userActions);
    QString listThen;
    connect(&user, &MGConfItem::valueChanged, this, [&] { listThen = stored(); });
    const auto check = [&](const char *verb, const QString &list) {
        MGConfItem(Places::userActions).unset();
        choose(verb, "b"_s);
        // The list is written before the note that the user has changed it.
        QVERIFY(userHasChosen());
        QCOMPARE(listThen, list);
    };
    check("enable", "a b"_s);
    check("disable", "a"_s);
}

void TestQuickActionsModel::move_data()
{
    QTest::addColumn<QString>("before");
    QTest::addColumn<int>("from");
    QTest::addColumn<int>("to");
    QTest::addColumn<QString>("list");
    QTest::addColumn<QString>("rows");
    QTest::addColumn<QString>("events");
    const auto row = [](const char *name, const char *before, int from, int to, const char *list,
                        const char *rows, const char *events) {
        QTest::newRow(name) << before << from << to << list << rows << events;
    };
    row("down", "a b c d", 0, 2, "b c a d", "b c a d", "moved 0 2");
    row("down by one", "a b c d", 1, 2, "a c b d", "a c b d", "moved 1 2");
    row("to the end", "a b c d", 0, 3, "b c d a", "b c d a", "moved 0 3");
    row("up", "a b c d", 2, 0, "c a b d", "c a b d", "moved 2 0");
    row("up by one", "a b c d", 3, 2, "a b d c", "a b d c", "moved 3 2");
    row("to its own place", "a b", 1, 1, "a b", "a b", "");
    row("from beyond the rows", "a b missing", 2, 0, "missing a b", "a b", "");
    row("to beyond the rows", "missing a b", 0, 2, "a b missing", "a b", "");
}

void TestQuickActionsModel::move()
{
    QFETCH(QString, before);
    QFETCH(int, from);
    QFETCH(int, to);
    define("a b c d"_s);
    store(before);
    loadModel();
    m_model->move(from, to);
    QTEST(rows(), "rows");
    QTEST(stored(), "list");
    QTEST(events(), "events");
    QVERIFY(userHasChosen());
    // Another model shows the stored list in the same order.
    QuickActionsModel other;
    other.componentComplete();
    QTEST(rowsOf(other), "rows");
}

void TestQuickActionsModel::moveBeforeCompletion()
{
    store("a b"_s);
    makeModel(false);
    m_model->move(0, 1);
    QCOMPARE(stored(), "b a"_s);
}

void TestQuickActionsModel::moveIsNotReloaded()
{
    loadEnabled("a b"_s);
    // A reload would notice the changed file.
    add("a"_s, "title=changed\n");
    m_model->move(0, 1);
    QCoreApplication::processEvents();
    QCOMPARE(events(), "moved 0 1"_s);
    store("b a a"_s);
    QCOMPARE(events(), "changed 1"_s);
}

void TestQuickActionsModel::requestsDuringAMove_data()
{
    // Whether the handler is connected to the row's signal or to the change of the key.
    QTest::addColumn<bool>("ofTheRow");
    QTest::addColumn<Answer>("answer");
    QTest::addColumn<QString>("rowsAtOnce");
    QTest::addColumn<QString>("rows");
    QTest::addColumn<QString>("list");
    const auto row = [](const char *name, bool ofTheRow, const Answer &answer,
                        const char *rowsAtOnce, const char *rows, const char *list) {
        QTest::newRow(name) << ofTheRow << answer << rowsAtOnce << rows << list;
    };
    row(
        "another move", true, [this] { m_model->move(1, 2); }, "b a c", "b c a", "b c a");
    // The handler's list is not overwritten by the move of the list before.
    row(
        "a choice in the announcement", true, [this] { choose("disable", "a"_s); }, "b c", "b c",
        "b c");
    row(
        "a choice", false, [this] { choose("enable", "d"_s); }, "b a c d", "b a c d", "b a c d");
    row(
        "a choice and a move", false,
        [this] {
            choose("enable", "d"_s);
            m_model->move(0, 3);
        },
        "b a c d", "a c d b", "a c d b");
    row(
        "a choice of somebody else", false, [this] { store("b"_s); }, "b", "b", "b");
    row(
        "the blocked list", false, [this] { setBlocked("a"_s); }, "b a c", "b c", "b a c");
}

void TestQuickActionsModel::requestsDuringAMove()
{
    QFETCH(bool, ofTheRow);
    QFETCH(Answer, answer);
    QFETCH(QString, list);
    define("d"_s);
    loadEnabled("a b c"_s);
    const MGConfItem follower(Places::enabledActions);
    if (ofTheRow) {
        once(m_model.get(), &Model::rowsAboutToBeMoved, answer);
    } else {
        once(&follower, &MGConfItem::valueChanged, answer);
    }
    m_model->move(0, 1);
    QTEST(rows(), "rowsAtOnce");
    TRY_COMPARE(stored(), list);
    QCoreApplication::processEvents();
    QTEST(rows(), "rows");
    // The rows and the list still agree, so a later move is the same in both.
    const QString before = rows();
    if (before == list && before.contains(QLatin1Char(' '))) {
        m_model->move(0, 1);
        QCOMPARE(rows(), stored());
        QVERIFY(rows() != before);
    }
}

void TestQuickActionsModel::firstChangeStartsTheDelay()
{
    loadModel(true);
    auto *timer = m_model->findChild<QTimer *>();
    QVERIFY(timer != nullptr);
    QCOMPARE(timer->interval(), 1000);
    QVERIFY(timer->isSingleShot());
    QVERIFY(!timer->isActive());

    // Long enough for a busy machine.
    timer->setInterval(60000);
    define("a"_s);
    TRY(timer->isActive());
    TRY(timer->remainingTime() < 59500);
    // A later change does not restart the timer.
    define("b"_s);
    QTest::qWait(50);
    QVERIFY(timer->isActive());
    QVERIFY(timer->remainingTime() < 59500);
    QCOMPARE(events(), QString());
    timer->setInterval(0);
    TRY_COMPARE(rows(), "a b"_s);
}

void TestQuickActionsModel::reloadsAccumulate()
{
    writeBroken();
    loadModel(true);
    QCOMPARE(takeMessages(), QStringList(unreadableWarning));
    for (int count = 1; count <= 3; ++count) {
        define(QString::number(count));
        define("a"_s);
        TRY_COMPARE(messages().size(), count);
        waitForNothing();
        QCOMPARE(takeMessages().size(), count);
    }
}

void TestQuickActionsModel::reloadsOfUnchangedFiles()
{
    add("a"_s, "icon=old\n");
    add("b"_s, "icon=b\n");
    writeBroken();
    loadModel(true);
    QCOMPARE(takeMessages(), QStringList(unreadableWarning));
    const Openings openings(path("a"_s));
    reload();
    QVERIFY(!openings.take());
    QCOMPARE(events(), QString());
    // A file that cannot be read is tried, and reported, each time.
    QCOMPARE(takeMessages(), QStringList(unreadableWarning));

    add("a"_s, "icon=changed\n");
    reload();
    QCOMPARE(events(), "changed 0"_s);
    QCOMPARE(data(0, Model::IconRole), QVariant("changed"_s));
    // A choice applies to a record that is not read again.
    choose("enable", "b"_s);
    QCOMPARE(events(), "changed 1"_s);
    QCOMPARE(enabledRows(), "b"_s);
    takeMessages();
}

void TestQuickActionsModel::irregularDefinitionsAreListed()
{
    add("broken"_s, "title=x\n[remote-arguments\n");
    Files::makeDirectory(path("directory"_s));
    Files::makePipe(inDirectory("pipe"_s));
    Files::makeLink(inDirectory("pipe"_s), path("link"_s));
    define("a"_s);
    loadModel(true);
    QCOMPARE(rows(), "a broken directory link"_s);
    QVERIFY(!data(1, Model::TitleRole).isValid());
    QCOMPARE(takeMessages(),
             QStringList({unreadableWarning, unreadableWarning, unreadableWarning}));
}

void TestQuickActionsModel::definitionFilter()
{
    for (const QString &name : words("A.CONF a.conf.orig .hidden.conf below/b.conf")) {
        Files::write(inDirectory(name), "title=x\n");
    }
    loadModel(true);
    QCOMPARE(rows(), "A"_s);
}

void TestQuickActionsModel::showPotentialSetInAHandler()
{
    define("b c"_s);
    loadEnabled("a"_s);
    connect(m_model.get(), &Model::rowsInserted, this, [&] {
        m_model->setShowPotential(true);
        // The property already has the new value.
        QVERIFY(m_model->showPotential());
    });
    store("a b"_s);
    QCOMPARE(events(), "inserted 1, count"_s);
    // The signal is emitted once, after those of the rows.
    TRY_COMPARE(rows(), "a b c"_s);
    QCoreApplication::processEvents();
    QCOMPARE(events(), "inserted 2, count, potential"_s);
}

// A move uses the same index in the rows and in the list, so it waits until the rows are complete.
void TestQuickActionsModel::movesWaitForTheRows()
{
    define("b c"_s);
    loadEnabled("a"_s);
    once(m_model.get(), &Model::rowsInserted, [this] {
        m_model->move(0, 2);
        m_model->move(0, 1);
        // Stored later than the requests, but before they are carried out.
        store("a b c"_s);
    });
    store("a b"_s);
    QCOMPARE(rows(), "a b"_s);
    TRY_COMPARE(rows(), "c b a"_s);
    QCOMPARE(stored(), "c b a"_s);
}

void TestQuickActionsModel::moveFollowsTheStoredList()
{
    loadEnabled("a b"_s);
    define("c"_s);
    DconfTool::waitUntilStored();
    // The model has not been notified when the row is moved.
    DconfTool::write(Places::enabledActions, paths("c a b"_s));
    m_model->move(2, 0);
    QCOMPARE(rows(), "b c a"_s);
    QCOMPARE(stored(), "b c a"_s);
}

void TestQuickActionsModel::moveFollowsAChoiceInAHandler()
{
    loadEnabled("a b"_s);
    define("c d"_s);
    DconfTool::waitUntilStored();
    DconfTool::write(Places::enabledActions, paths("a b c"_s));
    // The row of "c" is inserted for the move.
    once(m_model.get(), &Model::rowsInserted, [this] { choose("enable", "d"_s); });
    m_model->move(0, 1);
    QCOMPARE(rows(), "b a c d"_s);
    QCOMPARE(stored(), "b a c d"_s);

    // A handler that stores another list each time prevents the move, but the call returns.
    m_model->setShowPotential(true);
    connect(m_model.get(), &Model::dataChanged, this,
            [this] { choose(words(stored()).contains("b"_s) ? "disable" : "enable", "b"_s); });
    DconfTool::waitUntilStored();
    DconfTool::write(Places::enabledActions, paths("a c d"_s));
    m_model->move(0, 1);
    QCOMPARE(rows(), "b a c d"_s);
    QCOMPARE(stored(), "a c d b"_s);
}

QTEST_GUILESS_MAIN(TestQuickActionsModel)

#include "tst_quickactionsmodel.moc"
