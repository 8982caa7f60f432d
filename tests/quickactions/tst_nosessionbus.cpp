// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Quick actions without a session bus: calls report that they cannot be sent, and the rest works.

#include "files.h"
#include "messagelog.h"
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

const QByteArray disconnected =
    "org.freedesktop.DBus.Error.Disconnected Not connected to D-Bus server";

// Leaves out the messages of MGConfItem about the missing bus.
QString takeQmlMessages(MessageLog *log)
{
    return log->takeReport()
        .split(QLatin1Char('\n'))
        .filter(QStringLiteral("QuickActionsModel"))
        .join(QLatin1Char('\n'));
}

} // namespace

void TestNoSessionBus::reportsThatNothingCanBeSent()
{
    Files::write(QStringLiteral("/usr/share/glimmera/quickactions/a.conf"),
                 "remote-service=org.example.lamp\nremote-path=/lamp\n"
                 "remote-interface=org.example.Lamp\nremote-method=toggle\n");
    MessageLog log;
    QuickActionsModel model;
    model.setShowPotential(true);
    model.componentComplete();
    QCOMPARE(model.count(), 1);
    model.triggerAction(0);
    const QString text = takeQmlMessages(&log);
    const QString begin =
        QStringLiteral("info [default] <Unknown File>: QML QuickActionsModel: Failed to "
                       "initialize dbus call to: service=org.example.lamp path=/lamp "
                       "interface=org.example.Lamp method=toggle. Error was: ");
    QVERIFY2(text.startsWith(begin), qPrintable(text));
    QCOMPARE(text.mid(begin.size()), QString::fromLatin1(disconnected) + QStringLiteral(" %6"));
}

void TestNoSessionBus::reportsThatTheStoreCannotBeAsked()
{
    MessageLog log;
    QuickActionsModel model;
    QVERIFY(QMetaObject::invokeMethod(&model, "showStorePackage",
                                      Q_ARG(QString, QStringLiteral("lamp-daemon"))));
    QCOMPARE(takeQmlMessages(&log),
             QStringLiteral("info [default] <Unknown File>: QML QuickActionsModel: call to "
                            "com.marlo.marlostore failed: "
                            "QDBusError(\"org.freedesktop.DBus.Error.Disconnected\", "
                            "\"Not connected to D-Bus server\")"));
}

QTEST_GUILESS_MAIN(TestNoSessionBus)

#include "tst_nosessionbus.moc"
