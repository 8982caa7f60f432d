// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Tests the types that use a D-Bus service, while that service is stopped, dies or floods them.

#include "deviceinfo/kivinfo.h"
#include "files.h"
#include "formattertest.h"
#include "places.h"
#include "quickactions/quickactionsmodel.h"
#include "simulator/serviceprocess.h"
#include "texts.h"
#include "words.h"

#include <QDBusPendingCallWatcher>
#include <QPointer>
#include <QRegularExpression>
#include <QtTest>

class TestServiceFaults : public FormatterTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void coverDaemonHangs();
    void coverDaemonDiesBeforeItReplies();
    void coverDaemonFloods();

    void diskServiceHangs();
    void goesWhileTheDiskServiceHangs();
    void diskServiceSendsOtherThings_data();
    void diskServiceSendsOtherThings();
    void diskServiceComesBack();

    void actionServiceHangs();
    void goesWhileTheActionServiceHangs();
    void actionServiceSendsOtherThings_data();
    void actionServiceSendsOtherThings();
    void storeHangs();

private:
    // Each of these functions replaces the service of the test.
    void start(const char *bus, const char *name, const char *scenario);
    void startCoverDaemon(const char *scenario) { start("system", "com.marlo.kivd", scenario); }
    void startDiskService(const char *scenario)
    {
        start("system", "org.freedesktop.UDisks2", scenario);
        forgetEvents();
    }
    void startActionService(const char *scenario)
    {
        start("session", "org.example.lamp", scenario);
    }
    static void addScenarios();

    std::unique_ptr<ServiceProcess> m_service;
    std::unique_ptr<QuickActionsModel> m_model;
};

namespace {

constexpr int flood = 10000; // signals

const QByteArray action = "remote-service=org.example.lamp\nremote-path=/lamp\n"
                          "remote-interface=org.example.Lamp\nremote-method=toggle\n"
                          "requires-package=lamp\n";

// QtDBus logs this when two changes of an owner overtake each other between its threads, as they
// sometimes do when a service starts and stops as quickly as here. It then uses the later one.
const QString lateOwner = "QDBusConnection: name '[^']*' had owner '[^']*' but we thought it was"_s;

// Shows that nothing more changes.
void letEverythingArrive()
{
    QTest::qWait(100);
}

bool isSettled(const KivInfo &info)
{
    return info.findChildren<QDBusPendingCallWatcher *>().isEmpty();
}

} // namespace

void TestServiceFaults::init()
{
    FormatterTest::init();
    Files::remove(Places::quickActions);
    Files::write(Places::quickActions + "/lamp.conf"_s, action);
    m_model = std::make_unique<QuickActionsModel>();
    m_model->setShowPotential(true);
    m_model->componentComplete();
    makeFormatter();
    m_formatter->setDeviceName("testcard1"_s);
}

void TestServiceFaults::cleanup()
{
    m_formatter.reset();
    m_model.reset();
    m_service.reset();
    QCOMPARE(m_log->takeLinesWithout(QRegularExpression(lateOwner)), QStringList());
    FormatterTest::cleanup();
}

void TestServiceFaults::start(const char *bus, const char *name, const char *scenario)
{
    m_service.reset();
    m_service = std::make_unique<ServiceProcess>(bus, QString::fromLatin1(name), scenario);
}

void TestServiceFaults::addScenarios()
{
    QTest::addColumn<QByteArray>("scenario");
    QTest::addColumn<int>("signalCount");
    QTest::newRow("replies of other types") << QByteArray("other-types") << 0;
    QTest::newRow("many signals") << QByteArray("replies") << flood;
}

void TestServiceFaults::coverDaemonHangs()
{
    startCoverDaemon("replies");
    m_service->stop();
    const KivInfo info;
    // One is destroyed before its calls have been sent, and another after that.
    auto another = std::make_unique<KivInfo>();
    delete new KivInfo;
    letEverythingArrive();
    another.reset();
    QCOMPARE(info.kivId(), QString());
    QVERIFY(!info.kivReady());
    QVERIFY(!isSettled(info));

    m_service->goOn();
    TRY_COMPARE(info.kivId(), "cover-0"_s);
    TRY(info.kivReady());
    QVERIFY(!m_service->calls().contains("Introspect"_s));
}

void TestServiceFaults::coverDaemonDiesBeforeItReplies()
{
    startCoverDaemon("gone");
    const KivInfo info;
    TRY(isSettled(info));
    TRY_COMPARE(m_service->calls().size(), 1);
    QCOMPARE(info.kivId(), QString());
    QVERIFY(!info.kivReady());

    // The object follows the next daemon.
    startCoverDaemon("replies");
    m_service->sendSignals(1);
    TRY_COMPARE(info.kivId(), "cover-1"_s);
    QVERIFY(info.kivReady());
}

void TestServiceFaults::coverDaemonFloods()
{
    startCoverDaemon("replies");
    const KivInfo info;
    TRY(isSettled(info));
    const QSignalSpy changed(&info, &KivInfo::kivIdChanged);
    // This object is destroyed while signals arrive.
    const QPointer<KivInfo> another = new KivInfo;
    TRY(isSettled(*another));
    connect(another, &KivInfo::kivIdChanged, another, [&another] {
        if (another->kivId() == QLatin1String("cover-100")) {
            another->deleteLater();
        }
    });
    m_service->sendSignals(flood);
    TRY_COMPARE(info.kivId(), "cover-%1"_s.arg(flood));
    QVERIFY(info.kivReady());
    QCOMPARE(changed.count(), flood);
    QVERIFY(another == nullptr);
}

void TestServiceFaults::diskServiceHangs()
{
    startDiskService("replies");
    m_service->stop();
    m_formatter->mount();
    m_formatter->unmount();
    letEverythingArrive();
    QCOMPARE(events(), QByteArray("not busy, not busy"));

    m_service->goOn();
    TRY_COMPARE(m_service->calls(), words("Mount Unmount"));
    TRY_EVENTS("not busy, not busy, Mounting, busy, Unmounting, Idle, not busy");
}

void TestServiceFaults::goesWhileTheDiskServiceHangs()
{
    startDiskService("replies");
    m_service->stop();
    m_formatter->mount();
    m_formatter->unmount();
    letEverythingArrive();
    m_formatter.reset();
    m_service->goOn();
    TRY_COMPARE(m_service->calls(), words("Mount"));
    letEverythingArrive();
    QCOMPARE(m_service->calls(), words("Mount"));
}

void TestServiceFaults::diskServiceSendsOtherThings_data()
{
    addScenarios();
}

void TestServiceFaults::diskServiceSendsOtherThings()
{
    QFETCH(QByteArray, scenario);
    QFETCH(int, signalCount);
    startDiskService(scenario.constData());
    m_service->sendSignals(signalCount);
    // Any reply means success, whatever arguments it has.
    m_formatter->mount();
    TRY_EVENTS("not busy, Mounting, busy, Idle, not busy");
    forgetEvents()->unmount();
    TRY_EVENTS("not busy, Unmounting, busy, Idle, not busy");
}

void TestServiceFaults::diskServiceComesBack()
{
    for (const char *scenario : {"gone", "error"}) {
        startDiskService(scenario);
        m_formatter->mount();
        TRY_COMPARE(m_service->calls(), words("Mount"));
        QByteArray log;
        TRY(!(log += takeLog()).isEmpty());
        QVERIFY2(log.startsWith(warning("\"Mount\" error: ")), log.constData());
        QCOMPARE(m_formatter->status(), Formatter::Error);
    }
    startDiskService("replies");
    m_formatter->mount();
    TRY_EVENTS("not busy, Mounting, busy, Idle, not busy");
}

void TestServiceFaults::actionServiceHangs()
{
    startActionService("replies");
    m_service->stop();
    m_model->triggerAction(0);
    m_model->triggerAction(0);
    letEverythingArrive();
    QCOMPARE(m_model->count(), 1);
    m_service->goOn();
    TRY_COMPARE(m_service->calls(), words("toggle toggle"));
}

void TestServiceFaults::goesWhileTheActionServiceHangs()
{
    startActionService("error");
    m_service->stop();
    m_model->triggerAction(0);
    letEverythingArrive();
    m_model.reset();
    m_service->goOn();
    // The service still receives the call. Its reply is discarded.
    TRY_COMPARE(m_service->calls(), words("toggle"));
    letEverythingArrive();
}

void TestServiceFaults::actionServiceSendsOtherThings_data()
{
    addScenarios();
    // The bus sends the same error as for a timeout, so no message is logged.
    QTest::newRow("no reply") << QByteArray("gone") << 0;
}

void TestServiceFaults::actionServiceSendsOtherThings()
{
    QFETCH(QByteArray, scenario);
    QFETCH(int, signalCount);
    startActionService(scenario.constData());
    m_service->sendSignals(signalCount);
    m_model->triggerAction(0);
    TRY_COMPARE(m_service->calls(), words("toggle"));
    letEverythingArrive();
    QCOMPARE(m_model->count(), 1);

    startActionService("replies");
    m_model->triggerAction(0);
    TRY_COMPARE(m_service->calls(), words("toggle"));
}

void TestServiceFaults::storeHangs()
{
    start("session", "com.marlo.marlostore", "replies");
    m_service->stop();
    m_model->triggerAction(0);
    QByteArray log;
    TRY((log += takeLog()).contains("org.freedesktop.DBus.Error.ServiceUnknown"));
    letEverythingArrive();
    m_model.reset();
    m_service->goOn();
    TRY_COMPARE(m_service->calls(), words("showApp"));
}

QTEST_GUILESS_MAIN(TestServiceFaults)

#include "tst_servicefaults.moc"
