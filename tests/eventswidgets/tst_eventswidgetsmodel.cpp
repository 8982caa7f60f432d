// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "dconftool.h"
#include "eventswidgets/eventswidgetsmodel.h"
#include "files.h"
#include "listmodeltest.h"
#include "patience.h"
#include "places.h"
#include "texts.h"
#include "words.h"

#include <QtTest>

using Model = EventsWidgetsModel;

namespace {

const QString needed = "/usr/share/glimmera/needed"_s;

const QString a = "a"_s;
const QString b = "b"_s;
const QString c = "c"_s;

QString pathOf(const QString &file)
{
    return Places::eventsWidgets + QLatin1Char('/') + file;
}

QByteArray fileOf(const QByteArray &widgets, const QByteArray &catalog = {})
{
    return R"({ "translation_catalog": ")" + catalog + R"(", "widgets": [)" + widgets + "] }";
}

void write(const QString &file, const QByteArray &widgets, const QByteArray &catalog = {})
{
    Files::write(pathOf(file), fileOf(widgets, catalog));
}

} // namespace

class TestEventsWidgetsModel : public ListModelTest
{
    Q_OBJECT

public:
    TestEventsWidgetsModel()
        : ListModelTest(Places::eventsWidgets, ".json"_s, Places::enabledWidgets, "Widget")
    {
    }

private Q_SLOTS:
    void init();

    // Interface and data
    void roles();
    void dataOfRows();
    void dataOutsideTheRows();
    void readsNothingBeforeCompletion();

    // Reading
    void readsJsonFilesOnly();
    void badFilesHideNoGoodOnes();
    void placesByOrder_data();
    void placesByOrder();
    void repeatedPathInOneFile();
    void repeatedPathInTwoFiles();

    // Following the directory
    void changedWidgetKeepsItsRow();
    void unchangedWidgetsAreNotAnnounced();
    void removesOneRowAtATime();
    void oneScanPerNotification();

    // Texts
    void translatesTitleAndDescription();
    void looksTextsUpOnEveryCall();
    void catalogWithoutWidgets();
    void catalogsAreOnlyEverAdded();
    void modelsShareNoCatalogs();

    // Enabled
    void defaultsWhileNothingIsStored();
    void valuesOfAnyType_data();
    void valuesOfAnyType();
    void firstChoiceEnablesAllOthers();
    void orderOfTheFirstChoice();
    void firstChoiceBeforeCompletion();

    // Available
    void updatesAvailability();

    // Re-entrant calls
    void changesWaitForOneAnother();
    void firstChoiceInTheMiddleOfAScan();
    void languageChangesInTheMiddleOfAScan();

private:
    void loadModel() { loadEverything(); }
    // A model of one file with these widgets.
    void loadModel(const QByteArray &widgets, const QByteArray &catalog = {});
    // The values of a role in all rows.
    QStringList column(Model::Role role) const;
    // For each row, true or false.
    QStringList enabled() const { return column(Model::EnabledRole); }

    void makeModel() override;
    void removeModel() override { m_model.reset(); }
    void complete() override { m_model->componentComplete(); }
    void reload() override;
    QByteArray definition(const QString &name, const QByteArray &catalog) const override;
    QString path(const QString &name) const override { return name; }

    std::unique_ptr<MGConfItem> m_key;
    std::unique_ptr<Model> m_model;
};

void TestEventsWidgetsModel::init()
{
    m_key = std::make_unique<MGConfItem>(Places::enabledWidgets);
    Files::remove(needed);
    ListModelTest::init();
}

void TestEventsWidgetsModel::makeModel()
{
    m_model = std::make_unique<Model>();
    watch(m_model.get());
    m_model->classBegin();
}

void TestEventsWidgetsModel::loadModel(const QByteArray &widgets, const QByteArray &catalog)
{
    write("test.json"_s, widgets, catalog);
    loadModel();
}

QStringList TestEventsWidgetsModel::column(Model::Role role) const
{
    QStringList values;
    for (int row = 0; row < m_model->rowCount(); ++row) {
        values.append(m_model->data(m_model->index(row), role).toString());
    }
    return values;
}

void TestEventsWidgetsModel::reload()
{
    QVERIFY(QMetaObject::invokeMethod(m_watched, "directoryChanged"));
    QVERIFY(QMetaObject::invokeMethod(m_watched, "enabledWidgetsChanged"));
    QVERIFY(QMetaObject::invokeMethod(m_watched, "updateAvailable"));
}

QByteArray TestEventsWidgetsModel::definition(const QString &name, const QByteArray &catalog) const
{
    return fileOf(R"({ "title": "plain", "path": ")" + name.toUtf8() + "\" }", catalog);
}

void TestEventsWidgetsModel::roles()
{
    const QHash<int, QByteArray> expected{{256, "title"},       {257, "icon"},
                                          {258, "path"},        {259, "enabled"},
                                          {260, "description"}, {261, "available"}};
    QCOMPARE(Model().roleNames(), expected);
}

void TestEventsWidgetsModel::dataOfRows()
{
    loadModel(R"({ "path": "/a.qml", "title": "Title", "icon": "image://icon", "order": 1,
                   "default_enabled": true, "available_path": "/nowhere/at/all" },
                 { "path": "/b.qml" })");
    const auto data = [this](int row) {
        QVariantList values;
        for (int role = 256; role <= 261; ++role) {
            values.append(m_model->data(m_model->index(row), role));
        }
        return values;
    };
    QCOMPARE(m_model->rowCount(), 2);
    QCOMPARE(data(0),
             (QVariantList{"Title"_s, "image://icon"_s, "/a.qml"_s, true, QString(), false}));
    QCOMPARE(data(1), (QVariantList{QString(), QString(), "/b.qml"_s, false, QString(), true}));
    for (const int role : {256, 257, 258, 260}) {
        QCOMPARE(m_model->data(m_model->index(1), role).userType(), int(QMetaType::QString));
    }
}

void TestEventsWidgetsModel::dataOutsideTheRows()
{
    loadModel(R"({ "path": "a" })");
    class OtherModel : public QAbstractTableModel
    {
    public:
        int rowCount(const QModelIndex &) const override { return 3; }
        int columnCount(const QModelIndex &) const override { return 3; }
        QVariant data(const QModelIndex &, int) const override { return {}; }
    };
    const OtherModel other;
    QVERIFY(m_model->data(other.index(0, 0), Model::TitleRole).isValid());
    for (const QModelIndex &index : {QModelIndex(), other.index(1, 0), other.index(0, 1)}) {
        QVERIFY(!m_model->data(index, Model::TitleRole).isValid());
    }
    for (const int role : {0, 1, 255, 262, -1}) {
        QVERIFY(!m_model->data(m_model->index(0), role).isValid());
    }
    QCOMPARE(m_model->rowCount(m_model->index(0)), 0);
}

void TestEventsWidgetsModel::readsNothingBeforeCompletion()
{
    write("test.json"_s, R"({ "path": "a" })");
    writeBroken();
    makeModel();
    m_model->directoryChanged();
    m_model->enabledWidgetsChanged();
    m_model->updateAvailable();
    Files::write(pathOf("more.json"_s), "bad");
    m_key->set(QStringList{a});
    QTest::qWait(200);
    QCOMPARE(m_model->rowCount(), 0);
    QCOMPARE(takeMessages(), QStringList());

    m_model->componentComplete();
    QCOMPARE(rows(), "a"_s);
    QCOMPARE(takeMessages().size(), 2);
}

void TestEventsWidgetsModel::readsJsonFilesOnly()
{
    const QStringList names = words("plain.json UPPER.JSON more.json.bak json .hidden.json "
                                    "directory.json/below.json");
    for (const QString &name : names) {
        write(name, R"({ "path": ")" + name.toUtf8() + "\" }");
    }
    Files::makeLink(pathOf("json"_s), pathOf("link.json"_s));
    Files::makeLink(pathOf("nowhere"_s), pathOf("broken.json"_s));
    Files::makeLink(Places::eventsWidgets, pathOf("loop.json"_s));
    Files::makePipe(pathOf("pipe.json"_s));
    Files::makePipe(pathOf("pipe"_s));
    Files::makeLink(pathOf("pipe"_s), pathOf("linked-pipe.json"_s));
    Files::makeLink("/dev/zero"_s, pathOf("endless.json"_s));
    loadModel();
    QStringList found = column(Model::PathRole);
    found.sort();
    // The link is to the file "json".
    QCOMPARE(found, words("UPPER.JSON json plain.json"));
}

void TestEventsWidgetsModel::badFilesHideNoGoodOnes()
{
    write("good-1.json"_s, R"({ "path": "a", "order": 1 })");
    write("good-2.json"_s, R"({ "path": "b", "order": 2 }, 1, { "path": "c", "order": 3 })");
    Files::write(pathOf("array.json"_s), "[]");
    loadModel();
    QCOMPARE(rows(), "a b c"_s);

    QStringList warnings = takeMessages();
    warnings.sort();
    const QStringList expected{
        "warning [default] Invalid Events Widget \"%1\""_s.arg(pathOf("array.json"_s)),
        "warning [default] Invalid widget defined in \"%1\""_s.arg(pathOf("good-2.json"_s))};
    QCOMPARE(warnings, expected);
}

void TestEventsWidgetsModel::placesByOrder_data()
{
    QTest::addColumn<QString>("orders");
    QTest::addColumn<QString>("rows");
    const auto row = [](const char *name, const char *orders, const char *rows) {
        QTest::newRow(name) << orders << rows;
    };
    row("in order", "1 3 7", "1 3 7");
    row("backwards", "7 3 1", "1 3 7");
    row("before the first", "1 0", "0 1");
    row("after an equal one", "1 3 7 3", "1 3 3 7");
    row("none goes last", "1 -1 3", "1 -1 3");
    row("none before any", "-1 -2", "-1 -2");
    row("behind what has none", "-1 5 4", "-1 4 5");
    row("before a higher one only", "5 -1 6 4", "4 5 -1 6");
    row("first higher one", "5 -1 9 5 6", "5 -1 5 6 9");
}

void TestEventsWidgetsModel::placesByOrder()
{
    QFETCH(QString, orders);
    QByteArrayList widgets;
    for (const QByteArray &order : orders.toLatin1().split(' ')) {
        widgets.append(R"({ "path": ")" + QByteArray::number(widgets.size()) + R"(", "icon": ")"
                       + order + R"(", "order": )" + order + " }");
    }
    loadModel(widgets.join(", "));
    QTEST(column(Model::IconRole).join(QLatin1Char(' ')), "rows");

    // A widget that is added later also comes after those with the same order.
    const int last = orders.split(QLatin1Char(' ')).last().toInt();
    write("more.json"_s, R"({ "path": "late", "order": )" + QByteArray::number(last) + " }");
    m_model->directoryChanged();
    const QStringList paths = column(Model::PathRole);
    QVERIFY(paths.indexOf("late"_s) > paths.indexOf(QString::number(widgets.size() - 1)));
}

void TestEventsWidgetsModel::repeatedPathInOneFile()
{
    write("test.json"_s, R"({ "path": "a", "title": "1", "order": 5 }, { "path": "b", "order": 6 },
                            { "path": "a", "title": "2", "order": 7 })");
    makeModel();
    m_model->componentComplete();
    QCOMPARE(rows(), "a b"_s);
    QCOMPARE(column(Model::TitleRole).first(), "2"_s);
    QCOMPARE(events(), "inserted 0, inserted 1, changed 0"_s);
    // Every scan does the same: the row becomes the first widget and then the second again.
    m_model->directoryChanged();
    QCOMPARE(column(Model::TitleRole).first(), "2"_s);
    QCOMPARE(events(), "changed 0, changed 0"_s);
}

void TestEventsWidgetsModel::repeatedPathInTwoFiles()
{
    write("1.json"_s, R"({ "path": "a", "title": "1" })");
    write("2.json"_s, R"({ "path": "a", "title": "2" })");
    loadModel();
    // The file that was read last defines the row. Without it, the other one does.
    QCOMPARE(rows(), "a"_s);
    const QString title = column(Model::TitleRole).first();
    Files::remove(pathOf(title + ".json"_s));
    m_model->directoryChanged();
    QCOMPARE(rows(), "a"_s);
    QVERIFY(column(Model::TitleRole).first() != title);
}

void TestEventsWidgetsModel::changedWidgetKeepsItsRow()
{
    write("1.json"_s, R"({ "path": "a", "order": 3 })");
    write("2.json"_s, R"({ "path": "b", "order": 5 })");
    loadModel();
    write("2.json"_s, R"({ "path": "b", "order": 1 })");
    m_model->directoryChanged();
    QCOMPARE(rows(), "a b"_s);
    QCOMPARE(events(), "changed 1"_s);

    // The new order applies to later widgets, and to this widget when it is added again.
    write("2.json"_s, R"({ "path": "b", "order": 9 }, { "path": "c", "order": 6 })");
    m_model->directoryChanged();
    QCOMPARE(rows(), "a c b"_s);
    Files::remove(pathOf("2.json"_s));
    m_model->directoryChanged();
    QCOMPARE(rows(), "a"_s);
    write("2.json"_s, R"({ "path": "b", "order": 1 })");
    m_model->directoryChanged();
    QCOMPARE(rows(), "b a"_s);
}

void TestEventsWidgetsModel::unchangedWidgetsAreNotAnnounced()
{
    loadModel(R"({ "path": "a" }, { "path": "b" })");
    m_model->directoryChanged();
    m_model->enabledWidgetsChanged();
    m_model->updateAvailable();
    QCOMPARE(events(), QString());
    // Widgets that move to another file with another catalog are not announced either.
    Files::remove(pathOf("test.json"_s));
    write("other.json"_s, R"({ "path": "a" }, { "path": "b" })", "maps");
    m_model->directoryChanged();
    QCOMPARE(events(), QString());
    QCOMPARE(rows(), "a b"_s);
}

void TestEventsWidgetsModel::removesOneRowAtATime()
{
    write("1.json"_s, R"({ "path": "a", "order": 1 }, { "path": "c", "order": 3 },
                         { "path": "d", "order": 4 })");
    write("2.json"_s, R"({ "path": "b", "order": 2 })");
    loadModel();
    Files::remove(pathOf("1.json"_s));
    m_model->directoryChanged();
    QCOMPARE(rows(), "b"_s);
    QCOMPARE(events(), "removed 0, removed 1, removed 1"_s);
}

void TestEventsWidgetsModel::oneScanPerNotification()
{
    writeBroken();
    loadModel();
    QCOMPARE(takeMessages().size(), 1);

    // A new file that is complete before the event loop runs causes one scan.
    QFile added(pathOf("added.json"_s));
    QVERIFY(added.open(QIODevice::WriteOnly));
    added.write(fileOf(R"({ "path": "a" })"));
    added.close();
    TRY_COMPARE(rows(), "a"_s);
    QTest::qWait(200);
    QCOMPARE(takeMessages().size(), 1);
}

void TestEventsWidgetsModel::translatesTitleAndDescription()
{
    loadModel(R"({ "path": "a", "title": "plain", "translation_id": "maps-title",
                   "description_id": "maps-english" },
                 { "path": "b", "title": "plain", "translation_id": "maps-missing",
                   "description_id": "maps-missing" },
                 { "path": "c", "title": "maps-title" },
                 { "path": "d", "translation_id": "maps-missing" })",
              "maps");
    QCOMPARE(column(Model::TitleRole),
             (QStringList{"Kartat"_s, "plain"_s, "maps-title"_s, QString()}));
    QCOMPARE(column(Model::DescriptionRole),
             (QStringList{"Maps, English only"_s, QString(), QString(), QString()}));
}

void TestEventsWidgetsModel::looksTextsUpOnEveryCall()
{
    loadModel(R"({ "path": "a", "title": "plain", "translation_id": "maps-title",
                   "description_id": "maps-title" })");
    const auto texts = [this] { return column(Model::TitleRole) + column(Model::DescriptionRole); };
    QCOMPARE(texts(), (QStringList{"plain"_s, QString()}));
    {
        QTranslator translator;
        QVERIFY(translator.load("maps-fi"_s, "/usr/share/translations"_s));
        QCoreApplication::installTranslator(&translator);
        QCOMPARE(texts(), words("Kartat Kartat"));
    }
    QCOMPARE(texts(), (QStringList{"plain"_s, QString()}));
}

void TestEventsWidgetsModel::catalogWithoutWidgets()
{
    Files::write(pathOf("array.json"_s), R"([ { "translation_catalog": "atlas" } ])");
    loadModel("", "maps");
    QCOMPARE(m_model->findChildren<QTranslator *>().size(), 2);
    QCOMPARE(qtTrId("maps-title"), "Kartat"_s);
    QCOMPARE(takeMessages().size(), 1);
}

void TestEventsWidgetsModel::catalogsAreOnlyEverAdded()
{
    loadModel(R"({ "path": "a" })", "maps");
    QCOMPARE(qtTrId("maps-title"), "Kartat"_s);
    const auto hasBoth = [this] {
        return qtTrId("maps-title") == "Atlas"_s && qtTrId("maps-english") == "Maps, English only"_s
            && m_model->findChildren<QTranslator *>().size() == 4;
    };
    // Another catalog is added; the first one stays and is not loaded again.
    write("test.json"_s, R"({ "path": "a" })", "atlas");
    m_model->directoryChanged();
    QVERIFY(hasBoth());
    Files::remove(pathOf("test.json"_s));
    m_model->directoryChanged();
    QCOMPARE(m_model->rowCount(), 0);
    QVERIFY(hasBoth());
    write("again.json"_s, R"({ "path": "a" })", "maps");
    m_model->directoryChanged();
    QVERIFY(hasBoth());
}

void TestEventsWidgetsModel::modelsShareNoCatalogs()
{
    loadModel(R"({ "path": "a" })", "maps");
    {
        Model other;
        other.componentComplete();
        QCOMPARE(other.findChildren<QTranslator *>().size(), 2);
    }
    QCOMPARE(m_model->findChildren<QTranslator *>().size(), 2);
    QCOMPARE(qtTrId("maps-title"), "Kartat"_s);
}

void TestEventsWidgetsModel::defaultsWhileNothingIsStored()
{
    loadModel(R"({ "path": "a" }, { "path": "b", "default_enabled": true },
                 { "path": "c", "default_enabled": false })");
    QCOMPARE(enabled(), words("false true false"));
    // Loading writes nothing, and reading again changes nothing.
    m_model->enabledWidgetsChanged();
    m_model->directoryChanged();
    QCOMPARE(enabled(), words("false true false"));
    QVERIFY(!m_key->value().isValid());

    write("more.json"_s, R"({ "path": "d", "default_enabled": true })");
    m_model->directoryChanged();
    QCOMPARE(enabled(), words("false true false true"));
    store(a);
    QCOMPARE(enabled(), words("true false false false"));
    m_key->unset();
    QCOMPARE(enabled(), words("false true false true"));
}

void TestEventsWidgetsModel::valuesOfAnyType_data()
{
    QTest::addColumn<QStringList>("list");
    QTest::newRow("['a', 'c']") << words("a c");
    QTest::newRow("'a'") << words("a");
    QTest::newRow("[<'a'>, <7>, <true>]") << words("a 7 true");
    for (const char *value : {"@as []", "7", "1.5", "true", "{'a': <true>}", "handle 7",
                              "@ms nothing", "()", "@av []"}) {
        QTest::newRow(value) << QStringList();
    }
}

void TestEventsWidgetsModel::valuesOfAnyType()
{
    QFETCH(QStringList, list);
    DconfTool::waitUntilStored();
    DconfTool::write(Places::enabledWidgets, QByteArray(QTest::currentDataTag()));
    TRY(m_key->value().isValid());
    // Any stored value counts as a choice, so the defaults do not apply.
    loadModel(R"({ "path": "a" }, { "path": "b", "default_enabled": true }, { "path": "c" })");
    QStringList expected;
    for (const QString &path : {a, b, c}) {
        expected.append(QVariant(list.contains(path)).toString());
    }
    QCOMPARE(enabled(), expected);
    m_model->enableWidget(b);
    QCOMPARE(m_key->value().toStringList(), list + QStringList{b});
}

void TestEventsWidgetsModel::firstChoiceEnablesAllOthers()
{
    loadModel(R"({ "path": "a", "default_enabled": false },
                 { "path": "b", "default_enabled": true },
                 { "path": "c", "default_enabled": true })");
    m_model->disableWidget(b);
    TRY_COMPARE(enabled(), words("true false true"));
    QCOMPARE(stored(), "a c"_s);
    QCOMPARE(events(), "changed 0, changed 1"_s);

    // A later widget is not in the list of the user.
    write("more.json"_s, R"({ "path": "d", "default_enabled": true })");
    m_model->directoryChanged();
    QCOMPARE(enabled(), words("true false true false"));
}

// The order of reading after a scan, the order of the rows after a change of the key.
void TestEventsWidgetsModel::orderOfTheFirstChoice()
{
    loadModel(R"({ "path": "b", "order": 2 }, { "path": "a", "order": 1 }, { "path": "b" })");
    QCOMPARE(rows(), "a b"_s);
    m_model->directoryChanged();
    m_model->enableWidget(c);
    QCOMPARE(stored(), "b a b c"_s);
    m_key->unset();
    m_model->enableWidget(c);
    QCOMPARE(stored(), "a b c"_s);
}

void TestEventsWidgetsModel::firstChoiceBeforeCompletion()
{
    // No other widget is known yet, so none is stored with it.
    makeModel();
    m_model->enableWidget(a);
    QCOMPARE(stored(), "a"_s);
}

void TestEventsWidgetsModel::updatesAvailability()
{
    loadModel(R"({ "path": "a", "available_path": "/usr/share/glimmera/needed" },
                 { "path": "b" }, { "path": "c", "available_path": "/usr/share/glimmera" })");
    const auto available = [this] { return column(Model::AvailableRole); };
    // An unavailable widget is listed, too.
    QCOMPARE(available(), words("false true true"));
    Files::write(needed, "");
    QCOMPARE(available(), words("false true true"));
    m_model->updateAvailable();
    QCOMPARE(available(), words("true true true"));
    QCOMPARE(events(), "changed 0 (261)"_s);
    Files::remove(needed);
    m_model->updateAvailable();
    QCOMPARE(available(), words("false true true"));
    QCOMPARE(events(), "changed 0 (261)"_s);

    // A scan checks this too, and reports that the whole widget changed.
    Files::write(needed, "");
    m_model->directoryChanged();
    QCOMPARE(available(), words("true true true"));
    QCOMPARE(events(), "changed 0"_s);
}

void TestEventsWidgetsModel::changesWaitForOneAnother()
{
    const QByteArray widget = R"({ "path": "a", "available_path": "/usr/share/glimmera/needed" })";
    m_key->set(QStringList());
    loadModel(widget);
    connect(m_model.get(), &Model::rowsAboutToBeInserted, this, [this] {
        m_key->set(QStringList{a});
        Files::write(needed, "");
        m_model->updateAvailable();
        QCOMPARE(events(), QString());
    });
    write("test.json"_s, widget + R"(, { "path": "b" })");
    m_model->directoryChanged();
    TRY_COMPARE(enabled(), words("true false"));
    QCOMPARE(events(), "inserted 1, changed 0, changed 0 (261)"_s);
}

void TestEventsWidgetsModel::firstChoiceInTheMiddleOfAScan()
{
    write("test.json"_s, R"({ "path": "a" }, { "path": "b" }, { "path": "c" })");
    makeModel();
    // The handler sees one row only. The stored list names every widget.
    QString listThen;
    once(m_model.get(), &Model::rowsInserted, [&] {
        m_model->enabledWidgetsChanged();
        m_model->enableWidget(a);
        listThen = stored();
        m_key->unset();
        m_model->disableWidget(b);
    });
    m_model->componentComplete();
    QCOMPARE(listThen, "a b c a"_s);
    QCOMPARE(stored(), "a c"_s);
    TRY_COMPARE(enabled(), words("true false true"));
}

void TestEventsWidgetsModel::languageChangesInTheMiddleOfAScan()
{
    // Two files: one may still be unread when the catalog of the other is installed.
    write("1.json"_s, R"({ "path": "a", "default_enabled": true })", "maps");
    write("2.json"_s, R"({ "path": "b", "default_enabled": true })", "atlas");
    makeModel();
    const LanguageListener listener([this, isFirst = true]() mutable {
        if (std::exchange(isFirst, false)) {
            m_model->disableWidget(a);
            m_model->directoryChanged();
        }
        column(Model::TitleRole);
    });
    m_model->componentComplete();
    QVERIFY(listener.count > 0);
    // No widget is forgotten.
    QCOMPARE(stored(), b);
    TRY_COMPARE(enabledRows(), b);
    QCOMPARE(m_model->rowCount(), 2);
}

QTEST_GUILESS_MAIN(TestEventsWidgetsModel)

#include "tst_eventswidgetsmodel.moc"
