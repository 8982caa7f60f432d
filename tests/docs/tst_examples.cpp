// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The examples of the README, the manual pages and the reference work exactly as printed.

#include "dconftool.h"
#include "files.h"
#include "loggedtest.h"
#include "mgconfitem.h"
#include "patience.h"
#include "places.h"
#include "simulator/recordingservice.h"
#include "texts.h"
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

const QString actionPath = Places::quickActions + "/torch.conf"_s;
const QByteArray moduleImport = "import com.marlo.settings.system 1.0\n";
const QString programPath = "/usr/bin/weather"_s;

QByteArray contentOf(const QString &path)
{
    QFile file(SOURCE_DIR "/"_s + path);
    if (!file.open(QIODevice::ReadOnly)) {
        qFatal("cannot open %s", qPrintable(file.fileName()));
    }
    return file.readAll();
}

QByteArray example(const QString &name)
{
    return contentOf("docs/examples/"_s + name);
}

QVariant valueAt(const QAbstractItemModel &model, int row, const QByteArray &role)
{
    return model.data(model.index(row, 0), model.roleNames().key(role, -1));
}

// The examples that a file of the reference shows, as documents.
QByteArrayList examplesOf(const QString &file)
{
    static const QRegularExpression block("(?s)\\\\qml\\n(.*?)\\\\endqml"_s);
    QByteArrayList documents;
    auto blocks = block.globalMatch(QString::fromUtf8(contentOf(file)));
    while (blocks.hasNext()) {
        documents.append("import QtQuick 2.15\nimport QtQuick.Controls 2.15\n" + moduleImport
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
    void standInTheManualPages();

private:
    std::unique_ptr<QObject> create(const QByteArray &document);
    // The example of the reference in this file that contains the text.
    std::unique_ptr<QObject> createExample(const QString &file, const QByteArray &text);

    QQmlEngine m_engine;
};

void TestExamples::initTestCase()
{
    QLocale::setDefault(QLocale("en_GB"_s));
    m_engine.addImportPath(QLatin1String(QML_BUILD_DIR));
    Files::write(actionPath, example("torch.conf"_s));
    Files::write(Places::eventsWidgets + "/weather.json"_s, example("weather.json"_s));
    Files::write("/var/lib/bluetooth/board-address"_s, "00:1A:7D:DA:71:13\n");
    Files::write("/usr/share/marlo-settings/platform-eula/tarnwick_termsofuse-en_GB.txt"_s,
                 "Terms\nBody\n");
    MGConfItem(Places::enabledActions).set(QStringList(actionPath));
}

std::unique_ptr<QObject> TestExamples::create(const QByteArray &document)
{
    QQmlComponent component(&m_engine);
    component.setData(document, QUrl("file:///example.qml"_s));
    std::unique_ptr<QObject> object(component.create());
    if (object == nullptr) {
        qWarning("%s", qPrintable(component.errorString()));
    }
    return object;
}

void TestExamples::definesAQuickAction()
{
    RecordingService torch(QDBusConnection::SessionBus, "com.marlo.torch"_s);
    const auto object = create(moduleImport + "QuickActionsModel {}");
    auto *model = qobject_cast<QAbstractItemModel *>(object.get());
    QVERIFY(model != nullptr);
    TRY_COMPARE(model->rowCount(), 1);
    // Without its catalog the title is the identifier.
    QCOMPARE(valueAt(*model, 0, "title"), QVariant("torch-quick-action"_s));
    QCOMPARE(valueAt(*model, 0, "icon"), QVariant("/usr/share/glimmera/icons/torch.svg"_s));

    QVERIFY(QMetaObject::invokeMethod(model, "triggerAction", Q_ARG(int, 0)));
    TRY_COMPARE(torch.calls().size(), 1);
    const QDBusMessage call = torch.calls().constFirst();
    QCOMPARE(call.path(), "/"_s);
    QCOMPARE(call.interface(), "com.marlo.torch"_s);
    QCOMPARE(call.member(), "toggle"_s);
    QCOMPARE(call.arguments(), QVariantList{"bright"_s});
}

void TestExamples::definesAWidget()
{
    Files::remove(programPath);
    const auto object = create(moduleImport + "EventsWidgetsModel {}");
    auto *model = qobject_cast<QAbstractItemModel *>(object.get());
    QVERIFY(model != nullptr);
    QCOMPARE(model->rowCount(), 1);
    const auto text = [model](const char *role) { return valueAt(*model, 0, role).toString(); };
    QCOMPARE(text("title"), "Weather"_s);
    QCOMPARE(text("description"), QString());
    QCOMPARE(text("icon"), "image://theme/weather"_s);
    QCOMPARE(text("path"), "/usr/share/weather/EventsWidget.qml"_s);
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
    TRY(loader->height() > 0);
    const qreal height = loader->height();
    loader->setWidth(20);
    TRY(loader->height() > height);
}

void TestExamples::listsTheActionOnAPage()
{
    const auto object = create(example("page.qml"_s));
    auto *page = qobject_cast<QQuickItem *>(object.get());
    QVERIFY(page != nullptr);
    QQuickWindow window;
    window.resize(page->size().toSize());
    page->setParentItem(window.contentItem());
    window.show();
    QVERIFY(QTest::qWaitForWindowExposed(&window));
    TRY_COMPARE(page->property("count"), QVariant(1));

    QQuickItem *row = nullptr;
    TRY((QMetaObject::invokeMethod(page, "itemAtIndex", Q_RETURN_ARG(QQuickItem *, row),
                                   Q_ARG(int, 0)),
         row != nullptr));
    QCOMPARE(row->property("text"), QVariant("torch-quick-action"_s));

    RecordingService torch(QDBusConnection::SessionBus, "com.marlo.torch"_s);
    QTest::mouseClick(&window, Qt::LeftButton, Qt::NoModifier,
                      row->mapToScene({row->width() / 2, row->height() / 2}).toPoint());
    TRY_COMPARE(torch.calls().size(), 1);
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
    const QString pattern = Places::quickActions + "/order-%1.conf"_s;
    const auto paths = [&pattern](const char *names) {
        QStringList list;
        for (const QString &name : words(names)) {
            list.append(pattern.arg(name));
        }
        return list;
    };
    MGConfItem list(Places::enabledActions);
    const QVariant before = list.value();
    Files::write(pattern.arg(QLatin1Char('a')), "title=a\n");
    Files::write(pattern.arg(QLatin1Char('b')), "title=b\n");
    // The module has a dconf client of its own, which sees what is stored.
    list.set(paths("a missing b"));
    DconfTool::waitUntilStored();
    const auto page = createExample("quickactions/quickactionsmodel.cpp"_s, "showStoredOrder");
    QVERIFY(page != nullptr);
    const auto model = [&page] { return page->property("model").value<QAbstractItemModel *>(); };
    const auto titles = [&model] {
        return valueAt(*model(), 0, "title").toString() + valueAt(*model(), 1, "title").toString();
    };
    const auto move = [&page](int from, int to) {
        QMetaObject::invokeMethod(page.get(), "moveAction", Q_ARG(QVariant, from),
                                  Q_ARG(QVariant, to));
    };
    QCOMPARE(titles(), "ab"_s);
    // The entry of the missing action moves, so the rows return to the order of the list.
    move(1, 0);
    TRY_COMPARE(list.value().toStringList(), paths("missing a b"));
    QCOMPARE(titles(), "ab"_s);

    list.set(paths("a b"));
    DconfTool::waitUntilStored();
    const QAbstractItemModel *shown = model();
    move(1, 0);
    TRY_COMPARE(list.value().toStringList(), paths("b a"));
    QCOMPARE(titles(), "ba"_s);
    QCOMPARE(model(), shown);
    list.set(before);
    DconfTool::waitUntilStored();
    Files::remove(pattern.arg(QLatin1Char('a')));
    Files::remove(pattern.arg(QLatin1Char('b')));
}

void TestExamples::selectsByTwoRoles()
{
    const QString path = Places::eventsWidgets + "/roles.json"_s;
    const QString needed = "/usr/share/glimmera/needed"_s;
    const QString key = Places::enabledWidgets;
    Files::write(path, R"({ "widgets": [
        { "path": "a", "title": "A", "order": 1 },
        { "path": "b", "title": "B", "order": 2, "available_path": "/usr/share/glimmera/needed" },
        { "path": "c", "title": "C", "order": 3 } ] })");
    MGConfItem(key).set(words("a b"));
    const auto label = createExample("eventswidgets/titlesview.cpp"_s, "Instantiator");
    QVERIFY(label != nullptr);
    const auto text = [&label] { return label->property("text").toString(); };
    TRY_COMPARE(text(), "A"_s);
    MGConfItem(key).set(words("a b c"));
    TRY_COMPARE(text(), "A and C"_s);
    Files::write(needed, "");
    Files::write(path + ".json"_s, "{ \"widgets\": [] }"); // A change: scans again.
    TRY_COMPARE(text(), "A, B and C"_s);
    MGConfItem(key).unset();
    Files::remove(path);
    Files::remove(path + ".json"_s);
    Files::remove(needed);
}

void TestExamples::runsThoseOfTheReference_data()
{
    QTest::addColumn<QByteArray>("document");
    const QStringList directories =
        words("deviceinfo documents eventswidgets memorycard quickactions");
    int found = 0;
    for (const QString &directory : directories) {
        const QStringList names =
            QDir(SOURCE_DIR "/"_s + directory).entryList({"*.cpp"_s}, QDir::Files);
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
    TRY(!isBusy(*object));
    for (const QString &text : m_log->takeTexts()) {
        QVERIFY2(text.startsWith("Cannot start \"/usr/libexec/sdcardhelper\""_s), qPrintable(text));
    }
}

void TestExamples::areAllThatTheReadmeShows()
{
    static const QRegularExpression block("(?s)```(?:qml|ini|json)\\n(.*?)```"_s);
    auto blocks = block.globalMatch(QString::fromUtf8(contentOf("README.md"_s)));
    QStringList shown;
    while (blocks.hasNext()) {
        shown.append(blocks.next().captured(1));
    }
    QCOMPARE(shown, QStringList(QString::fromUtf8(example("page.qml"_s))));
}

void TestExamples::standInTheManualPages()
{
    for (const auto &[page, file] :
         {std::pair("quickactions", "torch.conf"), std::pair("eventswidgets", "weather.json"),
          std::pair("eventswidgets", "EventsWidget.qml")}) {
        // A manual page writes a backslash as \e.
        const QByteArray text =
            contentOf("docs/man/marlo-%1.5"_s.arg(QLatin1String(page))).replace("\\e", "\\");
        const QByteArray shown = example(QLatin1String(file));
        QVERIFY2(text.contains(".Bd -literal -offset indent\n" + shown + ".Ed\n"), file);
    }
}

QTEST_MAIN(TestExamples)

#include "tst_examples.moc"
