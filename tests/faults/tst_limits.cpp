// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The module with exhausted kernel resources, and with directories that are replaced.

#include "everytype.h"
#include "files.h"
#include "messagelog.h"
#include "ownprocess.h"
#include "patience.h"
#include "places.h"
#include "texts.h"
#include "usedupdescriptors.h"

#include <QAbstractListModel>
#include <QDir>
#include <QtTest>

class TestLimits : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();

    void noInotify_data();
    void noInotify();
    void noDescriptors();
    void directoryReplacedByALink_data();
    void directoryReplacedByALink();
};

namespace {

const QString actions = "QuickActionsModel"_s;
const QString widgets = "EventsWidgetsModel"_s;

// A user namespace has limits of its own, below those of the machine.
const QStringList ownNamespace = {"unshare"_s, "--user"_s, "--map-root-user"_s};

bool mayMakeNamespaces()
{
    return QProcess::execute(ownNamespace.first(), ownNamespace.mid(1) + QStringList{"true"_s})
        == 0;
}

bool setLimit(const QByteArray &name, const QByteArray &value)
{
    QFile file("/proc/sys/user/"_s + QLatin1String(name));
    return file.open(QIODevice::WriteOnly | QIODevice::Unbuffered)
        && file.write(value) == value.size();
}

void addFiles(const QString &name)
{
    Files::write(Places::quickActions + QLatin1Char('/') + name + ".conf"_s, "title=a\n");
    Files::write(Places::eventsWidgets + QLatin1Char('/') + name + ".json"_s,
                 R"({ "widgets": [ { "path": ")" + name.toUtf8() + R"(" } ] })");
}

int rows(QObject *model)
{
    return qobject_cast<QAbstractListModel *>(model)->rowCount();
}

QObject *it(const std::unique_ptr<QObject> &created)
{
    return created->property("it").value<QObject *>();
}

} // namespace

void TestLimits::initTestCase()
{
    QLocale::setDefault(QLocale("en_GB"_s));
}

void TestLimits::init()
{
    Files::remove(Places::quickActions);
    Files::remove(Places::eventsWidgets);
    EveryType::installFiles();
}

void TestLimits::noInotify_data()
{
    QTest::addColumn<QByteArray>("limit");
    QTest::newRow("no instances") << QByteArray("max_inotify_instances");
    QTest::newRow("no watches") << QByteArray("max_inotify_watches");
}

void TestLimits::noInotify()
{
    if (!OwnProcess::isThis() && !mayMakeNamespaces()) {
        QSKIP("this system forbids user namespaces");
    }
    IN_A_PROCESS_OF_ITS_OWN(ownNamespace)
    QFETCH(QByteArray, limit);
    QVERIFY(setLimit(limit, "0"));
    const EveryType types;
    QCOMPARE(rows(types.object(actions)), 1);
    QCOMPARE(rows(types.object(widgets)), 1);
    // The models poll the directories instead, which does not show files that are written in place.
    for (int i = 0; i < 3; ++i) {
        addFiles("new%1"_s.arg(i));
        TRY_COMPARE(rows(types.object(actions)), 2 + i);
        TRY_COMPARE(rows(types.object(widgets)), 2 + i);
    }

    QVERIFY(setLimit(limit, "128"));
    const auto actionsModel = types.make(actions);
    const auto widgetsModel = types.make(widgets);
    addFiles("newer"_s);
    TRY_COMPARE(rows(it(actionsModel)), 5);
    TRY_COMPARE(rows(it(widgetsModel)), 5);
}

void TestLimits::noDescriptors()
{
    IN_A_PROCESS_OF_ITS_OWN()
    const EveryType types;
    QTest::qWait(100);
    const QStringList before = types.state();
    // Set once while there are descriptors: without them, the sanitizer cannot inspect an object of
    // a type that it has not seen before, and reports an error.
    QObject *formatter = types.object("MemoryCardFormatter"_s);
    formatter->setProperty("devicePath", "/dev/first"_s);
    TRY_COMPARE(formatter->property("filesystemType").toString(), "vfat"_s);
    std::vector<std::unique_ptr<QObject>> made;
    {
        const MessageLog log;
        const UsedUpDescriptors none;
        QCOMPARE(types.state().filter("TextFileReader.readContent"_s),
                 QStringList{"TextFileReader.readContent QVariant(QString, \"\")"_s});
        for (const QString &name : EveryType::names()) {
            made.push_back(types.make(name));
        }
        // The formatter's helper cannot be started.
        formatter->setProperty("devicePath", "/dev/card"_s);
        TRY_COMPARE(formatter->property("status").toInt(), 6); // Error
        QTest::qWait(100);
    }
    // The address is read once, and the formatter has got a path.
    const QStringList after = types.state();
    for (const QString &line : before) {
        QVERIFY2(after.contains(line) || line.startsWith(QLatin1String("MemoryCardFormatter")),
                 qPrintable(line));
    }
    formatter->setProperty("devicePath", "/dev/other"_s);
    TRY_COMPARE(formatter->property("filesystemType").toString(), "vfat"_s);
    addFiles("new"_s);
    TRY_COMPARE(rows(types.object(actions)), 2);
    TRY_COMPARE(rows(types.object(widgets)), 2);
}

void TestLimits::directoryReplacedByALink_data()
{
    QTest::addColumn<QString>("type");
    QTest::addColumn<QString>("directory");
    QTest::newRow("QuickActionsModel") << actions << Places::quickActions;
    QTest::newRow("EventsWidgetsModel") << widgets << Places::eventsWidgets;
}

void TestLimits::directoryReplacedByALink()
{
    QFETCH(QString, type);
    QFETCH(QString, directory);
    const EveryType types;
    QObject *model = types.object(type);
    QCOMPARE(rows(model), 1);
    addFiles("other"_s);
    TRY_COMPARE(rows(model), 2);

    const QString target = directory + "-target"_s;
    Files::remove(target);
    QVERIFY(QDir().rename(directory, target));
    TRY_COMPARE(rows(model), 0);
    Files::makeLink(target, directory);
    TRY_COMPARE(rows(model), 2);
    // The model notices changes in the target of the link.
    addFiles("third"_s);
    TRY_COMPARE(rows(model), 3);
    // This removes the link, but nothing in its target.
    Files::remove(directory);
    TRY_COMPARE(rows(model), 0);
    QCOMPARE(QDir(target).count(), uint(3 + 2)); // with . and ..
    Files::makeDirectory(directory);
    addFiles("last"_s);
    TRY_COMPARE(rows(model), 1);
    Files::remove(target);
}

QTEST_GUILESS_MAIN(TestLimits)

#include "tst_limits.moc"
