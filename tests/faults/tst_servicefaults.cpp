// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The types that speak to a D-Bus service, while that service is stopped, dies or floods them.

#include "deviceinfo/kivinfo.h"
#include "files.h"
#include "memorycard/memorycardformatter.h"
#include "messagelog.h"
#include "quickactions/quickactionsmodel.h"
#include "simulator/serviceprocess.h"

#include <QDBusPendingCallWatcher>
#include <QPointer>
#include <QRegularExpression>
#include <QtTest>

#include <memory>

using Formatter = MemoryCardFormatter;

class TestServiceFaults : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void coverDaemonHangs();
    void coverDaemonDiesBeforeItReplies();
    void coverDaemonFloods();
    void goesWhileTheCoverDaemonFloods();

    void diskServiceHangs();
    void goesWhileTheDiskServiceHangs();
    void diskServiceRepliesWithOtherTypes();
    void diskServiceFloods();
    void diskServiceComesBack();

    void actionServiceHangs();
    void goesWhileTheActionServiceHangs();
    void actionServiceDiesBeforeItReplies();
    void actionServiceRepliesWithOtherTypes();
    void actionServiceFloods();
    void storeHangs();

private:
    QByteArray takeLog() { return m_log->takeReport().toUtf8(); }

    std::unique_ptr<MessageLog> m_log;
};

namespace {

constexpr int patience = 60000; // ms, of a machine that is very busy
constexpr int flood = 10000; // signals

const QString coverDaemon = QStringLiteral("com.marlo.kivd");
const QString diskService = QStringLiteral("org.freedesktop.UDisks2");
const QString actionService = QStringLiteral("org.example.lamp");
const QString store = QStringLiteral("com.marlo.marlostore");

const QString directory = QStringLiteral("/usr/share/glimmera/quickactions");
const QByteArray action = "remote-service=org.example.lamp\nremote-path=/lamp\n"
                          "remote-interface=org.example.Lamp\nremote-method=toggle\n"
                          "requires-package=lamp\n";

#define TRY(condition) QTRY_VERIFY_WITH_TIMEOUT(condition, patience)
#define TRY_COMPARE(actual, expected) QTRY_COMPARE_WITH_TIMEOUT(actual, expected, patience)

// Nothing that is there to come changes anything.
void letEverythingArrive()
{
    QTest::qWait(100);
}

// QtDBus says so when two changes of an owner overtake each other between its threads, as they do
// now and then where a service comes and goes as quickly as here. It goes by the later one.
const QString lateOwner =
    QStringLiteral("QDBusConnection: name '[^']*' had owner '[^']*' but we thought it was");

bool isSettled(const KivInfo &info)
{
    return info.findChildren<QDBusPendingCallWatcher *>().isEmpty();
}

std::unique_ptr<QuickActionsModel> loadedModel()
{
    auto model = std::make_unique<QuickActionsModel>();
    model->setShowPotential(true);
    model->componentComplete();
    return model;
}

} // namespace

void TestServiceFaults::init()
{
    Files::remove(directory);
    Files::write(directory + QStringLiteral("/lamp.conf"), action);
    m_log = std::make_unique<MessageLog>();
}

void TestServiceFaults::cleanup()
{
    QCOMPARE(m_log->takeLinesWithout(QRegularExpression(lateOwner)), QStringList());
    m_log.reset();
}

void TestServiceFaults::coverDaemonHangs()
{
    ServiceProcess daemon("system", coverDaemon, "replies");
    daemon.stop();
    const KivInfo info;
    // One that goes meanwhile, before and after its calls have left.
    auto another = std::make_unique<KivInfo>();
    delete new KivInfo;
    letEverythingArrive();
    another.reset();
    QCOMPARE(info.kivId(), QString());
    QVERIFY(!info.kivReady());
    QVERIFY(!isSettled(info));

    daemon.goOn();
    TRY_COMPARE(info.kivId(), QStringLiteral("cover-0"));
    TRY(info.kivReady());
    QVERIFY(!daemon.calls().contains(QStringLiteral("Introspect")));
}

void TestServiceFaults::coverDaemonDiesBeforeItReplies()
{
    std::unique_ptr<KivInfo> info;
    {
        ServiceProcess daemon("system", coverDaemon, "gone");
        info = std::make_unique<KivInfo>();
        TRY(isSettled(*info));
        TRY_COMPARE(daemon.calls().size(), 1);
    }
    QCOMPARE(info->kivId(), QString());
    QVERIFY(!info->kivReady());

    // The next one is followed.
    ServiceProcess daemon("system", coverDaemon, "replies");
    daemon.sendSignals(1);
    TRY_COMPARE(info->kivId(), QStringLiteral("cover-1"));
    QVERIFY(info->kivReady());
}

void TestServiceFaults::coverDaemonFloods()
{
    ServiceProcess daemon("system", coverDaemon, "replies");
    const KivInfo info;
    TRY(isSettled(info));
    const QSignalSpy changed(&info, &KivInfo::kivIdChanged);
    daemon.sendSignals(flood);
    TRY_COMPARE(info.kivId(), QStringLiteral("cover-%1").arg(flood));
    QVERIFY(info.kivReady());
    QCOMPARE(changed.count(), flood);
}

void TestServiceFaults::goesWhileTheCoverDaemonFloods()
{
    ServiceProcess daemon("system", coverDaemon, "replies");
    const KivInfo last;
    const QPointer<KivInfo> info = new KivInfo;
    TRY(isSettled(*info));
    connect(info, &KivInfo::kivIdChanged, info, [&info] {
        if (info->kivId() == QLatin1String("cover-100")) {
            info->deleteLater();
        }
    });
    daemon.sendSignals(flood);
    TRY_COMPARE(last.kivId(), QStringLiteral("cover-%1").arg(flood));
    QVERIFY(info == nullptr);
}

void TestServiceFaults::diskServiceHangs()
{
    ServiceProcess service("system", diskService, "replies");
    service.stop();
    Formatter formatter;
    formatter.setDeviceName(QStringLiteral("testcard1"));
    formatter.mount();
    formatter.unmount();
    letEverythingArrive();
    QCOMPARE(formatter.status(), Formatter::Idle);
    QVERIFY(!formatter.busy());

    const QSignalSpy changed(&formatter, &Formatter::statusChanged);
    service.goOn();
    // Mounting, then Unmounting at once, then Idle.
    TRY_COMPARE(service.calls(), (QStringList{QStringLiteral("Mount"), QStringLiteral("Unmount")}));
    TRY_COMPARE(changed.count(), 3);
    QCOMPARE(formatter.status(), Formatter::Idle);
}

void TestServiceFaults::goesWhileTheDiskServiceHangs()
{
    ServiceProcess service("system", diskService, "replies");
    service.stop();
    auto formatter = std::make_unique<Formatter>();
    formatter->setDeviceName(QStringLiteral("testcard1"));
    formatter->mount();
    formatter->unmount();
    letEverythingArrive();
    formatter.reset();
    service.goOn();
    TRY_COMPARE(service.calls(), QStringList{QStringLiteral("Mount")});
    letEverythingArrive();
    QCOMPARE(service.calls(), QStringList{QStringLiteral("Mount")});
}

void TestServiceFaults::diskServiceRepliesWithOtherTypes()
{
    ServiceProcess service("system", diskService, "other-types");
    Formatter formatter;
    formatter.setDeviceName(QStringLiteral("testcard1"));
    const QSignalSpy changed(&formatter, &Formatter::statusChanged);
    // Any reply means success, whatever arguments it has.
    formatter.mount();
    TRY_COMPARE(changed.count(), 2);
    formatter.unmount();
    TRY_COMPARE(changed.count(), 4);
    QCOMPARE(formatter.status(), Formatter::Idle);
}

void TestServiceFaults::diskServiceFloods()
{
    ServiceProcess service("system", diskService, "replies");
    Formatter formatter;
    formatter.setDeviceName(QStringLiteral("testcard1"));
    const QSignalSpy changed(&formatter, &Formatter::statusChanged);
    service.sendSignals(flood);
    formatter.mount();
    TRY_COMPARE(changed.count(), 2);
    QCOMPARE(formatter.status(), Formatter::Idle);
}

void TestServiceFaults::diskServiceComesBack()
{
    Formatter formatter;
    formatter.setDeviceName(QStringLiteral("testcard1"));
    for (const char *scenario : {"gone", "error"}) {
        ServiceProcess service("system", diskService, scenario);
        formatter.mount();
        TRY_COMPARE(service.calls(), QStringList{QStringLiteral("Mount")});
        TRY_COMPARE(formatter.status(), Formatter::Error);
        const QByteArray log = takeLog();
        QVERIFY2(log.startsWith("warning [org.tarnwickos.settings.memorycard] \"Mount\" error: "),
                 log.constData());
    }
    ServiceProcess service("system", diskService, "replies");
    const QSignalSpy changed(&formatter, &Formatter::statusChanged);
    formatter.mount();
    TRY_COMPARE(changed.count(), 2);
    QCOMPARE(formatter.status(), Formatter::Idle);
}

void TestServiceFaults::actionServiceHangs()
{
    ServiceProcess service("session", actionService, "replies");
    service.stop();
    const auto model = loadedModel();
    model->triggerAction(0);
    model->triggerAction(0);
    letEverythingArrive();
    QCOMPARE(model->count(), 1);
    service.goOn();
    TRY_COMPARE(service.calls(), (QStringList{QStringLiteral("toggle"), QStringLiteral("toggle")}));
}

void TestServiceFaults::goesWhileTheActionServiceHangs()
{
    ServiceProcess service("session", actionService, "error");
    service.stop();
    auto model = loadedModel();
    model->triggerAction(0);
    letEverythingArrive();
    model.reset();
    service.goOn();
    // The service still receives the call. Its reply is discarded.
    TRY_COMPARE(service.calls(), QStringList{QStringLiteral("toggle")});
    letEverythingArrive();
}

void TestServiceFaults::actionServiceDiesBeforeItReplies()
{
    const auto model = loadedModel();
    {
        ServiceProcess service("session", actionService, "gone");
        model->triggerAction(0);
        TRY_COMPARE(service.calls(), QStringList{QStringLiteral("toggle")});
        letEverythingArrive();
    }
    // The bus says what it says of a service that does not answer in time: no message.
    ServiceProcess service("session", actionService, "replies");
    model->triggerAction(0);
    TRY_COMPARE(service.calls(), QStringList{QStringLiteral("toggle")});
}

void TestServiceFaults::actionServiceRepliesWithOtherTypes()
{
    ServiceProcess service("session", actionService, "other-types");
    const auto model = loadedModel();
    model->triggerAction(0);
    TRY_COMPARE(service.calls(), QStringList{QStringLiteral("toggle")});
    letEverythingArrive();
    QCOMPARE(model->count(), 1);
}

void TestServiceFaults::actionServiceFloods()
{
    ServiceProcess service("session", actionService, "replies");
    const auto model = loadedModel();
    service.sendSignals(flood);
    model->triggerAction(0);
    TRY_COMPARE(service.calls(), QStringList{QStringLiteral("toggle")});
    letEverythingArrive();
    QCOMPARE(model->count(), 1);
}

void TestServiceFaults::storeHangs()
{
    ServiceProcess service("session", store, "replies");
    service.stop();
    auto model = loadedModel();
    model->triggerAction(0);
    QByteArray log;
    TRY((log += takeLog()).contains("org.freedesktop.DBus.Error.ServiceUnknown"));
    letEverythingArrive();
    model.reset();
    service.goOn();
    TRY_COMPARE(service.calls(), QStringList{QStringLiteral("showApp")});
}

QTEST_GUILESS_MAIN(TestServiceFaults)

#include "tst_servicefaults.moc"
