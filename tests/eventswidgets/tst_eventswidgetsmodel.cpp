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

    // tst_randomwidgets compares rows, signals and the stored list after any changes.

    // Interface and data
    void roles();
    void dataOfRows();
    void dataOutsideTheRows();
    void readsNothingBeforeCompletion();

    // Reading
    void readsJsonFilesOnly();
    void badFilesHideNoGoodOnes();

    void oneScanPerNotification();

    // Texts

    // Enabled
    void valuesOfAnyType_data();
    void valuesOfAnyType();
    void firstChoiceEnablesAllOthers();
    void firstChoiceBeforeCompletion();

    // Re-entrant calls
    void changesWaitForOneAnother();
    void firstChoiceInTheMiddleOfAScan();
    void firstChoiceInTheMiddleOfAChange();
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

void TestEventsWidgetsModel::firstChoiceBeforeCompletion()
{
    // No other widget is known yet, so none is stored with it.
    makeModel();
    m_model->enableWidget(a);
    QCOMPARE(stored(), "a"_s);
}

void TestEventsWidgetsModel::changesWaitForOneAnother()
{
    const QByteArray widget = R"({ "path": "a", "available_path": "/usr/share/glimmera/needed" })";
    m_key->set(QStringList());
    loadModel(widget);
    once(m_model.get(), &Model::rowsAboutToBeInserted, [this] {
        m_key->set(QStringList{a});
        Files::write(needed, "");
        m_model->updateAvailable();
        m_model->directoryChanged();
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

void TestEventsWidgetsModel::firstChoiceInTheMiddleOfAChange()
{
    store(a);
    loadModel(R"({ "path": "a" }, { "path": "b", "default_enabled": true },
                 { "path": "c", "default_enabled": true })");
    // The handler sees the first row changed only. The stored list names every other widget.
    once(m_model.get(), &Model::dataChanged, [this] { m_model->disableWidget(a); });
    m_key->unset();
    QCOMPARE(stored(), "b c"_s);
    QCoreApplication::processEvents();
    QCOMPARE(enabledRows(), "b c"_s);
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
