// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "dconftool.h"
#include "eventswidgets/eventswidgetsmodel.h"
#include "files.h"
#include "interfaceof.h"
#include "loggedtest.h"

#include <QAbstractItemModelTester>
#include <QtTest>

#include <functional>

class TestEventsWidgetsModel : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    // What it is
    void interface();
    void roles();
    void dataOfRows();
    void dataOutsideTheRows();
    void readsNothingBeforeCompletion();

    // Reading
    void missingDirectory();
    void readsJsonFilesOnly();
    void badFilesHideNoGoodOnes();
    void placesByOrder_data();
    void placesByOrder();
    void repeatedPathInOneFile();
    void repeatedPathInTwoFiles();

    // Following the directory
    void followsFiles();
    void changedWidgetKeepsItsRow();
    void placesAnewWhatComesAgain();
    void unchangedWidgetsAreNotAnnounced();
    void widgetThatMovesToAnotherFile();
    void removesOneRowAtATime();
    void directoryMadeLater();
    void directoryMadeAgain();
    void rewrittenInPlace();
    void oneScanPerNotification();
    void otherFilesAreIgnored();

    // Texts
    void translatesTitleAndDescription();
    void looksTextsUpOnEveryCall();
    void catalogWithoutWidgets();
    void catalogsAreOnlyEverAdded();
    void catalogsGoWithTheModel();

    // Enabled
    void defaultsWhileNothingIsStored();
    void emptyListEnablesNothing();
    void valuesOfAnyType_data();
    void valuesOfAnyType();
    void firstChoiceEnablesAllOthers();
    void enablesAgain();
    void disablesAll();
    void unknownPaths();
    void listInReadingOrderAfterAScan();
    void listInRowOrderAfterTheKeyChanged();
    void choiceBeforeCompletion();
    void firstChoiceBeforeCompletion();
    void followsTheKey();

    // Available
    void updatesAvailability();

    // Called back
    void handlersMayCallBack();
    void changesWaitForOneAnother();
    void choicesMadeInTheMiddleOfAScan();
    void firstChoiceInTheMiddleOfAScan();
    void requestsInHandlersRunOnce();
    void languageChangesInTheMiddleOfAScan();
    void languageChangesOfADyingModel();
    void modelsShareNothing();

private:
    static QStringList column(const EventsWidgetsModel &model, int role);
    static QStringList paths(const EventsWidgetsModel &model)
    {
        return column(model, EventsWidgetsModel::PathRole);
    }
    QStringList storedList() const { return m_key->value().toStringList(); }

    std::unique_ptr<MGConfItem> m_key;
};

namespace {

const QString directory = QStringLiteral("/usr/share/glimmera/eventswidgets");
const QString keyName = QStringLiteral("/desktop/glimmera-marlo-home/events_screen_widgets");

const QString a = QStringLiteral("a");
const QString b = QStringLiteral("b");
const QString c = QStringLiteral("c");

QString pathOf(const char *name)
{
    return directory + QLatin1Char('/') + QLatin1String(name);
}

void writeFile(const char *name, const QByteArray &widgets, const char *catalog = "")
{
    Files::write(pathOf(name),
                 QByteArray(R"({ "translation_catalog": ")") + catalog + R"(", "widgets": [)"
                     + widgets + "] }");
}

// A model under test, complete and watched by a model tester.
class Model : public EventsWidgetsModel
{
public:
    explicit Model(bool complete = true)
    {
        if (complete) {
            componentComplete();
        }
    }

private:
    QAbstractItemModelTester m_tester{this, QAbstractItemModelTester::FailureReportingMode::QtTest};
};

// Answers every language change of the application.
class LanguageListener : public QObject
{
public:
    explicit LanguageListener(std::function<void()> answer) : m_answer(std::move(answer))
    {
        QCoreApplication::instance()->installEventFilter(this);
    }
    bool eventFilter(QObject *watched, QEvent *event) override
    {
        if (event->type() == QEvent::LanguageChange) {
            ++count;
            m_answer();
        }
        return QObject::eventFilter(watched, event);
    }
    int count = 0;

private:
    std::function<void()> m_answer;
};

} // namespace

QStringList TestEventsWidgetsModel::column(const EventsWidgetsModel &model, int role)
{
    QStringList values;
    for (int row = 0; row < model.rowCount(); ++row) {
        values.append(model.data(model.index(row), role).toString());
    }
    return values;
}

void TestEventsWidgetsModel::init()
{
    for (const auto *name : {"maps_eng_en", "maps-fi", "atlas_eng_en"}) {
        Files::installCatalog(QString::fromLatin1(name));
    }
    QLocale::setDefault(QLocale(QStringLiteral("fi_FI")));
    Files::remove(directory);
    Files::makeDirectory(directory);
    m_key = std::make_unique<MGConfItem>(keyName);
    m_key->unset();
    LoggedTest::init();
}

void TestEventsWidgetsModel::cleanup()
{
    LoggedTest::cleanup();
    m_key.reset();
}

void TestEventsWidgetsModel::interface()
{
    EventsWidgetsModel model;
    const QStringList members{
        QStringLiteral("void enableWidget(QString)"), QStringLiteral("void disableWidget(QString)"),
        QStringLiteral("void directoryChanged()"), QStringLiteral("void enabledWidgetsChanged()"),
        QStringLiteral("void updateAvailable()")};
    QCOMPARE(interfaceOf(EventsWidgetsModel::staticMetaObject), members);
    QVERIFY(model.qt_metacast("org.qt-project.Qt.QQmlParserStatus") != nullptr);
    QVERIFY(qobject_cast<QAbstractListModel *>(&model) != nullptr);
}

void TestEventsWidgetsModel::roles()
{
    const EventsWidgetsModel model;
    QCOMPARE(model.roleNames(),
             (QHash<int, QByteArray>{{256, "title"},
                                     {257, "icon"},
                                     {258, "path"},
                                     {259, "enabled"},
                                     {260, "description"},
                                     {261, "available"}}));
}

void TestEventsWidgetsModel::dataOfRows()
{
    writeFile("test.json",
              R"({ "path": "/a.qml", "title": "Title", "icon": "image://icon", "order": 1,
                   "default_enabled": true, "available_path": "/nowhere/at/all" },
                 { "path": "/b.qml" })");
    const Model model;
    QCOMPARE(model.rowCount(), 2);
    const auto data = [&model](int row, int role) { return model.data(model.index(row), role); };
    QCOMPARE(data(0, 256), QVariant(QStringLiteral("Title")));
    QCOMPARE(data(0, 257), QVariant(QStringLiteral("image://icon")));
    QCOMPARE(data(0, 258), QVariant(QStringLiteral("/a.qml")));
    QCOMPARE(data(0, 259), QVariant(true));
    QCOMPARE(data(0, 260), QVariant(QString()));
    QCOMPARE(data(0, 261), QVariant(false));
    QCOMPARE(data(1, 259), QVariant(false));
    QCOMPARE(data(1, 261), QVariant(true));
    for (const int role : {256, 257, 258, 260}) {
        QCOMPARE(data(1, role).userType(), int(QMetaType::QString));
    }
}

void TestEventsWidgetsModel::dataOutsideTheRows()
{
    writeFile("test.json", R"({ "path": "a" })");
    const Model model;
    class OtherModel : public QAbstractTableModel
    {
    public:
        int rowCount(const QModelIndex &) const override { return 3; }
        int columnCount(const QModelIndex &) const override { return 3; }
        QVariant data(const QModelIndex &, int) const override { return {}; }
    };
    const OtherModel other;
    const int title = EventsWidgetsModel::TitleRole;
    QVERIFY(model.data(other.index(0, 0), title).isValid());
    QVERIFY(!model.data(QModelIndex(), title).isValid());
    QVERIFY(!model.data(other.index(1, 0), title).isValid());
    QVERIFY(!model.data(other.index(0, 1), title).isValid());
    for (const int role : {0, 1, 255, 262, -1}) {
        QVERIFY(!model.data(model.index(0), role).isValid());
    }
    QCOMPARE(model.rowCount(model.index(0)), 0);
}

void TestEventsWidgetsModel::readsNothingBeforeCompletion()
{
    writeFile("test.json", R"({ "path": "a" })");
    Files::write(pathOf("bad.json"), "bad");
    Model model(false);
    model.classBegin();
    model.directoryChanged();
    model.enabledWidgetsChanged();
    model.updateAvailable();
    Files::write(pathOf("more.json"), "bad");
    m_key->set(QStringList{a});
    QTest::qWait(200);
    QCOMPARE(model.rowCount(), 0);
    QCOMPARE(m_log->takeReport(), QString());

    model.componentComplete();
    QCOMPARE(paths(model), QStringList{a});
    QCOMPARE(m_log->takeAll().size(), 2);
}

void TestEventsWidgetsModel::missingDirectory()
{
    Files::remove(directory);
    const Model model;
    QCOMPARE(model.rowCount(), 0);
}

void TestEventsWidgetsModel::readsJsonFilesOnly()
{
    writeFile("plain.json", R"({ "path": "plain" })");
    writeFile("UPPER.JSON", R"({ "path": "upper" })");
    writeFile("more.json.bak", R"({ "path": "backup" })");
    writeFile("json", R"({ "path": "bare" })");
    writeFile(".hidden.json", R"({ "path": "hidden" })");
    writeFile("directory.json/below.json", R"({ "path": "below" })");
    Files::makeLink(pathOf("json"), pathOf("link.json"));
    Files::makeLink(pathOf("nowhere"), pathOf("broken.json"));
    Files::makeLink(directory, pathOf("loop.json"));
    Files::makePipe(pathOf("pipe.json"));
    Files::makePipe(pathOf("pipe"));
    Files::makeLink(pathOf("pipe"), pathOf("linked-pipe.json"));
    Files::makeLink(QStringLiteral("/dev/zero"), pathOf("endless.json"));

    const Model model;
    QStringList found = paths(model);
    found.sort();
    QCOMPARE(
        found,
        (QStringList{QStringLiteral("bare"), QStringLiteral("plain"), QStringLiteral("upper")}));
}

void TestEventsWidgetsModel::badFilesHideNoGoodOnes()
{
    writeFile("good-1.json", R"({ "path": "a", "order": 1 })");
    writeFile("good-2.json", R"({ "path": "b", "order": 2 }, 1, { "path": "c", "order": 3 })");
    Files::write(pathOf("array.json"), "[]");
    Files::write(pathOf("deep.json"), QByteArray(100000, '['));
    Files::write(pathOf("binary.json"), QByteArray(100000, '\x80'));
    Files::write(pathOf("large.json"), QByteArray(20 * 1024 * 1024, ' '));
    const Model model;
    QCOMPARE(paths(model), (QStringList{a, b, c}));

    QStringList warnings = m_log->takeTexts();
    warnings.sort();
    QStringList expected;
    for (const auto *name : {"array", "binary", "deep", "large"}) {
        expected.append(QStringLiteral("Invalid Events Widget \"%1/%2.json\"")
                            .arg(directory, QLatin1String(name)));
    }
    expected.append(QStringLiteral("Invalid widget defined in \"%1\"").arg(pathOf("good-2.json")));
    QCOMPARE(warnings, expected);
}

void TestEventsWidgetsModel::placesByOrder_data()
{
    using Orders = QVector<int>;
    QTest::addColumn<Orders>("orders");
    QTest::addColumn<Orders>("rows");
    QTest::newRow("in order") << Orders{1, 3, 7} << Orders{1, 3, 7};
    QTest::newRow("backwards") << Orders{7, 3, 1} << Orders{1, 3, 7};
    QTest::newRow("before the first") << Orders{1, 0} << Orders{0, 1};
    QTest::newRow("none goes last") << Orders{1, -1, 3} << Orders{1, -1, 3};
    QTest::newRow("none before any") << Orders{-1, -2} << Orders{-1, -2};
    QTest::newRow("behind what has none") << Orders{-1, 5, 4} << Orders{-1, 4, 5};
    QTest::newRow("before a higher one only") << Orders{5, -1, 6, 4} << Orders{4, 5, -1, 6};
    QTest::newRow("first higher one") << Orders{5, -1, 9, 5, 6} << Orders{5, -1, 5, 6, 9};
}

void TestEventsWidgetsModel::placesByOrder()
{
    QFETCH(QVector<int>, orders);
    QByteArray widgets;
    for (int i = 0; i < orders.size(); ++i) {
        widgets += (i > 0 ? ", " : "") + QByteArray(R"({ "path": ")") + QByteArray::number(i)
            + R"(", "icon": ")" + QByteArray::number(orders.at(i)) + R"(", "order": )"
            + QByteArray::number(orders.at(i)) + " }";
    }
    writeFile("test.json", widgets);
    Model model;
    QVector<int> rows;
    for (const QString &icon : column(model, EventsWidgetsModel::IconRole)) {
        rows.append(icon.toInt());
    }
    QTEST(rows, "rows");

    // A later widget goes behind those of its own order, too.
    writeFile("test.json", widgets + R"(, { "path": "late", "order": 3 })");
    model.directoryChanged();
    if (orders == QVector<int>{1, 3, 7}) {
        QCOMPARE(paths(model).indexOf(QStringLiteral("late")), 2);
    }
}

void TestEventsWidgetsModel::repeatedPathInOneFile()
{
    writeFile("test.json",
              R"({ "path": "a", "title": "1", "order": 5 }, { "path": "b", "order": 6 },
                 { "path": "a", "title": "2", "order": 7 })");
    Model model(false);
    QSignalSpy inserted(&model, &Model::rowsInserted);
    QSignalSpy changed(&model, &Model::dataChanged);
    model.componentComplete();
    QCOMPARE(paths(model), (QStringList{a, b}));
    QCOMPARE(model.data(model.index(0), EventsWidgetsModel::TitleRole).toString(),
             QStringLiteral("2"));
    QCOMPARE(inserted.size(), 2);
    QCOMPARE(changed.size(), 1);
    // Every scan does the same: the row becomes the first widget and then the second again.
    model.directoryChanged();
    QCOMPARE(changed.size(), 3);
    QCOMPARE(model.data(model.index(0), EventsWidgetsModel::TitleRole).toString(),
             QStringLiteral("2"));
}

void TestEventsWidgetsModel::repeatedPathInTwoFiles()
{
    writeFile("1.json", R"({ "path": "a", "title": "1" })");
    writeFile("2.json", R"({ "path": "a", "title": "2" })");
    Model model;
    QCOMPARE(model.rowCount(), 1);

    // The file that was read last defines the row. Without it, the other one does.
    const QString title = model.data(model.index(0), EventsWidgetsModel::TitleRole).toString();
    Files::remove(pathOf((title + QStringLiteral(".json")).toLatin1().constData()));
    model.directoryChanged();
    QCOMPARE(model.rowCount(), 1);
    QVERIFY(model.data(model.index(0), EventsWidgetsModel::TitleRole).toString() != title);
}

void TestEventsWidgetsModel::followsFiles()
{
    const Model model;
    QCOMPARE(model.rowCount(), 0);
    writeFile("test.json", R"({ "path": "a", "title": "1" })");
    QTRY_COMPARE(paths(model), QStringList{a});
    writeFile("test.json", R"({ "path": "a", "title": "2" })");
    QTRY_COMPARE(column(model, EventsWidgetsModel::TitleRole), QStringList{QStringLiteral("2")});
    writeFile("test.json", R"({ "path": "b" })");
    QTRY_COMPARE(paths(model), QStringList{b});
    writeFile("another.json", R"({ "path": "a" })");
    QTRY_COMPARE(paths(model), (QStringList{b, a}));
    Files::remove(pathOf("test.json"));
    QTRY_COMPARE(paths(model), QStringList{a});
    QVERIFY(QFile::rename(pathOf("another.json"), pathOf("another.bak")));
    QTRY_COMPARE(model.rowCount(), 0);
}

void TestEventsWidgetsModel::changedWidgetKeepsItsRow()
{
    writeFile("test.json", R"({ "path": "a", "order": 3 }, { "path": "b", "order": 5 })");
    Model model;
    QSignalSpy moved(&model, &Model::rowsMoved);
    QSignalSpy inserted(&model, &Model::rowsInserted);
    QSignalSpy changed(&model, &Model::dataChanged);
    writeFile("test.json", R"({ "path": "a", "order": 3 }, { "path": "b", "order": 1 })");
    model.directoryChanged();
    QCOMPARE(paths(model), (QStringList{a, b}));
    QCOMPARE(moved.size() + inserted.size(), 0);
    QCOMPARE(changed.size(), 1);
    QCOMPARE(changed.first().at(0).toModelIndex(), model.index(1));
    QCOMPARE(changed.first().at(1).toModelIndex(), model.index(1));
    QCOMPARE(changed.first().at(2).value<QVector<int>>(), QVector<int>());

    // The new order counts for the places of later widgets.
    writeFile("more.json", R"({ "path": "c", "order": 2 })");
    model.directoryChanged();
    QCOMPARE(paths(model), (QStringList{c, a, b}));
}

void TestEventsWidgetsModel::placesAnewWhatComesAgain()
{
    writeFile("1.json", R"({ "path": "a", "order": 3 })");
    Model model;
    writeFile("2.json", R"({ "path": "b", "order": 5 })");
    model.directoryChanged();
    Files::remove(pathOf("2.json"));
    model.directoryChanged();
    QCOMPARE(paths(model), QStringList{a});
    writeFile("2.json", R"({ "path": "b", "order": 1 })");
    model.directoryChanged();
    QCOMPARE(paths(model), (QStringList{b, a}));
}

void TestEventsWidgetsModel::unchangedWidgetsAreNotAnnounced()
{
    writeFile("test.json", R"({ "path": "a" }, { "path": "b" })");
    Model model;
    QSignalSpy changed(&model, &Model::dataChanged);
    QSignalSpy inserted(&model, &Model::rowsInserted);
    QSignalSpy removed(&model, &Model::rowsRemoved);
    model.directoryChanged();
    model.enabledWidgetsChanged();
    model.updateAvailable();
    QCOMPARE(changed.size() + inserted.size() + removed.size(), 0);
}

void TestEventsWidgetsModel::widgetThatMovesToAnotherFile()
{
    writeFile("1.json", R"({ "path": "a" })");
    Model model;
    QSignalSpy changed(&model, &Model::dataChanged);
    QSignalSpy removed(&model, &Model::rowsRemoved);
    Files::remove(pathOf("1.json"));
    writeFile("2.json", R"({ "path": "a" })", "maps");
    model.directoryChanged();
    QCOMPARE(paths(model), QStringList{a});
    QCOMPARE(changed.size() + removed.size(), 0);
}

void TestEventsWidgetsModel::removesOneRowAtATime()
{
    writeFile("1.json", R"({ "path": "a", "order": 1 }, { "path": "c", "order": 3 },
                           { "path": "d", "order": 4 })");
    writeFile("2.json", R"({ "path": "b", "order": 2 })");
    Model model;
    QSignalSpy removed(&model, &Model::rowsRemoved);
    Files::remove(pathOf("1.json"));
    model.directoryChanged();
    QCOMPARE(paths(model), QStringList{b});
    QCOMPARE(removed.size(), 3);
    for (int i = 0; i < removed.size(); ++i) {
        const int row = i == 0 ? 0 : 1;
        QCOMPARE(removed.at(i).at(0).toModelIndex(), QModelIndex());
        QCOMPARE(removed.at(i).at(1).toInt(), row);
        QCOMPARE(removed.at(i).at(2).toInt(), row);
    }
}

void TestEventsWidgetsModel::directoryMadeLater()
{
    Files::remove(QStringLiteral("/usr/share/glimmera"));
    const Model model;
    writeFile("test.json", R"({ "path": "a" })");
    QTRY_COMPARE(paths(model), QStringList{a});
    writeFile("more.json", R"({ "path": "b" })");
    QTRY_COMPARE(paths(model), (QStringList{a, b}));
}

void TestEventsWidgetsModel::directoryMadeAgain()
{
    writeFile("test.json", R"({ "path": "a" })");
    const Model model;
    Files::remove(directory);
    QTRY_COMPARE(model.rowCount(), 0);
    writeFile("test.json", R"({ "path": "b" })");
    QTRY_COMPARE(paths(model), QStringList{b});

    // Files that are rewritten in place are noticed in the new directory, too.
    QFile file(pathOf("test.json"));
    QVERIFY(file.open(QIODevice::WriteOnly));
    file.write(R"({ "widgets": [ { "path": "c" } ] })");
    file.close();
    QTRY_COMPARE(paths(model), QStringList{c});
}

void TestEventsWidgetsModel::rewrittenInPlace()
{
    writeFile("test.json", R"({ "path": "a" })");
    writeFile("other.json", R"({ "path": "b" })");
    Model model;

    QFile file(pathOf("test.json"));
    QVERIFY(file.open(QIODevice::WriteOnly));
    file.write(R"({ "widgets": [ )");
    file.flush();
    // A scan of the half-written file finds no definition.
    model.directoryChanged();
    QCOMPARE(paths(model), QStringList{b});
    QCOMPARE(m_log->takeTexts(),
             QStringList{QStringLiteral("Invalid Events Widget \"%1\"").arg(file.fileName())});
    file.write(R"({ "path": "c" } ] })");
    file.close();
    QTRY_COMPARE(paths(model), (QStringList{b, c}));

    // A new file that is written in place.
    QFile added(pathOf("added.json"));
    QVERIFY(added.open(QIODevice::WriteOnly));
    QString report;
    QTRY_VERIFY(!(report += m_log->takeReport()).isEmpty());
    QCOMPARE(
        report,
        QStringLiteral("warning [default] Invalid Events Widget \"%1\"").arg(added.fileName()));
    added.write(R"({ "widgets": [ { "path": "a" } ] })");
    added.close();
    QTRY_COMPARE(paths(model), (QStringList{b, c, a}));
}

void TestEventsWidgetsModel::oneScanPerNotification()
{
    // Every scan warns once that this is not a definition.
    Files::write(pathOf("bad.json"), "bad");
    const Model model;
    QCOMPARE(m_log->takeAll().size(), 1);

    // A new file that is complete before the event loop runs causes one scan.
    QFile added(pathOf("added.json"));
    QVERIFY(added.open(QIODevice::WriteOnly));
    added.write(R"({ "widgets": [ { "path": "a" } ] })");
    added.close();
    QTRY_COMPARE(paths(model), QStringList{a});
    QTest::qWait(200);
    QCOMPARE(m_log->takeAll().size(), 1);

    // Many writes in place.
    QVERIFY(added.open(QIODevice::WriteOnly));
    for (int i = 0; i < 100; ++i) {
        added.write(" ");
        added.flush();
        QCoreApplication::processEvents();
    }
    added.write(R"({ "widgets": [ { "path": "b" } ] })");
    added.close();
    QTRY_COMPARE(paths(model), QStringList{b});
    QTest::qWait(200);
    QCOMPARE(m_log->takeAll().size(), 1);
}

void TestEventsWidgetsModel::otherFilesAreIgnored()
{
    // Every scan warns once that this is not a definition.
    Files::write(pathOf("bad.json"), "bad");
    const Model model;
    QCOMPARE(m_log->takeAll().size(), 1);
    Files::write(pathOf("other.txt"), "x");
    QFile other(pathOf("other.txt"));
    QVERIFY(other.open(QIODevice::Append));
    other.write("more");
    other.close();
    QVERIFY(other.remove());
    QTest::qWait(200);
    QCOMPARE(m_log->takeAll().size(), 0);
}

void TestEventsWidgetsModel::translatesTitleAndDescription()
{
    writeFile("test.json",
              R"({ "path": "a", "title": "plain", "translation_id": "maps-title",
                   "description_id": "maps-english" },
                 { "path": "b", "title": "plain", "translation_id": "maps-missing",
                   "description_id": "maps-missing" },
                 { "path": "c", "title": "maps-title" },
                 { "path": "d", "translation_id": "maps-missing" })",
              "maps");
    const Model model;
    QCOMPARE(column(model, EventsWidgetsModel::TitleRole),
             (QStringList{QStringLiteral("Kartat"), QStringLiteral("plain"),
                          QStringLiteral("maps-title"), QString()}));
    QCOMPARE(column(model, EventsWidgetsModel::DescriptionRole),
             (QStringList{QStringLiteral("Maps, English only"), QString(), QString(), QString()}));
}

void TestEventsWidgetsModel::looksTextsUpOnEveryCall()
{
    writeFile("test.json",
              R"({ "path": "a", "title": "plain", "translation_id": "maps-title",
                   "description_id": "maps-title" })");
    const Model model;
    const auto text = [&model](int role) { return column(model, role).first(); };
    QCOMPARE(text(EventsWidgetsModel::TitleRole), QStringLiteral("plain"));
    {
        QTranslator translator;
        QVERIFY(
            translator.load(QStringLiteral("maps-fi"), QStringLiteral("/usr/share/translations")));
        QCoreApplication::installTranslator(&translator);
        QCOMPARE(text(EventsWidgetsModel::TitleRole), QStringLiteral("Kartat"));
        QCOMPARE(text(EventsWidgetsModel::DescriptionRole), QStringLiteral("Kartat"));
    }
    QCOMPARE(text(EventsWidgetsModel::TitleRole), QStringLiteral("plain"));
    QCOMPARE(text(EventsWidgetsModel::DescriptionRole), QString());
}

void TestEventsWidgetsModel::catalogWithoutWidgets()
{
    writeFile("test.json", "", "maps");
    Files::write(pathOf("array.json"), R"([ { "translation_catalog": "atlas" } ])");
    const Model model;
    QCOMPARE(model.findChildren<QTranslator *>().size(), 2);
    QCOMPARE(qtTrId("maps-title"), QStringLiteral("Kartat"));
    QCOMPARE(m_log->takeAll().size(), 1);
}

void TestEventsWidgetsModel::catalogsAreOnlyEverAdded()
{
    writeFile("test.json", R"({ "path": "a" })", "maps");
    Model model;
    QCOMPARE(qtTrId("maps-title"), QStringLiteral("Kartat"));
    // Another catalog is added; the first one stays and is not loaded again.
    writeFile("test.json", R"({ "path": "a" })", "atlas");
    model.directoryChanged();
    QCOMPARE(qtTrId("maps-title"), QStringLiteral("Atlas"));
    QCOMPARE(qtTrId("maps-english"), QStringLiteral("Maps, English only"));
    QCOMPARE(model.findChildren<QTranslator *>().size(), 4);

    Files::remove(pathOf("test.json"));
    model.directoryChanged();
    QCOMPARE(model.rowCount(), 0);
    QCOMPARE(qtTrId("maps-title"), QStringLiteral("Atlas"));
    QCOMPARE(qtTrId("maps-english"), QStringLiteral("Maps, English only"));

    writeFile("again.json", R"({ "path": "a" })", "maps");
    model.directoryChanged();
    QCOMPARE(qtTrId("maps-title"), QStringLiteral("Atlas"));
    QCOMPARE(model.findChildren<QTranslator *>().size(), 4);
}

void TestEventsWidgetsModel::catalogsGoWithTheModel()
{
    writeFile("test.json", R"({ "path": "a" })", "maps");
    {
        const Model model;
        QCOMPARE(qtTrId("maps-title"), QStringLiteral("Kartat"));
    }
    QCOMPARE(qtTrId("maps-title"), QStringLiteral("maps-title"));
}

void TestEventsWidgetsModel::defaultsWhileNothingIsStored()
{
    writeFile("test.json",
              R"({ "path": "a" }, { "path": "b", "default_enabled": true },
                 { "path": "c", "default_enabled": false })");
    Model model;
    const QStringList enabled{QStringLiteral("false"), QStringLiteral("true"),
                              QStringLiteral("false")};
    QCOMPARE(column(model, EventsWidgetsModel::EnabledRole), enabled);
    // Loading writes nothing, and reading again changes nothing.
    model.enabledWidgetsChanged();
    model.directoryChanged();
    QCOMPARE(column(model, EventsWidgetsModel::EnabledRole), enabled);
    QVERIFY(!m_key->value().isValid());

    writeFile("more.json", R"({ "path": "d", "default_enabled": true })");
    model.directoryChanged();
    QCOMPARE(column(model, EventsWidgetsModel::EnabledRole),
             enabled + QStringList{QStringLiteral("true")});
}

void TestEventsWidgetsModel::emptyListEnablesNothing()
{
    m_key->set(QStringList());
    QVERIFY(m_key->value().isValid());
    writeFile("test.json", R"({ "path": "a", "default_enabled": true })");
    Model model;
    QCOMPARE(column(model, EventsWidgetsModel::EnabledRole), QStringList{QStringLiteral("false")});

    // An empty list can also be the result of a choice.
    model.enableWidget(a);
    QCOMPARE(storedList(), QStringList{a});
    model.disableWidget(a);
    QVERIFY(m_key->value().isValid());
    QCOMPARE(storedList(), QStringList());
    QCOMPARE(column(model, EventsWidgetsModel::EnabledRole), QStringList{QStringLiteral("false")});
}

void TestEventsWidgetsModel::valuesOfAnyType_data()
{
    QTest::addColumn<QStringList>("list");
    QTest::newRow("['a', 'c']") << QStringList{a, c};
    QTest::newRow("'a'") << QStringList{a};
    QTest::newRow("[<'a'>, <7>, <true>]")
        << QStringList{a, QStringLiteral("7"), QStringLiteral("true")};
    for (const char *value :
         {"7", "1.5", "true", "{'a': <true>}", "handle 7", "@ms nothing", "()", "@av []"}) {
        QTest::newRow(value) << QStringList();
    }
}

void TestEventsWidgetsModel::valuesOfAnyType()
{
    QFETCH(QStringList, list);
    DconfTool::waitUntilStored();
    DconfTool::write(keyName, QTest::currentDataTag());
    QTRY_VERIFY(m_key->value().isValid());
    // Any stored value is a choice: the defaults do not count.
    writeFile("test.json",
              R"({ "path": "a" }, { "path": "b", "default_enabled": true }, { "path": "c" })");
    Model model;
    QStringList enabled;
    for (const QString &path : {a, b, c}) {
        enabled.append(QVariant(list.contains(path)).toString());
    }
    QCOMPARE(column(model, EventsWidgetsModel::EnabledRole), enabled);
    model.enableWidget(b);
    QCOMPARE(storedList(), list + QStringList{b});
}

void TestEventsWidgetsModel::firstChoiceEnablesAllOthers()
{
    writeFile("test.json",
              R"({ "path": "a", "default_enabled": false },
                 { "path": "b", "default_enabled": true },
                 { "path": "c", "default_enabled": true })");
    Model model;
    QSignalSpy changed(&model, &Model::dataChanged);
    model.disableWidget(b);
    QTRY_COMPARE(
        column(model, EventsWidgetsModel::EnabledRole),
        (QStringList{QStringLiteral("true"), QStringLiteral("false"), QStringLiteral("true")}));
    QCOMPARE(storedList(), (QStringList{a, c}));
    // Only the rows that changed, one by one.
    QCOMPARE(changed.size(), 2);
    for (int i = 0; i < 2; ++i) {
        QCOMPARE(changed.at(i).at(0).toModelIndex(), model.index(i));
        QCOMPARE(changed.at(i).at(1).toModelIndex(), model.index(i));
        QCOMPARE(changed.at(i).at(2).value<QVector<int>>(), QVector<int>());
    }

    // A later widget is not in the list of the user.
    writeFile("more.json", R"({ "path": "d", "default_enabled": true })");
    model.directoryChanged();
    QCOMPARE(column(model, EventsWidgetsModel::EnabledRole).last(), QStringLiteral("false"));
}

void TestEventsWidgetsModel::enablesAgain()
{
    m_key->set(QStringList{a});
    writeFile("test.json", R"({ "path": "a" })");
    Model model;
    QSignalSpy changed(&model, &Model::dataChanged);
    model.enableWidget(a);
    QCOMPARE(storedList(), (QStringList{a, a}));
    QCOMPARE(changed.size(), 0);
    model.disableWidget(a);
    QCOMPARE(storedList(), QStringList());
    QTRY_COMPARE(changed.size(), 1);
}

void TestEventsWidgetsModel::disablesAll()
{
    m_key->set(QStringList{a, b, a, c});
    writeFile("test.json", R"({ "path": "a" }, { "path": "b" })");
    Model model;
    model.disableWidget(a);
    QCOMPARE(storedList(), (QStringList{b, c}));
    // Paths are case-sensitive.
    model.disableWidget(QStringLiteral("B"));
    QCOMPARE(storedList(), (QStringList{b, c}));
    model.enableWidget(QStringLiteral("A"));
    QTRY_COMPARE(column(model, EventsWidgetsModel::EnabledRole),
                 (QStringList{QStringLiteral("false"), QStringLiteral("true")}));
}

void TestEventsWidgetsModel::unknownPaths()
{
    m_key->set(QStringList{QStringLiteral("gone")});
    Model model;
    model.enableWidget(QStringLiteral("later"));
    model.enableWidget(QString());
    QCOMPARE(storedList(),
             (QStringList{QStringLiteral("gone"), QStringLiteral("later"), QString()}));
    writeFile("test.json", R"({ "path": "later" })");
    QTRY_COMPARE(column(model, EventsWidgetsModel::EnabledRole),
                 QStringList{QStringLiteral("true")});
}

void TestEventsWidgetsModel::listInReadingOrderAfterAScan()
{
    writeFile("test.json",
              R"({ "path": "b", "order": 2 }, { "path": "a", "order": 1 }, { "path": "b" })");
    Model model;
    QCOMPARE(paths(model), (QStringList{a, b}));
    model.directoryChanged();
    model.enableWidget(c);
    QCOMPARE(storedList(), (QStringList{b, a, b, c}));
}

void TestEventsWidgetsModel::listInRowOrderAfterTheKeyChanged()
{
    writeFile("test.json",
              R"({ "path": "b", "order": 2 }, { "path": "a", "order": 1 }, { "path": "b" })");
    Model model;
    model.enabledWidgetsChanged();
    model.enableWidget(c);
    QCOMPARE(storedList(), (QStringList{a, b, c}));
}

void TestEventsWidgetsModel::choiceBeforeCompletion()
{
    m_key->set(QStringList{a, b});
    writeFile("test.json", R"({ "path": "a" }, { "path": "b" }, { "path": "c" })");
    Model model(false);
    model.enableWidget(c);
    QCOMPARE(storedList(), (QStringList{a, b, c}));
    model.disableWidget(a);
    QCOMPARE(storedList(), (QStringList{b, c}));
    model.componentComplete();
    QCOMPARE(
        column(model, EventsWidgetsModel::EnabledRole),
        (QStringList{QStringLiteral("false"), QStringLiteral("true"), QStringLiteral("true")}));
}

void TestEventsWidgetsModel::firstChoiceBeforeCompletion()
{
    // No other widget is known yet, so none is stored with it.
    Model model(false);
    model.enableWidget(a);
    QCOMPARE(storedList(), QStringList{a});
}

void TestEventsWidgetsModel::followsTheKey()
{
    writeFile("test.json", R"({ "path": "a" }, { "path": "b", "default_enabled": true })");
    const Model model;
    const auto enabled = [&model] { return column(model, EventsWidgetsModel::EnabledRole); };
    const QString yes = QStringLiteral("true");
    const QString no = QStringLiteral("false");
    QCOMPARE(enabled(), (QStringList{no, yes}));
    m_key->set(QStringList{a});
    QTRY_COMPARE(enabled(), (QStringList{yes, no}));

    // Another process changes the key.
    DconfTool::waitUntilStored();
    DconfTool::write(keyName, "['a', 'b']");
    QTRY_COMPARE(enabled(), (QStringList{yes, yes}));
    DconfTool::reset(keyName);
    QTRY_COMPARE(enabled(), (QStringList{no, yes}));
}

void TestEventsWidgetsModel::updatesAvailability()
{
    const QString needed = QStringLiteral("/usr/share/glimmera/needed");
    Files::remove(needed);
    writeFile("test.json",
              R"({ "path": "a", "available_path": "/usr/share/glimmera/needed" },
                 { "path": "b" }, { "path": "c", "available_path": "/usr/share/glimmera" })");
    Model model;
    const auto available = [&model] { return column(model, EventsWidgetsModel::AvailableRole); };
    const QString yes = QStringLiteral("true");
    const QString no = QStringLiteral("false");
    // An unavailable widget is listed, too.
    QCOMPARE(available(), (QStringList{no, yes, yes}));

    QSignalSpy changed(&model, &Model::dataChanged);
    Files::write(needed, "");
    QCOMPARE(available(), (QStringList{no, yes, yes}));
    model.updateAvailable();
    QCOMPARE(available(), (QStringList{yes, yes, yes}));
    QCOMPARE(changed.size(), 1);
    QCOMPARE(changed.first().at(0).toModelIndex(), model.index(0));
    QCOMPARE(changed.first().at(1).toModelIndex(), model.index(0));
    QCOMPARE(changed.first().at(2).value<QVector<int>>(), QVector<int>{261});

    Files::remove(needed);
    model.updateAvailable();
    QCOMPARE(available(), (QStringList{no, yes, yes}));
    QCOMPARE(changed.size(), 2);

    // A scan checks this too, and reports that the whole widget changed.
    Files::write(needed, "");
    model.directoryChanged();
    QCOMPARE(available(), (QStringList{yes, yes, yes}));
    QCOMPARE(changed.last().at(2).value<QVector<int>>(), QVector<int>());
    Files::remove(needed);
}

void TestEventsWidgetsModel::handlersMayCallBack()
{
    writeFile("test.json", R"({ "path": "a", "order": 1 }, { "path": "b", "order": 2 })");
    Model model;
    int answers = 0;
    const auto answer = [&] {
        // Otherwise the answers would never end.
        if (++answers > 20) {
            return;
        }
        writeFile("test.json",
                  answers % 2 == 0 ? R"({ "path": "a", "order": 1 }, { "path": "b", "order": 2 })"
                                   : R"({ "path": "c", "order": 1 }, { "path": "b", "order": 0 })");
        model.directoryChanged();
        model.enabledWidgetsChanged();
        model.updateAvailable();
        model.disableWidget(b);
        model.enableWidget(a);
    };
    const QObject context;
    connect(&model, &Model::rowsAboutToBeInserted, &context, answer);
    connect(&model, &Model::rowsInserted, &context, answer);
    connect(&model, &Model::rowsAboutToBeRemoved, &context, answer);
    connect(&model, &Model::rowsRemoved, &context, answer);
    connect(&model, &Model::dataChanged, &context, answer);

    while (answers <= 20) {
        const int before = answers;
        writeFile("test.json",
                  paths(model).contains(c) ? R"({ "path": "a", "order": 0 })"
                                           : R"({ "path": "c", "order": 0 })");
        QTRY_VERIFY(answers > before);
    }
    // Finally the model agrees with the files and the key.
    Files::remove(pathOf("test.json"));
    QTRY_COMPARE(model.rowCount(), 0);
    writeFile("test.json", R"({ "path": "a", "order": 1 }, { "path": "b", "order": 2 })");
    QTRY_COMPARE(paths(model), (QStringList{a, b}));
    m_key->set(QStringList{a});
    QTRY_COMPARE(column(model, EventsWidgetsModel::EnabledRole),
                 (QStringList{QStringLiteral("true"), QStringLiteral("false")}));
}

void TestEventsWidgetsModel::changesWaitForOneAnother()
{
    const QString needed = QStringLiteral("/usr/share/glimmera/needed");
    Files::remove(needed);
    const QByteArray widget = R"({ "path": "a", "available_path": "/usr/share/glimmera/needed" })";
    writeFile("test.json", widget);
    m_key->set(QStringList());
    Model model;
    QByteArrayList events;
    const QObject context;
    connect(&model, &Model::rowsAboutToBeInserted, &context, [&] {
        events.append("begin");
        m_key->set(QStringList{a});
        Files::write(needed, "");
        model.updateAvailable();
    });
    connect(&model, &Model::rowsInserted, &context, [&] { events.append("end"); });
    connect(&model, &Model::dataChanged, &context, [&] { events.append("change"); });
    writeFile("test.json", widget + R"(, { "path": "b" })");
    model.directoryChanged();
    QTRY_COMPARE(events, (QByteArrayList{"begin", "end", "change", "change"}));
    Files::remove(needed);
}

void TestEventsWidgetsModel::choicesMadeInTheMiddleOfAScan()
{
    m_key->set(QStringList{QStringLiteral("stored")});
    writeFile("test.json", R"({ "path": "a" }, { "path": "b" }, { "path": "c" })");
    Model model(false);
    // The second choice starts from the result of the first.
    QObject context;
    connect(&model, &Model::rowsInserted, &context, [&] {
        if (model.rowCount() == 1) {
            model.enableWidget(a);
            model.enableWidget(c);
        }
    });
    model.componentComplete();
    QTRY_COMPARE(storedList(), (QStringList{QStringLiteral("stored"), a, c}));
    QTRY_COMPARE(
        column(model, EventsWidgetsModel::EnabledRole),
        (QStringList{QStringLiteral("true"), QStringLiteral("false"), QStringLiteral("true")}));
}

void TestEventsWidgetsModel::firstChoiceInTheMiddleOfAScan()
{
    // The handler sees one row only; the list that is stored names every widget.
    writeFile("test.json", R"({ "path": "a" }, { "path": "b" }, { "path": "c" })");
    Model model(false);
    QObject context;
    connect(&model, &Model::rowsInserted, &context, [&] {
        if (model.rowCount() == 1) {
            model.enabledWidgetsChanged();
            model.enableWidget(QStringLiteral("x"));
        }
    });
    model.componentComplete();
    QTRY_COMPARE(storedList(), (QStringList{a, b, c, QStringLiteral("x")}));
}

void TestEventsWidgetsModel::requestsInHandlersRunOnce()
{
    // Every scan warns once that this is not a definition.
    Files::write(pathOf("bad.json"), "bad");
    const QString needed = QStringLiteral("/usr/share/glimmera/needed");
    Files::remove(needed);
    QByteArray widgets = R"({ "path": "a", "available_path": "/usr/share/glimmera/needed" })";
    constexpr int count = 100;
    for (int i = 1; i < count; ++i) {
        widgets += R"(, { "path": ")" + QByteArray::number(i) + R"(" })";
    }
    writeFile("test.json", widgets);
    m_key->set(QStringList());
    Model model(false);
    QStringList events;
    connect(&model, &Model::rowsInserted, &model, [&] {
        events.append(QStringLiteral("inserted"));
        if (model.rowCount() == count) {
            m_key->set(QStringList{a});
            Files::write(needed, "");
        }
        model.updateAvailable();
        model.directoryChanged();
        model.enabledWidgetsChanged();
    });
    connect(&model, &Model::dataChanged, &model,
            [&](const QModelIndex &, const QModelIndex &, const QVector<int> &roles) {
                events.append(roles.isEmpty() ? QStringLiteral("changed")
                                              : QStringLiteral("available"));
            });
    model.componentComplete();
    QCOMPARE(events.size(), count);
    QTRY_VERIFY(events.size() > count);
    QTest::qWait(100);
    // In the order in which they were requested first.
    QCOMPARE(events.mid(count),
             (QStringList{QStringLiteral("available"), QStringLiteral("changed")}));
    QCOMPARE(m_log->takeAll().size(), 2);
    Files::remove(needed);
}

void TestEventsWidgetsModel::languageChangesInTheMiddleOfAScan()
{
    // Two files: one may still be unread when the catalog of the other is installed.
    writeFile("1.json", R"({ "path": "a", "default_enabled": true })", "maps");
    writeFile("2.json", R"({ "path": "b", "default_enabled": true })", "atlas");
    Model model(false);
    LanguageListener listener([&] {
        if (listener.count == 1) {
            model.disableWidget(a);
            model.directoryChanged();
        }
        for (int row = 0; row < model.rowCount(); ++row) {
            model.data(model.index(row), EventsWidgetsModel::TitleRole);
        }
    });
    model.componentComplete();
    QVERIFY(listener.count > 0);
    // No widget is forgotten.
    QTRY_COMPARE(storedList(), QStringList{b});
    QTRY_COMPARE(column(model, EventsWidgetsModel::EnabledRole).indexOf(QStringLiteral("false")),
                 paths(model).indexOf(a));
    QCOMPARE(model.rowCount(), 2);
}

void TestEventsWidgetsModel::languageChangesOfADyingModel()
{
    writeFile("test.json", R"({ "path": "a", "title": "plain" })", "maps");
    auto model = std::make_unique<Model>();
    EventsWidgetsModel *dying = model.get();
    QStringList titles;
    LanguageListener listener([&] { titles += column(*dying, EventsWidgetsModel::TitleRole); });
    model.reset();
    QVERIFY(listener.count > 0);
    QCOMPARE(titles.size(), listener.count);
}

void TestEventsWidgetsModel::modelsShareNothing()
{
    writeFile("test.json", R"({ "path": "a" })", "maps");
    auto first = std::make_unique<Model>();
    const Model second;
    QCOMPARE(first->findChildren<QTranslator *>().size(), 2);
    QCOMPARE(second.findChildren<QTranslator *>().size(), 2);
    first.reset();
    QCOMPARE(qtTrId("maps-title"), QStringLiteral("Kartat"));
}

QTEST_GUILESS_MAIN(TestEventsWidgetsModel)

#include "tst_eventswidgetsmodel.moc"
