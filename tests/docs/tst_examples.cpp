// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The examples of the README, the manual pages and the reference work exactly as printed.

#include "dconftool.h"
#include "files.h"
#include "loggedtest.h"
#include "mgconfitem.h"
#include "simulator/recordingservice.h"
#include "words.h"

#include <QAbstractItemModel>
#include <QDir>
#include <QFile>
#include <QGuiApplication>
#include <QLocale>
#include <QQmlComponent>
#include <QQmlEngine>
#include <QQuickItem>
#include <QQuickWindow>
#include <QRegularExpression>
#include <QtTest>

#include <algorithm>
#include <memory>

namespace {

const QString actionPath = QStringLiteral("/usr/share/glimmera/quickactions/torch.conf");
const QString widgetsPath = QStringLiteral("/usr/share/glimmera/eventswidgets/weather.json");
const QString programPath = QStringLiteral("/usr/bin/weather");
const QString enabledKey = QStringLiteral("/desktop/glimmera-marlo-home/events_screen_actions");

QByteArray contentOf(const QString &path)
{
    QFile file(QStringLiteral(SOURCE_DIR "/") + path);
    if (!file.open(QIODevice::ReadOnly)) {
        qFatal("cannot open %s", qPrintable(file.fileName()));
    }
    return file.readAll();
}

QByteArray example(const QString &name)
{
    return contentOf(QStringLiteral("docs/examples/") + name);
}

QVariant valueAt(const QAbstractItemModel &model, int row, const QByteArray &role)
{
    return model.data(model.index(row, 0), model.roleNames().key(role, -1));
}

// The examples that a file of the reference shows, as documents.
QByteArrayList examplesOf(const QString &file)
{
    static const QRegularExpression block(QStringLiteral("(?s)\\\\qml\\n(.*?)\\\\endqml"));
    QByteArrayList documents;
    auto blocks = block.globalMatch(QString::fromUtf8(contentOf(file)));
    while (blocks.hasNext()) {
        documents.append("import QtQuick 2.15\nimport QtQuick.Controls 2.15\n"
                         "import com.marlo.settings.system 1.0\n"
                         + blocks.next().captured(1).toUtf8());
    }
    return documents;
}

bool isBusy(const QObject &example)
{
    const QList<QObject *> parts = example.findChildren<QObject *>();
    return std::any_of(parts.begin(), parts.end(),
                       [](const QObject *part) { return part->property("busy").toBool(); });
}

} // namespace

class TestExamples : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void definesAQuickAction();
    void definesAWidget();
    void loadsTheWidget();
    void listsTheActionOnAPage();
    void ordersActions();
    void selectsByTwoRoles();
    void runsThoseOfTheReference_data();
    void runsThoseOfTheReference();
    void areAllThatTheReadmeShows();
    void standInTheManualPages_data();
    void standInTheManualPages();

private:
    std::unique_ptr<QObject> create(const QByteArray &document);
    // The example of the reference in this file that contains the text.
    std::unique_ptr<QObject> createExample(const QString &file, const QByteArray &text);

    QQmlEngine m_engine;
};

void TestExamples::initTestCase()
{
    QLocale::setDefault(QLocale(QStringLiteral("en_GB")));
    m_engine.addImportPath(QStringLiteral(QML_BUILD_DIR));
    Files::write(actionPath, example(QStringLiteral("torch.conf")));
    Files::write(widgetsPath, example(QStringLiteral("weather.json")));
    Files::write(QStringLiteral("/var/lib/bluetooth/board-address"), "00:1A:7D:DA:71:13\n");
    Files::write(
        QStringLiteral("/usr/share/marlo-settings/platform-eula/tarnwick_termsofuse-en_GB.txt"),
        "Terms\nBody\n");
    MGConfItem(enabledKey).set(QStringList(actionPath));
}

std::unique_ptr<QObject> TestExamples::create(const QByteArray &document)
{
    QQmlComponent component(&m_engine);
    component.setData(document, QUrl(QStringLiteral("file:///example.qml")));
    std::unique_ptr<QObject> object(component.create());
    if (object == nullptr) {
        qWarning("%s", qPrintable(component.errorString()));
    }
    return object;
}

void TestExamples::definesAQuickAction()
{
    RecordingService torch(QDBusConnection::SessionBus, QStringLiteral("com.marlo.torch"));
    const auto object = create("import com.marlo.settings.system 1.0\nQuickActionsModel {}");
    auto *model = qobject_cast<QAbstractItemModel *>(object.get());
    QVERIFY(model != nullptr);
    QTRY_COMPARE(model->rowCount(), 1);
    // Without its catalog the title is the identifier.
    QCOMPARE(valueAt(*model, 0, "title"), QVariant(QStringLiteral("torch-quick-action")));
    QCOMPARE(valueAt(*model, 0, "icon"),
             QVariant(QStringLiteral("/usr/share/glimmera/icons/torch.svg")));

    QVERIFY(QMetaObject::invokeMethod(model, "triggerAction", Q_ARG(int, 0)));
    QTRY_COMPARE(torch.calls().size(), 1);
    const QDBusMessage call = torch.calls().constFirst();
    QCOMPARE(call.path(), QStringLiteral("/"));
    QCOMPARE(call.interface(), QStringLiteral("com.marlo.torch"));
    QCOMPARE(call.member(), QStringLiteral("toggle"));
    QCOMPARE(call.arguments(), QVariantList{QStringLiteral("bright")});
}

void TestExamples::definesAWidget()
{
    Files::remove(programPath);
    const auto object = create("import com.marlo.settings.system 1.0\nEventsWidgetsModel {}");
    auto *model = qobject_cast<QAbstractItemModel *>(object.get());
    QVERIFY(model != nullptr);
    QCOMPARE(model->rowCount(), 1);
    const auto text = [model](const char *role) { return valueAt(*model, 0, role).toString(); };
    QCOMPARE(text("title"), QStringLiteral("Weather"));
    QCOMPARE(text("description"), QString());
    QCOMPARE(text("icon"), QStringLiteral("image://theme/weather"));
    QCOMPARE(text("path"), QStringLiteral("/usr/share/weather/EventsWidget.qml"));
    QCOMPARE(valueAt(*model, 0, "enabled"), QVariant(true));
    QCOMPARE(valueAt(*model, 0, "available"), QVariant(false));

    Files::write(programPath, "");
    QVERIFY(QMetaObject::invokeMethod(model, "updateAvailable"));
    QCOMPARE(valueAt(*model, 0, "available"), QVariant(true));
}

// As the manual page says, the home screen sets the width, and the widget its height.
void TestExamples::loadsTheWidget()
{
    const QByteArray file = SOURCE_DIR "/docs/examples/EventsWidget.qml";
    const auto object = create("import QtQuick 2.15\nLoader { source: \"file://" + file + "\" }");
    auto *loader = qobject_cast<QQuickItem *>(object.get());
    QVERIFY(loader != nullptr);
    QQuickWindow window;
    loader->setParentItem(window.contentItem());
    window.show();
    loader->setWidth(1000);
    QTRY_VERIFY(loader->height() > 0);
    const qreal height = loader->height();
    loader->setWidth(20);
    QTRY_VERIFY(loader->height() > height);
}

void TestExamples::listsTheActionOnAPage()
{
    const auto object = create(example(QStringLiteral("page.qml")));
    auto *page = qobject_cast<QQuickItem *>(object.get());
    QVERIFY(page != nullptr);
    QQuickWindow window;
    window.resize(page->size().toSize());
    page->setParentItem(window.contentItem());
    window.show();
    QVERIFY(QTest::qWaitForWindowExposed(&window));
    QTRY_COMPARE(page->property("count"), QVariant(1));

    QQuickItem *row = nullptr;
    QTRY_VERIFY((QMetaObject::invokeMethod(page, "itemAtIndex", Q_RETURN_ARG(QQuickItem *, row),
                                           Q_ARG(int, 0)),
                 row != nullptr));
    QCOMPARE(row->property("text"), QVariant(QStringLiteral("torch-quick-action")));

    RecordingService torch(QDBusConnection::SessionBus, QStringLiteral("com.marlo.torch"));
    QTest::mouseClick(&window, Qt::LeftButton, Qt::NoModifier,
                      row->mapToScene({row->width() / 2, row->height() / 2}).toPoint());
    QTRY_COMPARE(torch.calls().size(), 1);
}

std::unique_ptr<QObject> TestExamples::createExample(const QString &file, const QByteArray &text)
{
    for (const QByteArray &document : examplesOf(file)) {
        if (document.contains(text)) {
            return create(document);
        }
    }
    return nullptr;
}

void TestExamples::ordersActions()
{
    const QString pattern = QStringLiteral("/usr/share/glimmera/quickactions/order-%1.conf");
    const auto paths = [&pattern](const char *names) {
        QStringList paths;
        for (const QString &name : words(names)) {
            paths.append(pattern.arg(name));
        }
        return paths;
    };
    MGConfItem list(enabledKey);
    const QVariant before = list.value();
    Files::write(pattern.arg(QLatin1Char('a')), "title=a\n");
    Files::write(pattern.arg(QLatin1Char('b')), "title=b\n");
    // The module has a dconf client of its own, which sees what is stored.
    list.set(paths("a missing b"));
    DconfTool::waitUntilStored();
    const auto page =
        createExample(QStringLiteral("quickactions/quickactionsmodel.cpp"), "showStoredOrder");
    QVERIFY(page != nullptr);
    const auto model = [&page] { return page->property("model").value<QAbstractItemModel *>(); };
    const auto titles = [&model] {
        return valueAt(*model(), 0, "title").toString() + valueAt(*model(), 1, "title").toString();
    };
    const auto move = [&page](int from, int to) {
        QMetaObject::invokeMethod(page.get(), "moveAction", Q_ARG(QVariant, from),
                                  Q_ARG(QVariant, to));
    };
    QCOMPARE(titles(), QStringLiteral("ab"));
    // The entry of the missing action moves, so the rows return to the order of the list.
    move(1, 0);
    QTRY_COMPARE(list.value().toStringList(), paths("missing a b"));
    QCOMPARE(titles(), QStringLiteral("ab"));

    list.set(paths("a b"));
    DconfTool::waitUntilStored();
    const QAbstractItemModel *shown = model();
    move(1, 0);
    QTRY_COMPARE(list.value().toStringList(), paths("b a"));
    QCOMPARE(titles(), QStringLiteral("ba"));
    QCOMPARE(model(), shown);
    list.set(before);
    DconfTool::waitUntilStored();
    Files::remove(pattern.arg(QLatin1Char('a')));
    Files::remove(pattern.arg(QLatin1Char('b')));
}

void TestExamples::selectsByTwoRoles()
{
    const QString path = QStringLiteral("/usr/share/glimmera/eventswidgets/roles.json");
    const QString needed = QStringLiteral("/usr/share/glimmera/needed");
    const QString key = QStringLiteral("/desktop/glimmera-marlo-home/events_screen_widgets");
    Files::write(path, R"({ "widgets": [
        { "path": "a", "title": "A", "order": 1 },
        { "path": "b", "title": "B", "order": 2, "available_path": "/usr/share/glimmera/needed" },
        { "path": "c", "title": "C", "order": 3 } ] })");
    MGConfItem(key).set(words("a b"));
    const auto label =
        createExample(QStringLiteral("eventswidgets/titlesview.cpp"), "Instantiator");
    QVERIFY(label != nullptr);
    const auto text = [&label] { return label->property("text").toString(); };
    QTRY_COMPARE(text(), QStringLiteral("A"));
    MGConfItem(key).set(words("a b c"));
    QTRY_COMPARE(text(), QStringLiteral("A and C"));
    Files::write(needed, "");
    Files::write(path + QStringLiteral(".json"), "{ \"widgets\": [] }"); // A change: scans again.
    QTRY_COMPARE(text(), QStringLiteral("A, B and C"));
    MGConfItem(key).unset();
    Files::remove(path);
    Files::remove(path + QStringLiteral(".json"));
    Files::remove(needed);
}

void TestExamples::runsThoseOfTheReference_data()
{
    QTest::addColumn<QByteArray>("document");
    const QStringList directories =
        words("deviceinfo documents eventswidgets memorycard quickactions");
    int found = 0;
    for (const QString &directory : directories) {
        const QStringList names = QDir(QStringLiteral(SOURCE_DIR "/") + directory)
                                      .entryList({QStringLiteral("*.cpp")}, QDir::Files);
        for (const QString &name : names) {
            const QByteArrayList documents = examplesOf(directory + QLatin1Char('/') + name);
            for (const QByteArray &document : documents) {
                ++found;
                QTest::addRow("%s %d", qPrintable(name), found) << document;
            }
        }
    }
    // tst_reference checks that each type has an example.
    QVERIFY(found > 0);
}

void TestExamples::runsThoseOfTheReference()
{
    QFETCH(const QByteArray, document);
    const auto object = create(document);
    QVERIFY(object != nullptr);
    // An example may probe its card. The helper does not exist; wait until its start has failed.
    QTRY_VERIFY(!isBusy(*object));
    for (const QString &text : m_log->takeTexts()) {
        QVERIFY2(text.startsWith(QStringLiteral("Cannot start \"/usr/libexec/sdcardhelper\"")),
                 qPrintable(text));
    }
}

void TestExamples::areAllThatTheReadmeShows()
{
    static const QRegularExpression block(QStringLiteral("(?s)```(?:qml|ini|json)\\n(.*?)```"));
    auto blocks = block.globalMatch(QString::fromUtf8(contentOf(QStringLiteral("README.md"))));
    QStringList shown;
    while (blocks.hasNext()) {
        shown.append(blocks.next().captured(1));
    }
    QCOMPARE(shown, QStringList(QString::fromUtf8(example(QStringLiteral("page.qml")))));
}

void TestExamples::standInTheManualPages_data()
{
    QTest::addColumn<QString>("page");
    QTest::addColumn<QString>("file");
    const auto row = [](const char *page, const char *file) {
        QTest::newRow(file) << page << file;
    };
    row("docs/man/marlo-quickactions.5", "torch.conf");
    row("docs/man/marlo-eventswidgets.5", "weather.json");
    row("docs/man/marlo-eventswidgets.5", "EventsWidget.qml");
}

void TestExamples::standInTheManualPages()
{
    QFETCH(const QString, page);
    QFETCH(const QString, file);
    // A manual page writes a backslash as \e.
    const QByteArray text = contentOf(page).replace("\\e", "\\");
    QVERIFY2(text.contains(".Bd -literal -offset indent\n" + example(file) + ".Ed\n"),
             "the manual page has another text than docs/examples");
}

QTEST_MAIN(TestExamples)

#include "tst_examples.moc"
