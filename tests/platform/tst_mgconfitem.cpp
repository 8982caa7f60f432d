// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "dconftool.h"
#include "files.h"
#include "loggedtest.h"
#include "mgconfitem.h"
#include "patience.h"
#include "texts.h"

#include <QDBusConnection>
#include <QDBusConnectionInterface>
#include <QDebug>
#include <QDir>
#include <QProcess>
#include <QScopeGuard>
#include <QScopedValueRollback>
#include <QSignalSpy>
#include <QTemporaryDir>
#include <QTest>
#include <QTimer>
#include <QUrl>
#include <atomic>
#include <csignal>
#include <cstdio>
#include <dconf.h>
#include <dlfcn.h>
#include <gio/gio.h>
#include <memory>
#include <unistd.h>

/*
    A test that needs a process of its own (for its exit, its bus, its event dispatcher) runs this
    program with the name of a scenario. A scenario prints lines that the test reads.
*/
namespace scenarios {

const QString followedKey = "/test/child/followed"_s;

void say(const char *line)
{
    std::puts(line);
    std::fflush(stdout);
}

// Returns from main right after the last set().
int setAndExit(QCoreApplication &app)
{
    for (int i = 0; i < app.arguments().at(2).toInt(); ++i) {
        MGConfItem("/test/child/key%1"_s.arg(i)).set(i);
    }
    return 0;
}

int setLocked(QCoreApplication &)
{
    MGConfItem item("/test/locked"_s);
    item.set(1);
    say(qPrintable(item.value().toString()));
    return 0;
}

// Prints when the key has changed and when it has its old value again.
int setAndSeeItFail(QCoreApplication &app)
{
    MGConfItem item(followedKey);
    MGConfItem another(followedKey);
    QObject::connect(&item, &MGConfItem::valueChanged, &app,
                     [&item] { say(item.value().isValid() ? "set" : "reverted"); });
    item.set(1);
    another.set(2);
    QTimer poll;
    QObject::connect(&poll, &QTimer::timeout, &app, [&] {
        if (!item.value().isValid()) {
            QTimer::singleShot(300, &app, &QCoreApplication::quit); // for messages that come twice
        }
    });
    poll.start(10);
    return app.exec();
}

// Prints a line for each change of the key, until the process is ended.
int follow(QCoreApplication &app)
{
    MGConfItem item(followedKey);
    const MGConfItem another(followedKey); // a warning must not come twice
    QObject::connect(&item, &MGConfItem::valueChanged, &app, [] { say("changed"); });
    if (app.arguments().value(2) == "set"_s) {
        item.set("own"_s);
    }
    say("ready");
    return app.exec();
}

const QHash<QString, int (*)(QCoreApplication &)> all = {
    {"setAndExit"_s, setAndExit},
    {"setLocked"_s, setLocked},
    {"setAndSeeItFail"_s, setAndSeeItFail},
    {"follow"_s, follow},
};

} // namespace scenarios

namespace {

const QString busVariable = "DBUS_SESSION_BUS_ADDRESS"_s;
const QString noBus = "unix:path=/nonexistent"_s;

const QByteArray withoutBus =
    "MGConfItem: without a session bus settings can neither be stored nor "
    "followed: Could not connect: No such file or directory";
const QByteArray withoutGlib = "MGConfItem: the event dispatcher is not GLib's: changes by other "
                               "processes and failures to store will not be seen";

// QVariants of different types may compare equal; their descriptions do not.
QString describe(const QVariant &value)
{
    QString description;
    QDebug(&description).nospace() << value;
    return description;
}

// An item that counts its changes.
class Item : public MGConfItem
{
public:
    using MGConfItem::MGConfItem;

    int changes() const { return m_changed.size(); }
    void forgetChanges() { m_changed.clear(); }

private:
    QSignalSpy m_changed{this, &MGConfItem::valueChanged};
};

// This program, running a scenario, with a variable set in its environment.
class Child : public QProcess
{
public:
    explicit Child(const QStringList &scenario, const QString &variable = {},
                   const QString &value = {})
    {
        auto environment = QProcessEnvironment::systemEnvironment();
        if (!variable.isEmpty()) {
            environment.insert(variable, value);
        }
        setProcessEnvironment(environment);
        start(QCoreApplication::applicationFilePath(), scenario);
    }
    ~Child() override
    {
        if (state() != NotRunning) {
            kill();
            waitForFinished();
        }
    }

    bool succeeds()
    {
        const bool finished = state() == NotRunning || waitForFinished(patience);
        return finished && exitStatus() == NormalExit && exitCode() == 0;
    }
    bool says(const QByteArray &line)
    {
        while (!lines().contains(line)) {
            if (!waitForReadyRead(patience)) {
                return false;
            }
        }
        return true;
    }
    QList<QByteArray> lines()
    {
        while (canReadLine()) {
            m_lines.append(readLine().trimmed());
        }
        return m_lines;
    }
    QList<QByteArray> warnings()
    {
        QList<QByteArray> own;
        const auto all = readAllStandardError().split('\n');
        for (const QByteArray &line : all) {
            const QByteArray category = "org.tarnwickos.settings.platform: ";
            if (line.startsWith(category)) {
                own.append(line.mid(category.size()));
            }
        }
        return own;
    }

private:
    QList<QByteArray> m_lines;
};

// A session bus for one child.
class Bus : public QProcess
{
public:
    Bus()
    {
        start("dbus-daemon"_s,
              {"--session"_s, "--nofork"_s, "--print-address"_s,
               "--address=unix:dir="_s + qEnvironmentVariable("XDG_RUNTIME_DIR")});
        if (!waitForReadyRead()) {
            qFatal("no session bus starts");
        }
        m_address = QString::fromUtf8(readLine().trimmed());
    }
    ~Bus() override
    {
        kill();
        waitForFinished();
    }

    QString address() const { return m_address; }

private:
    QString m_address;
};

// Every test has its own keys, because a value may be stored when the next test runs already.
QString newKey()
{
    static int count = 0;
    return "/test/key%1"_s.arg(++count);
}

// Stops a process for the lifetime of this object.
class Stopped
{
public:
    explicit Stopped(pid_t pid) : m_pid(pid) { ::kill(m_pid, SIGSTOP); }
    ~Stopped() { ::kill(m_pid, SIGCONT); }
    Q_DISABLE_COPY_MOVE(Stopped)

private:
    const pid_t m_pid;
};

// The process of dconf-service, which runs once a value has been stored.
pid_t servicePid()
{
    const QDBusReply<uint> pid =
        QDBusConnection::sessionBus().interface()->servicePid("ca.desrt.dconf"_s);
    if (!pid.isValid()) {
        qFatal("dconf-service does not run");
    }
    return static_cast<pid_t>(pid.value());
}

// Sets a value and waits until it is stored.
void store(MGConfItem *item, const QVariant &value)
{
    item->set(value);
    DconfTool::waitUntilStored();
}

/*
    This program replaces the lock that dconf takes between opening the database and searching the
    queue of writes. Waiting there makes it likely that a write completes in that moment, which
    otherwise happens about once in 80,000 writes, and only on a busy machine.
*/
enum class Call { None, Read, Write };
Call callThatWaits = Call::None;
thread_local bool waiting = false;

template<typename Function> Function *original(const char *name)
{
    return reinterpret_cast<Function *>(dlsym(RTLD_NEXT, name));
}

} // namespace

extern "C" Q_DECL_EXPORT void g_mutex_lock(GMutex *mutex)
{
    static auto *const lock = original<decltype(g_mutex_lock)>("g_mutex_lock");
    if (waiting) {
        static unsigned calls = 0;
        usleep(++calls % 7 * 60);
    }
    lock(mutex);
}

extern "C" Q_DECL_EXPORT GVariant *dconf_client_read(DConfClient *client, const gchar *key)
{
    static auto *const read = original<decltype(dconf_client_read)>("dconf_client_read");
    const QScopedValueRollback<bool> wait(waiting, callThatWaits == Call::Read);
    return read(client, key);
}

extern "C" Q_DECL_EXPORT gboolean dconf_client_write_fast(DConfClient *client, const gchar *key,
                                                          GVariant *value, GError **error)
{
    static auto *const write =
        original<decltype(dconf_client_write_fast)>("dconf_client_write_fast");
    const QScopedValueRollback<bool> wait(waiting, callThatWaits == Call::Write);
    return write(client, key, value, error);
}

class TestMGConfItem : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void cleanup()
    {
        LoggedTest::cleanup();
        DconfTool::reset("/test/"_s);
    }

    void startsUnset();
    void setIsSeenByEveryItemBeforeItReturns();
    void equalValueEmitsNothing();
    void anotherTypeIsAnotherValue();
    void unsetForgetsTheValue();
    void deletedItemIsNoLongerWatched();

    void followsOtherProcesses();
    void followsChangesOfADirectory();
    void missesNothingWhileTheBusIsSlow();

    void everySetIsSeenWhileWritesComplete();

    void slotMaySet();
    void slotMayDeleteItsItem();
    void slotMayDeleteAnotherItem();
    void slotMayMakeAnItem();

    void sharesValuesWithOthers_data();
    void sharesValuesWithOthers();

    void refusesOtherValues_data();
    void refusesOtherValues();
    void badKeyIsInert_data();
    void badKeyIsInert();
    void lockedKeyStays();
    void failedStoreReverts();

    void exitLosesNothing();
    void exitDoesNotHangOnAStoppedService();
    void withoutABusWarnsOnce();
    void withoutGlibWarnsOnce();
};

void TestMGConfItem::startsUnset()
{
    const QString key = newKey();
    QObject parent;
    const auto *const item = new MGConfItem(key, &parent);
    QCOMPARE(item->parent(), &parent);
    QCOMPARE(item->key(), key);
    QCOMPARE(describe(item->value()), describe(QVariant()));
    QCOMPARE(describe(item->value(5)), describe(5));
}

void TestMGConfItem::setIsSeenByEveryItemBeforeItReturns()
{
    const QString key = newKey();
    Item item(key);
    const Item another(key);
    const Item other(key + QLatin1Char('x'));

    item.set(1);
    QCOMPARE(item.changes(), 1);
    QCOMPARE(another.changes(), 1);
    QCOMPARE(describe(item.value()), describe(1));
    QCOMPARE(describe(another.value(7)), describe(1));

    MGConfItem(key).set(2);
    QCOMPARE(item.changes(), 2);
    QCOMPARE(another.changes(), 2);
    QCOMPARE(describe(another.value()), describe(2));

    // There is no second signal when the value has been stored.
    DconfTool::waitUntilStored();
    QTest::qWait(100);
    QCOMPARE(item.changes(), 2);
    QCOMPARE(another.changes(), 2);
    QCOMPARE(other.changes(), 0);
}

void TestMGConfItem::equalValueEmitsNothing()
{
    const QVariantList values = {
        1, "x"_s, QStringList{"x"_s}, QStringList(), QVariantMap{{"k"_s, QStringList{"x"_s}}},
    };
    for (const QVariant &value : values) {
        const QString key = newKey();
        Item item(key);
        item.set(value);
        item.forgetChanges();
        item.set(value);
        store(&item, value);
        MGConfItem(key).set(value);

        // Another process that stores the same value causes no signal either.
        DconfTool::write(key, DconfTool::read(key));
        QTest::qWait(50);
        QCOMPARE(item.changes(), 0);
        QCOMPARE(describe(item.value()), describe(value));
    }
}

void TestMGConfItem::anotherTypeIsAnotherValue()
{
    Item item(newKey());
    // In dconf, both are a zero byte.
    item.set(QString());
    item.set(false);
    QCOMPARE(item.changes(), 2);
    QCOMPARE(describe(item.value()), describe(false));
    item.set(QVariantMap());
    item.set(QStringList());
    QCOMPARE(item.changes(), 4);
    QCOMPARE(describe(item.value()), describe(QStringList()));
}

void TestMGConfItem::unsetForgetsTheValue()
{
    for (const bool byInvalidValue : {false, true}) {
        const QString key = newKey();
        Item item(key);
        store(&item, 1);
        item.forgetChanges();
        const Item fresh(key); // has seen no change yet
        for (int i = 0; i < 2; ++i) {
            byInvalidValue ? item.set(QVariant()) : item.unset();
            QCOMPARE(item.changes(), 1);
            QCOMPARE(fresh.changes(), 1);
            QVERIFY(!item.value().isValid());
        }
        TRY_COMPARE(DconfTool::read(key), QByteArray());
    }
}

void TestMGConfItem::deletedItemIsNoLongerWatched()
{
    // Messages that are sent over the connection of dconf; a thread of GLib counts them.
    static std::atomic<int> watches{0};
    static std::atomic<int> messages{0};
    static const QString key = newKey();
    GDBusConnection *const bus = g_bus_get_sync(G_BUS_TYPE_SESSION, nullptr, nullptr);
    QVERIFY(bus != nullptr);
    const auto count = [](GDBusConnection *, GDBusMessage *message, gboolean incoming, gpointer) {
        const char *const rule = g_dbus_message_get_arg0(message);
        const QByteArray path = "arg0path='" + key.toUtf8() + '\'';
        if (incoming == FALSE && QByteArray(rule).contains(path)) {
            const QByteArray member = g_dbus_message_get_member(message);
            watches += member == "AddMatch" ? 1 : member == "RemoveMatch" ? -1 : 0;
            ++messages;
        }
        return message;
    };
    const guint filter = g_dbus_connection_add_filter(bus, +count, nullptr, nullptr);

    auto item = std::make_unique<MGConfItem>(key);
    auto another = std::make_unique<MGConfItem>(key);
    TRY_COMPARE(watches.load(), 1);
    item.reset();
    QTest::qWait(100);
    QCOMPARE(watches.load(), 1);
    another.reset();
    TRY_COMPARE(watches.load(), 0);
    QCOMPARE(messages.load(), 2);

    // Short-lived items share one watch. Otherwise a message for each would wait to be sent.
    for (int i = 0; i < 1000; ++i) {
        const MGConfItem brief(key);
    }
    TRY_COMPARE(messages.load(), 4);
    QTest::qWait(100);
    QCOMPARE(messages.load(), 4);
    QCOMPARE(watches.load(), 0);

    g_dbus_connection_remove_filter(bus, filter);
    g_object_unref(bus);
}

void TestMGConfItem::followsOtherProcesses()
{
    const QString key = newKey();
    const Item item(key);
    const Item another(key);

    DconfTool::write(key, "'theirs'");
    TRY_COMPARE(item.changes(), 1);
    TRY_COMPARE(another.changes(), 1);
    QCOMPARE(describe(item.value()), describe("theirs"_s));

    DconfTool::reset(key);
    TRY_COMPARE(item.changes(), 2);
    TRY_COMPARE(another.changes(), 2);
    QVERIFY(!item.value().isValid());
}

void TestMGConfItem::followsChangesOfADirectory()
{
    const Item first("/test/directory/first"_s);
    const Item second("/test/directory/below/second"_s);
    Item same("/test/directory/same"_s);
    const Item untouched("/test/directory/untouched"_s);
    Item neighbour("/test/directory2"_s);
    neighbour.set(2);
    store(&same, 3);
    same.forgetChanges();
    neighbour.forgetChanges();

    DconfTool::run({"load"_s, "/test/directory/"_s}, "[/]\nfirst=1\nsame=3\n[below]\nsecond=2\n");
    TRY_COMPARE(first.changes(), 1);
    TRY_COMPARE(second.changes(), 1);
    QCOMPARE(describe(first.value()), describe(1));
    QCOMPARE(describe(second.value()), describe(2));
    QTest::qWait(100);
    QCOMPARE(first.changes(), 1);
    QCOMPARE(second.changes(), 1);
    QCOMPARE(same.changes(), 0);

    DconfTool::reset("/test/directory/"_s);
    for (const Item *item : {&first, &second}) {
        TRY_COMPARE(item->changes(), 2);
        QVERIFY(!item->value().isValid());
    }
    QTest::qWait(100);
    QCOMPARE(first.changes(), 2);
    QCOMPARE(untouched.changes() + neighbour.changes(), 0);
}

void TestMGConfItem::missesNothingWhileTheBusIsSlow()
{
    // The change is made over another bus, so the item receives no message about it. dconf compares
    // the values before and after it starts to watch the key.
    Bus bus;
    auto stopped = std::make_unique<Stopped>(static_cast<pid_t>(bus.processId()));
    Child child({"follow"_s}, busVariable, bus.address());
    QVERIFY(child.says("ready"));
    DconfTool::write(scenarios::followedKey, "'theirs'");
    QCOMPARE(DconfTool::read(scenarios::followedKey), QByteArray("'theirs'"));
    QCOMPARE(child.lines(), QList<QByteArray>{"ready"});
    stopped.reset();
    QVERIFY(child.says("changed"));
}

void TestMGConfItem::everySetIsSeenWhileWritesComplete()
{
    for (const Call waits : {Call::Read, Call::Write}) {
        const QScopedValueRollback<Call> wait(callThatWaits, waits);
        Item item(newKey());
        int lost = 0;
        for (int i = 1; i <= 1000; ++i) {
            const bool value = i % 2 != 0;
            item.forgetChanges();
            item.set(value);
            if (item.changes() != 1 || item.value() != value) {
                ++lost;
            }
        }
        QCOMPARE(lost, 0);
    }
}

void TestMGConfItem::slotMaySet()
{
    const QString key = newKey();
    MGConfItem first(key);
    MGConfItem second(key);
    QVariantList seenByFirst;
    QVariantList seenBySecond;
    connect(&first, &MGConfItem::valueChanged, this, [&] {
        seenByFirst.append(first.value());
        if (first.value().toInt() < 3) {
            first.set(first.value().toInt() + 1);
        }
    });
    connect(&second, &MGConfItem::valueChanged, this, [&] { seenBySecond.append(second.value()); });
    second.set(1);
    QCOMPARE(seenByFirst, (QVariantList{1, 2, 3}));
    QCOMPARE(seenBySecond, (QVariantList{3}));
    TRY_COMPARE(DconfTool::read(key), QByteArray("3"));
}

void TestMGConfItem::slotMayDeleteItsItem()
{
    for (const bool setsItself : {true, false}) {
        const QString key = newKey();
        const QPointer<MGConfItem> item = new MGConfItem(key);
        connect(item, &MGConfItem::valueChanged, this, [item] { delete item; });
        if (setsItself) {
            item->set(1);
            QVERIFY(!item);
        } else {
            DconfTool::write(key, "2");
            TRY(!item);
        }
    }
}

void TestMGConfItem::slotMayDeleteAnotherItem()
{
    const QString key = newKey();
    const QPointer<MGConfItem> before = new MGConfItem(key);
    const QPointer<MGConfItem> deleter = new MGConfItem(key);
    const QPointer<MGConfItem> after = new MGConfItem(key);
    connect(deleter.data(), &MGConfItem::valueChanged, this, [&] {
        delete before.data();
        delete after.data();
    });
    int heard = 0;
    connect(before.data(), &MGConfItem::valueChanged, this, [&heard] { ++heard; });
    connect(after.data(), &MGConfItem::valueChanged, this, [&heard] { heard += 10; });

    deleter->set(1);
    QVERIFY(!before && !after);
    QCOMPARE(heard, 1);
    delete deleter.data();
}

void TestMGConfItem::slotMayMakeAnItem()
{
    const QString key = newKey();
    MGConfItem item(key);
    std::unique_ptr<Item> made;
    connect(&item, &MGConfItem::valueChanged, this, [&] {
        if (!made) {
            made = std::make_unique<Item>(key);
        }
    });
    item.set(1);
    QVERIFY(made);
    QCOMPARE(describe(made->value()), describe(1));
    QCOMPARE(made->changes(), 0);
    item.set(2);
    QCOMPARE(made->changes(), 1);
}

void TestMGConfItem::sharesValuesWithOthers_data()
{
    QTest::addColumn<QVariant>("value");
    QTest::addColumn<bool>("isStored");

    const auto row = [](const char *printed, const QVariant &value, bool isStored = true) {
        QTest::newRow(printed) << value << isStored;
    };
    row("true", true);
    row("5", 5);
    row("@as []", QStringList());
    row("{'tëxt': <['tëxt']>}", QVariantMap{{"tëxt"_s, QStringList{"tëxt"_s}}});
    // These are read, but never stored.
    row("{'a': <[1, 2]>}", QVariantMap{{"a"_s, QVariantList{1, 2}}}, false);
    row("handle 5", QVariantList(), false);
}

void TestMGConfItem::sharesValuesWithOthers()
{
    QFETCH(const QVariant, value);
    QFETCH(const bool, isStored);

    const QByteArray printed = QTest::currentDataTag();
    const QString key = newKey();
    Item item(key);
    if (isStored) {
        item.set(value);
        QCOMPARE(describe(item.value()), describe(value)); // not stored yet
        TRY_COMPARE(DconfTool::read(key), printed);
        QCOMPARE(describe(item.value()), describe(value)); // from the database
        item.unset();
        DconfTool::waitUntilStored();
        item.forgetChanges();
    }
    DconfTool::write(key, printed);
    TRY_COMPARE(item.changes(), 1);
    QCOMPARE(describe(item.value()), describe(value));
    QCOMPARE(describe(item.value(7)), describe(value));
}

void TestMGConfItem::refusesOtherValues_data()
{
    QTest::addColumn<QVariant>("value");
    QTest::addColumn<QString>("reason");

    QTest::newRow("type") << QVariant(QUrl("file:///x"_s)) << "a value of type QUrl";
    QTest::newRow("lone surrogate in a key")
        << QVariant(QVariantMap{{QString(QChar(0xD83D)), 1}})
        << "text of type QString with a NUL or half a surrogate pair";
}

void TestMGConfItem::refusesOtherValues()
{
    QFETCH(const QVariant, value);
    QFETCH(const QString, reason);

    const QString key = newKey();
    Item item(key);
    store(&item, 1);
    item.set(value);
    QCOMPARE(m_log->takeReport(),
             "warning [org.tarnwickos.settings.platform] MGConfItem: %1 cannot hold %2"_s.arg(
                 key, reason));
    QCOMPARE(item.changes(), 1);
    QCOMPARE(describe(item.value()), describe(1));
    DconfTool::waitUntilStored();
    QCOMPARE(DconfTool::read(key), QByteArray("1"));
}

void TestMGConfItem::badKeyIsInert_data()
{
    QTest::addColumn<QString>("key");
    QTest::addColumn<QString>("named");

    const auto row = [](const char *name, const QString &key) {
        QTest::newRow(name) << key << QString::fromUtf8(key.toUtf8().constData());
    };
    row("empty", QString());
    row("relative", "test/bad/key"_s);
    row("directory", "/test/bad/"_s);
    row("root", "/"_s);
    row("two slashes", "/test/bad//key"_s);
    row("NUL", "/test/bad/key"_s + QChar(QChar::Null) + "x"_s);
    row("lone surrogate", "/test/bad/key"_s + QChar(0xD83D));
}

void TestMGConfItem::badKeyIsInert()
{
    QFETCH(const QString, key);
    QFETCH(const QString, named);

    Item item(key);
    QCOMPARE(m_log->takeTexts(), QStringList("MGConfItem: \"%1\" is not a dconf key"_s.arg(named)));
    item.set(1);
    item.set(QUrl());
    item.unset();
    QCOMPARE(item.key(), key);
    QVERIFY(!item.value().isValid());
    QCOMPARE(describe(item.value(7)), describe(7));
    DconfTool::write("/test/bad/key"_s, "1");
    QTest::qWait(50);
    QCOMPARE(item.changes(), 0);
    QCOMPARE(DconfTool::run({"list"_s, "/test/bad/"_s}), QByteArray("key"));
}

void TestMGConfItem::lockedKeyStays()
{
    const QTemporaryDir directory;
    const QString database = directory.filePath("db"_s);
    const QString profile = directory.filePath("profile"_s);
    const QString keys = directory.filePath("keys"_s);
    Files::write(keys + "/values"_s, "[test]\nlocked='vendor'\n");
    Files::write(keys + "/locks/locks"_s, "/test/locked\n");
    DconfTool::run({"compile"_s, database, keys});
    Files::write(profile, "user-db:user\nfile-db:" + database.toUtf8());

    Child child({"setLocked"_s}, "DCONF_PROFILE"_s, profile);
    QVERIFY(child.succeeds());
    QCOMPARE(child.lines(), QList<QByteArray>{"vendor"});
    const QList<QByteArray> warnings = child.warnings();
    QCOMPARE(warnings.count(), 1);
    QVERIFY2(warnings.first().startsWith("MGConfItem: /test/locked cannot be written: "),
             warnings.first().constData());
}

void TestMGConfItem::failedStoreReverts()
{
    const QString key = newKey();
    MGConfItem item(key);
    store(&item, 1);
    QCOMPARE(describe(item.value()), describe(1)); // opens the database, before it disappears
    QVariantList seen;
    connect(&item, &MGConfItem::valueChanged, this, [&] { seen.append(item.value()); });
    {
        // A file in place of the database's directory: nobody can write there, not even root.
        QDir config(qEnvironmentVariable("XDG_CONFIG_HOME"));
        const QString directory = "dconf"_s;
        const QString aside = "dconf.aside"_s;
        QVERIFY(config.rename(directory, aside));
        const auto restore = qScopeGuard([&] {
            config.remove(directory);
            config.rename(aside, directory);
        });
        Files::write(config.filePath(directory), {});

        // The service must not fail before the new value was seen.
        auto stopped = std::make_unique<Stopped>(servicePid());
        item.set(2);
        const QVariantList seenAtOnce = seen;
        stopped.reset();
        QCOMPARE(seenAtOnce, QVariantList{2});
        TRY_COMPARE(seen, (QVariantList{2, 1}));
    }
    store(&item, 3);
    QCOMPARE(DconfTool::read(key), QByteArray("3"));
    QCOMPARE(seen, (QVariantList{2, 1, 3}));
}

void TestMGConfItem::exitLosesNothing()
{
    for (const int count : {1, 20, 1, 20, 1, 20}) {
        DconfTool::reset("/test/child/"_s);
        Child child({"setAndExit"_s, QString::number(count)});
        QVERIFY(child.succeeds());
        for (int i = 0; i < count; ++i) {
            const QString key = "/test/child/key%1"_s.arg(i);
            QCOMPARE(DconfTool::read(key), QByteArray::number(i));
        }
        QCOMPARE(child.warnings(), QList<QByteArray>());
    }
}

void TestMGConfItem::exitDoesNotHangOnAStoppedService()
{
    DconfTool::write("/test/key"_s, "1"); // starts the service, if need be
    const Stopped stopped(servicePid());
    Child child({"setAndExit"_s, "2"_s});
    // A missing answer counts as a failure after 25 s. The exit must not wait that long.
    QVERIFY(child.waitForFinished(20000));
    QVERIFY(child.succeeds());
}

void TestMGConfItem::withoutABusWarnsOnce()
{
    Child child({"setAndSeeItFail"_s}, busVariable, noBus);
    QVERIFY(child.succeeds());
    QCOMPARE(child.warnings(), QList<QByteArray>{withoutBus});
    QVERIFY(child.lines().isEmpty() || child.lines().last() == "reverted");

    // The exit neither waits for the missing bus nor fails.
    Child brief({"setAndExit"_s, "2"_s}, busVariable, noBus);
    QVERIFY(brief.succeeds());
}

void TestMGConfItem::withoutGlibWarnsOnce()
{
    // The run with GLib shows that the item then sees the change.
    for (const bool hasGlib : {false, true}) {
        Child child({"follow"_s, "set"_s}, "QT_NO_GLIB"_s, hasGlib ? QString() : "1"_s);
        QVERIFY(child.says("ready"));
        TRY_COMPARE(DconfTool::read(scenarios::followedKey), QByteArray("'own'"));
        DconfTool::write(scenarios::followedKey, "'theirs'");
        QList<QByteArray> expected = {"changed", "ready"}; // it sees its own change
        if (hasGlib) {
            expected.append("changed");
            TRY_COMPARE(child.lines(), expected);
        } else {
            QTest::qWait(300);
        }
        child.terminate();
        QVERIFY(child.waitForFinished());
        QCOMPARE(child.lines(), expected);
        QCOMPARE(child.warnings(), hasGlib ? QList<QByteArray>() : QList<QByteArray>{withoutGlib});
    }
}

int main(int argc, char *argv[])
{
    // GLib logs a critical message when a program calls it incorrectly.
    g_log_set_always_fatal(static_cast<GLogLevelFlags>(G_LOG_LEVEL_ERROR | G_LOG_LEVEL_CRITICAL));
    QCoreApplication app(argc, argv);
    if (const auto scenario = scenarios::all.value(app.arguments().value(1))) {
        return scenario(app);
    }
    TestMGConfItem test;
    return QTest::qExec(&test, argc, argv);
}

#include "tst_mgconfitem.moc"
