// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The input is a definition file of a quick action. The target reads it, calls every getter and
// sends its call.

#include "fuzzing.h"
#include "quickactions/quickaction.h"

#include <QCoreApplication>
#include <QDBusConnection>
#include <QDBusMessage>
#include <QFile>

namespace {

class Receiver : public QObject
{
    Q_OBJECT

public Q_SLOTS:
    void failed(const QDBusError &error, const QDBusMessage &call)
    {
        Q_UNUSED(call)
        Fuzzing::require(error.isValid(), "a failure has a name");
    }
};

// The bus disconnects a client that sends a malformed message. Asking the bus takes longer than the
// rest of a run. After many successful calls it is therefore asked only once per hundred calls.
bool isStillOnTheBus()
{
    constexpr int many = 1000;
    constexpr int some = 100;
    static int calls = 0;
    if (++calls > many && calls % some != 0) {
        return QDBusConnection::sessionBus().isConnected();
    }
    const QDBusMessage ping = QDBusMessage::createMethodCall(
        QStringLiteral("org.freedesktop.DBus"), QStringLiteral("/org/freedesktop/DBus"),
        QStringLiteral("org.freedesktop.DBus.Peer"), QStringLiteral("Ping"));
    return QDBusConnection::sessionBus().call(ping).type() == QDBusMessage::ReplyMessage;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size)
{
    // Uses a new name each time, because QSettings caches what it has read of a file.
    static int number = 0;
    ++number;
    const QByteArray content(reinterpret_cast<const char *>(data), int(size));
    const QString path =
        Fuzzing::writeFile((QByteArray::number(number) + ".conf").constData(), content);
    const QuickAction action(path, true);
    const QuickAction again(path, true);
    QFile::remove(path);
    Fuzzing::require(action == again, "a file reads the same twice");

    action.title();
    action.icon();
    action.translationCatalog();
    action.requiredPackage();
    action.priority();

    static Receiver receiver;
    const bool sendable = !action.whyUnsendable().isValid();
    const bool sent = action.trigger(&receiver, nullptr, SLOT(failed(QDBusError, QDBusMessage)));
    Fuzzing::require(sendable || !sent, "what cannot be sent is not");
    Fuzzing::require(!sent || isStillOnTheBus(), "the bus has taken the call");
    QCoreApplication::sendPostedEvents();
    return 0;
}

#include "fuzz_quickaction.moc"
