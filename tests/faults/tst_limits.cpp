// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The module with exhausted kernel resources, and with directories that are replaced.

#include "everytype.h"
#include "files.h"
#include "messagelog.h"
#include "ownprocess.h"
#include "patience.h"
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

    void noInotifyInstances();
    void noInotifyWatches();
    void noDescriptors();
    void directoryReplacedByALink_data();
    void directoryReplacedByALink();
};

namespace {

const QString actions = QStringLiteral("QuickActionsModel");
const QString widgets = QStringLiteral("EventsWidgetsModel");
const QString actionsDirectory = QStringLiteral("/usr/share/glimmera/quickactions");
const QString widgetsDirectory = QStringLiteral("/usr/share/glimmera/eventswidgets");

// A user namespace has limits of its own, below those of the machine.
const QStringList ownNamespace = {QStringLiteral("unshare"), QStringLiteral("--user"),
                                  QStringLiteral("--map-root-user")};

bool mayMakeNamespaces()
{
    return QProcess::execute(ownNamespace.first(),
                             ownNamespace.mid(1) + QStringList{QStringLiteral("true")})
        == 0;
}

void setLimit(const char *name, int value)
{
    QFile file(QStringLiteral("/proc/sys/user/") + QLatin1String(name));
    QVERIFY2(file.open(QIODevice::WriteOnly | QIODevice::Unbuffered), name);
    const QByteArray text = QByteArray::number(value);
    QCOMPARE(file.write(text), qint64(text.size()));
}

void addFiles(const QString &name)
{
    Files::write(actionsDirectory + QLatin1Char('/') + name + QStringLiteral(".conf"), "title=a\n");
    Files::write(widgetsDirectory + QLatin1Char('/') + name + QStringLiteral(".json"),
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
    QLocale::setDefault(QLocale(QStringLiteral("en_GB")));
}

void TestLimits::init()
{
    Files::remove(actionsDirectory);
    Files::remove(widgetsDirectory);
    EveryType::installFiles();
}

void TestLimits::noInotifyInstances()
{
    if (!OwnProcess::isThis() && !mayMakeNamespaces()) {
        QSKIP("this system forbids user namespaces");
    }
    IN_A_PROCESS_OF_ITS_OWN(ownNamespace)
    setLimit("max_inotify_instances", 0);
    const EveryType types;
    QCOMPARE(rows(types.object(actions)), 1);
    QCOMPARE(rows(types.object(widgets)), 1);
    // The models poll the directories instead, which does not show files that are written in place.
    for (int i = 0; i < 3; ++i) {
        addFiles(QStringLiteral("new%1").arg(i));
        TRY_COMPARE(rows(types.object(actions)), 2 + i);
        TRY_COMPARE(rows(types.object(widgets)), 2 + i);
    }

    setLimit("max_inotify_instances", 128);
    const auto model = types.make(widgets);
    Files::write(widgetsDirectory + QStringLiteral("/new0.json"), "{ \"widgets\": [ ] }");
    TRY_COMPARE(rows(it(model)), 3);
}

void TestLimits::noInotifyWatches()
{
    if (!OwnProcess::isThis() && !mayMakeNamespaces()) {
        QSKIP("this system forbids user namespaces");
    }
    IN_A_PROCESS_OF_ITS_OWN(ownNamespace)
    setLimit("max_inotify_watches", 0);
    const EveryType types;
    QCOMPARE(rows(types.object(actions)), 1);
    QCOMPARE(rows(types.object(widgets)), 1);
    // The models poll the directories, as without an instance.
    addFiles(QStringLiteral("new"));
    TRY_COMPARE(rows(types.object(actions)), 2);
    TRY_COMPARE(rows(types.object(widgets)), 2);

    setLimit("max_inotify_watches", 1000);
    const auto actionsModel = types.make(actions);
    const auto widgetsModel = types.make(widgets);
    addFiles(QStringLiteral("newer"));
    TRY_COMPARE(rows(it(actionsModel)), 3);
    TRY_COMPARE(rows(it(widgetsModel)), 3);
}

void TestLimits::noDescriptors()
{
    IN_A_PROCESS_OF_ITS_OWN()
    const EveryType types;
    QTest::qWait(100);
    const QStringList before = types.state();
    // Set once while there are descriptors: without them, the sanitizer cannot inspect an object of
    // a type that it has not seen before, and reports an error.
    QObject *formatter = types.object(QStringLiteral("MemoryCardFormatter"));
    formatter->setProperty("devicePath", QStringLiteral("/dev/first"));
    TRY_COMPARE(formatter->property("filesystemType").toString(), QStringLiteral("vfat"));
    std::vector<std::unique_ptr<QObject>> made;
    {
        const MessageLog log;
        const UsedUpDescriptors none;
        QCOMPARE(types.state().filter(QStringLiteral("TextFileReader.readContent")),
                 QStringList{QStringLiteral("TextFileReader.readContent QVariant(QString, \"\")")});
        for (const QString &name : EveryType::names()) {
            made.push_back(types.make(name));
        }
        // The formatter's helper cannot be started.
        formatter->setProperty("devicePath", QStringLiteral("/dev/card"));
        TRY_COMPARE(formatter->property("status").toInt(), 6); // Error
        QTest::qWait(100);
    }
    // The address is read once, and the formatter has got a path.
    const QStringList after = types.state();
    for (const QString &line : before) {
        QVERIFY2(after.contains(line) || line.startsWith(QLatin1String("MemoryCardFormatter")),
                 qPrintable(line));
    }
    formatter->setProperty("devicePath", QStringLiteral("/dev/other"));
    TRY_COMPARE(formatter->property("filesystemType").toString(), QStringLiteral("vfat"));
    addFiles(QStringLiteral("new"));
    TRY_COMPARE(rows(types.object(actions)), 2);
    TRY_COMPARE(rows(types.object(widgets)), 2);
}

void TestLimits::directoryReplacedByALink_data()
{
    QTest::addColumn<QString>("type");
    QTest::addColumn<QString>("directory");
    QTest::newRow("QuickActionsModel") << actions << actionsDirectory;
    QTest::newRow("EventsWidgetsModel") << widgets << widgetsDirectory;
}

void TestLimits::directoryReplacedByALink()
{
    QFETCH(QString, type);
    QFETCH(QString, directory);
    const EveryType types;
    QObject *model = types.object(type);
    QCOMPARE(rows(model), 1);
    addFiles(QStringLiteral("other"));
    TRY_COMPARE(rows(model), 2);

    const QString target = directory + QStringLiteral("-target");
    Files::remove(target);
    QVERIFY(QDir().rename(directory, target));
    TRY_COMPARE(rows(model), 0);
    Files::makeLink(target, directory);
    TRY_COMPARE(rows(model), 2);
    // The model notices changes in the target of the link.
    addFiles(QStringLiteral("third"));
    TRY_COMPARE(rows(model), 3);
    // This removes the link, but nothing in its target.
    Files::remove(directory);
    TRY_COMPARE(rows(model), 0);
    QCOMPARE(QDir(target).count(), uint(3 + 2)); // with . and ..
    Files::makeDirectory(directory);
    addFiles(QStringLiteral("last"));
    TRY_COMPARE(rows(model), 1);
    Files::remove(target);
}

QTEST_GUILESS_MAIN(TestLimits)

#include "tst_limits.moc"
