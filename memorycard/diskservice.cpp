// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "diskservice.h"

#include <QDBusConnection>
#include <QDBusError>
#include <QDBusMessage>
#include <QMetaEnum>
#include <QVariantMap>

#include <chrono>

namespace {

constexpr QLatin1String service = "org.freedesktop.UDisks2"_L1;
constexpr QLatin1String objectPath = "/org/freedesktop/UDisks2/block_devices/%1"_L1;
constexpr QLatin1String interface = "org.freedesktop.UDisks2.Filesystem"_L1;
constexpr QLatin1String fileSystemTypeOption = "fstype"_L1;

// The service writes out all cached data before it replies, which takes long on a slow card.
constexpr std::chrono::milliseconds requestTimeout = std::chrono::minutes(5);

// The keys of the error codes are the names of the service's errors with another prefix.
constexpr QLatin1String errorPrefix = "org.freedesktop.UDisks2.Error."_L1;
constexpr const char *keyPrefix = "Error";

} // namespace

QDBusPendingCall DiskService::call(QLatin1String method, const QString &deviceName)
{
    const QDBusConnection bus = QDBusConnection::systemBus();
    if (!bus.isConnected()) {
        // Without a connection Qt would never report the end of the call.
        return QDBusPendingCall::fromError(
            {QDBusError::Disconnected, QStringLiteral("Not connected to the system bus")});
    }
    QDBusMessage message = QDBusMessage::createMethodCall(
        service, QString(objectPath).arg(deviceName), interface, method);
    // With an empty type the service detects the file system itself. To unmount, the option with an
    // empty name is intended: the service ignores it.
    const QString option = method == mountMethod ? fileSystemTypeOption : QString();
    message.setArguments({QVariantMap{{option, QString()}}});
    return bus.asyncCall(message, int(requestTimeout.count()));
}

std::optional<MemoryCardFormatter::MountError> DiskService::errorCode(const QString &errorName)
{
    if (!errorName.startsWith(errorPrefix)) {
        return {};
    }
    const QByteArray key = keyPrefix + errorName.mid(errorPrefix.size()).toLatin1();
    bool isKnown = false;
    const int value =
        QMetaEnum::fromType<MemoryCardFormatter::MountError>().keyToValue(key, &isKnown);
    return isKnown ? std::optional(MemoryCardFormatter::MountError(value)) : std::nullopt;
}
