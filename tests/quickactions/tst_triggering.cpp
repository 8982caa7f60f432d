// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// A tap: the call, its errors, and the call to the store.

#include "files.h"
#include "messagelog.h"
#include "mgconfitem.h"
#include "patience.h"
#include "places.h"
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

    void callsTheServiceOfARow();
    void callsWithoutPathOrInterface();
    void missingServiceLeadsToTheStore();
    void failures_data();
    void failures();
    void missingStore();
    void invalidNamesAreReported();
    void actionIsGoneBeforeTheError();

private:
    static void add(const QByteArray &name, const QByteArray &content);
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

void TestTriggering::add(const QByteArray &name, const QByteArray &content)
{
    Files::write(Places::quickActions + "/%1.conf"_s.arg(QString::fromLatin1(name)), content);
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
    Files::remove(Places::quickActions);
    Files::makeDirectory(Places::quickActions);
    MGConfItem(Places::enabledActions).unset();
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

void TestTriggering::callsTheServiceOfARow()
{
    const RecordingService lamp(QDBusConnection::SessionBus, lampName);
    add("a", call);
    add("b", call + "[remote-arguments]\nsize=1\n1\\argument=bright\n");
    m_model->componentComplete();
    for (const int index : {-1, 2}) {
        m_model->triggerAction(index);
        m_expected += "info [default] <Unknown File>: QML QuickActionsModel: "
                      "triggerAction() called with invalid index: %1"_s.arg(index);
        QCOMPARE(messages(), m_expected);
    }
    m_model->triggerAction(1);
    TRY_COMPARE(lamp.calls().size(), 1);
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
    TRY_COMPARE(lamp.calls().size(), 1);
    QCOMPARE(lamp.calls().constFirst().interface(), QString());
    QCOMPARE(lamp.calls().constFirst().member(), "toggle"_s);

    m_model->triggerAction(1);
    // Qt logs a message too.
    TRY_COMPARE(messages().size(), 2);
    m_expected = messages();
    QCOMPARE(m_expected.last(),
             "info [default] <Unknown File>: QML QuickActionsModel: Failed to send "
             "dbus call to: service=org.example.lamp path= "
             "interface=org.example.Lamp method=toggle. Error was: "
             "org.qtproject.QtDBus.Error.InvalidObjectPath "
             "Object path cannot be empty"_s);
    QCOMPARE(lamp.calls().size(), 1);
}

void TestTriggering::missingServiceLeadsToTheStore()
{
    RecordingService store(QDBusConnection::SessionBus, storeName);
    QStringList messagesBefore;
    connect(&store, &RecordingService::called, this, [&] { messagesBefore = messages(); });
    add("a", call + "requires-package=lamp-daemon\n");
    tap();
    TRY_COMPARE(store.calls().size(), 1);
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
    TRY_COMPARE(store.calls().size(), 2);
    m_expected += m_expected;
}

void TestTriggering::failures_data()
{
    QTest::addColumn<QByteArrayList>("definitions");
    QTest::addColumn<QString>("error"); // that the service answers, if it exists
    QTest::addColumn<QStringList>("messages");
    QTest::addColumn<QString>("package"); // that the store is asked for
    const auto row = [](const QByteArray &name, const QByteArrayList &definitions,
                        const char *error, const QStringList &messages, const char *package) {
        QTest::newRow(name.constData()) << definitions << error << messages << package;
    };
    const QByteArray needed = "requires-package=lamp-daemon\n";
    const QStringList noService(failure(serviceUnknown));
    row("a later row names the package", {call, call + needed, call + "requires-package=another\n"},
        "", noService, "lamp-daemon");
    row("no package", {call, call}, "", noService, "");
    for (const char *line : {"remote-service=org.example.other", "remote-path=/other",
                             "remote-interface=org.example.Other", "remote-method=other"}) {
        row(QByteArray("package of another call: ") + line, {call, call + line + '\n' + needed}, "",
            noService, "");
    }
    // The text looks like placeholders.
    row("other error", {call + needed}, "org.freedesktop.DBus.Error.UnknownMethod",
        QStringList(failure("org.freedesktop.DBus.Error.UnknownMethod %1 %7"_s)), "");
    row("no reply", {call + needed}, "org.freedesktop.DBus.Error.NoReply", {}, "");
}

void TestTriggering::failures()
{
    QFETCH(QByteArrayList, definitions);
    QFETCH(QString, error);
    QFETCH(QStringList, messages);
    QFETCH(QString, package);
    const RecordingService store(QDBusConnection::SessionBus, storeName);
    std::unique_ptr<RecordingService> lamp;
    if (!error.isEmpty()) {
        lamp = std::make_unique<RecordingService>(QDBusConnection::SessionBus, lampName);
        lamp->setAnswer(Answer::Error, error, "%1 %7"_s);
    }
    for (int i = 0; i < definitions.size(); ++i) {
        add(QByteArray::number(i), definitions.at(i));
    }
    tap();
    m_expected = messages;
    TRY_COMPARE(this->messages(), m_expected);
    TRY(lamp == nullptr || lamp->calls().size() == 1);
    TRY(package.isEmpty() || !store.calls().isEmpty());
    QTest::qWait(longEnough);
    QCOMPARE(store.calls().size(), package.isEmpty() ? 0 : 1);
    if (!package.isEmpty()) {
        QCOMPARE(store.calls().constFirst().arguments(), QVariantList{package});
    }
}

void TestTriggering::missingStore()
{
    add("a", call + "requires-package=lamp-daemon\n");
    tap();
    // The model does not wait for the store, so it does not notice that the store is missing.
    m_expected = QStringList(failure(serviceUnknown));
    TRY_COMPARE(messages(), m_expected);
    QTest::qWait(longEnough);
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
    TRY_COMPARE(messages().size(), 2);
    m_expected = messages();
    const QString text = m_expected.last();
    QVERIFY2(text.startsWith(
                 "info [default] <Unknown File>: QML QuickActionsModel: Failed to send dbus call "
                 "to: service=org.example.lamp path=no path interface=%1 method=%2. Error was: "
                 "org.qtproject.QtDBus.Error.Invalid"_s),
             qPrintable(text));
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
    TRY_COMPARE(messages(), m_expected);
    QTest::qWait(longEnough);
    QCOMPARE(store.calls().size(), 0);
}

QTEST_GUILESS_MAIN(TestTriggering)

#include "tst_triggering.moc"
