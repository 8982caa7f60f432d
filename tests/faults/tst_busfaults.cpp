// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Tests every type in a process whose buses are missing or die.

#include "everytype.h"
#include "messagelog.h"
#include "ownprocess.h"
#include "patience.h"
#include "simulator/serviceprocess.h"
#include "texts.h"

#include <QDBusConnection>
#include <QProcess>
#include <QtTest>

class TestBusFaults : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();

    void everyTypeWithoutABus();
    void everyTypeOutlivesItsBuses();
    void busesDieBeforeServicesReply();
    void everyTypeGoesWhenItsBusesHaveDied();
};

namespace {

const char *const addresses[] = {"DBUS_SESSION_BUS_ADDRESS", "DBUS_SYSTEM_BUS_ADDRESS"};

// The session bus and the system bus of this process, which must not be connected to any bus yet.
class Buses
{
public:
    Buses()
    {
        for (size_t i = 0; i < 2; ++i) {
            m_daemons[i].start("dbus-daemon"_s,
                               {"--session"_s, "--nofork"_s, "--print-address"_s,
                                "--address=unix:dir="_s + qEnvironmentVariable("XDG_RUNTIME_DIR")});
            if (!m_daemons[i].waitForReadyRead()) {
                qFatal("no bus daemon");
            }
            qputenv(addresses[i], m_daemons[i].readLine().trimmed());
        }
    }
    ~Buses() { kill(); }
    Q_DISABLE_COPY_MOVE(Buses)

    void kill()
    {
        for (QProcess &daemon : m_daemons) {
            daemon.kill();
            daemon.waitForFinished();
        }
    }
    static bool areGone()
    {
        return !QDBusConnection::sessionBus().isConnected()
            && !QDBusConnection::systemBus().isConnected();
    }

private:
    QProcess m_daemons[2];
};

// Values that need no service.
const QStringList someFacts = {
    "AndroidSupport.dataDirectoriesVisible QVariant(bool, true)"_s,
    "BluetoothInfo.adapterAddress QVariant(QString, \"00:1a:7d:da:71:13\")"_s,
    "EventsWidgetsModel.path QVariant(QString, \"weather\")"_s,
    "KivInfo.kivId QVariant(QString, \"\")"_s,
    "KivInfo.kivReady QVariant(bool, false)"_s,
    "LocationConfiguration.gpsEnabled QVariant(bool, false)"_s,
    "LocationConfiguration.hereAgreementText QVariant(QString, \"here\")"_s,
    "MemoryCardFormatter.busy QVariant(bool, false)"_s,
    "ModemFeatures.variant QVariant(QString, \"europe\")"_s,
    "QuickActionsModel.count QVariant(int, 1)"_s,
    "TermsOfUseManager.vendorTermsSummary QVariant(QStringList, "
    "(\"Summary\", \"of the terms\"))"_s,
    "TextFileReader.collate QVariant(QString, \"text\")"_s,
    "TitlesView.value QVariant(QString, \"Weather\")"_s,
};

QStringList missing(const QStringList &facts, const QStringList &state)
{
    QStringList lines;
    for (const QString &fact : facts) {
        if (!state.contains(fact)) {
            lines.append(fact);
        }
    }
    return lines;
}

// Whether the formatter has finished everything that useAll() requested.
bool isIdle(const EveryType &types)
{
    return !types.object("MemoryCardFormatter"_s)->property("busy").toBool();
}

} // namespace

void TestBusFaults::initTestCase()
{
    EveryType::installFiles();
    QLocale::setDefault(QLocale("en_GB"_s));
}

void TestBusFaults::everyTypeWithoutABus()
{
    IN_A_PROCESS_OF_ITS_OWN()
    for (const char *address : addresses) {
        qputenv(address, "unix:path=/nonexistent");
    }
    const EveryType types;
    QTest::qWait(100);
    QCOMPARE(missing(someFacts, types.state()), QStringList());
    const QStringList before = types.stateOfFiles();
    types.useAll();
    TRY(isIdle(types));
    QVERIFY(Buses::areGone());
    // useAll() has set another path of the vendor's terms.
    QCOMPARE(missing(before, types.stateOfFiles())
                 .filter(QRegularExpression("^(?!TermsOfUseManager)"_s)),
             QStringList());
}

void TestBusFaults::everyTypeOutlivesItsBuses()
{
    IN_A_PROCESS_OF_ITS_OWN()
    Buses buses;
    const EveryType types;
    QTest::qWait(100);
    QVERIFY(!Buses::areGone());
    const QStringList before = types.state();
    QCOMPARE(missing(someFacts, before), QStringList());

    buses.kill();
    TRY(Buses::areGone());
    QTest::qWait(100);
    QCOMPARE(types.state(), before);
    types.useAll();
    TRY(isIdle(types));

    // New objects work without their buses, too.
    const EveryType others;
    QTest::qWait(100);
    QCOMPARE(missing(someFacts, others.state()), QStringList());
}

void TestBusFaults::busesDieBeforeServicesReply()
{
    IN_A_PROCESS_OF_ITS_OWN()
    Buses buses;
    ServiceProcess cover("system", "com.marlo.kivd"_s, "replies");
    ServiceProcess disk("system", "org.freedesktop.UDisks2"_s, "replies");
    ServiceProcess lamp("session", "org.example.lamp"_s, "replies");
    for (ServiceProcess *service : {&cover, &disk, &lamp}) {
        service->stop();
    }
    const EveryType types;
    QObject *formatter = types.object("MemoryCardFormatter"_s);
    formatter->setProperty("deviceName", "card"_s);
    QMetaObject::invokeMethod(formatter, "mount");
    QMetaObject::invokeMethod(types.object("QuickActionsModel"_s), "triggerAction", Q_ARG(int, 0));
    QTest::qWait(100);
    const QStringList before = types.state("KivInfo"_s);

    const MessageLog log;
    buses.kill();
    TRY_COMPARE(formatter->property("status").toInt(), 6); // Error
    QVERIFY(Buses::areGone());
    QCOMPARE(types.state("KivInfo"_s), before);
    for (ServiceProcess *service : {&cover, &disk, &lamp}) {
        service->goOn();
    }
    QMetaObject::invokeMethod(formatter, "mount");
    TRY_COMPARE(formatter->property("status").toInt(), 6);
}

void TestBusFaults::everyTypeGoesWhenItsBusesHaveDied()
{
    IN_A_PROCESS_OF_ITS_OWN()
    Buses buses;
    auto types = std::make_unique<EveryType>();
    auto others = std::make_unique<EveryType>();
    types->useAll();
    buses.kill();
    // Destroys some objects before Qt notices that the buses are gone, and the others afterwards.
    types.reset();
    TRY(Buses::areGone());
    others.reset();
    QTest::qWait(100);
}

QTEST_GUILESS_MAIN(TestBusFaults)

#include "tst_busfaults.moc"
