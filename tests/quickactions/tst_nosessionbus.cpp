// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Quick actions without a session bus: calls report that they cannot be sent, and the rest works.

#include "files.h"
#include "messagelog.h"
#include "places.h"
#include "quickactions/quickactionsmodel.h"

#include <QtTest>

class TestNoSessionBus : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void reportsThatNothingCanBeSent();
    void reportsThatTheStoreCannotBeAsked();
};

namespace {

// Leaves out the messages of MGConfItem about the missing bus.
QString takeQmlMessages(MessageLog *log)
{
    return log->takeReport()
        .split(QLatin1Char('\n'))
        .filter("QuickActionsModel"_s)
        .join(QLatin1Char('\n'));
}

} // namespace

void TestNoSessionBus::reportsThatNothingCanBeSent()
{
    Files::write(Places::quickActions + "/a.conf"_s,
                 "remote-service=org.example.lamp\nremote-path=/lamp\n"
                 "remote-interface=org.example.Lamp\nremote-method=toggle\n");
    MessageLog log;
    QuickActionsModel model;
    model.setShowPotential(true);
    model.componentComplete();
    QCOMPARE(model.count(), 1);
    model.triggerAction(0);
    QCOMPARE(
        takeQmlMessages(&log),
        "info [default] <Unknown File>: QML QuickActionsModel: Failed to initialize dbus call "
        "to: service=org.example.lamp path=/lamp interface=org.example.Lamp method=toggle. "
        "Error was: org.freedesktop.DBus.Error.Disconnected Not connected to D-Bus server %6"_s);
}

void TestNoSessionBus::reportsThatTheStoreCannotBeAsked()
{
    MessageLog log;
    QuickActionsModel model;
    QVERIFY(QMetaObject::invokeMethod(&model, "showStorePackage", Q_ARG(QString, "lamp-daemon"_s)));
    QCOMPARE(takeQmlMessages(&log),
             "info [default] <Unknown File>: QML QuickActionsModel: call to "
             "com.marlo.marlostore failed: "
             "QDBusError(\"org.freedesktop.DBus.Error.Disconnected\", "
             "\"Not connected to D-Bus server\")"_s);
}

QTEST_GUILESS_MAIN(TestNoSessionBus)

#include "tst_nosessionbus.moc"
