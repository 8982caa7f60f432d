// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Tests the types that store values in dconf: while its service hangs, dies or is missing, and with
// unexpected values in their keys.

#include "dconfclient.h"
#include "dconftool.h"
#include "deviceinfo/locationconfiguration.h"
#include "eventswidgets/eventswidgetsmodel.h"
#include "files.h"
#include "messagelog.h"
#include "mgconfitem.h"
#include "patience.h"
#include "quickactions/quickactionsmodel.h"
#include "words.h"

#include <QAbstractItemModelTester>
#include <QDBusConnection>
#include <QDBusConnectionInterface>
#include <QDBusMessage>
#include <QRegularExpression>
#include <QtTest>

#include <algorithm>
#include <atomic>
#include <csignal>
#include <functional>
#include <memory>
#include <optional>
#include <type_traits>

#include <dconf.h>
#include <gio/gio.h>

// An object with one choice that it stores in dconf.
struct User {
    QString key;
    // The output of the dconf tool for each of the two choices.
    QByteArray on;
    QByteArray off;
    std::function<void(bool choice)> choose;
    std::function<bool()> isOn;

    QByteArray stored(bool choice) const { return choice ? on : off; }
};

using MakeUser = std::function<User()>;
Q_DECLARE_METATYPE(MakeUser)

// Every function runs for each type that stores values in dconf.
class TestDconfFaults : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase_data();
    void init();
    void cleanup();

    void serviceHangs();
    void goesWhileTheServiceHangs();
    void serviceDiesInTheMiddleOfAWrite();
    void serviceIsAbsent();
    void moveIsNotStored();
    void everyOtherType();
    void hugeLists();
    void hugeDatabase();
    void tenThousandNotifications();

private:
    // Makes a choice and waits until it is stored.
    bool stores(bool on);
    bool isStored(bool on) const;
    // Waits until dconf reports a failed write.
    bool aWriteFails();
    QStringList takeMessages();
    void takeFailedWrites();

    MakeUser m_make;
    std::optional<User> m_user;
    std::unique_ptr<MessageLog> m_log;
};

namespace {

constexpr int many = 100000; // entries
// The service itself takes half a minute for fifty times as many.
constexpr int manyKeys = 2000;
constexpr int flood = 10000; // signals

const QString serviceName = QStringLiteral("ca.desrt.dconf");
const QString serviceFile = QStringLiteral("/usr/share/dbus-1/services/ca.desrt.dconf.service");

const QString actionsKey = QStringLiteral("/desktop/glimmera-marlo-home/events_screen_actions");
const QString blockedKey = QStringLiteral("/desktop/glimmera-marlo-home/blocked_actions");
const QString userKey = QStringLiteral("/desktop/glimmera-marlo-home/events_screen_actions_user");
const QString widgetsKey = QStringLiteral("/desktop/glimmera-marlo-home/events_screen_widgets");
const QString gpsKey = QStringLiteral("/settings/location/gps_enabled");
const QString customKey = QStringLiteral("/settings/location/custom_settings");
const QStringList allKeys =
    QStringList{actionsKey, blockedKey, userKey, widgetsKey, gpsKey, customKey}
    + words("/settings/location/mls_enabled /settings/location/mls_online_state "
            "/settings/location/here_state /settings/location/custom_settings_enabled");

const QString actionPath = QStringLiteral("/usr/share/glimmera/quickactions/lamp.conf");

// A model that stores the paths of its enabled entries.
template<typename Model>
User listUser(const QString &key, const QString &path, void (Model::*enable)(const QString &),
              void (Model::*disable)(const QString &))
{
    const auto model = std::make_shared<Model>();
    if constexpr (std::is_same_v<Model, QuickActionsModel>) {
        model->setShowPotential(true);
    } else {
        // The other model has rows below its rows, which the tester reports as an error.
        new QAbstractItemModelTester(model.get(), model.get());
    }
    model->componentComplete();
    return {key, "['" + path.toUtf8() + "']", "@as []",
            [=](bool choice) { (model.get()->*(choice ? enable : disable))(path); },
            [=] { return model->data(model->index(0), Model::EnabledRole).toBool(); }};
}

User actionsUser()
{
    return listUser(actionsKey, actionPath, &QuickActionsModel::enableAction,
                    &QuickActionsModel::disableAction);
}

User widgetsUser()
{
    return listUser(widgetsKey, QStringLiteral("weather"), &EventsWidgetsModel::enableWidget,
                    &EventsWidgetsModel::disableWidget);
}

User locationUser()
{
    const auto location = std::make_shared<LocationConfiguration>();
    return {gpsKey, "true", "false", [=](bool choice) { location->setGpsEnabled(choice); },
            [=] { return location->gpsEnabled(); }};
}

// Sets the keys in a single write, however large it is.
void load(const QStringList &keys, const QByteArray &value)
{
    QByteArray file;
    for (const QString &key : keys) {
        const int slash = key.lastIndexOf(QLatin1Char('/'));
        file += '[' + key.mid(1, slash - 1).toUtf8() + "]\n" + key.mid(slash + 1).toUtf8() + '='
            + value + '\n';
    }
    DconfTool::run({QStringLiteral("load"), QStringLiteral("/")}, file);
}

void reset()
{
    for (const char *directory : {"/desktop/", "/settings/", "/other/"}) {
        DconfTool::reset(QString::fromLatin1(directory));
    }
}

// Follows a key as the types do, and thereby knows when they have received a change.
class Change
{
public:
    explicit Change(const QString &key) : m_item(key), m_spy(&m_item, &MGConfItem::valueChanged) { }

    bool hasCome()
    {
        const bool come = !m_spy.isEmpty() || m_spy.wait(patience);
        m_spy.clear();
        // Lets the change reach all other objects, too.
        QCoreApplication::processEvents();
        return come;
    }

private:
    MGConfItem m_item;
    QSignalSpy m_spy;
};

// The process of dconf-service; 0 if it does not run.
pid_t servicePid()
{
    const QDBusReply<uint> pid = QDBusConnection::sessionBus().interface()->servicePid(serviceName);
    return static_cast<pid_t>(pid.value());
}

// Starts the service if it does not run.
void signalService(int number)
{
    if (servicePid() == 0) {
        load({QStringLiteral("/other/start")}, "1");
    }
    const pid_t pid = servicePid();
    if (pid <= 0 || kill(pid, number) != 0) {
        qFatal("cannot signal the service of dconf");
    }
}

// Stops the service. It does not matter whether the service has read earlier calls.
class StoppedService
{
public:
    StoppedService() { signalService(SIGSTOP); }
    ~StoppedService() { goOn(); }
    Q_DISABLE_COPY_MOVE(StoppedService)
    void goOn()
    {
        if (m_stopped) {
            m_stopped = false;
            signalService(SIGCONT);
        }
    }
    void kill()
    {
        m_stopped = false;
        signalService(SIGKILL);
    }

private:
    bool m_stopped = true;
};

// Counts the writes that this process sends, on the connection that dconf uses as well.
class SentWrites
{
public:
    SentWrites() { g_dbus_connection_add_filter(m_bus, count, &m_count, nullptr); }

    operator int() const { return m_count; }

    // Waits until the bus has read what this process has sent.
    bool reachTheBus()
    {
        GVariant *reply = g_dbus_connection_call_sync(
            m_bus, "org.freedesktop.DBus", "/org/freedesktop/DBus", "org.freedesktop.DBus", "GetId",
            nullptr, nullptr, G_DBUS_CALL_FLAGS_NONE, patience, nullptr, nullptr);
        const bool read = reply != nullptr;
        g_clear_pointer(&reply, g_variant_unref);
        return read;
    }

private:
    // Runs in a thread of GLib's.
    static GDBusMessage *count(GDBusConnection *, GDBusMessage *message, gboolean incoming,
                               gpointer sent)
    {
        if (!incoming && qstrcmp(g_dbus_message_get_member(message), "Change") == 0) {
            ++*static_cast<std::atomic<int> *>(sent);
        }
        return message;
    }

    GDBusConnection *const m_bus = g_bus_get_sync(G_BUS_TYPE_SESSION, nullptr, nullptr);
    std::atomic<int> m_count = 0;
};

void reloadBusConfiguration()
{
    const QDBusMessage call = QDBusMessage::createMethodCall(
        QStringLiteral("org.freedesktop.DBus"), QStringLiteral("/org/freedesktop/DBus"),
        QStringLiteral("org.freedesktop.DBus"), QStringLiteral("ReloadConfig"));
    QCOMPARE(QDBusConnection::sessionBus().call(call).type(), QDBusMessage::ReplyMessage);
}

// Takes the service away. The bus cannot start it again.
class AbsentService
{
public:
    AbsentService()
    {
        if (!QFile::rename(serviceFile, m_away)) {
            qFatal("cannot take the service of dconf away");
        }
        reloadBusConfiguration();
        const pid_t pid = servicePid();
        if (pid > 0) {
            kill(pid, SIGKILL);
        }
        becomesTrue([] { return servicePid() == 0; });
    }
    ~AbsentService() { comeBack(); }
    Q_DISABLE_COPY_MOVE(AbsentService)
    void comeBack()
    {
        if (QFile::rename(m_away, serviceFile)) {
            reloadBusConfiguration();
        }
    }

private:
    const QString m_away = serviceFile + QStringLiteral(".away");
};

// dconf logs this for each failed write. Their number varies, because it may merge waiting writes.
bool isFailedWrite(const QString &message)
{
    return message.contains(QLatin1String("failed to commit changes to dconf"));
}

// dconf reports a failed write to GLib's log only.
GLogWriterOutput intoMessageLog(GLogLevelFlags level, const GLogField *fields, gsize count, void *)
{
    for (gsize i = 0; i < count && level <= G_LOG_LEVEL_WARNING; ++i) {
        if (qstrcmp(fields[i].key, "MESSAGE") == 0) {
            qWarning("%s", static_cast<const char *>(fields[i].value));
        }
    }
    return G_LOG_WRITER_HANDLED;
}

} // namespace

void TestDconfFaults::initTestCase_data()
{
    QTest::addColumn<MakeUser>("make");
    QTest::newRow("QuickActionsModel") << MakeUser(actionsUser);
    QTest::newRow("EventsWidgetsModel") << MakeUser(widgetsUser);
    QTest::newRow("LocationConfiguration") << MakeUser(locationUser);
}

void TestDconfFaults::init()
{
    Files::write(actionPath, "title=lamp\n");
    Files::write(QStringLiteral("/usr/share/glimmera/eventswidgets/weather.json"),
                 R"({ "widgets": [ { "path": "weather" } ] })");
    reset();
    // Without a list the first choice would enable all widgets.
    load({widgetsKey}, "@as []");
    m_log = std::make_unique<MessageLog>();
    QFETCH_GLOBAL(MakeUser, make);
    m_make = make;
    m_user = m_make();
}

void TestDconfFaults::cleanup()
{
    m_user.reset();
    QCOMPARE(takeMessages(), QStringList());
    m_log.reset();
}

QStringList TestDconfFaults::takeMessages()
{
    // GLib logs this for each connection from a user namespace.
    return m_log->takeLinesWithout(
        QRegularExpression(QStringLiteral("Using cross-namespace EXTERNAL authentication")));
}

void TestDconfFaults::takeFailedWrites()
{
    const QStringList messages = takeMessages();
    QVERIFY2(std::all_of(messages.begin(), messages.end(), isFailedWrite),
             qUtf8Printable(messages.join(QLatin1Char('\n'))));
}

bool TestDconfFaults::stores(bool on)
{
    m_user->choose(on);
    return becomesTrue([&] { return isStored(on); });
}

bool TestDconfFaults::isStored(bool on) const
{
    return DconfTool::read(m_user->key) == m_user->stored(on);
}

bool TestDconfFaults::aWriteFails()
{
    QStringList messages;
    return becomesTrue([&] { return !(messages += takeMessages()).isEmpty(); })
        && isFailedWrite(messages.first());
}

void TestDconfFaults::serviceHangs()
{
    QVERIFY(stores(true));

    StoppedService service;
    // This process sees its choice immediately. Others see it once the service continues.
    m_user->choose(false);
    TRY(!m_user->isOn());
    m_user->choose(true);
    m_user->choose(false);
    TRY(!m_user->isOn());
    QVERIFY(!m_make().isOn());
    QVERIFY(isStored(true));
    service.goOn();
    TRY(isStored(false));
    QVERIFY(!m_user->isOn());
}

void TestDconfFaults::goesWhileTheServiceHangs()
{
    const QString key = m_user->key;
    const QByteArray stored = m_user->stored(true);
    StoppedService service;
    m_user->choose(true);
    m_user.reset();
    m_make();
    service.goOn();
    TRY_COMPARE(DconfTool::read(key), stored);
    QVERIFY(m_make().isOn());
}

void TestDconfFaults::serviceDiesInTheMiddleOfAWrite()
{
    static auto &sent = *new SentWrites; // GLib uses it until the process ends
    QVERIFY(stores(true));
    // A value is stored before its write is answered, and a model writes a second key after it. If
    // the service died with an earlier write, the next one would reach its successor.
    dconf_client_sync(dconfClient());

    StoppedService service;
    const int before = sent;
    m_user->choose(false);
    TRY(!m_user->isOn());
    TRY(sent > before);
    QVERIFY(sent.reachTheBus());
    service.kill();
    // dconf reverts changes that were not stored, once each pending write has succeeded or failed.
    QVERIFY(aWriteFails());
    TRY_COMPARE(m_user->isOn(), true);
    QVERIFY(isStored(true));

    // The bus starts the service again.
    QVERIFY(stores(false));
    QVERIFY(!m_user->isOn());
    takeFailedWrites();
}

void TestDconfFaults::serviceIsAbsent()
{
    AbsentService service;
    QCOMPARE(servicePid(), 0);
    m_user->choose(true);
    QVERIFY(aWriteFails());
    TRY_COMPARE(m_user->isOn(), false);
    QVERIFY(!m_make().isOn());

    service.comeBack();
    QVERIFY(stores(true));
    QVERIFY(m_user->isOn());
    takeFailedWrites();
}

void TestDconfFaults::moveIsNotStored()
{
    if (m_user->key != actionsKey) {
        return; // The other types order nothing.
    }
    const QString other = actionPath + QStringLiteral(".conf");
    const QStringList paths = {actionPath, other};
    Files::write(other, "title=torch\n");
    Change change(actionsKey);
    DconfTool::write(actionsKey, paths);
    QVERIFY(change.hasCome());
    QuickActionsModel model;
    model.componentComplete();

    // If the write failed at once, the row would return to its old place.
    signalService(SIGSTOP);
    model.move(0, 1);
    QVERIFY(change.hasCome());
    AbsentService service;
    QVERIFY(aWriteFails());
    QVERIFY(change.hasCome());
    QCOMPARE(MGConfItem(actionsKey).value().toStringList(), paths);
    // As when another process changes the order.
    QCOMPARE(model.count(), 2);
    QCOMPARE(model.get(0).value(QStringLiteral("path")).toString(), other);
    service.comeBack();
    DconfTool::waitUntilStored();
    takeFailedWrites();
    Files::remove(other);
}

void TestDconfFaults::everyOtherType()
{
    const char *const values[] = {"true",
                                  "byte 0x7f",
                                  "int16 -7",
                                  "uint16 7",
                                  "-7",
                                  "uint32 4294967295",
                                  "int64 -9223372036854775808",
                                  "uint64 18446744073709551615",
                                  "handle 7",
                                  "1.5",
                                  "'text'",
                                  "''",
                                  "objectpath '/text'",
                                  "signature 'as'",
                                  "<7>",
                                  "<<<<'text'>>>>",
                                  "@mi 7",
                                  "@mi nothing",
                                  "@mmi just nothing",
                                  "('text', 7)",
                                  "()",
                                  "@as []",
                                  "['text', '']",
                                  "[1, 2]",
                                  "[<1>, <'text'>]",
                                  "[['text'], ['other']]",
                                  "b'bytes'",
                                  "[true, false]",
                                  "{'key': <true>}",
                                  "{'gps/enabled': <'text'>, 'mls/enabled': <{'a': <1>}>}",
                                  "{7: 'text'}",
                                  "@a{sv} {}",
                                  "[{'key': <('a', @mi 7)>}]",
                                  "{'key', <7>}"};
    Change change(m_user->key);
    for (const char *value : values) {
        load(allKeys, value);
        QVERIFY2(change.hasCome(), value);
        // Uses both the existing object and new ones.
        m_user->isOn();
        m_make().isOn();
        LocationConfiguration().restoreCustomSettings();
    }
    DconfTool::waitUntilStored();
    reset();
    QVERIFY(change.hasCome());
    load({widgetsKey}, "@as []");
    QVERIFY(m_user->key != widgetsKey || change.hasCome());
    QVERIFY(stores(true));
    QVERIFY(m_user->isOn());
}

void TestDconfFaults::hugeLists()
{
    QByteArray list;
    QByteArray map;
    for (int i = 0; i < many; ++i) {
        const QByteArray number = QByteArray::number(i);
        list += (i == 0 ? "['/a/" : ", '/a/") + number + '\'';
        map += (i == 0 ? "{'entry" : ", 'entry") + number + "': <true>";
    }
    map += ", 'gps/enabled': <true>}";
    Change listChange(actionsKey);
    Change mapChange(customKey);
    load({actionsKey, widgetsKey, blockedKey}, list + ']');
    load({customKey}, map);
    QVERIFY(listChange.hasCome());
    QVERIFY(mapChange.hasCome());
    QCOMPARE(MGConfItem(actionsKey).value().toStringList().size(), many);
    QCOMPARE(MGConfItem(customKey).value().toMap().size(), many + 1);
    QVERIFY(!m_user->isOn());
    QVERIFY(!m_make().isOn());
    QCOMPARE(LocationConfiguration().gpsEnabled(), false);
    LocationConfiguration().restoreCustomSettings();
    QCOMPARE(LocationConfiguration().gpsEnabled(), true);
    TRY_COMPARE(DconfTool::read(gpsKey), QByteArray("true"));

    // Replacing such a long list is slow, because dconf compares it with the new one. The test
    // therefore removes the list before it makes a choice.
    Change keyChange(m_user->key);
    reset();
    QVERIFY(keyChange.hasCome());
    if (m_user->key == widgetsKey) {
        load({widgetsKey}, "@as []");
        QVERIFY(keyChange.hasCome());
    }
    QVERIFY(!m_user->isOn());
    QVERIFY(stores(true));
}

void TestDconfFaults::hugeDatabase()
{
    QByteArray file = "[other]\n";
    for (int i = 0; i < manyKeys; ++i) {
        file += "key" + QByteArray::number(i) + "=1\n";
    }
    // Every type is notified of one change of many keys.
    DconfTool::run({QStringLiteral("load"), QStringLiteral("/")}, file);
    TRY_COMPARE(MGConfItem(QStringLiteral("/other/key%1").arg(manyKeys - 1)).value(), QVariant(1));
    QVERIFY(!m_user->isOn());
    QVERIFY(stores(true));
    QVERIFY(m_user->isOn());
    QVERIFY(m_make().isOn());
}

void TestDconfFaults::tenThousandNotifications()
{
    QVERIFY(stores(true));
    // Notifications like those of the service, although nothing has changed.
    QDBusConnection bus =
        QDBusConnection::connectToBus(QDBusConnection::SessionBus, QStringLiteral("notifications"));
    for (int i = 0; i < flood; ++i) {
        QDBusMessage notify = QDBusMessage::createSignal(
            QStringLiteral("/ca/desrt/dconf/Writer/user"), QStringLiteral("ca.desrt.dconf.Writer"),
            QStringLiteral("Notify"));
        notify.setArguments({m_user->key, QStringList{QString()}, QStringLiteral("tag")});
        QVERIFY(bus.send(notify));
    }
    // Then the value does change.
    load({m_user->key}, m_user->stored(false));
    TRY(!m_user->isOn());
    QDBusConnection::disconnectFromBus(QStringLiteral("notifications"));
}

int main(int argc, char *argv[])
{
    g_log_set_writer_func(intoMessageLog, nullptr, nullptr);
    const QCoreApplication application(argc, argv);
    TestDconfFaults test;
    return QTest::qExec(&test, argc, argv);
}

#include "tst_dconffaults.moc"
