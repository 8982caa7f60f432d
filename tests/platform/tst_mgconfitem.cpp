// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "dconftool.h"
#include "loggedtest.h"
#include "mgconfitem.h"

#include <QDBusConnection>
#include <QDBusConnectionInterface>
#include <QDebug>
#include <QDir>
#include <QFile>
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
    What needs a process of its own (its exit, its bus, its event dispatcher) is a scenario, which
    this program runs when it is called with the scenario's name. A scenario prints what the test
    then looks at; what it logs goes to its standard error as usual.
*/
namespace scenarios {

const QString followedKey = QStringLiteral("/test/child/followed");

void say(const char *line)
{
    std::puts(line);
    std::fflush(stdout);
}

// Returns from main right after the last set().
int setAndExit(QCoreApplication &app)
{
    for (int i = 0; i < app.arguments().at(2).toInt(); ++i) {
        MGConfItem(QStringLiteral("/test/child/key%1").arg(i)).set(i);
    }
    return 0;
}

int setLocked(QCoreApplication &)
{
    MGConfItem item(QStringLiteral("/test/locked"));
    item.set(1);
    say(qPrintable(item.value().toString()));
    return 0;
}

// Says when the key changes and when it is back to what it was.
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

// Runs until it is ended.
int follow(QCoreApplication &app)
{
    MGConfItem item(followedKey);
    MGConfItem another(followedKey);
    QObject::connect(&item, &MGConfItem::valueChanged, &app, [] { say("changed"); });
    item.set(QStringLiteral("own"));
    say("ready");
    return app.exec();
}

// As above, but sets nothing.
int watch(QCoreApplication &app)
{
    const MGConfItem item(followedKey);
    QObject::connect(&item, &MGConfItem::valueChanged, &app, [] { say("changed"); });
    say("ready");
    return app.exec();
}

// Says "ready" when its connection can be cut, "cut" when it was.
int outliveTheBus(QCoreApplication &app)
{
    const MGConfItem item(followedKey);
    GDBusConnection *const bus = g_bus_get_sync(G_BUS_TYPE_SESSION, nullptr, nullptr);
    bool ready = false;
    QTimer poll;
    QObject::connect(&poll, &QTimer::timeout, &app, [&] {
        if (!ready && g_dbus_connection_get_exit_on_close(bus) == FALSE) {
            ready = true;
            say("ready");
        }
        if (g_dbus_connection_is_closed(bus) != FALSE) {
            say("cut");
            QTimer::singleShot(300, &app, &QCoreApplication::quit);
            poll.stop();
        }
    });
    poll.start(10);
    const int status = app.exec();
    g_object_unref(bus);
    return status;
}

const QHash<QString, int (*)(QCoreApplication &)> all = {
    {QStringLiteral("setAndExit"), setAndExit},
    {QStringLiteral("setLocked"), setLocked},
    {QStringLiteral("setAndSeeItFail"), setAndSeeItFail},
    {QStringLiteral("follow"), follow},
    {QStringLiteral("watch"), watch},
    {QStringLiteral("outliveTheBus"), outliveTheBus},
};

} // namespace scenarios

namespace {

const QString noBus = QStringLiteral("unix:path=/nonexistent");

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

class Child : public QProcess
{
public:
    explicit Child(const QStringList &scenario, const QMap<QString, QString> &environment = {})
    {
        auto full = QProcessEnvironment::systemEnvironment();
        for (auto it = environment.cbegin(); it != environment.cend(); ++it) {
            full.insert(it.key(), it.value());
        }
        setProcessEnvironment(full);
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
        const bool finished = state() == NotRunning || waitForFinished(60000);
        return finished && exitStatus() == NormalExit && exitCode() == 0;
    }
    bool says(const QByteArray &line)
    {
        while (!m_lines.contains(line)) {
            if (!canReadLine() && !waitForReadyRead(60000)) {
                return false;
            }
            while (canReadLine()) {
                m_lines.append(readLine().trimmed());
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
            if (line.startsWith("MGConfItem")) {
                own.append(line);
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
        const QString directory = qEnvironmentVariable("XDG_RUNTIME_DIR");
        start(QStringLiteral("dbus-daemon"),
              {QStringLiteral("--session"), QStringLiteral("--nofork"),
               QStringLiteral("--print-address"),
               QStringLiteral("--address=unix:dir=") + directory});
        if (waitForReadyRead()) {
            m_address = QString::fromUtf8(readLine().trimmed());
        }
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

// Every test has keys of its own: what one set last may be stored when the next one runs.
QString newKey()
{
    static int count = 0;
    return QStringLiteral("/test/key%1").arg(++count);
}

// Of dconf-service; 0 if it does not run.
pid_t servicePid()
{
    const QDBusReply<uint> pid =
        QDBusConnection::sessionBus().interface()->servicePid(QStringLiteral("ca.desrt.dconf"));
    return static_cast<pid_t>(pid.value());
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

Q_DECLARE_METATYPE(Call)

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
        DconfTool::reset(QStringLiteral("/test/"));
    }

    void startsUnset();
    void setIsSeenByEveryItemBeforeItReturns();
    void equalValueEmitsNothing();
    void anotherTypeIsAnotherValue();
    void unsetForgetsTheValue();
    void invalidValueUnsets();
    void temporaryItemStores();
    void deletedItemHearsNothing();
    void deletedItemIsWatchedNoMore();

    void followsOtherProcesses();
    void followsSeveralChangesAtOnce();
    void followsTheResetOfADirectory();
    void missesNothingWhileTheBusIsSlow();

    void everySetIsSeenWhileWritesComplete_data();
    void everySetIsSeenWhileWritesComplete();

    void slotMaySet();
    void slotMayDeleteItsItem();
    void slotMayDeleteAnotherItem();
    void slotMayMakeAnItem();

    void storesWhatOthersRead_data();
    void storesWhatOthersRead();
    void readsWhatOthersStore_data();
    void readsWhatOthersStore();

    void refusesWhatCannotBeHeld_data();
    void refusesWhatCannotBeHeld();
    void badKeyIsInert_data();
    void badKeyIsInert();
    void lockedKeyStays();
    void failedStoreReverts();

    void exitLosesNothing_data();
    void exitLosesNothing();
    void exitDoesNotHangOnAStoppedService();
    void withoutABusWarnsOnce();
    void withoutGlibWarnsOnce();
    void outlivesTheBus();
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
    MGConfItem item(key);
    const MGConfItem another(key);
    const MGConfItem other(key + QLatin1Char('x'));
    const QSignalSpy changed(&item, &MGConfItem::valueChanged);
    const QSignalSpy anotherChanged(&another, &MGConfItem::valueChanged);
    const QSignalSpy otherChanged(&other, &MGConfItem::valueChanged);

    item.set(1);
    QCOMPARE(changed.count(), 1);
    QCOMPARE(anotherChanged.count(), 1);
    QCOMPARE(describe(item.value()), describe(1));
    QCOMPARE(describe(another.value(7)), describe(1));

    MGConfItem(key).set(2);
    QCOMPARE(changed.count(), 2);
    QCOMPARE(anotherChanged.count(), 2);
    QCOMPARE(describe(another.value()), describe(2));

    // Nor does it come a second time when the value has been stored.
    QTRY_COMPARE(DconfTool::read(key), QByteArray("2"));
    QTest::qWait(100);
    QCOMPARE(changed.count(), 2);
    QCOMPARE(anotherChanged.count(), 2);
    QCOMPARE(otherChanged.count(), 0);
}

void TestMGConfItem::equalValueEmitsNothing()
{
    const QVariantList values = {
        1,
        QStringLiteral("x"),
        QStringList{QStringLiteral("x")},
        QStringList(),
        QVariantMap{{QStringLiteral("k"), QStringList{QStringLiteral("x")}}},
    };
    for (const QVariant &value : values) {
        const QString key = newKey();
        MGConfItem item(key);
        item.set(value);
        const QSignalSpy changed(&item, &MGConfItem::valueChanged);
        item.set(value);
        MGConfItem(key).set(value);
        QCOMPARE(changed.count(), 0);

        // Equal to what is stored, too, and stored by somebody else.
        QByteArray printed;
        QTRY_VERIFY(!(printed = DconfTool::read(key)).isEmpty());
        item.set(value);
        DconfTool::write(key, printed.constData());
        QTest::qWait(50);
        QCOMPARE(changed.count(), 0);
        QCOMPARE(describe(item.value()), describe(value));
    }
}

void TestMGConfItem::anotherTypeIsAnotherValue()
{
    MGConfItem item(newKey());
    item.set(1);
    const QSignalSpy changed(&item, &MGConfItem::valueChanged);
    item.set(1U);
    QCOMPARE(changed.count(), 1);
    QCOMPARE(describe(item.value()), describe(1U));
    item.set(QVariantMap());
    item.set(QStringList());
    QCOMPARE(changed.count(), 3);
    QCOMPARE(describe(item.value()), describe(QStringList()));
}

void TestMGConfItem::unsetForgetsTheValue()
{
    const QString key = newKey();
    MGConfItem item(key);
    item.set(1);
    QTRY_COMPARE(DconfTool::read(key), QByteArray("1"));
    const MGConfItem fresh(key); // has seen no change yet
    const QSignalSpy changed(&item, &MGConfItem::valueChanged);
    const QSignalSpy freshChanged(&fresh, &MGConfItem::valueChanged);
    item.unset();
    QCOMPARE(changed.count(), 1);
    QCOMPARE(freshChanged.count(), 1);
    QVERIFY(!item.value().isValid());
    item.unset();
    QCOMPARE(changed.count(), 1);
    QTRY_COMPARE(DconfTool::read(key), QByteArray());
}

void TestMGConfItem::invalidValueUnsets()
{
    const QString key = newKey();
    MGConfItem item(key);
    item.set(1);
    QTRY_COMPARE(DconfTool::read(key), QByteArray("1"));
    const QSignalSpy changed(&item, &MGConfItem::valueChanged);
    item.set(QVariant());
    QCOMPARE(changed.count(), 1);
    QVERIFY(!item.value().isValid());
    QTRY_COMPARE(DconfTool::read(key), QByteArray());
}

void TestMGConfItem::temporaryItemStores()
{
    for (int i = 0; i < 20; ++i) {
        MGConfItem(QStringLiteral("/test/many/key%1").arg(i)).set(i);
    }
    for (int i = 0; i < 20; ++i) {
        const QString key = QStringLiteral("/test/many/key%1").arg(i);
        QTRY_COMPARE(DconfTool::read(key), QByteArray::number(i));
    }
}

void TestMGConfItem::deletedItemHearsNothing()
{
    const QString key = newKey();
    int heard = 0;
    auto item = std::make_unique<MGConfItem>(key);
    connect(item.get(), &MGConfItem::valueChanged, this, [&heard] { ++heard; });
    const MGConfItem another(key);
    const QSignalSpy changed(&another, &MGConfItem::valueChanged);
    item.reset();
    MGConfItem(key).set(1);
    QTRY_COMPARE(DconfTool::read(key), QByteArray("1"));
    DconfTool::write(key, "2");
    QTRY_COMPARE(changed.count(), 2); // the other item still follows the key
    QCOMPARE(heard, 0);
}

void TestMGConfItem::deletedItemIsWatchedNoMore()
{
    // What goes out over the connection that dconf uses, seen in a thread of GLib's.
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
    QTRY_COMPARE(watches.load(), 1);
    item.reset();
    QTest::qWait(100);
    QCOMPARE(watches.load(), 1);
    another.reset();
    QTRY_COMPARE(watches.load(), 0);
    QCOMPARE(messages.load(), 2);

    // Items that come and go quickly share one watch, or a message for each would wait to be sent.
    for (int i = 0; i < 1000; ++i) {
        const MGConfItem brief(key);
    }
    QTRY_COMPARE(messages.load(), 4);
    QTest::qWait(100);
    QCOMPARE(messages.load(), 4);
    QCOMPARE(watches.load(), 0);

    g_dbus_connection_remove_filter(bus, filter);
    g_object_unref(bus);
}

void TestMGConfItem::followsOtherProcesses()
{
    const QString key = newKey();
    const MGConfItem item(key);
    const MGConfItem another(key);
    QSignalSpy changed(&item, &MGConfItem::valueChanged);
    const QSignalSpy anotherChanged(&another, &MGConfItem::valueChanged);

    DconfTool::write(key, "'theirs'");
    QTRY_COMPARE(changed.count(), 1);
    QTRY_COMPARE(anotherChanged.count(), 1);
    QCOMPARE(describe(item.value()), describe(QStringLiteral("theirs")));

    DconfTool::reset(key);
    QTRY_COMPARE(changed.count(), 2);
    QTRY_COMPARE(anotherChanged.count(), 2);
    QVERIFY(!item.value().isValid());
}

void TestMGConfItem::followsSeveralChangesAtOnce()
{
    const MGConfItem first(QStringLiteral("/test/directory/first"));
    const MGConfItem second(QStringLiteral("/test/directory/below/second"));
    MGConfItem same(QStringLiteral("/test/directory/same"));
    const MGConfItem untouched(QStringLiteral("/test/directory/untouched"));
    const MGConfItem neighbour(QStringLiteral("/test/directory2"));
    same.set(3);
    QTRY_COMPARE(DconfTool::read(same.key()), QByteArray("3"));

    QSignalSpy firstChanged(&first, &MGConfItem::valueChanged);
    QSignalSpy secondChanged(&second, &MGConfItem::valueChanged);
    const QSignalSpy sameChanged(&same, &MGConfItem::valueChanged);
    const QSignalSpy untouchedChanged(&untouched, &MGConfItem::valueChanged);
    const QSignalSpy neighbourChanged(&neighbour, &MGConfItem::valueChanged);

    DconfTool::run({QStringLiteral("load"), QStringLiteral("/test/directory/")},
                   "[/]\nfirst=1\nsame=3\n[below]\nsecond=2\n");
    QTRY_COMPARE(firstChanged.count(), 1);
    QTRY_COMPARE(secondChanged.count(), 1);
    QCOMPARE(describe(first.value()), describe(1));
    QCOMPARE(describe(second.value()), describe(2));

    QTest::qWait(100);
    QCOMPARE(firstChanged.count(), 1);
    QCOMPARE(secondChanged.count(), 1);
    QCOMPARE(sameChanged.count(), 0);
    QCOMPARE(untouchedChanged.count(), 0);
    QCOMPARE(neighbourChanged.count(), 0);
}

void TestMGConfItem::followsTheResetOfADirectory()
{
    MGConfItem inside(QStringLiteral("/test/directory/inside"));
    const MGConfItem empty(QStringLiteral("/test/directory/empty"));
    MGConfItem neighbour(QStringLiteral("/test/directory2"));
    inside.set(1);
    neighbour.set(2);
    QTRY_COMPARE(DconfTool::read(neighbour.key()), QByteArray("2"));

    QSignalSpy insideChanged(&inside, &MGConfItem::valueChanged);
    const QSignalSpy emptyChanged(&empty, &MGConfItem::valueChanged);
    const QSignalSpy neighbourChanged(&neighbour, &MGConfItem::valueChanged);
    DconfTool::reset(QStringLiteral("/test/directory/"));
    QTRY_COMPARE(insideChanged.count(), 1);
    QVERIFY(!inside.value().isValid());
    QTest::qWait(100);
    QCOMPARE(insideChanged.count(), 1);
    QCOMPARE(emptyChanged.count(), 0);
    QCOMPARE(neighbourChanged.count(), 0);
}

void TestMGConfItem::missesNothingWhileTheBusIsSlow()
{
    // The change goes over another bus, so that no message of it reaches the item: dconf notices
    // by itself what changed between the item's first look and the bus's answer.
    Bus bus;
    QVERIFY(!bus.address().isEmpty());
    const auto pid = static_cast<pid_t>(bus.processId());
    QCOMPARE(::kill(pid, SIGSTOP), 0);
    Child child({QStringLiteral("watch")},
                {{QStringLiteral("DBUS_SESSION_BUS_ADDRESS"), bus.address()}});
    QVERIFY(child.says("ready"));
    DconfTool::write(scenarios::followedKey, "'theirs'");
    QCOMPARE(DconfTool::read(scenarios::followedKey), QByteArray("'theirs'"));
    QCOMPARE(child.lines(), QList<QByteArray>{"ready"});
    QCOMPARE(::kill(pid, SIGCONT), 0);
    QVERIFY(child.says("changed"));
}

void TestMGConfItem::everySetIsSeenWhileWritesComplete_data()
{
    QTest::addColumn<Call>("waits");

    QTest::newRow("during a read") << Call::Read;
    QTest::newRow("during a write") << Call::Write;
    // For measurements without any waiting, such as SETS=1000000.
    if (qEnvironmentVariableIsSet("SETS")) {
        QTest::newRow("measured") << Call::None;
    }
}

void TestMGConfItem::everySetIsSeenWhileWritesComplete()
{
    QFETCH(const Call, waits);

    const int sets = waits == Call::None ? qEnvironmentVariableIntValue("SETS") : 1000;
    const QScopedValueRollback<Call> wait(callThatWaits, waits);
    MGConfItem item(newKey());
    int changes = 0;
    int lost = 0;
    connect(&item, &MGConfItem::valueChanged, this, [&] { ++changes; });
    for (int i = 1; i <= sets; ++i) {
        const bool value = i % 2 != 0;
        const int before = changes;
        item.set(value);
        if (changes != before + 1 || item.value() != value) {
            ++lost;
        }
    }
    QCOMPARE(lost, 0);
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
    QTRY_COMPARE(DconfTool::read(key), QByteArray("3"));
}

void TestMGConfItem::slotMayDeleteItsItem()
{
    const auto deleteOnChange = [this](const QString &key) {
        auto *const item = new MGConfItem(key);
        connect(item, &MGConfItem::valueChanged, this, [item] { delete item; });
        return QPointer<MGConfItem>(item);
    };

    const QPointer<MGConfItem> setsItself = deleteOnChange(newKey());
    setsItself->set(1);
    QVERIFY(!setsItself);

    const QString key = newKey();
    const QPointer<MGConfItem> follows = deleteOnChange(key);
    DconfTool::write(key, "2");
    QTRY_VERIFY(!follows);
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
    std::unique_ptr<MGConfItem> made;
    int heard = 0;
    connect(&item, &MGConfItem::valueChanged, this, [&] {
        if (!made) {
            made = std::make_unique<MGConfItem>(key);
            connect(made.get(), &MGConfItem::valueChanged, this, [&heard] { ++heard; });
        }
    });
    item.set(1);
    QVERIFY(made);
    QCOMPARE(describe(made->value()), describe(1));
    QCOMPARE(heard, 0);
    item.set(2);
    QCOMPARE(heard, 1);
}

void TestMGConfItem::storesWhatOthersRead_data()
{
    QTest::addColumn<QVariant>("value");
    QTest::addColumn<QByteArray>("printed");

    const QString text = QStringLiteral("tëxt");
    QTest::newRow("bool") << QVariant(true) << QByteArray("true");
    QTest::newRow("int") << QVariant(-5) << QByteArray("-5");
    QTest::newRow("uint") << QVariant(5U) << QByteArray("uint32 5");
    QTest::newRow("qlonglong") << QVariant(-5LL) << QByteArray("int64 -5");
    QTest::newRow("qulonglong") << QVariant(5ULL) << QByteArray("uint64 5");
    QTest::newRow("string") << QVariant(text) << QByteArray("'tëxt'");
    QTest::newRow("string list") << QVariant(QStringList{text, QString()})
                                 << QByteArray("['tëxt', '']");
    QTest::newRow("empty string list") << QVariant(QStringList()) << QByteArray("@as []");
    QTest::newRow("map") << QVariant(QVariantMap{{text, QStringList{text}}})
                         << QByteArray("{'tëxt': <['tëxt']>}");
    QTest::newRow("empty map") << QVariant(QVariantMap()) << QByteArray("@a{sv} {}");
}

void TestMGConfItem::storesWhatOthersRead()
{
    QFETCH(const QVariant, value);
    QFETCH(const QByteArray, printed);

    const QString key = newKey();
    MGConfItem item(key);
    item.set(value);
    QCOMPARE(describe(item.value()), describe(value)); // on its way
    QTRY_COMPARE(DconfTool::read(key), printed);
    QCOMPARE(describe(item.value()), describe(value)); // from the database
}

void TestMGConfItem::readsWhatOthersStore_data()
{
    QTest::addColumn<QVariant>("value");

    const auto text = [](const char *latin) { return QString::fromLatin1(latin); };
    QTest::newRow("true") << QVariant(true);
    QTest::newRow("uint32 4294967295") << QVariant(4294967295U);
    QTest::newRow("int64 5") << QVariant(5LL);
    QTest::newRow("byte 5") << QVariant(5);
    QTest::newRow("1.5") << QVariant(1.5);
    QTest::newRow("'text'") << QVariant(text("text"));
    QTest::newRow("['a', 'b']") << QVariant(QStringList{text("a"), text("b")});
    QTest::newRow("@as []") << QVariant(QStringList());
    QTest::newRow("[1, 2]") << QVariant(QVariantList{1, 2});
    QTest::newRow("('a', 1)") << QVariant(QVariantList{text("a"), 1});
    QTest::newRow("{'a': <1>}") << QVariant(QVariantMap{{text("a"), 1}});
    QTest::newRow("handle 5") << QVariant(QVariantList());
    QTest::newRow("<<1>>") << QVariant(1);
}

void TestMGConfItem::readsWhatOthersStore()
{
    QFETCH(const QVariant, value);

    const QString key = newKey();
    const MGConfItem item(key);
    QSignalSpy changed(&item, &MGConfItem::valueChanged);
    DconfTool::write(key, QTest::currentDataTag());
    QTRY_COMPARE(changed.count(), 1);
    QCOMPARE(describe(item.value()), describe(value));
    QCOMPARE(describe(item.value(7)), describe(value.isValid() ? value : QVariant(7)));
}

void TestMGConfItem::refusesWhatCannotBeHeld_data()
{
    QTest::addColumn<QVariant>("value");
    QTest::addColumn<QString>("reason");

    const QString notText =
        QStringLiteral("text of type QString with a NUL or half a surrogate pair");
    QTest::newRow("type") << QVariant(QUrl(QStringLiteral("file:///x")))
                          << QStringLiteral("a value of type QUrl");
    QTest::newRow("nested type") << QVariant(QVariantMap{{QStringLiteral("k"), QByteArray()}})
                                 << QStringLiteral("a value of type QByteArray");
    QTest::newRow("NUL") << QVariant(QString(QChar(QChar::Null))) << notText;
    QTest::newRow("lone surrogate in a key")
        << QVariant(QVariantMap{{QString(QChar(0xD83D)), 1}}) << notText;
}

void TestMGConfItem::refusesWhatCannotBeHeld()
{
    QFETCH(const QVariant, value);
    QFETCH(const QString, reason);

    const QString key = newKey();
    MGConfItem item(key);
    item.set(1);
    QTRY_COMPARE(DconfTool::read(key), QByteArray("1"));
    const QSignalSpy changed(&item, &MGConfItem::valueChanged);
    item.set(value);
    const MessageLog::Message warning{
        QtWarningMsg, QStringLiteral("default"),
        QStringLiteral("MGConfItem: %1 cannot hold %2").arg(key, reason)};
    QCOMPARE(m_log->takeAll(), QList<MessageLog::Message>{warning});
    QCOMPARE(changed.count(), 0);
    QCOMPARE(describe(item.value()), describe(1));
    QTest::qWait(50);
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
    row("relative", QStringLiteral("test/bad/key"));
    row("directory", QStringLiteral("/test/bad/"));
    row("root", QStringLiteral("/"));
    row("two slashes", QStringLiteral("/test/bad//key"));
    row("NUL", QStringLiteral("/test/bad/key") + QChar(QChar::Null) + QStringLiteral("x"));
    row("lone surrogate", QStringLiteral("/test/bad/key") + QChar(0xD83D));
}

void TestMGConfItem::badKeyIsInert()
{
    QFETCH(const QString, key);
    QFETCH(const QString, named);

    MGConfItem item(key);
    QCOMPARE(m_log->takeTexts(),
             QStringList(QStringLiteral("MGConfItem: \"%1\" is not a dconf key").arg(named)));
    QSignalSpy changed(&item, &MGConfItem::valueChanged);
    item.set(1);
    item.set(QUrl());
    item.unset();
    QCOMPARE(item.key(), key);
    QVERIFY(!item.value().isValid());
    QCOMPARE(describe(item.value(7)), describe(7));
    DconfTool::write(QStringLiteral("/test/bad/key"), "1");
    QTest::qWait(50);
    QCOMPARE(changed.count(), 0);
    QCOMPARE(DconfTool::run({QStringLiteral("list"), QStringLiteral("/test/bad/")}),
             QByteArray("key"));
}

void TestMGConfItem::lockedKeyStays()
{
    QTemporaryDir dir;
    const auto write = [&dir](const char *name, const QByteArray &contents) {
        QFile file(dir.filePath(QLatin1String(name)));
        return file.open(QIODevice::WriteOnly) && file.write(contents) == contents.size();
    };
    QVERIFY(QDir(dir.path()).mkpath(QStringLiteral("keys/locks")));
    QVERIFY(write("keys/values", "[test]\nlocked='vendor'\n"));
    QVERIFY(write("keys/locks/locks", "/test/locked\n"));
    DconfTool::run({QStringLiteral("compile"), dir.filePath(QStringLiteral("db")),
                    dir.filePath(QStringLiteral("keys"))});
    QVERIFY(
        write("profile", "user-db:user\nfile-db:" + dir.filePath(QStringLiteral("db")).toUtf8()));

    Child child({QStringLiteral("setLocked")},
                {{QStringLiteral("DCONF_PROFILE"), dir.filePath(QStringLiteral("profile"))}});
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
    item.set(1);
    QTRY_COMPARE(DconfTool::read(key), QByteArray("1"));
    QCOMPARE(describe(item.value()), describe(1)); // opens the database, before it goes

    QVariantList seen;
    {
        // A file in the place of the database's directory: nobody can write there, not even root.
        QDir config(qEnvironmentVariable("XDG_CONFIG_HOME"));
        const QString directory = QStringLiteral("dconf");
        const QString aside = QStringLiteral("dconf.aside");
        QVERIFY(config.rename(directory, aside));
        const auto restore = qScopeGuard([&] {
            config.remove(directory);
            config.rename(aside, directory);
        });
        QVERIFY(QFile(config.filePath(directory)).open(QIODevice::WriteOnly));

        connect(&item, &MGConfItem::valueChanged, this, [&] { seen.append(item.value()); });
        // The service must not fail before the new value was seen.
        const pid_t pid = servicePid();
        QVERIFY(pid > 0);
        QCOMPARE(::kill(pid, SIGSTOP), 0);
        item.set(2);
        const QVariantList seenAtOnce = seen;
        QCOMPARE(::kill(pid, SIGCONT), 0);
        QCOMPARE(seenAtOnce, QVariantList{2});
        QTRY_COMPARE(seen, (QVariantList{2, 1}));
    }
    item.set(3);
    QTRY_COMPARE(DconfTool::read(key), QByteArray("3"));
    QCOMPARE(seen, (QVariantList{2, 1, 3}));
}

void TestMGConfItem::exitLosesNothing_data()
{
    QTest::addColumn<int>("count");

    QTest::newRow("one") << 1;
    QTest::newRow("several") << 20;
}

void TestMGConfItem::exitLosesNothing()
{
    QFETCH(const int, count);

    for (int round = 0; round < 5; ++round) {
        DconfTool::reset(QStringLiteral("/test/child/"));
        Child child({QStringLiteral("setAndExit"), QString::number(count)});
        QVERIFY(child.succeeds());
        for (int i = 0; i < count; ++i) {
            const QString key = QStringLiteral("/test/child/key%1").arg(i);
            QCOMPARE(DconfTool::read(key), QByteArray::number(i));
        }
        QCOMPARE(child.warnings(), QList<QByteArray>());
    }
}

void TestMGConfItem::exitDoesNotHangOnAStoppedService()
{
    DconfTool::write(QStringLiteral("/test/key"), "1"); // starts the service, if need be
    const pid_t pid = servicePid();
    QVERIFY(pid > 0);
    QCOMPARE(::kill(pid, SIGSTOP), 0);
    Child child({QStringLiteral("setAndExit"), QStringLiteral("2")});
    // An answer that never comes counts as a failure after 25 s; nobody waits that long.
    const bool finished = child.waitForFinished(20000);
    QCOMPARE(::kill(pid, SIGCONT), 0);
    QVERIFY(finished);
    QVERIFY(child.succeeds());
}

void TestMGConfItem::withoutABusWarnsOnce()
{
    Child child({QStringLiteral("setAndSeeItFail")},
                {{QStringLiteral("DBUS_SESSION_BUS_ADDRESS"), noBus}});
    QVERIFY(child.succeeds());
    QCOMPARE(child.warnings(), QList<QByteArray>{withoutBus});
    QVERIFY(child.lines().isEmpty() || child.lines().last() == "reverted");

    // Nor does the exit wait for a bus that is not there, or fail.
    Child brief({QStringLiteral("setAndExit"), QStringLiteral("2")},
                {{QStringLiteral("DBUS_SESSION_BUS_ADDRESS"), noBus}});
    QVERIFY(brief.succeeds());
}

void TestMGConfItem::withoutGlibWarnsOnce()
{
    Child child({QStringLiteral("follow")}, {{QStringLiteral("QT_NO_GLIB"), QStringLiteral("1")}});
    QVERIFY(child.says("ready"));
    QTRY_COMPARE(DconfTool::read(scenarios::followedKey), QByteArray("'own'"));
    DconfTool::write(scenarios::followedKey, "'theirs'");
    QTest::qWait(300);
    child.terminate();
    QVERIFY(child.waitForFinished());
    // Its own change it sees.
    QCOMPARE(child.lines(), (QList<QByteArray>{"changed", "ready"}));
    QCOMPARE(child.warnings(), QList<QByteArray>{withoutGlib});

    // The same scenario with GLib: the silence above is not the test's.
    Child other({QStringLiteral("follow")});
    QVERIFY(other.says("ready"));
    QTRY_COMPARE(DconfTool::read(scenarios::followedKey), QByteArray("'own'"));
    DconfTool::write(scenarios::followedKey, "'theirs'");
    QTRY_COMPARE(other.lines(), (QList<QByteArray>{"changed", "ready", "changed"}));
    other.terminate();
    QVERIFY(other.waitForFinished());
    QCOMPARE(other.warnings(), QList<QByteArray>());
}

void TestMGConfItem::outlivesTheBus()
{
    Bus bus;
    QVERIFY(!bus.address().isEmpty());
    Child child({QStringLiteral("outliveTheBus")},
                {{QStringLiteral("DBUS_SESSION_BUS_ADDRESS"), bus.address()}});
    QVERIFY(child.says("ready"));
    bus.kill();
    QVERIFY(bus.waitForFinished());
    QVERIFY(child.says("cut"));
    QVERIFY(child.succeeds());
}

int main(int argc, char *argv[])
{
    // A critical message of GLib's means that it was called wrongly.
    g_log_set_always_fatal(static_cast<GLogLevelFlags>(G_LOG_LEVEL_ERROR | G_LOG_LEVEL_CRITICAL));
    QCoreApplication app(argc, argv);
    if (const auto scenario = scenarios::all.value(app.arguments().value(1))) {
        return scenario(app);
    }
    TestMGConfItem test;
    return QTest::qExec(&test, argc, argv);
}

#include "tst_mgconfitem.moc"
