// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The reader of definition files, without a model.

#include "eventswidgets/eventswidgetsfile.h"
#include "files.h"
#include "loggedtest.h"
#include "texts.h"

#include <QTemporaryDir>
#include <QtTest>

using Widget = EventsWidget;

class TestEventsWidgetsFile : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void readsEveryKey();
    void wrongTypesReadAsAbsent_data();
    void wrongTypesReadAsAbsent();
    void order_data();
    void order();
    void readsWidgets_data();
    void readsWidgets();
    void entriesThatAreNoWidgets();
    void boundedWarnings();
    void noDefinition_data();
    void noDefinition();
    void cannotBeOpened();
    void tooManyContainers();
    void availability();
    void comparison();

private:
    std::optional<EventsWidgetsFile> read(const QByteArray &content);
    // The only widget of a file, with these members besides its path.
    Widget readWidget(const QByteArray &members);
    QString warning(const char *text) const;

    std::unique_ptr<QTemporaryDir> m_root;
    QString m_path;
};

void TestEventsWidgetsFile::init()
{
    m_root = std::make_unique<QTemporaryDir>();
    m_path = m_root->filePath("test.json"_s);
    LoggedTest::init();
}

void TestEventsWidgetsFile::cleanup()
{
    LoggedTest::cleanup();
    m_root.reset();
}

std::optional<EventsWidgetsFile> TestEventsWidgetsFile::read(const QByteArray &content)
{
    Files::write(m_path, content);
    return readEventsWidgetsFile(m_path);
}

Widget TestEventsWidgetsFile::readWidget(const QByteArray &members)
{
    const auto file = read(R"({ "widgets": [ { "path": "a")" + members + "} ] }");
    return file ? file->widgets.at(0) : Widget();
}

// In the form that MessageLog reports.
QString TestEventsWidgetsFile::warning(const char *text) const
{
    return "warning [default] %1 \"%2\""_s.arg(QLatin1String(text), m_path);
}

void TestEventsWidgetsFile::readsEveryKey()
{
    const auto file = read(R"({
        "translation_catalog": "maps",
        "widgets": [ {
            "path": "/a.qml", "title": "Title", "translation_id": "t-id",
            "description_id": "d-id", "icon": "image://icon", "order": 7,
            "default_enabled": true, "available_path": "/nowhere/at/all"
        } ]
    })");
    QVERIFY(file);
    QCOMPARE(file->path, m_path);
    QCOMPARE(file->translationCatalog, "maps"_s);
    QCOMPARE(file->widgets.size(), size_t(1));
    const Widget &widget = file->widgets.front();
    QCOMPARE(widget.title, "Title"_s);
    QCOMPARE(widget.translationId, "t-id"_s);
    QCOMPARE(widget.descriptionId, "d-id"_s);
    QCOMPARE(widget.translationCatalog, "maps"_s);
    QCOMPARE(widget.icon, "image://icon"_s);
    QCOMPARE(widget.path, "/a.qml"_s);
    QCOMPARE(widget.availablePath, "/nowhere/at/all"_s);
    QCOMPARE(widget.order, 7);
    QCOMPARE(widget.defaultEnabled, true);
    QCOMPARE(widget.available, false);

    // The other keys may be absent.
    Widget plain;
    plain.path = "a"_s;
    plain.available = true;
    QVERIFY(!(readWidget("") != plain));
}

void TestEventsWidgetsFile::wrongTypesReadAsAbsent_data()
{
    QTest::addColumn<QByteArray>("value");
    for (const QByteArray value :
         {"null", "1", "1.5", "true", "\"text\"", "[\"a\"]", "{\"a\": 1}"}) {
        QTest::newRow(value.constData()) << value;
    }
}

void TestEventsWidgetsFile::wrongTypesReadAsAbsent()
{
    QFETCH(QByteArray, value);
    const bool isText = value.startsWith('"');
    const QString text = isText ? "text"_s : QString();

    const auto catalog = read(R"({ "widgets": [], "translation_catalog": )" + value + "}");
    QVERIFY(catalog);
    QCOMPARE(catalog->translationCatalog, text);

    const Widget widget =
        readWidget(R"(, "title": )" + value + R"(, "translation_id": )" + value
                   + R"(, "description_id": )" + value + R"(, "icon": )" + value
                   + R"(, "available_path": )" + value + R"(, "default_enabled": )" + value);
    QCOMPARE(widget.path, "a"_s);
    QCOMPARE(widget.title, text);
    QCOMPARE(widget.translationId, text);
    QCOMPARE(widget.descriptionId, text);
    QCOMPARE(widget.icon, text);
    QCOMPARE(widget.availablePath, text);
    QCOMPARE(widget.available, !isText);
    QCOMPARE(widget.defaultEnabled, value == "true");

    const auto path = read(R"({ "widgets": [ { "path": )" + value + "} ] }");
    QVERIFY(path);
    QCOMPARE(path->widgets.size(), size_t(isText ? 1 : 0));
    QCOMPARE(m_log->takeReport(), isText ? QString() : warning("Invalid widget defined in"));

    // Any other type reads as an empty array. Entries that are not widgets are left out.
    const auto widgets = read(R"({ "widgets": )" + value + "}");
    QVERIFY(widgets);
    QCOMPARE(widgets->widgets.size(), size_t(0));
    QCOMPARE(m_log->takeReport(),
             value.startsWith('[') ? warning("Invalid widget defined in") : QString());
}

void TestEventsWidgetsFile::order_data()
{
    QTest::addColumn<QByteArray>("value");
    QTest::addColumn<int>("order");
    const auto row = [](const char *value, int order) {
        QTest::newRow(value) << QByteArray(value) << order;
    };
    row("0", 0);
    row("5", 5);
    row("5.0", 5);
    row("5.5", -1);
    row("5e2", 500);
    row("-1", -1);
    row("-7", -7);
    row("2147483647", std::numeric_limits<int>::max());
    row("2147483648", -1);
    row("-2147483648", std::numeric_limits<int>::min());
    row("-2147483649", -1);
    row("4294967296", -1);
    row("1e300", -1);
    row("\"5\"", -1);
    row("true", -1);
    row("null", -1);
    row("[5]", -1);
}

void TestEventsWidgetsFile::order()
{
    QFETCH(QByteArray, value);
    const Widget widget = readWidget(R"(, "order": )" + value);
    QCOMPARE(widget.path, "a"_s);
    QTEST(widget.order, "order");
}

void TestEventsWidgetsFile::readsWidgets_data()
{
    QTest::addColumn<QByteArray>("content");
    QTest::addColumn<QString>("catalog");
    QTest::addColumn<QString>("widgets"); // path, title and order of each
    const auto row = [](const char *name, const QByteArray &content, const char *catalog,
                        const char *widgets) {
        QTest::newRow(name) << content << catalog << widgets;
    };
    row("several",
        R"({ "widgets": [ { "path": "c", "order": 9 }, { "path": "a", "title": "A" },
                          { "path": "b", "order": 1 } ] })",
        "", "c::9 a:A:-1 b::1");
    row("repeated path",
        R"({ "widgets": [ { "path": "a", "title": "1" }, { "path": "a", "title": "2" } ] })", "",
        "a:1:-1 a:2:-1");
    row("last of repeated keys",
        R"({ "widgets": [ 1, { "path": "a" } ], "widgets": [
             { "path": 1, "title": "1", "order": 1, "path": "b", "title": "2", "order": "3" } ] })",
        "", "b:2:-1");
    row("last of repeated keys, of another type",
        R"({ "widgets": [ { "path": "a" } ], "widgets": 5 })", "", "");
    row("unknown keys",
        R"({ "x": [1, {"y": null}], "Widgets": [ 1 ],
             "widgets": [ { "z": {"path": "b"}, "path": "a", "PATH": "c", "enabled": true } ] })",
        "", "a::-1");
    row("byte-order mark", "\xef\xbb\xbf{ \"widgets\": [ { \"path\": \"\xc3\xa4\" } ] }", "",
        "ä::-1");
    row("catalog only", R"({ "translation_catalog": "maps" })", "maps", "");
    row("catalog and no widget", R"({ "translation_catalog": "maps", "widgets": [] })", "maps", "");
    row("catalog behind the widgets",
        R"({ "widgets": [ { "path": "a" } ], "translation_catalog": "maps" })", "maps", "a::-1");
    const QByteArray begin = R"({ "widgets": [ { "path": "a" } ], "x": )";
    row("large file", begin + '"' + QByteArray(20 * 1024 * 1024, 'x') + "\" }", "", "a::-1");
    // The deepest file that QJsonDocument reads; deeper files are in noDefinition().
    row("deep file", begin + QByteArray(1023, '[') + QByteArray(1023, ']') + "}", "", "a::-1");
}

void TestEventsWidgetsFile::readsWidgets()
{
    QFETCH(QByteArray, content);
    QFETCH(QString, catalog);
    const auto file = read(content);
    QVERIFY(file);
    QCOMPARE(file->translationCatalog, catalog);
    QStringList widgets;
    for (const Widget &widget : file->widgets) {
        widgets.append("%1:%2:%3"_s.arg(widget.path, widget.title).arg(widget.order));
        QCOMPARE(widget.translationCatalog, catalog);
        QCOMPARE(widget.enabled, false);
    }
    QTEST(widgets.join(QLatin1Char(' ')), "widgets");
}

void TestEventsWidgetsFile::entriesThatAreNoWidgets()
{
    const auto file = read(R"({ "widgets": [
        1, { "path": "a" }, [], { "path": "" }, { }, { "path": "b" }, null ] })");
    QVERIFY(file);
    QCOMPARE(file->widgets.size(), size_t(2));
    QCOMPARE(file->widgets.at(0).path, "a"_s);
    QCOMPARE(file->widgets.at(1).path, "b"_s);
    const QStringList warnings(QVector<QString>(5, warning("Invalid widget defined in")).toList());
    QCOMPARE(m_log->takeReport(), warnings.join(QLatin1Char('\n')));
}

void TestEventsWidgetsFile::boundedWarnings()
{
    QByteArray entries;
    for (int i = 0; i < 5000; ++i) {
        entries += "0,";
    }
    const auto file = read(R"({ "widgets": [ )" + entries + R"({ "path": "a" } ] })");
    QVERIFY(file);
    QCOMPARE(file->widgets.size(), size_t(1));
    const QStringList warnings = m_log->takeTexts();
    QCOMPARE(warnings.size(), 1001);
    const QString path = " \"%1\""_s.arg(m_path);
    QCOMPARE(warnings.at(999), "Invalid widget defined in"_s + path);
    QCOMPARE(warnings.at(1000), "No further invalid widgets are reported in"_s + path);
}

void TestEventsWidgetsFile::noDefinition_data()
{
    QTest::addColumn<QByteArray>("content");
    const auto row = [](const char *name, const QByteArray &content) {
        QTest::newRow(name) << content;
    };
    row("empty", {});
    row("array", R"([ { "translation_catalog": "maps" } ])");
    row("text", "\"widgets\"");
    row("null", "null");
    row("not JSON", "widgets");
    row("cut off", R"({ "widgets": [ { "path": "a" } )");
    row("more behind it", R"({ "widgets": [] } x)");
    row("not UTF-8", "{ \"widgets\": [ { \"path\": \"\xff\" } ] }");
    row("UTF-16", QByteArray("\xff\xfe{\0}\0", 6));
    row("zeroes", QByteArray(4096, '\0'));
    row("one level too deep", R"({ "x": )" + QByteArray(1024, '[') + QByteArray(1024, ']') + "}");
    row("deep arrays", QByteArray(100000, '[') + QByteArray(100000, ']'));
    row("deep objects", QByteArray(R"({"widgets":)").repeated(100000));
}

void TestEventsWidgetsFile::noDefinition()
{
    QFETCH(QByteArray, content);
    QVERIFY(!read(content));
    QCOMPARE(m_log->takeReport(), warning("Invalid Events Widget"));
}

// What cannot be read, and how, is tested with the reader of regular files.
void TestEventsWidgetsFile::cannotBeOpened()
{
    QVERIFY(!readEventsWidgetsFile(m_path));
    QCOMPARE(m_log->takeReport(), warning("Failed to open"));
    Files::makePipe(m_path);
    QVERIFY(!readEventsWidgetsFile(m_path));
    QCOMPARE(m_log->takeReport(), warning("Failed to open"));
    Files::remove(m_path);
    Files::makeSparse(m_path, 1LL << 40);
    QVERIFY(!readEventsWidgetsFile(m_path));
    QCOMPARE(m_log->takeReport(), warning("Invalid Events Widget"));
}

void TestEventsWidgetsFile::tooManyContainers()
{
    // QJsonDocument needs about 50 times the size of such a text in memory.
    const QByteArray entries = QByteArray("[{}],").repeated(499999);
    QVERIFY(!isTooComplex("[{" + entries));
    QVERIFY(isTooComplex("[{[" + entries));
    QVERIFY(!read(R"({ "x": [ )" + entries + R"([] ], "widgets": [] })"));
    QCOMPARE(m_log->takeReport(), warning("Invalid Events Widget"));
}

void TestEventsWidgetsFile::availability()
{
    Widget widget;
    QVERIFY(widget.isAvailable());
    widget.availablePath = m_root->filePath("needed"_s);
    QVERIFY(!widget.isAvailable());
    Files::write(widget.availablePath, "");
    QVERIFY(widget.isAvailable());
    Files::remove(widget.availablePath);
    Files::makeDirectory(widget.availablePath);
    QVERIFY(widget.isAvailable());

    const QByteArray path = '"' + widget.availablePath.toUtf8() + '"';
    QVERIFY(readWidget(", \"available_path\": " + path).available);

    // Only a path can exist: not a name in a search path of the application, nor a cut path.
    QDir::addSearchPath("root"_s, m_root->path());
    widget.availablePath = "root:needed"_s;
    QVERIFY(!widget.isAvailable());
    widget.availablePath = m_root->filePath("needed"_s) + QChar::Null;
    QVERIFY(!widget.isAvailable());
}

void TestEventsWidgetsFile::comparison()
{
    const auto differs = [](auto change) {
        const Widget widget;
        Widget other;
        change(&other);
        return widget != other && other != widget;
    };
    QVERIFY(!differs([](Widget *) {}));
    QVERIFY(!differs([](Widget *widget) { widget->translationCatalog = "other"_s; }));
    for (QString Widget::*text : {&Widget::title, &Widget::translationId, &Widget::descriptionId,
                                  &Widget::icon, &Widget::path, &Widget::availablePath}) {
        QVERIFY(differs([text](Widget *widget) { widget->*text = "other"_s; }));
    }
    for (bool Widget::*flag : {&Widget::enabled, &Widget::defaultEnabled, &Widget::available}) {
        QVERIFY(differs([flag](Widget *widget) { widget->*flag = true; }));
    }
    QVERIFY(differs([](Widget *widget) { widget->order = 3; }));
}

QTEST_GUILESS_MAIN(TestEventsWidgetsFile)

#include "tst_eventswidgetsfile.moc"
