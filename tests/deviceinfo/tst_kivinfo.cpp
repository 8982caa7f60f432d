// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "deviceinfo/kivinfo.h"
#include "loggedtest.h"
#include "patience.h"
#include "simulator/coverdaemon.h"
#include "texts.h"

#include <QDBusArgument>
#include <QDBusConnectionInterface>
#include <QDBusMetaType>
#include <QDBusObjectPath>
#include <QDBusPendingCallWatcher>
#include <QDBusVariant>
#include <QtTest>

class TestKivInfo : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();

    void asksTheDaemonTwice();
    void readsBothInEitherOrder();
    void repliesAreTyped_data();
    void repliesAreTyped();
    void errorsKeepTheDefaults();
    void lateRepliesOverwriteSignals();

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
    void aHandlerMayWaitForTheNextSignal();

    void followsADaemonThatStartsLater();
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

const QString idProperty = "KIVID"_s;
const QString readyProperty = "Ready"_s;
const QString cover = "cover-7"_s;

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
        return "%1 %2: %3 %4"_s.arg(kivId(), kivReady() ? "ready"_s : "not ready"_s)
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
const QString lastCover = "last"_s;

void sendLast(CoverDaemon &daemon)
{
    daemon.sendChanges({{idProperty, lastCover}});
}

} // namespace

void TestKivInfo::initTestCase()
{
    qDBusRegisterMetaType<StringMap>();
    qDBusRegisterMetaType<NumberMap>();
    qDBusRegisterMetaType<NumberedMap>();
    qDBusRegisterMetaType<MapOfMaps>();
    qDBusRegisterMetaType<QList<QStringList>>();
}

void TestKivInfo::asksTheDaemonTwice()
{
    CoverDaemon daemon;
    const KivInfo info;
    answerBoth(daemon, {cover}, {1});
    TRY(isSettled(info));

    // No other call is sent. In particular, there is no introspection, which would block.
    const QList<QDBusMessage> calls = daemon.calls();
    QCOMPARE(calls.size(), 2);
    for (const QDBusMessage &call : calls) {
        QCOMPARE(call.path(), "/com/marlo/kivd"_s);
        QCOMPARE(call.interface(), "org.freedesktop.DBus.Properties"_s);
        QCOMPARE(call.member(), "Get"_s);
        QCOMPARE(call.signature(), "ss"_s);
        QCOMPARE(call.arguments().at(0).toString(), "com.marlo.kivd"_s);
    }
    QCOMPARE(calls.at(0).arguments().at(1).toString(), idProperty);
    QCOMPARE(calls.at(1).arguments().at(1).toString(), readyProperty);
}

void TestKivInfo::readsBothInEitherOrder()
{
    CoverDaemon daemon;
    const CountingKivInfo info;
    QCOMPARE(info.report(), " not ready: 0 0"_s);
    TRY_COMPARE(daemon.calls().size(), 2);
    daemon.answer(readyProperty, {1});
    TRY_COMPARE(info.report(), " ready: 0 1"_s);
    daemon.answer(idProperty, {cover});
    TRY_COMPARE(info.report(), "cover-7 ready: 1 1"_s);
    TRY(isSettled(info));

    // Now the daemon answers both calls at once, the identifier first.
    const CountingKivInfo another;
    TRY_COMPARE(another.report(), "cover-7 ready: 1 1"_s);
}

void TestKivInfo::repliesAreTyped_data()
{
    QTest::addColumn<QVariantList>("id");
    QTest::addColumn<QVariantList>("ready");
    QTest::addColumn<QString>("report");

    const auto id = [](const char *name, const QVariantList &reply, bool isTaken = false) {
        QTest::addRow("id: %s", name)
            << reply << QVariantList{1} << (isTaken ? "cover-7 ready: 1 1"_s : " ready: 0 1"_s);
    };
    id("string", {cover}, true);
    id("string and more", {cover, 1, 2.0}, true);
    id("empty string", {QString()});
    id("nothing", {});
    id("variant", {QVariant::fromValue(QDBusVariant(cover))});
    id("integer", {1});
    id("object path", {QVariant::fromValue(QDBusObjectPath("/cover"_s))});
    id("strings", {QStringList(cover)});
    id("bytes", {cover.toUtf8()});
    id("structure", {structure(cover, cover)});
    id("integer, then string", {1, cover});

    const auto ready = [](const char *name, const QVariantList &reply, bool isTaken = false) {
        QTest::addRow("ready: %s", name)
            << QVariantList{cover} << reply
            << (isTaken ? "cover-7 ready: 1 1"_s : "cover-7 not ready: 1 0"_s);
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
    ready("string", {"1"_s});
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
    TRY(isSettled(info));
    QTEST(info.report(), "report");

    // The values stay until the next change signal.
    const bool wasReady = info.kivReady();
    sendLast(daemon);
    TRY_COMPARE(info.kivId(), lastCover);
    QCOMPARE(info.kivReady(), wasReady);
}

void TestKivInfo::errorsKeepTheDefaults()
{
    CoverDaemon daemon;
    daemon.answerWithError(idProperty);
    daemon.answerWithError(readyProperty);
    const CountingKivInfo info;
    TRY(isSettled(info));
    QCOMPARE(info.report(), " not ready: 0 0"_s);

    // The properties are not requested again, and change signals still arrive.
    daemon.sendChanges({{idProperty, cover}, {readyProperty, 1}});
    TRY_COMPARE(info.report(), "cover-7 ready: 1 1"_s);
    QCOMPARE(daemon.calls().size(), 2);
}

void TestKivInfo::lateRepliesOverwriteSignals()
{
    for (const bool areErrors : {false, true}) {
        CoverDaemon daemon;
        const CountingKivInfo info;
        TRY_COMPARE(daemon.calls().size(), 2);
        daemon.sendChanges({{idProperty, "newer"_s}, {readyProperty, 1}});
        TRY_COMPARE(info.report(), "newer ready: 1 1"_s);
        QVERIFY(!isSettled(info));
        if (areErrors) {
            daemon.answerWithError(idProperty);
            daemon.answer(readyProperty, {QVariant::fromValue(QDBusVariant(1))});
        } else {
            answerBoth(daemon, {cover}, {0});
        }
        TRY(isSettled(info));
        // Errors reset to the defaults.
        QCOMPARE(info.report(), (areErrors ? QString() : cover) + " not ready: 2 2"_s);
    }
}

void TestKivInfo::followsChanges()
{
    CoverDaemon daemon;
    answerBoth(daemon, {cover}, {0});
    const CountingKivInfo info;
    const CountingKivInfo another;
    TRY(isSettled(info) && isSettled(another));
    QCOMPARE(info.report(), "cover-7 not ready: 1 0"_s);

    daemon.sendChanges({{readyProperty, 1}});
    TRY_COMPARE(info.report(), "cover-7 ready: 1 1"_s);
    TRY_COMPARE(another.report(), "cover-7 ready: 1 1"_s);
    daemon.sendChanges({{idProperty, QString()}});
    TRY_COMPARE(info.report(), " ready: 2 1"_s);
    daemon.sendChanges({{idProperty, "another"_s}, {"Color"_s, 3}});
    TRY_COMPARE(info.report(), "another ready: 3 1"_s);
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
    TRY_COMPARE(order.size(), 2);
    QCOMPARE(order, QStringList({"cover-7 not ready: 1 0"_s, "cover-7 ready: 1 1"_s}));
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
    row("one as text", "1"_s, "1", true);
    row("text", cover, "cover-7", false);
    row("structure", structure(cover, cover), "", false);
    row("map", QVariantMap{{idProperty, cover}}, "", false);
    row("numbers", QVariant::fromValue(QList<int>{1}), "", false);
    row("object path", QVariant::fromValue(QDBusObjectPath("/1"_s)), "", false);
    row("variant in a variant", QVariant::fromValue(QDBusVariant(1)), "", false);
}

void TestKivInfo::convertsChanges()
{
    QFETCH(QVariant, value);
    QFETCH(QString, id);
    QFETCH(bool, ready);
    CoverDaemon daemon;
    const KivInfo info;
    daemon.sendChanges({{idProperty, "before"_s}, {readyProperty, ready ? 0 : 1}});
    TRY_COMPARE(info.kivId(), "before"_s);
    daemon.sendChanges({{idProperty, value}, {readyProperty, value}});
    TRY_COMPARE(info.kivId(), id);
    QCOMPARE(info.kivReady(), ready);
}

void TestKivInfo::sameValuesEmitNothing()
{
    CoverDaemon daemon;
    answerBoth(daemon, {cover}, {1});
    const CountingKivInfo info;
    TRY(isSettled(info));
    daemon.sendChanges({{idProperty, cover}, {readyProperty, 1}});
    daemon.sendChanges({{idProperty, cover}});
    sendLast(daemon);
    TRY_COMPARE(info.report(), "last ready: 2 1"_s);

    // All numbers other than 1 have the same meaning.
    daemon.sendChanges({{readyProperty, 0}});
    daemon.sendChanges({{readyProperty, 2}});
    daemon.sendChanges({{idProperty, cover}});
    TRY_COMPARE(info.report(), "cover-7 not ready: 3 2"_s);
}

void TestKivInfo::theFirstArgumentIsIgnored()
{
    CoverDaemon daemon;
    const KivInfo info;
    daemon.sendPropertiesChanged(
        {"another.interface"_s, QVariantMap{{idProperty, "a"_s}}, QStringList()});
    TRY_COMPARE(info.kivId(), "a"_s);
    daemon.sendPropertiesChanged({7, QVariantMap{{idProperty, "b"_s}}});
    TRY_COMPARE(info.kivId(), "b"_s);
}

void TestKivInfo::nonsenseChangesNothing_data()
{
    QTest::addColumn<QVariantList>("arguments");

    const QString name = "com.marlo.kivd"_s;
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
    QTest::newRow("other keys") << second(QVariantMap{{"kivid"_s, cover}, {"READY"_s, 0}});
}

void TestKivInfo::nonsenseChangesNothing()
{
    QFETCH(QVariantList, arguments);
    CoverDaemon daemon;
    const CountingKivInfo info;
    daemon.sendChanges({{idProperty, "before"_s}, {readyProperty, 1}});
    daemon.sendPropertiesChanged(arguments);
    sendLast(daemon);
    TRY_COMPARE(info.report(), "last ready: 2 1"_s);
}

void TestKivInfo::othersChangeNothing()
{
    CoverDaemon daemon;
    const CountingKivInfo info;
    daemon.sendChanges({{idProperty, cover}});
    TRY_COMPARE(info.report(), "cover-7 not ready: 1 0"_s);

    const QString path = "/com/marlo/kivd"_s;
    const QString interface = "org.freedesktop.DBus.Properties"_s;
    const QString member = "PropertiesChanged"_s;
    const auto send = [](QDBusConnection from, QDBusMessage signal) {
        signal.setArguments(
            {"com.marlo.kivd"_s, QVariantMap{{idProperty, "other"_s}}, QStringList()});
        from.send(signal);
    };
    const auto signal = &QDBusMessage::createSignal;
    send(daemon.connection(), signal(path + "/other"_s, interface, member));
    send(daemon.connection(), signal("/"_s, interface, member));
    send(daemon.connection(), signal(path, "com.marlo.kivd"_s, member));
    send(daemon.connection(), signal(path, interface, "Changed"_s));
    const QDBusConnection stranger =
        QDBusConnection::connectToBus(QDBusConnection::SystemBus, "stranger"_s);
    send(stranger, signal(path, interface, member));
    // Returns when the bus has received the signal.
    QVERIFY(stranger.interface()->isServiceRegistered("com.marlo.kivd"_s));
    QDBusConnection::disconnectFromBus(stranger.name());

    sendLast(daemon);
    TRY_COMPARE(info.report(), "last not ready: 2 0"_s);
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
        TRY(isSettled(inner));
        readyInside = inner.kivReady();
    });
    TRY(isSettled(info));
    QVERIFY(readyInside);
    QCOMPARE(info.kivId(), cover);
    QVERIFY(info.kivReady());

    // A page that closes because its cover was taken off.
    QPointer<KivInfo> page = new KivInfo;
    TRY(isSettled(*page));
    connect(page, &KivInfo::kivIdChanged, this, [&page] { delete page; });
    daemon.sendChanges({{idProperty, QString()}, {readyProperty, 0}});
    TRY(page == nullptr);
    // The handler of a reply may delete it as well.
    answerBoth(daemon, {cover}, {1});
    page = new KivInfo;
    connect(page, &KivInfo::kivIdChanged, this, [&page] { delete page; });
    TRY(page == nullptr);
}

void TestKivInfo::aHandlerMayWaitForTheNextSignal()
{
    CoverDaemon daemon;
    const CountingKivInfo info;
    connect(&info, &KivInfo::kivIdChanged, this, [&] {
        if (info.kivId() == cover) {
            daemon.sendChanges({{idProperty, lastCover}, {readyProperty, 0}});
            TRY_COMPARE(info.kivId(), lastCover);
        }
    });
    daemon.sendChanges({{idProperty, cover}, {readyProperty, 1}});
    TRY_COMPARE(info.report(), "last not ready: 2 0"_s);
}

void TestKivInfo::followsADaemonThatStartsLater()
{
    const CountingKivInfo info;
    TRY(isSettled(info));
    // The text of the bus's error is not an identifier.
    QCOMPARE(info.report(), " not ready: 0 0"_s);
    {
        CoverDaemon daemon;
        daemon.sendChanges({{idProperty, cover}, {readyProperty, 1}});
        TRY_COMPARE(info.report(), "cover-7 ready: 1 1"_s);
        // The properties are not requested again.
        QVERIFY(daemon.calls().isEmpty());
    }
    // The values stay when the daemon is gone, and signals of a new daemon change them.
    CoverDaemon daemon;
    QCOMPARE(info.report(), "cover-7 ready: 1 1"_s);
    sendLast(daemon);
    TRY_COMPARE(info.report(), "last ready: 2 1"_s);
}

QTEST_GUILESS_MAIN(TestKivInfo)

#include "tst_kivinfo.moc"
