// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "dconftool.h"
#include "files.h"
#include "messagelog.h"
#include "mgconfitem.h"
#include "quickactions/quickactionsmodel.h"

#include <QAbstractItemModelTester>
#include <QRegularExpression>
#include <QtTest>

class TestQuickActionsModel : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void roles();
    void isEmptyUntilComplete();
    void listsEnabledActionsInOrder();
    void listsEveryActionWithShowPotential();
    void showPotentialChanges();
    void neverListsBlockedActions();
    void followsTheBlockedList();
    void followsTheEnabledList();
    void followsOtherProcesses();
    void rowsFollowTheListWhateverTheOrder();
    void repeatedEntriesCountOnce();
    void missingDefinitionsHaveNoRow();

    void ordersByPriority_data();
    void ordersByPriority();
    void priorityStopsAtRowsWithout();
    void equalPrioritiesKeepTheirOrder();

    void titles();
    void titlesOfCatalogs();
    void sharedCatalogStaysUntilTheLastActionGoes();
    void changedCatalogIsAdded();
    void catalogsGoWithTheModel();
    void languageChangesMayAskTheModel();

    void get();
    void getWithInvalidIndex();
    void dataOutside();

    void enable();
    void enableTwiceDisableOnce();
    void disable();
    void rowTurnsWithShowPotential();
    void choosesBeforeCompletion();

    void move_data();
    void move();
    void moveOutside_data();
    void moveOutside();
    void moveToItsOwnPlace();
    void moveBeyondTheRows();
    void moveIsNotReloaded();
    void moveDuringAMove();
    void otherChoiceDuringAMove();
    void choiceOfSomebodyElseDuringAMove();

    void reloadsOneSecondAfterAChange();
    void reloadsAccumulate();
    void followsDirectoryMadeLater();
    void followsDirectoryMadeAgain();
    void changedDefinition();
    void rewrittenInPlace();
    void otherFilesAreIgnored();
    void unreadableDefinitionIsListed();
    void directoriesAndPipesAmongTheDefinitions();
    void otherFilesAreNoDefinitions();

    void countOfASwap();
    void rowsGoOneByOne();
    void negativePriorityStopsNothing();
    void definitionFilterIgnoresCase();
    void blockedListDuringAMove();
    void orderOfSomebodyElse();
    void moveAnsweredByShorteningTheList();
    void firstChangeStartsTheDelay();
    void writesTheListBeforeTheUserKey();
    void catalogsOfARowChangeWithIt();

    void handlersMayCallBack_data();
    void handlersMayCallBack();
    void showPotentialSetInAHandler();
    void requestsInHandlersLoadOnce();
    void choicesInHandlersKeepTheirOrder();
    void listsOfOtherTypes_data();
    void listsOfOtherTypes();

private:
    // A model with the tester attached before anything changes.
    QuickActionsModel *makeModel(bool showPotential = false);
    QuickActionsModel *loadedModel(bool showPotential = false);
    static QString path(const char *name);
    static QString add(const char *name, const QByteArray &content = "title=x\n");
    static QStringList names(const QAbstractItemModel *model);
    static QStringList enabledInDconf();
    static void setEnabled(const QStringList &paths);
    static void setBlocked(const QStringList &paths);
    QStringList takeMessages();

    std::unique_ptr<MessageLog> m_log;
    std::unique_ptr<QuickActionsModel> m_model;
    std::unique_ptr<QAbstractItemModelTester> m_tester;
};

namespace {

const QString directory = QStringLiteral("/usr/share/glimmera/quickactions");
const QString enabledKey = QStringLiteral("/desktop/glimmera-marlo-home/events_screen_actions");
const QString blockedKey = QStringLiteral("/desktop/glimmera-marlo-home/blocked_actions");
const QString userKey = QStringLiteral("/desktop/glimmera-marlo-home/events_screen_actions_user");

QStringList list(std::initializer_list<const char *> names)
{
    QStringList strings;
    for (const char *name : names) {
        strings.append(QString::fromLatin1(name));
    }
    return strings;
}

bool userHasChosen()
{
    return MGConfItem(userKey).value() == QVariant(true);
}

// Longer than the delay of a reload, to show that something does not happen.
constexpr int longEnough = 1500;

} // namespace

QuickActionsModel *TestQuickActionsModel::makeModel(bool showPotential)
{
    m_model = std::make_unique<QuickActionsModel>();
    m_tester = std::make_unique<QAbstractItemModelTester>(
        m_model.get(), QAbstractItemModelTester::FailureReportingMode::Warning);
    m_model->classBegin();
    m_model->setShowPotential(showPotential);
    return m_model.get();
}

QuickActionsModel *TestQuickActionsModel::loadedModel(bool showPotential)
{
    QuickActionsModel *model = makeModel(showPotential);
    model->componentComplete();
    return model;
}

QString TestQuickActionsModel::path(const char *name)
{
    return directory + QLatin1Char('/') + QString::fromLatin1(name) + QStringLiteral(".conf");
}

QString TestQuickActionsModel::add(const char *name, const QByteArray &content)
{
    Files::write(path(name), content);
    return path(name);
}

QStringList TestQuickActionsModel::names(const QAbstractItemModel *model)
{
    QStringList names;
    for (int row = 0; row < model->rowCount(); ++row) {
        const QVariant path = model->data(model->index(row, 0), 2);
        names.append(QFileInfo(path.toString()).completeBaseName());
    }
    return names;
}

QStringList TestQuickActionsModel::enabledInDconf()
{
    QStringList names;
    const QStringList paths = MGConfItem(enabledKey).value().toStringList();
    for (const QString &path : paths) {
        names.append(QFileInfo(path).completeBaseName());
    }
    return names;
}

void TestQuickActionsModel::setEnabled(const QStringList &paths)
{
    MGConfItem(enabledKey).set(paths);
}

void TestQuickActionsModel::setBlocked(const QStringList &paths)
{
    MGConfItem(blockedKey).set(paths);
}

QStringList TestQuickActionsModel::takeMessages()
{
    // The only expected complaint: rowCount() ignores its parent on purpose.
    const QString complaint =
        QStringLiteral("warning [qt.modeltest] FAIL! childIndex.isValid() () returned FALSE");
    return m_log->takeLinesWithout(
        QRegularExpression(QLatin1Char('^') + QRegularExpression::escape(complaint)));
}

void TestQuickActionsModel::init()
{
    Files::remove(directory);
    Files::makeDirectory(directory);
    for (const auto *name : {"maps_eng_en", "maps-fi", "maps-de", "atlas_eng_en"}) {
        Files::installCatalog(QString::fromLatin1(name));
    }
    QLocale::setDefault(QLocale(QStringLiteral("fi_FI")));
    MGConfItem(enabledKey).unset();
    MGConfItem(blockedKey).unset();
    MGConfItem(userKey).unset();
    m_log = std::make_unique<MessageLog>();
}

void TestQuickActionsModel::cleanup()
{
    m_tester.reset();
    m_model.reset();
    QCOMPARE(takeMessages(), QStringList());
    m_log.reset();
}

void TestQuickActionsModel::roles()
{
    const QuickActionsModel model;
    const QHash<int, QByteArray> expected{{0, "title"}, {1, "icon"}, {2, "path"}, {3, "enabled"}};
    QCOMPARE(model.roleNames(), expected);
}

void TestQuickActionsModel::isEmptyUntilComplete()
{
    const QString a = add("a");
    setEnabled({a});
    QuickActionsModel *model = makeModel();
    QSignalSpy count(model, &QuickActionsModel::countChanged);
    QCOMPARE(model->count(), 0);
    model->setShowPotential(true);
    model->setShowPotential(false);
    setEnabled({});
    setEnabled({a});
    QCOMPARE(model->count(), 0);
    QCOMPARE(count.size(), 0);

    model->componentComplete();
    QCOMPARE(model->count(), 1);
    QCOMPARE(model->rowCount(), 1);
    QCOMPARE(count.size(), 1);
}

void TestQuickActionsModel::listsEnabledActionsInOrder()
{
    const QString a = add("a");
    add("b");
    const QString c = add("c");
    const QString d = add("d");
    setEnabled({d, a, c});
    QCOMPARE(names(loadedModel()), list({"d", "a", "c"}));
    for (int row = 0; row < 3; ++row) {
        QCOMPARE(m_model->data(m_model->index(row), 3), QVariant(true));
    }
}

void TestQuickActionsModel::listsEveryActionWithShowPotential()
{
    add("a");
    const QString b = add("b");
    const QString c = add("c");
    setEnabled({c, b});
    const QuickActionsModel *model = loadedModel(true);
    QCOMPARE(names(model), list({"c", "b", "a"}));
    QCOMPARE(model->data(model->index(1), 3), QVariant(true));
    QCOMPARE(model->data(model->index(2), 3), QVariant(false));
}

void TestQuickActionsModel::showPotentialChanges()
{
    const QString a = add("a");
    add("b");
    setEnabled({a});
    QuickActionsModel *model = loadedModel();
    QSignalSpy changed(model, &QuickActionsModel::showPotentialChanged);
    QSignalSpy count(model, &QuickActionsModel::countChanged);
    QVERIFY(!model->showPotential());

    // The rows have changed when the signal is emitted.
    int rowsThen = -1;
    connect(model, &QuickActionsModel::showPotentialChanged, this,
            [&] { rowsThen = model->count(); });
    model->setShowPotential(true);
    QVERIFY(model->showPotential());
    QCOMPARE(rowsThen, 2);
    QCOMPARE(changed.size(), 1);
    QCOMPARE(count.size(), 1);

    model->setShowPotential(true);
    QCOMPARE(changed.size(), 1);

    model->setShowPotential(false);
    QCOMPARE(names(model), list({"a"}));
    QCOMPARE(changed.size(), 2);
    QCOMPARE(count.size(), 2);
}

void TestQuickActionsModel::neverListsBlockedActions()
{
    const QString a = add("a");
    const QString b = add("b");
    add("c");
    setEnabled({a, b});
    setBlocked({a});
    QCOMPARE(names(loadedModel()), list({"b"}));
    m_model->setShowPotential(true);
    QCOMPARE(names(m_model.get()), list({"b", "c"}));
}

void TestQuickActionsModel::followsTheBlockedList()
{
    const QString a = add("a");
    const QString b = add("b");
    setEnabled({a, b});
    QuickActionsModel *model = loadedModel();
    QSignalSpy count(model, &QuickActionsModel::countChanged);
    setBlocked({a});
    QCOMPARE(names(model), list({"b"}));
    setBlocked({});
    QCOMPARE(names(model), list({"a", "b"}));
    QCOMPARE(count.size(), 2);
}

void TestQuickActionsModel::followsTheEnabledList()
{
    const QString a = add("a");
    const QString b = add("b");
    setEnabled({a});
    QuickActionsModel *model = loadedModel();
    setEnabled({a, b});
    QCOMPARE(names(model), list({"a", "b"}));
    QSignalSpy removed(model, &QAbstractItemModel::rowsRemoved);
    setEnabled({b});
    QCOMPARE(names(model), list({"b"}));
    QCOMPARE(removed.size(), 1);
    MGConfItem(enabledKey).unset();
    QCOMPARE(model->count(), 0);
}

void TestQuickActionsModel::followsOtherProcesses()
{
    const QString a = add("a");
    QuickActionsModel *model = loadedModel();
    const QByteArray onlyA = "['" + a.toUtf8() + "']";
    DconfTool::waitUntilStored();
    DconfTool::write(enabledKey, onlyA);
    QTRY_COMPARE(names(model), list({"a"}));
    DconfTool::write(blockedKey, onlyA);
    QTRY_COMPARE(model->count(), 0);
}

void TestQuickActionsModel::rowsFollowTheListWhateverTheOrder()
{
    const QString a = add("a");
    const QString b = add("b");
    const QString c = add("c");
    setEnabled({c});
    QuickActionsModel *model = loadedModel();
    setEnabled({a, b, c});
    QCOMPARE(names(model), list({"a", "b", "c"}));
    setEnabled({a, c});
    setEnabled({a, b, c});
    QCOMPARE(names(model), list({"a", "b", "c"}));
}

void TestQuickActionsModel::repeatedEntriesCountOnce()
{
    const QString a = add("a");
    const QString b = add("b");
    setEnabled({a, a, b});
    QCOMPARE(names(loadedModel()), list({"a", "b"}));

    setEnabled({a, a});
    setEnabled({a, a, b});
    QCOMPARE(names(m_model.get()), list({"a", "b"}));
}

void TestQuickActionsModel::missingDefinitionsHaveNoRow()
{
    const QString a = add("a");
    const QString c = add("c");
    setEnabled({path("missing"), a, path("missing too"), c, QStringLiteral("/etc/passwd")});
    QCOMPARE(names(loadedModel()), list({"a", "c"}));

    // The entry gets its row as soon as it has a definition.
    const QString missing = add("missing");
    QTRY_COMPARE(names(m_model.get()), list({"missing", "a", "c"}));
}

void TestQuickActionsModel::ordersByPriority_data()
{
    QTest::addColumn<QByteArray>("priority");
    QTest::addColumn<int>("row");
    // Among rows of priorities 0, 10, 10, 20.
    QTest::newRow("lowest") << QByteArray("0") << 1;
    QTest::newRow("equal") << QByteArray("10") << 3;
    QTest::newRow("between") << QByteArray("15") << 3;
    QTest::newRow("highest") << QByteArray("30") << 4;
    QTest::newRow("none") << QByteArray() << 4;
    QTest::newRow("negative") << QByteArray("-1") << 4;
    QTest::newRow("no integer") << QByteArray("high") << 4;
    QTest::newRow("beyond 32 bits") << QByteArray("99999999999") << 4;
}

void TestQuickActionsModel::ordersByPriority()
{
    QFETCH(QByteArray, priority);
    QFETCH(int, row);
    add("b", "priority=0\n");
    add("c", "priority=10\n");
    add("d", "priority=10\n");
    add("e", "priority=20\n");
    setBlocked({path("new")});
    QuickActionsModel *model = loadedModel(true);
    QCOMPARE(names(model), list({"b", "c", "d", "e"}));

    add("new", "priority=" + priority + '\n');
    setBlocked({});
    QCOMPARE(names(model).indexOf(QStringLiteral("new")), row);
}

void TestQuickActionsModel::priorityStopsAtRowsWithout()
{
    const QString enabled = add("enabled");
    add("none");
    add("some", "priority=5\n");
    setEnabled({enabled});
    // An action with a priority goes above the top row, which is enabled and has none.
    QCOMPARE(names(loadedModel(true)), list({"some", "enabled", "none"}));
}

void TestQuickActionsModel::equalPrioritiesKeepTheirOrder()
{
    for (const char *name : {"d", "b", "a", "c"}) {
        add(name);
    }
    QCOMPARE(names(loadedModel(true)), list({"a", "b", "c", "d"}));
}

void TestQuickActionsModel::titles()
{
    add("a", "title=maps-title\n");
    add("b", "title=\n");
    add("c", "title=one, two\n");
    add("d", "title=\"no such, identifier\"\nicon=i\n");
    const QuickActionsModel *model = loadedModel(true);
    const auto title = [model](int row) { return model->data(model->index(row), 0); };
    QCOMPARE(title(0), QVariant(QStringLiteral("maps-title")));
    QVERIFY(!title(1).isValid());
    QVERIFY(!title(2).isValid());
    QCOMPARE(title(3), QVariant(QStringLiteral("no such, identifier")));
    QVERIFY(!model->data(model->index(0), 1).isValid());
    QCOMPARE(model->data(model->index(3), 1), QVariant(QStringLiteral("i")));
}

void TestQuickActionsModel::titlesOfCatalogs()
{
    add("a", "title=maps-title\ntranslation-catalog=maps\n");
    add("b", "title=maps-english\ntranslation-catalog=maps\n");
    const QuickActionsModel *model = loadedModel(true);
    QCOMPARE(model->data(model->index(0), 0), QVariant(QStringLiteral("Kartat")));
    QCOMPARE(model->data(model->index(1), 0), QVariant(QStringLiteral("Maps, English only")));
    QCOMPARE(model->findChildren<QTranslator *>().size(), 2);
}

void TestQuickActionsModel::sharedCatalogStaysUntilTheLastActionGoes()
{
    const QString a = add("a", "translation-catalog=maps\n");
    const QString b = add("b", "translation-catalog=maps\n");
    setEnabled({a, b});
    loadedModel();
    setEnabled({b});
    QCOMPARE(qtTrId("maps-title"), QStringLiteral("Kartat"));
    setEnabled({});
    QCOMPARE(qtTrId("maps-title"), QStringLiteral("maps-title"));
}

void TestQuickActionsModel::changedCatalogIsAdded()
{
    const QString a = add("a", "title=maps-title\ntranslation-catalog=maps\n");
    setEnabled({a});
    const QuickActionsModel *model = loadedModel();
    add("a", "title=maps-title\ntranslation-catalog=atlas\n");
    // The later catalog takes precedence, and has no Finnish.
    QTRY_COMPARE(model->data(model->index(0), 0), QVariant(QStringLiteral("Atlas")));
    // The row's current catalog is removed with it, the earlier one stays.
    setEnabled({});
    QCOMPARE(qtTrId("maps-title"), QStringLiteral("Kartat"));
}

void TestQuickActionsModel::catalogsGoWithTheModel()
{
    add("a", "translation-catalog=maps\n");
    loadedModel(true);
    QCOMPARE(qtTrId("maps-title"), QStringLiteral("Kartat"));
    m_tester.reset();
    m_model.reset();
    QCOMPARE(qtTrId("maps-title"), QStringLiteral("maps-title"));
}

void TestQuickActionsModel::languageChangesMayAskTheModel()
{
    // A catalog with texts causes a language change event when it is installed, in the middle of an
    // insertion, and when it is removed, which happens in the model's destructor too.
    class Reader : public QObject
    {
    public:
        bool eventFilter(QObject *watched, QEvent *event) override
        {
            if (event->type() == QEvent::LanguageChange) {
                ++seen;
                for (int row = 0; row < model->rowCount(); ++row) {
                    texts.append(model->data(model->index(row), 0).toString());
                }
                model->setShowPotential(!model->showPotential());
                model->setShowPotential(!model->showPotential());
            }
            return QObject::eventFilter(watched, event);
        }
        QuickActionsModel *model = nullptr;
        int seen = 0;
        QStringList texts;
    };

    add("a", "title=maps-english\ntranslation-catalog=maps\n");
    add("b", "title=maps-title\ntranslation-catalog=atlas\n");
    Reader reader;
    reader.model = makeModel(true);
    QCoreApplication::instance()->installEventFilter(&reader);
    m_model->componentComplete();
    QCOMPARE(reader.seen, 3);
    QCOMPARE(names(m_model.get()), list({"a", "b"}));
    m_tester.reset();
    m_model.reset();
    QVERIFY(reader.seen > 3);
    QCoreApplication::instance()->removeEventFilter(&reader);
}

void TestQuickActionsModel::get()
{
    const QString a = add("a", "title=maps-title\nicon=i\ntranslation-catalog=maps\n");
    setEnabled({a});
    const QuickActionsModel *model = loadedModel();
    const QVariantMap expected{{QStringLiteral("title"), QStringLiteral("Kartat")},
                               {QStringLiteral("icon"), QStringLiteral("i")},
                               {QStringLiteral("path"), a},
                               {QStringLiteral("enabled"), true}};
    QCOMPARE(model->get(0), expected);
}

void TestQuickActionsModel::getWithInvalidIndex()
{
    add("a");
    const QuickActionsModel *model = loadedModel(true);
    for (const int index : {-1, 1}) {
        QCOMPARE(model->get(index), QVariantMap());
        QCOMPARE(takeMessages(),
                 QStringList(QStringLiteral("info [default] <Unknown File>: QML QuickActionsModel: "
                                            "get() called with invalid index: %1")
                                 .arg(index)));
    }
}

void TestQuickActionsModel::dataOutside()
{
    add("a");
    const QuickActionsModel *model = loadedModel(true);
    QVERIFY(!model->data(model->index(0), 4).isValid());
    QVERIFY(!model->data(model->index(0), -1).isValid());
    QVERIFY(!model->data(model->index(0), Qt::UserRole).isValid());
    QVERIFY(!model->data(QModelIndex(), 0).isValid());
    // With any parent.
    QCOMPARE(model->rowCount(model->index(0)), 1);
}

void TestQuickActionsModel::enable()
{
    const QString a = add("a");
    const QString b = add("b");
    setEnabled({b});
    QuickActionsModel *model = loadedModel();
    QVERIFY(!userHasChosen());
    model->enableAction(a);
    QCOMPARE(enabledInDconf(), list({"b", "a"}));
    QVERIFY(userHasChosen());
    QCOMPARE(names(model), list({"b", "a"}));
}

void TestQuickActionsModel::enableTwiceDisableOnce()
{
    const QString a = add("a");
    const QString b = add("b");
    setEnabled({a, b});
    QuickActionsModel *model = loadedModel();
    model->enableAction(a);
    QCOMPARE(enabledInDconf(), list({"a", "b", "a"}));
    QCOMPARE(names(model), list({"a", "b"}));
    model->disableAction(a);
    QCOMPARE(enabledInDconf(), list({"b"}));
    QCOMPARE(names(model), list({"b"}));
}

void TestQuickActionsModel::disable()
{
    const QString a = add("a");
    setEnabled({a});
    QuickActionsModel *model = loadedModel();
    model->disableAction(path("unknown"));
    QCOMPARE(enabledInDconf(), list({"a"}));
    QVERIFY(userHasChosen());

    MGConfItem(userKey).unset();
    model->disableAction(a);
    QCOMPARE(enabledInDconf(), QStringList());
    QVERIFY(userHasChosen());
    QCOMPARE(model->count(), 0);
}

void TestQuickActionsModel::rowTurnsWithShowPotential()
{
    const QString a = add("a");
    const QString b = add("b");
    setEnabled({a, b});
    QuickActionsModel *model = loadedModel(true);
    QSignalSpy changed(model, &QAbstractItemModel::dataChanged);
    QSignalSpy count(model, &QuickActionsModel::countChanged);
    model->disableAction(a);
    QCOMPARE(names(model), list({"a", "b"}));
    QCOMPARE(model->data(model->index(0), 3), QVariant(false));
    // Only that row, and all of its roles.
    QCOMPARE(changed.size(), 1);
    QCOMPARE(changed.at(0).at(0).toModelIndex(), model->index(0));
    QCOMPARE(changed.at(0).at(1).toModelIndex(), model->index(0));
    QCOMPARE(changed.at(0).at(2).value<QVector<int>>(), QVector<int>());
    QCOMPARE(count.size(), 0);

    model->enableAction(a);
    QCOMPARE(model->data(model->index(0), 3), QVariant(true));
    QCOMPARE(changed.size(), 2);
}

void TestQuickActionsModel::choosesBeforeCompletion()
{
    const QString a = add("a");
    const QString b = add("b");
    setEnabled({a});
    QuickActionsModel *model = makeModel();
    model->enableAction(b);
    QCOMPARE(enabledInDconf(), list({"a", "b"}));
    QCOMPARE(model->count(), 0);
    model->componentComplete();
    QCOMPARE(names(model), list({"a", "b"}));
}

void TestQuickActionsModel::move_data()
{
    QTest::addColumn<int>("from");
    QTest::addColumn<int>("to");
    QTest::addColumn<QStringList>("expected");
    QTest::newRow("down") << 0 << 2 << list({"b", "c", "a", "d"});
    QTest::newRow("down by one") << 1 << 2 << list({"a", "c", "b", "d"});
    QTest::newRow("to the end") << 0 << 3 << list({"b", "c", "d", "a"});
    QTest::newRow("up") << 2 << 0 << list({"c", "a", "b", "d"});
    QTest::newRow("up by one") << 3 << 2 << list({"a", "b", "d", "c"});
}

void TestQuickActionsModel::move()
{
    QFETCH(int, from);
    QFETCH(int, to);
    QFETCH(QStringList, expected);
    setEnabled({add("a"), add("b"), add("c"), add("d")});
    QuickActionsModel *model = loadedModel();
    QSignalSpy moved(model, &QAbstractItemModel::rowsMoved);
    model->move(from, to);
    QCOMPARE(names(model), expected);
    QCOMPARE(enabledInDconf(), expected);
    QVERIFY(userHasChosen());
    QCOMPARE(moved.size(), 1);
    QCOMPARE(moved.at(0).at(1).toInt(), from);
    QCOMPARE(moved.at(0).at(2).toInt(), from);
    QCOMPARE(moved.at(0).at(4).toInt(), to > from ? to + 1 : to);
    // Another model shows the stored list in the same order.
    QuickActionsModel other;
    other.componentComplete();
    QCOMPARE(names(&other), expected);
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
    setEnabled({add("a"), add("b")});
    add("c");
    QuickActionsModel *model = loadedModel(true);
    QCOMPARE(names(model), list({"a", "b", "c"}));
    model->move(from, to);
    QCOMPARE(names(model), list({"a", "b", "c"}));
    QCOMPARE(enabledInDconf(), list({"a", "b"}));
    QVERIFY(!userHasChosen());
}

void TestQuickActionsModel::moveToItsOwnPlace()
{
    setEnabled({add("a"), add("b")});
    QuickActionsModel *model = loadedModel();
    QSignalSpy moved(model, &QAbstractItemModel::rowsMoved);
    model->move(1, 1);
    QCOMPARE(names(model), list({"a", "b"}));
    QCOMPARE(moved.size(), 0);
    QCOMPARE(enabledInDconf(), list({"a", "b"}));
    QVERIFY(userHasChosen());
}

void TestQuickActionsModel::moveBeyondTheRows()
{
    setEnabled({add("a"), add("b"), path("missing")});
    QuickActionsModel *model = loadedModel();
    model->move(2, 0);
    QCOMPARE(names(model), list({"a", "b"}));
    QCOMPARE(enabledInDconf(), list({"missing", "a", "b"}));
    model->move(0, 2);
    QCOMPARE(names(model), list({"a", "b"}));
    QCOMPARE(enabledInDconf(), list({"a", "b", "missing"}));
}

void TestQuickActionsModel::moveIsNotReloaded()
{
    const QString a = add("a");
    const QString b = add("b");
    setEnabled({a, b});
    QuickActionsModel *model = loadedModel();
    add("a", "title=changed\n");
    // A reload would notice the changed file.
    QSignalSpy changed(model, &QAbstractItemModel::dataChanged);
    model->move(0, 1);
    QCOMPARE(changed.size(), 0);
    setEnabled({b, a, a});
    QCOMPARE(changed.size(), 1);
}

void TestQuickActionsModel::moveDuringAMove()
{
    setEnabled({add("a"), add("b"), add("c")});
    QuickActionsModel *model = loadedModel();
    bool answered = false;
    connect(model, &QAbstractItemModel::rowsAboutToBeMoved, this, [&] {
        if (!answered) {
            answered = true;
            model->move(1, 2);
        }
    });
    // One move after the other, and each once.
    model->move(0, 1);
    QVERIFY(answered);
    QCOMPARE(names(model), list({"b", "a", "c"}));
    QTRY_COMPARE(names(model), list({"b", "c", "a"}));
    QCOMPARE(enabledInDconf(), list({"b", "c", "a"}));
}

void TestQuickActionsModel::otherChoiceDuringAMove()
{
    const QString a = add("a");
    const QString b = add("b");
    const QString c = add("c");
    setEnabled({a, b});
    QuickActionsModel *model = loadedModel();
    // A handler of the change calls this model at once.
    const MGConfItem follower(enabledKey);
    bool answered = false;
    connect(&follower, &MGConfItem::valueChanged, this, [&] {
        if (!answered) {
            answered = true;
            model->enableAction(c);
            model->move(0, 2);
        }
    });
    model->move(0, 1);
    QVERIFY(answered);
    QTRY_COMPARE(enabledInDconf(), list({"a", "c", "b"}));
    QTRY_COMPARE(names(model), list({"a", "c", "b"}));
}

void TestQuickActionsModel::choiceOfSomebodyElseDuringAMove()
{
    const QString a = add("a");
    const QString b = add("b");
    setEnabled({a, b});
    QuickActionsModel *model = loadedModel();
    const MGConfItem follower(enabledKey);
    bool answered = false;
    connect(&follower, &MGConfItem::valueChanged, this, [&] {
        if (!answered) {
            answered = true;
            setEnabled({b});
        }
    });
    model->move(0, 1);
    QVERIFY(answered);
    QCOMPARE(names(model), list({"b"}));
    QCOMPARE(enabledInDconf(), list({"b"}));
}

void TestQuickActionsModel::reloadsOneSecondAfterAChange()
{
    const QuickActionsModel *model = loadedModel(true);
    QSignalSpy inserted(model, &QAbstractItemModel::rowsInserted);
    add("a");
    add("b");
    QVERIFY(!inserted.wait(500));
    QTRY_COMPARE(names(model), list({"a", "b"}));
    Files::remove(path("a"));
    QTRY_COMPARE(names(model), list({"b"}));
}

void TestQuickActionsModel::reloadsAccumulate()
{
    // A definition that cannot be read causes a warning each time it is loaded.
    const QStringList warning(QStringLiteral("warning [default] Unable to open action file"));
    Files::makeDirectory(path("broken"));
    loadedModel(true);
    QCOMPARE(takeMessages(), warning);

    QStringList messages;
    const auto collect = [&](int count) {
        const auto done = [&] {
            messages += takeMessages();
            return messages.size() >= count;
        };
        QTRY_VERIFY(done());
        QTest::qWait(longEnough);
        messages += takeMessages();
        QCOMPARE(messages.size(), count);
    };
    add("a");
    add("b");
    collect(1);
    messages.clear();
    add("c");
    collect(2);
    messages.clear();
    add("d");
    collect(3);
    QCOMPARE(messages, warning + warning + warning);
}

void TestQuickActionsModel::followsDirectoryMadeLater()
{
    Files::remove(directory);
    const QuickActionsModel *model = loadedModel(true);
    QCOMPARE(model->count(), 0);
    add("a");
    QTRY_COMPARE(names(model), list({"a"}));
    add("b");
    QTRY_COMPARE(names(model), list({"a", "b"}));
}

void TestQuickActionsModel::followsDirectoryMadeAgain()
{
    add("a");
    const QuickActionsModel *model = loadedModel(true);
    Files::remove(directory);
    QTRY_COMPARE(model->count(), 0);
    add("b");
    QTRY_COMPARE(names(model), list({"b"}));
}

void TestQuickActionsModel::changedDefinition()
{
    add("a", "icon=old\n");
    add("b");
    const QuickActionsModel *model = loadedModel(true);
    QSignalSpy changed(model, &QAbstractItemModel::dataChanged);
    add("a", "icon=changed\n");
    QVERIFY(changed.wait());
    QCOMPARE(model->data(model->index(0), 1), QVariant(QStringLiteral("changed")));
    QCOMPARE(changed.size(), 1);
    QCOMPARE(changed.at(0).at(0).toModelIndex(), model->index(0));
}

void TestQuickActionsModel::rewrittenInPlace()
{
    QFile definition(add("a", "icon=old\n"));
    const QuickActionsModel *model = loadedModel(true);
    QSignalSpy changed(model, &QAbstractItemModel::dataChanged);
    QVERIFY(definition.open(QIODevice::WriteOnly));
    // The length must change: QSettings does not read a file again if its length and time are the
    // same.
    definition.write("icon=changed\n");
    QVERIFY(definition.flush());
    // Reported when it is complete, and read one second later.
    QVERIFY(!changed.wait(longEnough));
    definition.close();
    QVERIFY(!changed.wait(500));
    QVERIFY(changed.wait());
    QCOMPARE(model->data(model->index(0), 1), QVariant(QStringLiteral("changed")));
    QCOMPARE(changed.size(), 1);
}

void TestQuickActionsModel::otherFilesAreIgnored()
{
    // A definition that cannot be read gives a warning each time it is loaded.
    Files::makeDirectory(path("broken"));
    loadedModel(true);
    QCOMPARE(takeMessages().size(), 1);
    Files::write(directory + QStringLiteral("/other.txt"), "x");
    QFile other(directory + QStringLiteral("/other.txt"));
    QVERIFY(other.open(QIODevice::Append));
    other.write("more");
    other.close();
    QVERIFY(other.remove());
    QTest::qWait(longEnough);
    QCOMPARE(takeMessages(), QStringList());
}

void TestQuickActionsModel::unreadableDefinitionIsListed()
{
    const QString broken = add("broken", "title=x\n[remote-arguments\n");
    setEnabled({broken});
    const QuickActionsModel *model = loadedModel();
    QCOMPARE(names(model), list({"broken"}));
    QVERIFY(!model->data(model->index(0), 0).isValid());
    QCOMPARE(takeMessages(), list({"warning [default] Unable to open action file"}));
}

void TestQuickActionsModel::directoriesAndPipesAmongTheDefinitions()
{
    Files::makeDirectory(path("directory"));
    Files::makePipe(directory + QStringLiteral("/pipe"));
    Files::makeLink(directory + QStringLiteral("/pipe"), path("link"));
    add("a");
    QCOMPARE(names(loadedModel(true)), list({"a", "directory", "link"}));
    QCOMPARE(takeMessages(),
             list({"warning [default] Unable to open action file",
                   "warning [default] Unable to open action file"}));
}

void TestQuickActionsModel::otherFilesAreNoDefinitions()
{
    Files::write(directory + QStringLiteral("/a.conf.orig"), "title=x\n");
    Files::write(directory + QStringLiteral("/.hidden.conf"), "title=x\n");
    Files::write(directory + QStringLiteral("/below/b.conf"), "title=x\n");
    QCOMPARE(loadedModel(true)->count(), 0);
}

void TestQuickActionsModel::countOfASwap()
{
    const QString a = add("a");
    const QString b = add("b");
    setEnabled({a});
    QuickActionsModel *model = loadedModel();
    QSignalSpy count(model, &QuickActionsModel::countChanged);
    setEnabled({b});
    QCOMPARE(names(model), list({"b"}));
    QCOMPARE(count.size(), 0);
}

void TestQuickActionsModel::rowsGoOneByOne()
{
    setEnabled({add("a"), add("b"), add("c")});
    QuickActionsModel *model = loadedModel();
    QSignalSpy removed(model, &QAbstractItemModel::rowsRemoved);
    setEnabled({});
    QCOMPARE(removed.size(), 3);
    for (const QVariantList &arguments : removed) {
        QCOMPARE(arguments.mid(1), (QVariantList{0, 0}));
    }
}

void TestQuickActionsModel::negativePriorityStopsNothing()
{
    const QString enabled = add("enabled", "priority=-3\n");
    add("some", "priority=5\n");
    setEnabled({enabled});
    QCOMPARE(names(loadedModel(true)), list({"enabled", "some"}));
}

void TestQuickActionsModel::definitionFilterIgnoresCase()
{
    Files::write(directory + QStringLiteral("/A.CONF"), "title=x\n");
    QCOMPARE(loadedModel(true)->count(), 1);
}

void TestQuickActionsModel::blockedListDuringAMove()
{
    const QString a = add("a");
    const QString b = add("b");
    setEnabled({a, b});
    QuickActionsModel *model = loadedModel();
    const MGConfItem follower(enabledKey);
    connect(&follower, &MGConfItem::valueChanged, this, [&] { setBlocked({a}); });
    model->move(0, 1);
    QTRY_COMPARE(names(model), list({"b"}));
}

void TestQuickActionsModel::orderOfSomebodyElse()
{
    // Rows that stay keep their places; move() goes by the list.
    const QString a = add("a");
    const QString b = add("b");
    setEnabled({a, b});
    QuickActionsModel *model = loadedModel();
    setEnabled({b, a});
    QCOMPARE(names(model), list({"a", "b"}));
    model->move(0, 1);
    QCOMPARE(names(model), list({"b", "a"}));
    QCOMPARE(enabledInDconf(), list({"a", "b"}));
}

void TestQuickActionsModel::moveAnsweredByShorteningTheList()
{
    const QString a = add("a");
    const QString b = add("b");
    setEnabled({a, b});
    QuickActionsModel *model = loadedModel();
    connect(model, &QAbstractItemModel::rowsAboutToBeMoved, this, [&] {
        model->disableAction(a);
        model->disableAction(b);
    });
    model->move(0, 1);
    QTRY_COMPARE(model->count(), 0);
    QCOMPARE(enabledInDconf(), QStringList());
}

void TestQuickActionsModel::firstChangeStartsTheDelay()
{
    const QuickActionsModel *model = loadedModel(true);
    auto *timer = model->findChild<QTimer *>();
    QVERIFY(timer != nullptr);
    QCOMPARE(timer->interval(), 1000);
    QVERIFY(timer->isSingleShot());
    QVERIFY(!timer->isActive());

    // Long enough for a busy machine.
    timer->setInterval(60000);
    add("a");
    QTRY_VERIFY(timer->isActive());
    QTRY_VERIFY(timer->remainingTime() < 59500);
    // A later change does not start it again.
    add("b");
    QTest::qWait(50);
    QVERIFY(timer->isActive());
    QVERIFY(timer->remainingTime() < 59500);
    timer->setInterval(0);
    QTRY_COMPARE(names(model), list({"a", "b"}));
}

void TestQuickActionsModel::writesTheListBeforeTheUserKey()
{
    const QString a = add("a");
    setEnabled({});
    QuickActionsModel *model = loadedModel();
    const MGConfItem user(userKey);
    QStringList enabledThen;
    connect(&user, &MGConfItem::valueChanged, this, [&] { enabledThen = enabledInDconf(); });
    model->enableAction(a);
    QCOMPARE(enabledThen, list({"a"}));
}

void TestQuickActionsModel::catalogsOfARowChangeWithIt()
{
    // Which texts are available before and after a row is inserted and removed.
    const QString a = add("a", "title=maps-title\ntranslation-catalog=maps\n");
    QuickActionsModel *model = loadedModel();
    QStringList texts;
    const auto note = [&] { texts.append(qtTrId("maps-title")); };
    connect(model, &QAbstractItemModel::rowsAboutToBeInserted, this, note);
    connect(model, &QAbstractItemModel::rowsInserted, this, note);
    connect(model, &QAbstractItemModel::rowsAboutToBeRemoved, this, note);
    connect(model, &QAbstractItemModel::rowsRemoved, this, note);
    setEnabled({a});
    setEnabled({});
    QCOMPARE(texts, list({"maps-title", "Kartat", "Kartat", "maps-title"}));
}

void TestQuickActionsModel::handlersMayCallBack_data()
{
    QTest::addColumn<QByteArray>("signal");
    for (const char *signal : {"rowsAboutToBeInserted", "rowsInserted", "rowsAboutToBeRemoved",
                               "rowsRemoved", "rowsAboutToBeMoved", "rowsMoved", "dataChanged",
                               "countChanged", "showPotentialChanged"}) {
        QTest::newRow(signal) << QByteArray(signal);
    }
}

void TestQuickActionsModel::handlersMayCallBack()
{
    QFETCH(QByteArray, signal);
    const QString a = add("a");
    const QString b = add("b");
    const QString c = add("c");
    setEnabled({a, b});
    QuickActionsModel *model = loadedModel();
    int answers = 0;
    const auto answer = [&] {
        // Everything that a page can request, once for each of the first few signals.
        if (++answers > 3) {
            return;
        }
        if (model->count() > 0) {
            model->get(0);
        }
        model->disableAction(a);
        model->enableAction(c);
        model->setShowPotential(!model->showPotential());
        model->move(0, 1);
        setBlocked({b});
        model->enableAction(a);
        setBlocked({});
    };
    const auto answerTo = [&](auto someSignal, const char *name) {
        if (signal == name) {
            connect(model, someSignal, this, answer);
        }
    };
    answerTo(&QAbstractItemModel::rowsAboutToBeInserted, "rowsAboutToBeInserted");
    answerTo(&QAbstractItemModel::rowsInserted, "rowsInserted");
    answerTo(&QAbstractItemModel::rowsAboutToBeRemoved, "rowsAboutToBeRemoved");
    answerTo(&QAbstractItemModel::rowsRemoved, "rowsRemoved");
    answerTo(&QAbstractItemModel::rowsAboutToBeMoved, "rowsAboutToBeMoved");
    answerTo(&QAbstractItemModel::rowsMoved, "rowsMoved");
    answerTo(&QAbstractItemModel::dataChanged, "dataChanged");
    answerTo(&QuickActionsModel::countChanged, "countChanged");
    answerTo(&QuickActionsModel::showPotentialChanged, "showPotentialChanged");

    model->move(0, 1);
    model->setShowPotential(true);
    model->disableAction(b);
    model->setShowPotential(false);
    model->enableAction(b);
    QTRY_VERIFY(answers > 0);
    // Finally the rows are those of the list.
    const auto settled = [&] {
        QStringList expected = enabledInDconf();
        if (model->showPotential()) {
            expected += list({"a", "b", "c"});
        }
        expected.removeDuplicates();
        expected.sort();
        QStringList listed = names(model);
        listed.sort();
        return listed == expected;
    };
    QTRY_VERIFY(settled());
}

void TestQuickActionsModel::showPotentialSetInAHandler()
{
    const QString a = add("a");
    const QString b = add("b");
    add("c");
    setEnabled({a});
    QuickActionsModel *model = loadedModel();
    QSignalSpy changed(model, &QuickActionsModel::showPotentialChanged);
    QVector<int> rowsThen;
    connect(model, &QuickActionsModel::showPotentialChanged, this,
            [&] { rowsThen.append(model->count()); });
    connect(model, &QAbstractItemModel::rowsInserted, this, [&] {
        model->setShowPotential(true);
        // Read back, it is what was set.
        QVERIFY(model->showPotential());
    });
    setEnabled({a, b});
    QCOMPARE(model->count(), 2);
    QCOMPARE(changed.size(), 0);
    // Announced together with its rows, and once.
    QTRY_COMPARE(changed.size(), 1);
    QCOMPARE(rowsThen, QVector<int>{3});
    QCOMPARE(names(model), list({"a", "b", "c"}));
}

void TestQuickActionsModel::requestsInHandlersLoadOnce()
{
    // Each load of a definition that cannot be read gives a warning.
    constexpr int count = 50;
    Files::makeDirectory(path("broken"));
    for (int i = 0; i < count; ++i) {
        add(QByteArray::number(i).constData());
    }
    QuickActionsModel *model = makeModel(true);
    QSignalSpy inserted(model, &QAbstractItemModel::rowsInserted);
    QSignalSpy changed(model, &QuickActionsModel::showPotentialChanged);
    connect(model, &QAbstractItemModel::rowsInserted, this, [&] {
        for (int i = 0; i < 2; ++i) {
            model->setShowPotential(!model->showPotential());
            setBlocked({path("unknown")});
            setBlocked({});
            setEnabled({path("unknown")});
            setEnabled({});
        }
    });
    model->componentComplete();
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
    const QString a = add("a");
    const QString b = add("b");
    const QString c = add("c");
    const QString d = add("d");
    setEnabled({a});
    QuickActionsModel *model = loadedModel();
    QMetaObject::Connection connection;
    connection = connect(model, &QAbstractItemModel::rowsInserted, this, [&] {
        disconnect(connection);
        model->enableAction(c);
        model->move(0, 2);
        model->disableAction(c);
        model->enableAction(c);
        model->enableAction(c);
        // Stored by another process after the requests: nothing is lost.
        setEnabled({a, b, d});
    });
    setEnabled({a, b});
    QTRY_COMPARE(enabledInDconf(), list({"b", "d", "a", "c", "c"}));
    QCOMPARE(names(model), list({"b", "d", "a", "c"}));
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
    add("a");
    DconfTool::waitUntilStored();
    for (const QString &key : {enabledKey, blockedKey}) {
        DconfTool::write(key, value);
        QTRY_VERIFY(MGConfItem(key).value().isValid());
    }
    QuickActionsModel *model = loadedModel();
    QCOMPARE(model->count(), 0);
    model->setShowPotential(true);
    QCOMPARE(names(model), list({"a"}));
    QCOMPARE(model->data(model->index(0), 3), QVariant(false));
}

QTEST_GUILESS_MAIN(TestQuickActionsModel)

#include "tst_quickactionsmodel.moc"
