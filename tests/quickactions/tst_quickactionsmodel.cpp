// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "dconftool.h"
#include "files.h"
#include "listmodeltest.h"
#include "mgconfitem.h"
#include "quickactions/quickactionsmodel.h"
#include "texts.h"
#include "words.h"

#include <QRegularExpression>
#include <QtTest>

using Model = QuickActionsModel;
using Answer = std::function<void()>;
using Connect = std::function<void(Model *, const Answer &)>;
Q_DECLARE_METATYPE(Answer)
Q_DECLARE_METATYPE(Connect)

namespace {

const QString directory = "/usr/share/glimmera/quickactions"_s;
const QString enabledKey = "/desktop/glimmera-marlo-home/events_screen_actions"_s;
const QString blockedKey = "/desktop/glimmera-marlo-home/blocked_actions"_s;
const QString userKey = "/desktop/glimmera-marlo-home/events_screen_actions_user"_s;

const QString unreadableWarning = "warning [default] Unable to open action file"_s;

// The path of the definition of this name; a path stays as it is.
QString path(const QString &name)
{
    return name.startsWith(QLatin1Char('/')) ? name : "%1/%2.conf"_s.arg(directory, name);
}

// The names in a text, separated by blanks, as paths, and back.
QStringList paths(const QString &names)
{
    QStringList paths;
    for (const QString &name : words(names)) {
        paths.append(path(name));
    }
    return paths;
}

QString names(const QStringList &paths)
{
    QStringList names;
    for (const QString &path : paths) {
        names.append(QFileInfo(path).completeBaseName());
    }
    return names.join(QLatin1Char(' '));
}

void add(const QString &names, const QByteArray &content = "title=x\n")
{
    for (const QString &path : paths(names)) {
        Files::write(path, content);
    }
}

void setEnabled(const QString &names)
{
    MGConfItem(enabledKey).set(paths(names));
}

void setBlocked(const QString &names)
{
    MGConfItem(blockedKey).set(paths(names));
}

QString enabledInDconf()
{
    return names(MGConfItem(enabledKey).value().toStringList());
}

bool userHasChosen()
{
    return MGConfItem(userKey).value() == QVariant(true);
}

} // namespace

class TestQuickActionsModel : public ListModelTest
{
    Q_OBJECT

public:
    TestQuickActionsModel() : ListModelTest(directory, ".conf"_s) { }

private Q_SLOTS:
    void init();

    // Which actions have a row, and where
    void isEmptyUntilComplete();
    void listsActions_data();
    void listsActions();
    void followsTheEnabledList_data();
    void followsTheEnabledList();
    void followsTheBlockedList();
    void followsOtherProcesses();
    void listsOfOtherTypes_data();
    void listsOfOtherTypes();
    void showPotentialChanges();
    void ordersByPriority_data();
    void ordersByPriority();

    // What a row shows
    void roles();
    void titles();
    void titlesOfCatalogs();
    void catalogsOfARowChangeWithIt();
    void changedCatalogIsAdded();
    void languageChangesMayChangeTheModel();
    void get();
    void getWithInvalidIndex();
    void dataOutside();

    // The user's choices
    void choices_data();
    void choices();
    void rowTurnsWithShowPotential();
    void choosesBeforeCompletion();
    void move_data();
    void move();
    void moveOutside_data();
    void moveOutside();
    void moveIsNotReloaded();
    void requestsDuringAMove_data();
    void requestsDuringAMove();

    // Definition files
    void firstChangeStartsTheDelay();
    void reloadsAccumulate();
    void changedDefinition();
    void entryGetsItsRowWithItsDefinition();
    void irregularDefinitionsAreListed();
    void definitionFilter();

    // Re-entrant calls
    void handlersMayCallBack_data();
    void handlersMayCallBack();
    void showPotentialSetInAHandler();
    void requestsInHandlersLoadOnce();
    void choicesInHandlersKeepTheirOrder();

private:
    void makeModel(bool showPotential = false);
    void loadModel(bool showPotential = false);
    // Adds and enables these actions and loads a model.
    void loadEnabled(const QString &enabled);
    QVariant data(int row, Model::Role role) const;

    void loadEverything() override { loadModel(true); }
    void removeModel() override { m_model.reset(); }
    QString rowsOf(const QAbstractListModel &model) const override;
    QByteArray definition(const QString &name, const QByteArray &catalog) const override;
    QStringList newMessages() override;

    std::unique_ptr<QuickActionsModel> m_model;
};

void TestQuickActionsModel::init()
{
    for (const QString &key : {enabledKey, blockedKey, userKey}) {
        MGConfItem(key).unset();
    }
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
    add(enabled);
    setEnabled(enabled);
    loadModel();
}

QVariant TestQuickActionsModel::data(int row, Model::Role role) const
{
    return m_model->data(m_model->index(row), role);
}

QString TestQuickActionsModel::rowsOf(const QAbstractListModel &model) const
{
    QStringList paths;
    for (int row = 0; row < model.rowCount(); ++row) {
        paths.append(model.data(model.index(row), Model::PathRole).toString());
    }
    return names(paths);
}

QByteArray TestQuickActionsModel::definition(const QString &, const QByteArray &catalog) const
{
    return "title=maps-title\ntranslation-catalog=" + catalog + '\n';
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
    add("a"_s);
    setEnabled("a"_s);
    makeModel();
    m_model->setShowPotential(true);
    m_model->setShowPotential(false);
    setEnabled(QString());
    setEnabled("a"_s);
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
    QTest::newRow("in the user's order") << false << "c a"
                                         << ""
                                         << "c a";
    QTest::newRow("repeated entries") << false << "a a b"
                                      << ""
                                      << "a b";
    QTest::newRow("entries without a definition") << false << "missing a more c /etc/passwd"
                                                  << ""
                                                  << "a c";
    QTest::newRow("blocked") << false << "a b"
                             << "a"
                             << "b";
    QTest::newRow("all, without enabled ones") << true << ""
                                               << ""
                                               << "a b c";
    QTest::newRow("all, enabled ones first") << true << "c b"
                                             << ""
                                             << "c b a";
    QTest::newRow("all but a blocked one") << true << "a b"
                                           << "a"
                                           << "b c";
}

void TestQuickActionsModel::listsActions()
{
    QFETCH(bool, showPotential);
    QFETCH(QString, enabled);
    QFETCH(QString, blocked);
    add("a b c"_s);
    setEnabled(enabled);
    setBlocked(blocked);
    loadModel(showPotential);
    QTEST(rows(), "rows");
    for (int row = 0; row < m_model->count(); ++row) {
        const QString path = data(row, Model::PathRole).toString();
        QCOMPARE(data(row, Model::EnabledRole), QVariant(paths(enabled).contains(path)));
    }
}

void TestQuickActionsModel::followsTheEnabledList_data()
{
    QTest::addColumn<QString>("before");
    QTest::addColumn<QString>("after");
    QTest::addColumn<QString>("rows");
    QTest::addColumn<QString>("events");
    QTest::newRow("one more") << "a"
                              << "a b"
                              << "a b"
                              << "inserted 1, count";
    QTest::newRow("above") << "c"
                           << "a b c"
                           << "a b c"
                           << "inserted 0, inserted 1, count";
    QTest::newRow("between") << "a c"
                             << "a b c"
                             << "a b c"
                             << "inserted 1, count";
    QTest::newRow("behind a repeated one") << "a a"
                                           << "a a b"
                                           << "a b"
                                           << "inserted 1, count";
    QTest::newRow("one less") << "a b"
                              << "b"
                              << "b"
                              << "removed 0, count";
    QTest::newRow("none") << "a b c"
                          << ""
                          << ""
                          << "removed 0, removed 0, removed 0, count";
    QTest::newRow("another one") << "a"
                                 << "b"
                                 << "b"
                                 << "removed 0, inserted 0";
    QTest::newRow("another order") << "a b"
                                   << "b a"
                                   << "a b"
                                   << "";
}

void TestQuickActionsModel::followsTheEnabledList()
{
    QFETCH(QString, before);
    QFETCH(QString, after);
    add("a b c"_s);
    setEnabled(before);
    loadModel();
    setEnabled(after);
    QTEST(rows(), "rows");
    QTEST(events(), "events");
    MGConfItem(enabledKey).unset();
    QCOMPARE(m_model->count(), 0);
}

void TestQuickActionsModel::followsTheBlockedList()
{
    loadEnabled("a b"_s);
    setBlocked("a"_s);
    QCOMPARE(rows(), "b"_s);
    setBlocked(QString());
    QCOMPARE(rows(), "a b"_s);
    QCOMPARE(events(), "removed 0, count, inserted 0, count"_s);
}

void TestQuickActionsModel::followsOtherProcesses()
{
    add("a"_s);
    loadModel();
    DconfTool::waitUntilStored();
    DconfTool::write(enabledKey, paths("a"_s));
    QTRY_COMPARE(rows(), "a"_s);
    DconfTool::write(blockedKey, paths("a"_s));
    QTRY_COMPARE(m_model->count(), 0);
}

void TestQuickActionsModel::listsOfOtherTypes_data()
{
    QTest::addColumn<QByteArray>("value");
    for (const char *value : {"7", "true", "{'a': <1>}", "[<1>, <2>]", "'a'"}) {
        QTest::newRow(value) << QByteArray(value);
    }
}

void TestQuickActionsModel::listsOfOtherTypes()
{
    QFETCH(QByteArray, value);
    add("a"_s);
    DconfTool::waitUntilStored();
    for (const QString &key : {enabledKey, blockedKey}) {
        DconfTool::write(key, value);
        QTRY_VERIFY(MGConfItem(key).value().isValid());
    }
    loadModel();
    QCOMPARE(m_model->count(), 0);
    m_model->setShowPotential(true);
    QCOMPARE(rows(), "a"_s);
    QCOMPARE(data(0, Model::EnabledRole), QVariant(false));
}

void TestQuickActionsModel::showPotentialChanges()
{
    add("b"_s);
    loadEnabled("a"_s);
    QVERIFY(!m_model->showPotential());
    m_model->setShowPotential(true);
    QVERIFY(m_model->showPotential());
    // The signal comes after the rows.
    QCOMPARE(events(), "inserted 1, count, potential"_s);
    m_model->setShowPotential(true);
    QCOMPARE(events(), QString());
    m_model->setShowPotential(false);
    QCOMPARE(rows(), "a"_s);
    QCOMPARE(events(), "removed 1, count, potential"_s);
}

void TestQuickActionsModel::ordersByPriority_data()
{
    using Priorities = QByteArrayList;
    QTest::addColumn<Priorities>("priorities");
    QTest::addColumn<QByteArray>("priority");
    QTest::addColumn<int>("row");
    const Priorities usual{"0", "10", "10", "20"};
    const auto row = [](const char *name, const Priorities &priorities, const char *priority,
                        int row) {
        QTest::newRow(name) << priorities << QByteArray(priority) << row;
    };
    row("lowest", usual, "0", 1);
    row("equal", usual, "10", 3);
    row("between", usual, "15", 3);
    row("highest", usual, "30", 4);
    row("none", usual, "", 4);
    row("negative", usual, "-1", 4);
    row("no integer", usual, "high", 4);
    row("beyond 32 bits", usual, "99999999999", 4);
    row("above an enabled row without a priority", {"", ""}, "5", 0);
    row("below a negative priority", {"-3", "10"}, "5", 1);
}

// The first row is enabled. The new action is not enabled, and gets its row once it is unblocked.
void TestQuickActionsModel::ordersByPriority()
{
    QFETCH(QByteArrayList, priorities);
    QFETCH(QByteArray, priority);
    const QStringList rowNames = words("a b c d").mid(0, priorities.size());
    for (int i = 0; i < priorities.size(); ++i) {
        add(rowNames.at(i), "priority=" + priorities.at(i) + '\n');
    }
    add("new"_s, "priority=" + priority + '\n');
    setEnabled("a"_s);
    setBlocked("new"_s);
    loadModel(true);
    QCOMPARE(rows(), rowNames.join(QLatin1Char(' ')));
    setBlocked(QString());
    QTEST(int(rows().split(QLatin1Char(' ')).indexOf("new"_s)), "row");
}

void TestQuickActionsModel::roles()
{
    const QHash<int, QByteArray> expected{{0, "title"}, {1, "icon"}, {2, "path"}, {3, "enabled"}};
    QCOMPARE(QuickActionsModel().roleNames(), expected);
}

void TestQuickActionsModel::titles()
{
    add("a"_s, "title=maps-title\n");
    add("b"_s, "title=\n");
    add("c"_s, "title=one, two\n");
    add("d"_s, "title=\"no such, identifier\"\nicon=i\n");
    loadModel(true);
    QCOMPARE(data(0, Model::TitleRole), QVariant("maps-title"_s));
    QVERIFY(!data(1, Model::TitleRole).isValid());
    QVERIFY(!data(2, Model::TitleRole).isValid());
    QCOMPARE(data(3, Model::TitleRole), QVariant("no such, identifier"_s));
    QVERIFY(!data(0, Model::IconRole).isValid());
    QCOMPARE(data(3, Model::IconRole), QVariant("i"_s));
}

void TestQuickActionsModel::titlesOfCatalogs()
{
    add("a"_s, "title=maps-title\ntranslation-catalog=maps\n");
    add("b"_s, "title=maps-english\ntranslation-catalog=maps\n");
    loadModel(true);
    QCOMPARE(data(0, Model::TitleRole), QVariant("Kartat"_s));
    QCOMPARE(data(1, Model::TitleRole), QVariant("Maps, English only"_s));
    QCOMPARE(m_model->findChildren<QTranslator *>().size(), 2);
}

void TestQuickActionsModel::catalogsOfARowChangeWithIt()
{
    add("a b"_s, "translation-catalog=maps\n");
    loadModel();
    QStringList texts;
    const auto note = [&] { texts.append(qtTrId("maps-title")); };
    connect(m_model.get(), &Model::rowsAboutToBeInserted, this, note);
    connect(m_model.get(), &Model::rowsInserted, this, note);
    connect(m_model.get(), &Model::rowsAboutToBeRemoved, this, note);
    connect(m_model.get(), &Model::rowsRemoved, this, note);
    setEnabled("a"_s);
    QCOMPARE(texts, words("maps-title Kartat"));
    // The catalog stays until its last row goes.
    setEnabled("a b"_s);
    setEnabled("b"_s);
    QCOMPARE(texts.mid(2), words("Kartat Kartat Kartat Kartat"));
    setEnabled(QString());
    QCOMPARE(texts.mid(6), words("Kartat maps-title"));
}

void TestQuickActionsModel::changedCatalogIsAdded()
{
    add("a"_s, "title=maps-title\ntranslation-catalog=maps\n");
    setEnabled("a"_s);
    loadModel();
    add("a"_s, "title=maps-title\ntranslation-catalog=atlas\n");
    // The later catalog takes precedence, and has no Finnish.
    QTRY_COMPARE(data(0, Model::TitleRole), QVariant("Atlas"_s));
    // The row's current catalog is removed together with the row. The earlier catalog is kept.
    setEnabled(QString());
    QCOMPARE(qtTrId("maps-title"), "Kartat"_s);
}

void TestQuickActionsModel::languageChangesMayChangeTheModel()
{
    add("a"_s, "title=maps-english\ntranslation-catalog=maps\n");
    add("b"_s, "title=maps-title\ntranslation-catalog=atlas\n");
    makeModel(true);
    Model *model = m_model.get();
    const LanguageListener listener([&] {
        for (int row = 0; row < model->rowCount(); ++row) {
            model->data(model->index(row), Model::TitleRole);
        }
        model->setShowPotential(!model->showPotential());
        model->setShowPotential(!model->showPotential());
    });
    // Language changes come in the middle of an insertion and in the destructor of the model.
    m_model->componentComplete();
    QCOMPARE(listener.count, 3);
    QCOMPARE(rows(), "a b"_s);
    removeModel();
    QVERIFY(listener.count > 3);
}

void TestQuickActionsModel::get()
{
    add("a"_s, "title=maps-title\nicon=i\ntranslation-catalog=maps\n");
    setEnabled("a"_s);
    loadModel();
    const QVariantMap expected{
        {"title"_s, "Kartat"_s}, {"icon"_s, "i"_s}, {"path"_s, path("a"_s)}, {"enabled"_s, true}};
    QCOMPARE(m_model->get(0), expected);
}

void TestQuickActionsModel::getWithInvalidIndex()
{
    loadEnabled("a"_s);
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
    for (const int role : {4, -1, int(Qt::UserRole)}) {
        QVERIFY(!m_model->data(m_model->index(0), role).isValid());
    }
    QVERIFY(!m_model->data(QModelIndex(), 0).isValid());
    // rowCount() ignores its parent.
    QCOMPARE(m_model->rowCount(m_model->index(0)), 1);
}

void TestQuickActionsModel::choices_data()
{
    QTest::addColumn<QString>("before");
    QTest::addColumn<QByteArray>("method");
    QTest::addColumn<QString>("list");
    QTest::addColumn<QString>("rows");
    const QByteArray enable("enableAction");
    const QByteArray disable("disableAction");
    QTest::newRow("enable") << "b" << enable << "b a"
                            << "b a";
    QTest::newRow("enable again") << "a b" << enable << "a b a"
                                  << "a b";
    QTest::newRow("disable what is enabled twice") << "a b a" << disable << "b"
                                                   << "b";
    QTest::newRow("disable the last one") << "a" << disable << ""
                                          << "";
    QTest::newRow("disable what is not enabled") << "b" << disable << "b"
                                                 << "b";
}

// Enables or disables the action "a".
void TestQuickActionsModel::choices()
{
    QFETCH(QString, before);
    QFETCH(QByteArray, method);
    QFETCH(QString, list);
    add("a b"_s);
    setEnabled(before);
    loadModel();
    QVERIFY(!userHasChosen());
    const MGConfItem user(userKey);
    QString listThen;
    connect(&user, &MGConfItem::valueChanged, this, [&] { listThen = enabledInDconf(); });
    QVERIFY(
        QMetaObject::invokeMethod(m_model.get(), method.constData(), Q_ARG(QString, path("a"_s))));
    QCOMPARE(enabledInDconf(), list);
    QTEST(rows(), "rows");
    // The list is written before the note that the user has changed it.
    QVERIFY(userHasChosen());
    QCOMPARE(listThen, list);
}

void TestQuickActionsModel::rowTurnsWithShowPotential()
{
    add("a b"_s);
    setEnabled("a b"_s);
    loadModel(true);
    for (const bool enabled : {false, true}) {
        if (enabled) {
            m_model->enableAction(path("a"_s));
        } else {
            m_model->disableAction(path("a"_s));
        }
        QCOMPARE(rows(), "a b"_s);
        QCOMPARE(data(0, Model::EnabledRole), QVariant(enabled));
        QCOMPARE(events(), "changed 0"_s);
    }
}

void TestQuickActionsModel::choosesBeforeCompletion()
{
    add("a b"_s);
    setEnabled("a"_s);
    makeModel();
    m_model->enableAction(path("b"_s));
    QCOMPARE(enabledInDconf(), "a b"_s);
    QCOMPARE(m_model->count(), 0);
    m_model->componentComplete();
    QCOMPARE(rows(), "a b"_s);
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
    add("a b c d"_s);
    setEnabled(before);
    loadModel();
    m_model->move(from, to);
    QTEST(rows(), "rows");
    QTEST(enabledInDconf(), "list");
    QTEST(events(), "events");
    QVERIFY(userHasChosen());
    // Another model shows the stored list in the same order.
    QuickActionsModel other;
    other.componentComplete();
    QTEST(rowsOf(other), "rows");
}

void TestQuickActionsModel::moveOutside_data()
{
    QTest::addColumn<int>("from");
    QTest::addColumn<int>("to");
    QTest::newRow("negative from") << -1 << 0;
    QTest::newRow("negative to") << 0 << -1;
    QTest::newRow("from beyond the list") << 2 << 0;
    QTest::newRow("to beyond the list, within the rows") << 0 << 2;
}

void TestQuickActionsModel::moveOutside()
{
    QFETCH(int, from);
    QFETCH(int, to);
    add("a b c"_s);
    setEnabled("a b"_s);
    loadModel(true);
    m_model->move(from, to);
    QCOMPARE(rows(), "a b c"_s);
    QCOMPARE(enabledInDconf(), "a b"_s);
    QVERIFY(!userHasChosen());
}

void TestQuickActionsModel::moveIsNotReloaded()
{
    loadEnabled("a b"_s);
    // A reload would notice the changed file.
    add("a"_s, "title=changed\n");
    m_model->move(0, 1);
    QCoreApplication::processEvents();
    QCOMPARE(events(), "moved 0 1"_s);
    setEnabled("b a a"_s);
    QCOMPARE(events(), "changed 1"_s);
    // Rows that stay keep their places; move() uses the indexes of the list.
    setEnabled("a b"_s);
    QCOMPARE(rows(), "b a"_s);
    m_model->move(0, 1);
    QCOMPARE(rows(), "a b"_s);
    QCOMPARE(enabledInDconf(), "b a"_s);
}

void TestQuickActionsModel::requestsDuringAMove_data()
{
    // Whether the handler is connected to the row's signal or to the change of the key.
    QTest::addColumn<bool>("ofTheRow");
    QTest::addColumn<Answer>("answer");
    QTest::addColumn<QString>("rowsAtOnce");
    QTest::addColumn<QString>("rows");
    QTest::addColumn<QString>("list");
    QTest::newRow("another move") << true << Answer([this] { m_model->move(1, 2); }) << "b a c"
                                  << "b c a"
                                  << "b c a";
    QTest::newRow("an empty list") << true << Answer([this] {
        for (const QString &path : paths("a b c"_s)) {
            m_model->disableAction(path);
        }
    }) << "b a c"
                                   << ""
                                   << "";
    QTest::newRow("another choice and a move") << false << Answer([this] {
        m_model->enableAction(path("d"_s));
        m_model->move(0, 3);
    }) << "b a c"
                                               << "a c d b"
                                               << "a c d b";
    QTest::newRow("a choice of somebody else") << false << Answer([] { setEnabled("b"_s); }) << "b"
                                               << "b"
                                               << "b";
    QTest::newRow("the blocked list") << false << Answer([] { setBlocked("a"_s); }) << "b a c"
                                      << "b c"
                                      << "b a c";
}

void TestQuickActionsModel::requestsDuringAMove()
{
    QFETCH(bool, ofTheRow);
    QFETCH(Answer, answer);
    QFETCH(QString, list);
    add("d"_s);
    loadEnabled("a b c"_s);
    const MGConfItem follower(enabledKey);
    if (ofTheRow) {
        once(m_model.get(), &Model::rowsAboutToBeMoved, answer);
    } else {
        once(&follower, &MGConfItem::valueChanged, answer);
    }
    m_model->move(0, 1);
    QTEST(rows(), "rowsAtOnce");
    QTRY_COMPARE(enabledInDconf(), list);
    QCoreApplication::processEvents();
    QTEST(rows(), "rows");
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
    add("a"_s);
    QTRY_VERIFY(timer->isActive());
    QTRY_VERIFY(timer->remainingTime() < 59500);
    // A later change does not restart the timer.
    add("b"_s);
    QTest::qWait(50);
    QVERIFY(timer->isActive());
    QVERIFY(timer->remainingTime() < 59500);
    QCOMPARE(events(), QString());
    timer->setInterval(0);
    QTRY_COMPARE(rows(), "a b"_s);
}

void TestQuickActionsModel::reloadsAccumulate()
{
    writeBroken();
    loadModel(true);
    QCOMPARE(takeMessages(), QStringList(unreadableWarning));
    for (int count = 1; count <= 3; ++count) {
        add(QString::number(count));
        add("a"_s);
        QTRY_COMPARE(messages().size(), count);
        waitForNothing();
        QCOMPARE(takeMessages().size(), count);
    }
}

void TestQuickActionsModel::changedDefinition()
{
    add("a b"_s, "icon=old\n");
    loadModel(true);
    add("a"_s, "icon=changed\n");
    QTRY_COMPARE(data(0, Model::IconRole), QVariant("changed"_s));
    QCOMPARE(events(), "changed 0"_s);
}

void TestQuickActionsModel::entryGetsItsRowWithItsDefinition()
{
    loadEnabled("a b"_s);
    setEnabled("later a b"_s);
    QCOMPARE(rows(), "a b"_s);
    add("later"_s);
    QTRY_COMPARE(rows(), "later a b"_s);
}

void TestQuickActionsModel::irregularDefinitionsAreListed()
{
    add("broken"_s, "title=x\n[remote-arguments\n");
    Files::makeDirectory(path("directory"_s));
    Files::makePipe(inDirectory("pipe"_s));
    Files::makeLink(inDirectory("pipe"_s), path("link"_s));
    add("a"_s);
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

void TestQuickActionsModel::handlersMayCallBack_data()
{
    QTest::addColumn<Connect>("connectTo");
    const auto row = [](const char *name, auto signal) {
        QTest::newRow(name) << Connect([signal](Model *model, const Answer &answer) {
            connect(model, signal, model, answer);
        });
    };
    row("rowsAboutToBeInserted", &Model::rowsAboutToBeInserted);
    row("rowsInserted", &Model::rowsInserted);
    row("rowsAboutToBeRemoved", &Model::rowsAboutToBeRemoved);
    row("rowsRemoved", &Model::rowsRemoved);
    row("rowsAboutToBeMoved", &Model::rowsAboutToBeMoved);
    row("rowsMoved", &Model::rowsMoved);
    row("dataChanged", &Model::dataChanged);
    row("countChanged", &Model::countChanged);
    row("showPotentialChanged", &Model::showPotentialChanged);
}

void TestQuickActionsModel::handlersMayCallBack()
{
    QFETCH(Connect, connectTo);
    add("c"_s);
    loadEnabled("a b"_s);
    Model *model = m_model.get();
    int answers = 0;
    connectTo(model, [&] {
        // Everything that a page can request, once for each of the first few signals.
        if (++answers > 3) {
            return;
        }
        if (model->count() > 0) {
            model->get(0);
        }
        model->disableAction(path("a"_s));
        model->enableAction(path("c"_s));
        model->setShowPotential(!model->showPotential());
        model->move(0, 1);
        setBlocked("b"_s);
        model->enableAction(path("a"_s));
        setBlocked(QString());
    });
    model->move(0, 1);
    model->setShowPotential(true);
    model->disableAction(path("b"_s));
    model->setShowPotential(false);
    model->enableAction(path("b"_s));
    QTRY_VERIFY(answers > 0);
    // In the end, the rows match the list.
    const auto sorted = [](const QString &names) {
        QStringList list = words(names);
        list.removeDuplicates();
        list.sort();
        return list;
    };
    QTRY_COMPARE(sorted(rows()),
                 sorted(enabledInDconf() + (model->showPotential() ? " a b c"_s : QString())));
}

void TestQuickActionsModel::showPotentialSetInAHandler()
{
    add("b c"_s);
    loadEnabled("a"_s);
    connect(m_model.get(), &Model::rowsInserted, this, [&] {
        m_model->setShowPotential(true);
        // The property already has the new value.
        QVERIFY(m_model->showPotential());
    });
    setEnabled("a b"_s);
    QCOMPARE(events(), "inserted 1, count"_s);
    // The signal is emitted once, after those of the rows.
    QTRY_COMPARE(rows(), "a b c"_s);
    QCoreApplication::processEvents();
    QCOMPARE(events(), "inserted 2, count, potential"_s);
}

void TestQuickActionsModel::requestsInHandlersLoadOnce()
{
    // Each load of a definition that cannot be read gives a warning.
    constexpr int count = 50;
    writeBroken();
    for (int i = 0; i < count; ++i) {
        add(QString::number(i));
    }
    makeModel(true);
    QSignalSpy inserted(m_model.get(), &Model::rowsInserted);
    QSignalSpy changed(m_model.get(), &Model::showPotentialChanged);
    connect(m_model.get(), &Model::rowsInserted, this, [&] {
        for (int i = 0; i < 2; ++i) {
            m_model->setShowPotential(!m_model->showPotential());
            setBlocked("unknown"_s);
            setBlocked(QString());
            setEnabled("unknown"_s);
            setEnabled(QString());
        }
    });
    m_model->componentComplete();
    QCOMPARE(inserted.size(), count + 1);
    QTRY_COMPARE(changed.size(), 1);
    QTest::qWait(50);
    QCOMPARE(inserted.size(), count + 1);
    QCOMPARE(changed.size(), 1);
    // One load of each kind: for the blocked list, for the enabled list and for the property.
    QCOMPARE(takeMessages().size(), 1 + 3);
}

void TestQuickActionsModel::choicesInHandlersKeepTheirOrder()
{
    add("b c d"_s);
    loadEnabled("a"_s);
    once(m_model.get(), &Model::rowsInserted, [&] {
        m_model->enableAction(path("c"_s));
        m_model->move(0, 2);
        m_model->disableAction(path("c"_s));
        m_model->enableAction(path("c"_s));
        m_model->enableAction(path("c"_s));
        // Stored by another process after the requests: nothing is lost.
        setEnabled("a b d"_s);
    });
    setEnabled("a b"_s);
    QTRY_COMPARE(enabledInDconf(), "b d a c c"_s);
    QCOMPARE(rows(), "b d a c"_s);
}

QTEST_GUILESS_MAIN(TestQuickActionsModel)

#include "tst_quickactionsmodel.moc"
