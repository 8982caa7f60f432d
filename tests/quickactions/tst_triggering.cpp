// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// A tap: the call, its errors, and the call to the store.

#include "files.h"
#include "messagelog.h"
#include "mgconfitem.h"
#include "quickactions/quickactionsmodel.h"
#include "simulator/recordingservice.h"
#include "texts.h"

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
    void secondRowNamesThePackage();
    void asksNoStore_data();
    void asksNoStore();
    void missingStore();
    void errorTextsMayLookLikePlaceholders();
    void invalidNamesAreReported();
    void modelIsGoneBeforeTheError();
    void actionIsGoneBeforeTheError();

private:
    static void add(const char *name, const QByteArray &content);
    // Loads the model and triggers its first action.
    void tap();
    // All messages of the test function that is running.
    QStringList messages();

    std::unique_ptr<MessageLog> m_log;
    QStringList m_messages;
    // The messages that the test expects.
    QStringList m_expected;
    std::unique_ptr<QuickActionsModel> m_model;
};

namespace {

const QString directory = "/usr/share/glimmera/quickactions"_s;
const QString lampName = "org.example.lamp"_s;
const QString storeName = "com.marlo.marlostore"_s;

const QByteArray call = "remote-service=org.example.lamp\n"
                        "remote-path=/lamp\n"
                        "remote-interface=org.example.Lamp\n"
                        "remote-method=toggle\n";

QString failure(const QString &error)
{
    return "info [default] <Unknown File>: QML QuickActionsModel: Failed to send "
           "dbus call to: service=org.example.lamp path=/lamp "
           "interface=org.example.Lamp method=toggle. Error was: "_s
        + error;
}

const QString serviceUnknown = "org.freedesktop.DBus.Error.ServiceUnknown "
                               "The name org.example.lamp was not provided by any .service files"_s;

// How long to wait for something that must not happen: longer than any reply takes.
constexpr int longEnough = 200;

} // namespace

void TestTriggering::add(const char *name, const QByteArray &content)
{
    Files::write(directory + "/%1.conf"_s.arg(QString::fromLatin1(name)), content);
}

void TestTriggering::tap()
{
    m_model->componentComplete();
    m_model->triggerAction(0);
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
    MGConfItem("/desktop/glimmera-marlo-home/events_screen_actions"_s).unset();
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
    QCOMPARE(lamp.calls().constFirst().path(), "/lamp"_s);
    QCOMPARE(lamp.calls().constFirst().member(), "toggle"_s);
    QCOMPARE(lamp.calls().constFirst().arguments(), QVariantList{"bright"_s});
}

void TestTriggering::callsWithoutPathOrInterface()
{
    // A call needs a path but no interface.
    RecordingService lamp(QDBusConnection::SessionBus, lampName);
    add("a", "remote-service=org.example.lamp\nremote-path=/lamp\nremote-method=toggle\n");
    add("b",
        "remote-service=org.example.lamp\nremote-interface=org.example.Lamp\n"
        "remote-method=toggle\n");
    tap();
    QTRY_COMPARE(lamp.calls().size(), 1);
    QCOMPARE(lamp.calls().constFirst().interface(), QString());
    QCOMPARE(lamp.calls().constFirst().member(), "toggle"_s);

    m_model->triggerAction(1);
    // Qt logs a message too.
    QTRY_COMPARE(messages().size(), 2);
    m_expected = messages();
    QCOMPARE(m_expected.last(),
             "info [default] <Unknown File>: QML QuickActionsModel: Failed to send "
             "dbus call to: service=org.example.lamp path= "
             "interface=org.example.Lamp method=toggle. Error was: "
             "org.qtproject.QtDBus.Error.InvalidObjectPath "
             "Object path cannot be empty"_s);
    QCOMPARE(lamp.calls().size(), 1);
}

void TestTriggering::invalidIndex()
{
    RecordingService lamp(QDBusConnection::SessionBus, lampName);
    add("a", call);
    m_model->componentComplete();
    for (const int index : {-1, 1}) {
        m_model->triggerAction(index);
        m_expected += "info [default] <Unknown File>: QML QuickActionsModel: "
                      "triggerAction() called with invalid index: %1"_s.arg(index);
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
    tap();
    QTRY_COMPARE(store.calls().size(), 1);
    const QDBusMessage show = store.calls().constFirst();
    QCOMPARE(show.path(), "/StoreClient"_s);
    QCOMPARE(show.interface(), "com.marlo.marlostore"_s);
    QCOMPARE(show.member(), "showApp"_s);
    QCOMPARE(show.signature(), "s"_s);
    QCOMPARE(show.arguments(), QVariantList{"lamp-daemon"_s});
    m_expected = QStringList(failure(serviceUnknown));
    QCOMPARE(messagesBefore, m_expected);

    // A second tap calls the store again.
    m_model->triggerAction(0);
    QTRY_COMPARE(store.calls().size(), 2);
    m_expected += m_expected;
}

void TestTriggering::secondRowNamesThePackage()
{
    RecordingService store(QDBusConnection::SessionBus, storeName);
    add("a", call);
    add("b", call + "requires-package=lamp-daemon\n");
    add("c", call + "requires-package=another\n");
    tap();
    QTRY_COMPARE(store.calls().size(), 1);
    QTest::qWait(longEnough);
    QCOMPARE(store.calls().size(), 1);
    QCOMPARE(store.calls().constFirst().arguments(), QVariantList{"lamp-daemon"_s});
    m_expected = QStringList(failure(serviceUnknown));
}

void TestTriggering::asksNoStore_data()
{
    QTest::addColumn<QByteArray>("first");
    QTest::addColumn<QByteArray>("second");
    QTest::addColumn<QString>("error"); // that the service answers, if it exists
    QTest::addColumn<QStringList>("messages");
    const QByteArray needed = "requires-package=lamp-daemon\n";
    const QStringList noService(failure(serviceUnknown));
    QTest::newRow("no package") << call << call << "" << noService;
    for (const char *line : {"remote-service=org.example.other", "remote-path=/other",
                             "remote-interface=org.example.Other", "remote-method=other"}) {
        QTest::addRow("package of another call: %s", line)
            << call << call + line + '\n' + needed << "" << noService;
    }
    QTest::newRow("other error") << call + needed << call
                                 << "org.freedesktop.DBus.Error.UnknownMethod"
                                 << QStringList(failure(
                                        "org.freedesktop.DBus.Error.UnknownMethod as told"_s));
    QTest::newRow("no reply") << call + needed << call << "org.freedesktop.DBus.Error.NoReply"
                              << QStringList();
}

void TestTriggering::asksNoStore()
{
    QFETCH(QByteArray, first);
    QFETCH(QByteArray, second);
    QFETCH(QString, error);
    QFETCH(QStringList, messages);
    const RecordingService store(QDBusConnection::SessionBus, storeName);
    std::unique_ptr<RecordingService> lamp;
    if (!error.isEmpty()) {
        lamp = std::make_unique<RecordingService>(QDBusConnection::SessionBus, lampName);
        lamp->setAnswer(Answer::Error, error);
    }
    add("a", first);
    add("b", second);
    tap();
    m_expected = messages;
    QTRY_COMPARE(this->messages(), m_expected);
    QTRY_VERIFY(lamp == nullptr || lamp->calls().size() == 1);
    QTest::qWait(longEnough);
    QCOMPARE(store.calls().size(), 0);
}

void TestTriggering::missingStore()
{
    add("a", call + "requires-package=lamp-daemon\n");
    tap();
    // The model does not wait for the store, so it does not notice that the store is missing.
    m_expected = QStringList(failure(serviceUnknown));
    QTRY_COMPARE(messages(), m_expected);
    QTest::qWait(longEnough);
}

void TestTriggering::errorTextsMayLookLikePlaceholders()
{
    RecordingService lamp(QDBusConnection::SessionBus, lampName);
    lamp.setAnswer(Answer::Error, "org.example.Error"_s, "%1 %7"_s);
    add("a", call);
    tap();
    m_expected = QStringList(failure("org.example.Error %1 %7"_s));
    QTRY_COMPARE(messages(), m_expected);
}

void TestTriggering::invalidNamesAreReported()
{
    // No message can contain these names. The error is reported like that of a call that was sent.
    RecordingService store(QDBusConnection::SessionBus, storeName);
    add("a",
        "remote-service=org.example.lamp\nremote-path=no path\n"
        "remote-interface=%1\nremote-method=%2\nrequires-package=p\n");
    tap();
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
    tap();
    m_model.reset();
    QTest::qWait(longEnough);
    QCOMPARE(store.calls().size(), 0);
}

void TestTriggering::actionIsGoneBeforeTheError()
{
    RecordingService store(QDBusConnection::SessionBus, storeName);
    add("a", call + "requires-package=lamp-daemon\n");
    tap();
    m_model->setShowPotential(false);
    QCOMPARE(m_model->count(), 0);
    m_expected = QStringList(failure(serviceUnknown));
    QTRY_COMPARE(messages(), m_expected);
    QTest::qWait(longEnough);
    QCOMPARE(store.calls().size(), 0);
}

QTEST_GUILESS_MAIN(TestTriggering)

#include "tst_triggering.moc"
