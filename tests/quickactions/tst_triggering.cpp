// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// A tap: the call, its errors, and the call to the store.

#include "files.h"
#include "messagelog.h"
#include "mgconfitem.h"
#include "quickactions/quickactionsmodel.h"
#include "simulator/recordingservice.h"

#include <QtTest>

using Answer = RecordingService::Answer;

class TestTriggering : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void callsTheService();
    void callsWithoutPathOrInterface();
    void invalidIndex();
    void missingServiceLeadsToTheStore();
    void missingServiceWithoutPackage();
    void secondRowNamesThePackage();
    void otherCallsNameNoPackage_data();
    void otherCallsNameNoPackage();
    void missingStore();
    void otherErrors();
    void noReplyIsSilent();
    void errorTextsMayLookLikePlaceholders();
    void invalidNamesAreReported();
    void modelIsGoneBeforeTheError();
    void actionIsGoneBeforeTheError();

private:
    static void add(const char *name, const QByteArray &content);
    // All messages of the test function that is running.
    QStringList messages();

    std::unique_ptr<MessageLog> m_log;
    QStringList m_messages;
    // What the test has to see.
    QStringList m_expected;
    std::unique_ptr<QuickActionsModel> m_model;
};

namespace {

const QString directory = QStringLiteral("/usr/share/glimmera/quickactions");
const QString lampName = QStringLiteral("org.example.lamp");
const QString storeName = QStringLiteral("com.marlo.marlostore");

const QByteArray call = "remote-service=org.example.lamp\n"
                        "remote-path=/lamp\n"
                        "remote-interface=org.example.Lamp\n"
                        "remote-method=toggle\n";

QString failure(const QString &error)
{
    return QStringLiteral("info [default] <Unknown File>: QML QuickActionsModel: Failed to send "
                          "dbus call to: service=org.example.lamp path=/lamp "
                          "interface=org.example.Lamp method=toggle. Error was: ")
        + error;
}

const QString serviceUnknown =
    QStringLiteral("org.freedesktop.DBus.Error.ServiceUnknown "
                   "The name org.example.lamp was not provided by any .service files");

// For what must not come: longer than any answer takes.
constexpr int longEnough = 200;

} // namespace

void TestTriggering::add(const char *name, const QByteArray &content)
{
    Files::write(directory + QStringLiteral("/%1.conf").arg(QString::fromLatin1(name)), content);
}

QStringList TestTriggering::messages()
{
    m_messages += m_log->takeReport().split(QLatin1Char('\n'), Qt::SkipEmptyParts);
    return m_messages;
}

void TestTriggering::init()
{
    Files::remove(directory);
    Files::makeDirectory(directory);
    MGConfItem(QStringLiteral("/desktop/glimmera-marlo-home/events_screen_actions")).unset();
    m_log = std::make_unique<MessageLog>();
    m_model = std::make_unique<QuickActionsModel>();
    m_model->setShowPotential(true);
    m_messages.clear();
    m_expected.clear();
}

void TestTriggering::cleanup()
{
    m_model.reset();
    QCOMPARE(messages(), m_expected);
    m_log.reset();
}

void TestTriggering::callsTheService()
{
    RecordingService lamp(QDBusConnection::SessionBus, lampName);
    add("a", call);
    add("b", call + "[remote-arguments]\nsize=1\n1\\argument=bright\n");
    m_model->componentComplete();
    m_model->triggerAction(1);
    QTRY_COMPARE(lamp.calls().size(), 1);
    QCOMPARE(lamp.calls().constFirst().path(), QStringLiteral("/lamp"));
    QCOMPARE(lamp.calls().constFirst().member(), QStringLiteral("toggle"));
    QCOMPARE(lamp.calls().constFirst().arguments(), QVariantList{QStringLiteral("bright")});
}

void TestTriggering::callsWithoutPathOrInterface()
{
    // A call needs a path but no interface.
    RecordingService lamp(QDBusConnection::SessionBus, lampName);
    add("a", "remote-service=org.example.lamp\nremote-path=/lamp\nremote-method=toggle\n");
    add("b",
        "remote-service=org.example.lamp\nremote-interface=org.example.Lamp\n"
        "remote-method=toggle\n");
    m_model->componentComplete();
    m_model->triggerAction(0);
    QTRY_COMPARE(lamp.calls().size(), 1);
    QCOMPARE(lamp.calls().constFirst().interface(), QString());
    QCOMPARE(lamp.calls().constFirst().member(), QStringLiteral("toggle"));

    m_model->triggerAction(1);
    // Qt logs a message too.
    QTRY_COMPARE(messages().size(), 2);
    m_expected = messages();
    QCOMPARE(m_expected.last(),
             QStringLiteral("info [default] <Unknown File>: QML QuickActionsModel: Failed to send "
                            "dbus call to: service=org.example.lamp path= "
                            "interface=org.example.Lamp method=toggle. Error was: "
                            "org.qtproject.QtDBus.Error.InvalidObjectPath "
                            "Object path cannot be empty"));
    QCOMPARE(lamp.calls().size(), 1);
}

void TestTriggering::invalidIndex()
{
    RecordingService lamp(QDBusConnection::SessionBus, lampName);
    add("a", call);
    m_model->componentComplete();
    for (const int index : {-1, 1}) {
        m_model->triggerAction(index);
        m_expected += QStringLiteral("info [default] <Unknown File>: QML QuickActionsModel: "
                                     "triggerAction() called with invalid index: %1")
                          .arg(index);
        QCOMPARE(messages(), m_expected);
    }
    QTest::qWait(longEnough);
    QCOMPARE(lamp.calls().size(), 0);
}

void TestTriggering::missingServiceLeadsToTheStore()
{
    RecordingService store(QDBusConnection::SessionBus, storeName);
    QStringList messagesBefore;
    connect(&store, &RecordingService::called, this, [&] { messagesBefore = messages(); });
    add("a", call + "requires-package=lamp-daemon\n");
    m_model->componentComplete();
    m_model->triggerAction(0);
    QTRY_COMPARE(store.calls().size(), 1);
    const QDBusMessage show = store.calls().constFirst();
    QCOMPARE(show.path(), QStringLiteral("/StoreClient"));
    QCOMPARE(show.interface(), QStringLiteral("com.marlo.marlostore"));
    QCOMPARE(show.member(), QStringLiteral("showApp"));
    QCOMPARE(show.signature(), QStringLiteral("s"));
    QCOMPARE(show.arguments(), QVariantList{QStringLiteral("lamp-daemon")});
    m_expected = QStringList(failure(serviceUnknown));
    QCOMPARE(messagesBefore, m_expected);

    // A second tap asks the store again.
    m_model->triggerAction(0);
    QTRY_COMPARE(store.calls().size(), 2);
    m_expected += m_expected;
}

void TestTriggering::missingServiceWithoutPackage()
{
    RecordingService store(QDBusConnection::SessionBus, storeName);
    add("a", call);
    m_model->componentComplete();
    m_model->triggerAction(0);
    m_expected = QStringList(failure(serviceUnknown));
    QTRY_COMPARE(messages(), m_expected);
    QTest::qWait(longEnough);
    QCOMPARE(store.calls().size(), 0);
}

void TestTriggering::secondRowNamesThePackage()
{
    RecordingService store(QDBusConnection::SessionBus, storeName);
    add("a", call);
    add("b", call + "requires-package=lamp-daemon\n");
    add("c", call + "requires-package=another\n");
    m_model->componentComplete();
    m_model->triggerAction(0);
    QTRY_COMPARE(store.calls().size(), 1);
    QTest::qWait(longEnough);
    QCOMPARE(store.calls().size(), 1);
    QCOMPARE(store.calls().constFirst().arguments(), QVariantList{QStringLiteral("lamp-daemon")});
    m_expected = QStringList(failure(serviceUnknown));
}

void TestTriggering::otherCallsNameNoPackage_data()
{
    QTest::addColumn<QByteArray>("other");
    for (const char *line : {"remote-service=org.example.other", "remote-path=/other",
                             "remote-interface=org.example.Other", "remote-method=other"}) {
        QTest::newRow(line) << QByteArray(line) + '\n';
    }
}

void TestTriggering::otherCallsNameNoPackage()
{
    QFETCH(QByteArray, other);
    RecordingService store(QDBusConnection::SessionBus, storeName);
    add("a", call);
    add("b", call + other + "requires-package=lamp-daemon\n");
    m_model->componentComplete();
    m_model->triggerAction(0);
    m_expected = QStringList(failure(serviceUnknown));
    QTRY_COMPARE(messages(), m_expected);
    QTest::qWait(longEnough);
    QCOMPARE(store.calls().size(), 0);
}

void TestTriggering::missingStore()
{
    add("a", call + "requires-package=lamp-daemon\n");
    m_model->componentComplete();
    m_model->triggerAction(0);
    // Nobody waits for the store, so nobody learns that it is missing.
    m_expected = QStringList(failure(serviceUnknown));
    QTRY_COMPARE(messages(), m_expected);
    QTest::qWait(longEnough);
}

void TestTriggering::otherErrors()
{
    RecordingService store(QDBusConnection::SessionBus, storeName);
    RecordingService lamp(QDBusConnection::SessionBus, lampName);
    lamp.setAnswer(Answer::Error, QStringLiteral("org.freedesktop.DBus.Error.UnknownMethod"));
    add("a", call + "requires-package=lamp-daemon\n");
    m_model->componentComplete();
    m_model->triggerAction(0);
    m_expected =
        QStringList(failure(QStringLiteral("org.freedesktop.DBus.Error.UnknownMethod as told")));
    QTRY_COMPARE(messages(), m_expected);
    QTest::qWait(longEnough);
    QCOMPARE(store.calls().size(), 0);
}

void TestTriggering::noReplyIsSilent()
{
    RecordingService store(QDBusConnection::SessionBus, storeName);
    RecordingService lamp(QDBusConnection::SessionBus, lampName);
    lamp.setAnswer(Answer::Error, QStringLiteral("org.freedesktop.DBus.Error.NoReply"));
    add("a", call + "requires-package=lamp-daemon\n");
    m_model->componentComplete();
    m_model->triggerAction(0);
    QTRY_COMPARE(lamp.calls().size(), 1);
    QTest::qWait(longEnough);
    QCOMPARE(store.calls().size(), 0);
}

void TestTriggering::errorTextsMayLookLikePlaceholders()
{
    RecordingService lamp(QDBusConnection::SessionBus, lampName);
    lamp.setAnswer(Answer::Error, QStringLiteral("org.example.Error"), QStringLiteral("%1 %7"));
    add("a", call);
    m_model->componentComplete();
    m_model->triggerAction(0);
    m_expected = QStringList(failure(QStringLiteral("org.example.Error %1 %7")));
    QTRY_COMPARE(messages(), m_expected);
}

void TestTriggering::invalidNamesAreReported()
{
    // Names that no message can carry: the error comes back like that of a call that was sent.
    RecordingService store(QDBusConnection::SessionBus, storeName);
    add("a",
        "remote-service=org.example.lamp\nremote-path=no path\n"
        "remote-interface=%1\nremote-method=%2\nrequires-package=p\n");
    m_model->componentComplete();
    m_model->triggerAction(0);
    // Qt logs a message too.
    QTRY_COMPARE(messages().size(), 2);
    m_expected = messages();
    const QString text = m_expected.last();
    QVERIFY2(text.startsWith(QStringLiteral(
                 "info [default] <Unknown File>: QML QuickActionsModel: Failed to send dbus call "
                 "to: service=org.example.lamp path=no path interface=%1 method=%2. Error was: "
                 "org.qtproject.QtDBus.Error.Invalid")),
             qPrintable(text));
    QTest::qWait(longEnough);
    QCOMPARE(store.calls().size(), 0);
}

void TestTriggering::modelIsGoneBeforeTheError()
{
    RecordingService store(QDBusConnection::SessionBus, storeName);
    add("a", call + "requires-package=lamp-daemon\n");
    m_model->componentComplete();
    m_model->triggerAction(0);
    m_model.reset();
    QTest::qWait(longEnough);
    QCOMPARE(store.calls().size(), 0);
}

void TestTriggering::actionIsGoneBeforeTheError()
{
    RecordingService store(QDBusConnection::SessionBus, storeName);
    add("a", call + "requires-package=lamp-daemon\n");
    m_model->componentComplete();
    m_model->triggerAction(0);
    m_model->setShowPotential(false);
    QCOMPARE(m_model->count(), 0);
    m_expected = QStringList(failure(serviceUnknown));
    QTRY_COMPARE(messages(), m_expected);
    QTest::qWait(longEnough);
    QCOMPARE(store.calls().size(), 0);
}

QTEST_GUILESS_MAIN(TestTriggering)

#include "tst_triggering.moc"
