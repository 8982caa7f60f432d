// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "diskservice.h"

#include <QDBusConnection>
#include <QDBusError>
#include <QMetaEnum>
#include <QVariantMap>

namespace {

const QLatin1String service("org.freedesktop.UDisks2");
const QLatin1String objectPath("/org/freedesktop/UDisks2/block_devices/%1");
const QLatin1String interface("org.freedesktop.UDisks2.Filesystem");
const QLatin1String mountMethod("Mount");
const QLatin1String unmountMethod("Unmount");
const QLatin1String fileSystemTypeOption("fstype");

// The service writes out all cached data before it replies, which takes long on a slow card.
constexpr int requestTimeout = 5 * 60 * 1000; // ms

// The keys of the error codes are the names of the service's errors with another prefix.
const QLatin1String errorPrefix("org.freedesktop.UDisks2.Error.");
const QLatin1String keyPrefix("Error");

QDBusMessage createCall(const QString &deviceName, QLatin1String method, const QString &option)
{
    QDBusMessage call = QDBusMessage::createMethodCall(service, QString(objectPath).arg(deviceName),
                                                       interface, method);
    call.setArguments({QVariantMap{{option, QString()}}});
    return call;
}

} // namespace

QDBusMessage DiskService::mountCall(const QString &deviceName)
{
    // With an empty type the service detects the file system itself.
    return createCall(deviceName, mountMethod, fileSystemTypeOption);
}

QDBusMessage DiskService::unmountCall(const QString &deviceName)
{
    // The option with an empty name is intended. The service ignores it.
    return createCall(deviceName, unmountMethod, QString());
}

QDBusPendingCall DiskService::send(const QDBusMessage &call)
{
    const QDBusConnection bus = QDBusConnection::systemBus();
    if (!bus.isConnected()) {
        // Without a connection Qt would never report the end of the call.
        return QDBusPendingCall::fromError(
            {QDBusError::Disconnected, QStringLiteral("Not connected to the system bus")});
    }
    return bus.asyncCall(call, requestTimeout);
}

std::optional<MemoryCardFormatter::MountError> DiskService::errorCode(const QString &errorName)
{
    const auto codes = QMetaEnum::fromType<MemoryCardFormatter::MountError>();
    for (int i = 0; i < codes.keyCount(); ++i) {
        if (errorName == errorPrefix + QLatin1String(codes.key(i)).mid(keyPrefix.size())) {
            return MemoryCardFormatter::MountError(codes.value(i));
        }
    }
    return {};
}
