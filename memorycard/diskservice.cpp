// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "diskservice.h"

#include <QDBusConnection>
#include <QDBusError>
#include <QVariantMap>

#include <array>

namespace {

const QLatin1String service("org.freedesktop.UDisks2");
const QLatin1String objectPath("/org/freedesktop/UDisks2/block_devices/%1");
const QLatin1String interface("org.freedesktop.UDisks2.Filesystem");
const QLatin1String mountMethod("Mount");
const QLatin1String unmountMethod("Unmount");
const QLatin1String fileSystemTypeOption("fstype");

// The service writes out all cached data before it replies, which takes long on a slow card.
constexpr int requestTimeout = 5 * 60 * 1000; // ms

const QLatin1String alreadyMounted("org.freedesktop.UDisks2.Error.AlreadyMounted");
const QLatin1String alreadyUnmounting("org.freedesktop.UDisks2.Error.AlreadyUnmounting");

struct ErrorName {
    MemoryCardFormatter::MountError code;
    QLatin1String name;
};

const std::array<ErrorName, 15> errorNames = {{
    {MemoryCardFormatter::ErrorFailed, QLatin1String("org.freedesktop.UDisks2.Error.Failed")},
    {MemoryCardFormatter::ErrorCancelled, QLatin1String("org.freedesktop.UDisks2.Error.Cancelled")},
    {MemoryCardFormatter::ErrorAlreadyCancelled,
     QLatin1String("org.freedesktop.UDisks2.Error.AlreadyCancelled")},
    {MemoryCardFormatter::ErrorNotAuthorized,
     QLatin1String("org.freedesktop.UDisks2.Error.NotAuthorized")},
    {MemoryCardFormatter::ErrorNotAuthorizedCanObtain,
     QLatin1String("org.freedesktop.UDisks2.Error.NotAuthorizedCanObtain")},
    {MemoryCardFormatter::ErrorNotAuthorizedDismissed,
     QLatin1String("org.freedesktop.UDisks2.Error.NotAuthorizedDismissed")},
    {MemoryCardFormatter::ErrorAlreadyMounted, alreadyMounted},
    {MemoryCardFormatter::ErrorNotMounted,
     QLatin1String("org.freedesktop.UDisks2.Error.NotMounted")},
    {MemoryCardFormatter::ErrorOptionNotPermitted,
     QLatin1String("org.freedesktop.UDisks2.Error.OptionNotPermitted")},
    {MemoryCardFormatter::ErrorMountedByOtherUser,
     QLatin1String("org.freedesktop.UDisks2.Error.MountedByOtherUser")},
    {MemoryCardFormatter::ErrorAlreadyUnmounting, alreadyUnmounting},
    {MemoryCardFormatter::ErrorNotSupported,
     QLatin1String("org.freedesktop.UDisks2.Error.NotSupported")},
    {MemoryCardFormatter::ErrorTimedout, QLatin1String("org.freedesktop.UDisks2.Error.Timedout")},
    {MemoryCardFormatter::ErrorWouldWakeup,
     QLatin1String("org.freedesktop.UDisks2.Error.WouldWakeup")},
    {MemoryCardFormatter::ErrorDeviceBusy,
     QLatin1String("org.freedesktop.UDisks2.Error.DeviceBusy")},
}};

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
    // With an empty type the service finds out the file system by itself.
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
        // Qt would never report the end of such a call.
        return QDBusPendingCall::fromError(
            {QDBusError::Disconnected, QStringLiteral("Not connected to the system bus")});
    }
    return bus.asyncCall(call, requestTimeout);
}

bool DiskService::isForgiven(const QString &errorName)
{
    return errorName == alreadyMounted || errorName == alreadyUnmounting;
}

std::optional<MemoryCardFormatter::MountError> DiskService::errorCode(const QString &errorName)
{
    for (const ErrorName &known : errorNames) {
        if (errorName == known.name) {
            return known.code;
        }
    }
    return {};
}
