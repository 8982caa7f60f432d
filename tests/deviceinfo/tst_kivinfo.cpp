// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "deviceinfo/kivinfo.h"
#include "loggedtest.h"
#include "patience.h"
#include "simulator/coverdaemon.h"

#include <QDBusArgument>
#include <QDBusConnectionInterface>
#include <QDBusMetaType>
#include <QDBusObjectPath>
#include <QDBusPendingCallWatcher>
#include <QDBusVariant>
#include <QProcess>
#include <QtTest>

class TestKivInfo : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void asksTheDaemonTwice();
    void readsBothInEitherOrder();
    void repliesAreTyped_data();
    void repliesAreTyped();
    void errorsKeepTheDefaults();
    void lateRepliesOverwriteSignals();
    void lateErrorsResetToTheDefaults();

    void followsChanges();
    void idChangesBeforeReadiness();
    void convertsChanges_data();
    void convertsChanges();
    void sameValuesEmitNothing();
    void theFirstArgumentIsIgnored();
    void nonsenseChangesNothing_data();
    void nonsenseChangesNothing();
    void othersChangeNothing();
    void aHandlerMayCallBack();

    void defaultsWithoutADaemon();
    void followsADaemonThatStartsLater();
    void defaultsWithoutABus();
    void goesWithRepliesPending();
};

using StringMap = QMap<QString, QString>;
using NumberMap = QMap<QString, int>;
using NumberedMap = QMap<int, QDBusVariant>;
using MapOfMaps = QMap<QString, QVariantMap>;

Q_DECLARE_METATYPE(StringMap)
Q_DECLARE_METATYPE(NumberMap)
Q_DECLARE_METATYPE(NumberedMap)
Q_DECLARE_METATYPE(MapOfMaps)
Q_DECLARE_METATYPE(QList<QStringList>)

namespace {

const QString idProperty = QStringLiteral("KIVID");
const QString readyProperty = QStringLiteral("Ready");
const QString cover = QStringLiteral("cover-7");

QVariant structure(const QString &first, const QString &second)
{
    QDBusArgument argument;
    argument.beginStructure();
    argument << first << second;
    argument.endStructure();
    return QVariant::fromValue(argument);
}

void answerBoth(CoverDaemon &daemon, const QVariantList &id, const QVariantList &ready)
{
    daemon.answer(idProperty, id);
    daemon.answer(readyProperty, ready);
}

// Counts its own signals.
class CountingKivInfo : public KivInfo
{
public:
    QSignalSpy idChanged{this, &KivInfo::kivIdChanged};
    QSignalSpy readyChanged{this, &KivInfo::kivReadyChanged};

    // The values and the numbers of changes, as "id ready: 1 1".
    QString report() const
    {
        return QStringLiteral("%1 %2: %3 %4")
            .arg(kivId(), kivReady() ? QStringLiteral("ready") : QStringLiteral("not ready"))
            .arg(idChanged.size())
            .arg(readyChanged.size());
    }
};

// Both replies have been handled, or their errors.
bool isSettled(const KivInfo &info)
{
    return info.findChildren<QDBusPendingCallWatcher *>().isEmpty();
}

// A last change: when it arrives, everything that was sent before it has arrived.
const QString lastCover = QStringLiteral("last");

void sendLast(CoverDaemon &daemon)
{
    daemon.sendChanges({{idProperty, lastCover}});
}

// Returns when the bus has received everything that the connection sent.
void flush(QDBusConnection connection)
{
    const QDBusMessage call = QDBusMessage::createMethodCall(
        QStringLiteral("org.freedesktop.DBus"), QStringLiteral("/"),
        QStringLiteral("org.freedesktop.DBus"), QStringLiteral("GetId"));
    QCOMPARE(connection.call(call).type(), QDBusMessage::ReplyMessage);
}

// Runs in a process of its own, because a process has only one system bus.
int withoutABus()
{
    const MessageLog log;
    const KivInfo info;
    QSignalSpy idChanged(&info, &KivInfo::kivIdChanged);
    QCoreApplication::processEvents();
    const bool isDefault = info.kivId().isEmpty() && !info.kivReady() && idChanged.isEmpty();
    return isDefault && !QDBusConnection::systemBus().isConnected() ? 0 : 1;
}

} // namespace

void TestKivInfo::asksTheDaemonTwice()
{
    CoverDaemon daemon;
    const KivInfo info;
    answerBoth(daemon, {cover}, {1});
    QTRY_VERIFY(isSettled(info));

    // No other call is sent. In particular, there is no introspection, which would block.
    const QList<QDBusMessage> calls = daemon.calls();
    QCOMPARE(calls.size(), 2);
    for (const QDBusMessage &call : calls) {
        QCOMPARE(call.path(), QStringLiteral("/com/marlo/kivd"));
        QCOMPARE(call.interface(), QStringLiteral("org.freedesktop.DBus.Properties"));
        QCOMPARE(call.member(), QStringLiteral("Get"));
        QCOMPARE(call.signature(), QStringLiteral("ss"));
        QCOMPARE(call.arguments().at(0).toString(), QStringLiteral("com.marlo.kivd"));
    }
    QCOMPARE(calls.at(0).arguments().at(1).toString(), idProperty);
    QCOMPARE(calls.at(1).arguments().at(1).toString(), readyProperty);
}

void TestKivInfo::readsBothInEitherOrder()
{
    CoverDaemon daemon;
    const CountingKivInfo info;
    QCOMPARE(info.report(), QStringLiteral(" not ready: 0 0"));
    QTRY_COMPARE(daemon.calls().size(), 2);
    daemon.answer(readyProperty, {1});
    QTRY_COMPARE(info.report(), QStringLiteral(" ready: 0 1"));
    daemon.answer(idProperty, {cover});
    QTRY_COMPARE(info.report(), QStringLiteral("cover-7 ready: 1 1"));
    QTRY_VERIFY(isSettled(info));

    // Now the daemon answers both calls at once, the identifier first.
    const CountingKivInfo another;
    QTRY_COMPARE(another.report(), QStringLiteral("cover-7 ready: 1 1"));
}

void TestKivInfo::repliesAreTyped_data()
{
    QTest::addColumn<QVariantList>("id");
    QTest::addColumn<QVariantList>("ready");
    QTest::addColumn<QString>("report");

    const auto id = [](const char *name, const QVariantList &reply, bool isTaken = false) {
        QTest::addRow("id: %s", name)
            << reply << QVariantList{1}
            << (isTaken ? QStringLiteral("cover-7 ready: 1 1") : QStringLiteral(" ready: 0 1"));
    };
    id("string", {cover}, true);
    id("string and more", {cover, 1, 2.0}, true);
    id("empty string", {QString()});
    id("nothing", {});
    id("variant", {QVariant::fromValue(QDBusVariant(cover))});
    id("integer", {1});
    id("object path", {QVariant::fromValue(QDBusObjectPath(QStringLiteral("/cover")))});
    id("strings", {QStringList(cover)});
    id("bytes", {cover.toUtf8()});
    id("structure", {structure(cover, cover)});
    id("integer, then string", {1, cover});

    const auto ready = [](const char *name, const QVariantList &reply, bool isTaken = false) {
        QTest::addRow("ready: %s", name) << QVariantList{cover} << reply
                                         << (isTaken ? QStringLiteral("cover-7 ready: 1 1")
                                                     : QStringLiteral("cover-7 not ready: 1 0"));
    };
    ready("integer", {1}, true);
    ready("integer and more", {1, cover}, true);
    for (const int number : {0, 2, -1, 257}) {
        ready(QByteArray::number(number).constData(), {number});
    }
    ready("nothing", {});
    ready("variant", {QVariant::fromValue(QDBusVariant(1))});
    ready("unsigned", {1U});
    ready("64 bits", {Q_INT64_C(1)});
    ready("16 bits", {QVariant::fromValue(short(1))});
    ready("byte", {QVariant::fromValue(uchar(1))});
    ready("boolean", {true});
    ready("floating point", {1.0});
    ready("string", {QStringLiteral("1")});
    ready("integers", {QVariant::fromValue(QList<int>{1})});
    ready("string, then integer", {cover, 1});
}

void TestKivInfo::repliesAreTyped()
{
    QFETCH(QVariantList, id);
    QFETCH(QVariantList, ready);
    CoverDaemon daemon;
    answerBoth(daemon, id, ready);
    const CountingKivInfo info;
    QTRY_VERIFY(isSettled(info));
    QTEST(info.report(), "report");

    // The values stay until the next change signal.
    sendLast(daemon);
    QTRY_COMPARE(info.kivId(), lastCover);
}

void TestKivInfo::errorsKeepTheDefaults()
{
    CoverDaemon daemon;
    daemon.answerWithError(idProperty);
    daemon.answerWithError(readyProperty);
    const CountingKivInfo info;
    QTRY_VERIFY(isSettled(info));
    QCOMPARE(info.report(), QStringLiteral(" not ready: 0 0"));

    // The properties are not requested again, and change signals still arrive.
    daemon.sendChanges({{idProperty, cover}, {readyProperty, 1}});
    QTRY_COMPARE(info.report(), QStringLiteral("cover-7 ready: 1 1"));
    QCOMPARE(daemon.calls().size(), 2);
}

void TestKivInfo::lateRepliesOverwriteSignals()
{
    CoverDaemon daemon;
    const CountingKivInfo info;
    QTRY_COMPARE(daemon.calls().size(), 2);
    daemon.sendChanges({{idProperty, QStringLiteral("newer")}, {readyProperty, 1}});
    QTRY_COMPARE(info.report(), QStringLiteral("newer ready: 1 1"));
    QVERIFY(!isSettled(info));

    answerBoth(daemon, {cover}, {0});
    QTRY_VERIFY(isSettled(info));
    QCOMPARE(info.report(), QStringLiteral("cover-7 not ready: 2 2"));
}

void TestKivInfo::lateErrorsResetToTheDefaults()
{
    CoverDaemon daemon;
    const CountingKivInfo info;
    QTRY_COMPARE(daemon.calls().size(), 2);
    daemon.sendChanges({{idProperty, cover}, {readyProperty, 1}});
    QTRY_COMPARE(info.report(), QStringLiteral("cover-7 ready: 1 1"));

    daemon.answerWithError(idProperty);
    daemon.answer(readyProperty, {QVariant::fromValue(QDBusVariant(1))});
    QTRY_VERIFY(isSettled(info));
    QCOMPARE(info.report(), QStringLiteral(" not ready: 2 2"));
}

void TestKivInfo::followsChanges()
{
    CoverDaemon daemon;
    answerBoth(daemon, {cover}, {0});
    const CountingKivInfo info;
    const CountingKivInfo another;
    QTRY_VERIFY(isSettled(info) && isSettled(another));
    QCOMPARE(info.report(), QStringLiteral("cover-7 not ready: 1 0"));

    daemon.sendChanges({{readyProperty, 1}});
    QTRY_COMPARE(info.report(), QStringLiteral("cover-7 ready: 1 1"));
    QTRY_COMPARE(another.report(), QStringLiteral("cover-7 ready: 1 1"));
    daemon.sendChanges({{idProperty, QString()}});
    QTRY_COMPARE(info.report(), QStringLiteral(" ready: 2 1"));
    daemon.sendChanges({{idProperty, QStringLiteral("another")}, {QStringLiteral("Color"), 3}});
    QTRY_COMPARE(info.report(), QStringLiteral("another ready: 3 1"));
}

void TestKivInfo::idChangesBeforeReadiness()
{
    CoverDaemon daemon;
    const CountingKivInfo info;
    QStringList order;
    const auto note = [&] { order.append(info.report()); };
    connect(&info, &KivInfo::kivIdChanged, this, note);
    connect(&info, &KivInfo::kivReadyChanged, this, note);
    daemon.sendChanges({{idProperty, cover}, {readyProperty, 1}});
    QTRY_COMPARE(order.size(), 2);
    QCOMPARE(order,
             QStringList(
                 {QStringLiteral("cover-7 not ready: 1 0"), QStringLiteral("cover-7 ready: 1 1")}));
}

void TestKivInfo::convertsChanges_data()
{
    QTest::addColumn<QVariant>("value");
    QTest::addColumn<QString>("id");
    QTest::addColumn<bool>("ready");

    const auto row = [](const char *name, const QVariant &value, const char *id, bool ready) {
        QTest::newRow(name) << value << id << ready;
    };
    row("number", 7, "7", false);
    row("one", 1, "1", true);
    row("minus one", -1, "-1", false);
    row("one in the lower 8 bits", 257, "257", false);
    row("one in 64 bits", Q_INT64_C(1), "1", true);
    row("one as a byte", QVariant::fromValue(uchar(1)), "\x01", true);
    row("one in the lower 32 bits", Q_INT64_C(0x100000001), "4294967297", false);
    row("true", true, "true", true);
    row("one as text", QStringLiteral("1"), "1", true);
    row("text", cover, "cover-7", false);
    row("structure", structure(cover, cover), "", false);
    row("map", QVariantMap{{idProperty, cover}}, "", false);
    row("numbers", QVariant::fromValue(QList<int>{1}), "", false);
    row("object path", QVariant::fromValue(QDBusObjectPath(QStringLiteral("/1"))), "", false);
    row("variant in a variant", QVariant::fromValue(QDBusVariant(1)), "", false);
}

void TestKivInfo::convertsChanges()
{
    QFETCH(QVariant, value);
    QFETCH(QString, id);
    QFETCH(bool, ready);
    CoverDaemon daemon;
    const KivInfo info;
    daemon.sendChanges({{idProperty, QStringLiteral("before")}, {readyProperty, ready ? 0 : 1}});
    QTRY_COMPARE(info.kivId(), QStringLiteral("before"));
    daemon.sendChanges({{idProperty, value}, {readyProperty, value}});
    QTRY_COMPARE(info.kivId(), id);
    QCOMPARE(info.kivReady(), ready);
}

void TestKivInfo::sameValuesEmitNothing()
{
    CoverDaemon daemon;
    answerBoth(daemon, {cover}, {1});
    const CountingKivInfo info;
    QTRY_VERIFY(isSettled(info));
    daemon.sendChanges({{idProperty, cover}, {readyProperty, 1}});
    daemon.sendChanges({{idProperty, cover}});
    sendLast(daemon);
    QTRY_COMPARE(info.report(), QStringLiteral("last ready: 2 1"));

    // All numbers other than 1 have the same meaning.
    daemon.sendChanges({{readyProperty, 0}});
    daemon.sendChanges({{readyProperty, 2}});
    daemon.sendChanges({{idProperty, cover}});
    QTRY_COMPARE(info.report(), QStringLiteral("cover-7 not ready: 3 2"));
}

void TestKivInfo::theFirstArgumentIsIgnored()
{
    CoverDaemon daemon;
    const KivInfo info;
    daemon.sendPropertiesChanged({QStringLiteral("another.interface"),
                                  QVariantMap{{idProperty, QStringLiteral("a")}}, QStringList()});
    QTRY_COMPARE(info.kivId(), QStringLiteral("a"));
    daemon.sendPropertiesChanged({7, QVariantMap{{idProperty, QStringLiteral("b")}}});
    QTRY_COMPARE(info.kivId(), QStringLiteral("b"));
}

void TestKivInfo::nonsenseChangesNothing_data()
{
    QTest::addColumn<QVariantList>("arguments");

    const QString name = QStringLiteral("com.marlo.kivd");
    const QVariantMap changes = {{idProperty, cover}, {readyProperty, 0}};
    const auto second = [&name](const QVariant &argument) {
        return QVariantList{name, argument, QStringList()};
    };
    QTest::newRow("nothing") << QVariantList();
    QTest::newRow("the first alone") << QVariantList{name};
    QTest::newRow("a map in the first place") << QVariantList{changes};
    QTest::newRow("a map in the third place") << QVariantList{name, name, changes};
    QTest::newRow("s") << second(idProperty);
    QTest::newRow("i") << second(1);
    QTest::newRow("b") << second(false);
    QTest::newRow("as") << second(QStringList{idProperty, cover});
    QTest::newRow("ay") << second(QByteArray("KIVID"));
    QTest::newRow("ai") << second(QVariant::fromValue(QList<int>{1, 2}));
    QTest::newRow("aas") << second(
        QVariant::fromValue(QList<QStringList>{{idProperty, cover}, {readyProperty}}));
    QTest::newRow("av") << second(QVariantList{idProperty, cover});
    QTest::newRow("(ss)") << second(structure(idProperty, cover));
    QTest::newRow("(ii)") << second(QPoint(1, 2));
    QTest::newRow("a{ss}") << second(QVariant::fromValue(StringMap{{idProperty, cover}}));
    QTest::newRow("a{si}") << second(QVariant::fromValue(NumberMap{{readyProperty, 0}}));
    QTest::newRow("a{iv}") << second(QVariant::fromValue(NumberedMap{{1, QDBusVariant(cover)}}));
    QTest::newRow("a{sa{sv}}") << second(QVariant::fromValue(MapOfMaps{{idProperty, changes}}));
    QTest::newRow("v") << second(QVariant::fromValue(QDBusVariant(changes)));
    QTest::newRow("empty a{sv}") << second(QVariantMap());
    QTest::newRow("invalidated properties")
        << QVariantList{name, QVariantMap(), QStringList{idProperty, readyProperty}};
    QTest::newRow("other keys") << second(
        QVariantMap{{QStringLiteral("kivid"), cover}, {QStringLiteral("READY"), 0}});
}

void TestKivInfo::nonsenseChangesNothing()
{
    QFETCH(QVariantList, arguments);
    CoverDaemon daemon;
    const CountingKivInfo info;
    daemon.sendChanges({{idProperty, QStringLiteral("before")}, {readyProperty, 1}});
    daemon.sendPropertiesChanged(arguments);
    sendLast(daemon);
    QTRY_COMPARE(info.report(), QStringLiteral("last ready: 2 1"));
}

void TestKivInfo::othersChangeNothing()
{
    CoverDaemon daemon;
    const CountingKivInfo info;
    daemon.sendChanges({{idProperty, cover}});
    QTRY_COMPARE(info.report(), QStringLiteral("cover-7 not ready: 1 0"));

    const QString path = QStringLiteral("/com/marlo/kivd");
    const QString interface = QStringLiteral("org.freedesktop.DBus.Properties");
    const QString member = QStringLiteral("PropertiesChanged");
    const auto send = [](QDBusConnection from, QDBusMessage signal) {
        signal.setArguments({QStringLiteral("com.marlo.kivd"),
                             QVariantMap{{idProperty, QStringLiteral("other")}}, QStringList()});
        QVERIFY(from.send(signal));
    };
    const auto signal = &QDBusMessage::createSignal;
    send(daemon.connection(), signal(path + QStringLiteral("/other"), interface, member));
    send(daemon.connection(), signal(QStringLiteral("/"), interface, member));
    send(daemon.connection(), signal(path, QStringLiteral("com.marlo.kivd"), member));
    send(daemon.connection(), signal(path, interface, QStringLiteral("Changed")));
    const QDBusConnection stranger =
        QDBusConnection::connectToBus(QDBusConnection::SystemBus, QStringLiteral("stranger"));
    send(stranger, signal(path, interface, member));
    flush(stranger);
    QDBusConnection::disconnectFromBus(stranger.name());

    sendLast(daemon);
    QTRY_COMPARE(info.report(), QStringLiteral("last not ready: 2 0"));
}

void TestKivInfo::aHandlerMayCallBack()
{
    CoverDaemon daemon;
    answerBoth(daemon, {cover}, {1});
    const KivInfo info;
    bool readyInside = false;
    // While a reply is handled, a handler creates another KivInfo and waits for it.
    connect(&info, &KivInfo::kivIdChanged, this, [&readyInside] {
        const KivInfo inner;
        QTRY_VERIFY(isSettled(inner));
        readyInside = inner.kivReady();
    });
    QTRY_VERIFY(isSettled(info));
    QVERIFY(readyInside);
    QCOMPARE(info.kivId(), cover);
    QVERIFY(info.kivReady());

    // A page that closes because its cover was taken off.
    QPointer<KivInfo> page = new KivInfo;
    QTRY_VERIFY(isSettled(*page));
    connect(page, &KivInfo::kivIdChanged, this, [&page] { delete page; });
    daemon.sendChanges({{idProperty, QString()}, {readyProperty, 0}});
    QTRY_VERIFY(page == nullptr);
    // The handler of a reply may delete it as well.
    answerBoth(daemon, {cover}, {1});
    page = new KivInfo;
    connect(page, &KivInfo::kivIdChanged, this, [&page] { delete page; });
    QTRY_VERIFY(page == nullptr);
}

void TestKivInfo::defaultsWithoutADaemon()
{
    const CountingKivInfo info;
    // The text of the bus's error is not an identifier.
    QTRY_VERIFY(isSettled(info));
    QCOMPARE(info.report(), QStringLiteral(" not ready: 0 0"));
}

void TestKivInfo::followsADaemonThatStartsLater()
{
    const CountingKivInfo info;
    QTRY_VERIFY(isSettled(info));
    {
        CoverDaemon daemon;
        daemon.sendChanges({{idProperty, cover}, {readyProperty, 1}});
        QTRY_COMPARE(info.report(), QStringLiteral("cover-7 ready: 1 1"));
        // The properties are not requested again.
        QVERIFY(daemon.calls().isEmpty());
    }
    // The values stay when the daemon is gone, and signals of a new daemon change them.
    CoverDaemon daemon;
    QCOMPARE(info.report(), QStringLiteral("cover-7 ready: 1 1"));
    sendLast(daemon);
    QTRY_COMPARE(info.report(), QStringLiteral("last ready: 2 1"));
}

void TestKivInfo::defaultsWithoutABus()
{
    QProcess child;
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.insert(QStringLiteral("DBUS_SYSTEM_BUS_ADDRESS"),
                       QStringLiteral("unix:path=/nowhere"));
    child.setProcessEnvironment(environment);
    child.start(QCoreApplication::applicationFilePath(), {QStringLiteral("--without-a-bus")});
    QVERIFY(child.waitForFinished(patience));
    QCOMPARE(child.exitStatus(), QProcess::NormalExit);
    QCOMPARE(child.exitCode(), 0);
    QCOMPARE(child.readAllStandardError(), QByteArray());
}

void TestKivInfo::goesWithRepliesPending()
{
    CoverDaemon daemon;
    auto info = std::make_unique<KivInfo>();
    QTRY_COMPARE(daemon.calls().size(), 2);
    info.reset();
    answerBoth(daemon, {cover}, {1});
    daemon.sendChanges({{idProperty, cover}});

    // The earlier replies have arrived before this one's.
    const KivInfo another;
    QTRY_VERIFY(isSettled(another));
    QCOMPARE(another.kivId(), cover);

    // The next one is destroyed before its calls are sent.
    delete new KivInfo;
    flush(QDBusConnection::systemBus());
    const KivInfo last;
    QTRY_VERIFY(isSettled(last));
}

int main(int argc, char *argv[])
{
    QCoreApplication application(argc, argv);
    if (QCoreApplication::arguments().contains(QStringLiteral("--without-a-bus"))) {
        return withoutABus();
    }
    qDBusRegisterMetaType<StringMap>();
    qDBusRegisterMetaType<NumberMap>();
    qDBusRegisterMetaType<NumberedMap>();
    qDBusRegisterMetaType<MapOfMaps>();
    qDBusRegisterMetaType<QList<QStringList>>();
    TestKivInfo test;
    return QTest::qExec(&test, argc, argv);
}

#include "tst_kivinfo.moc"
