// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "diskservice.h"

#include <QVariantMap>

#include <array>

namespace {

const QLatin1String service("org.freedesktop.UDisks2");
const QLatin1String objectPath("/org/freedesktop/UDisks2/block_devices/%1");
const QLatin1String interface("org.freedesktop.UDisks2.Filesystem");
const QLatin1String mountMethod("Mount");
const QLatin1String unmountMethod("Unmount");
const QLatin1String fileSystemTypeOption("fstype");

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
    {MemoryCardFormatter::ErrorAlreadyMounted,
     QLatin1String("org.freedesktop.UDisks2.Error.AlreadyMounted")},
    {MemoryCardFormatter::ErrorNotMounted,
     QLatin1String("org.freedesktop.UDisks2.Error.NotMounted")},
    {MemoryCardFormatter::ErrorOptionNotPermitted,
     QLatin1String("org.freedesktop.UDisks2.Error.OptionNotPermitted")},
    {MemoryCardFormatter::ErrorMountedByOtherUser,
     QLatin1String("org.freedesktop.UDisks2.Error.MountedByOtherUser")},
    {MemoryCardFormatter::ErrorAlreadyUnmounting,
     QLatin1String("org.freedesktop.UDisks2.Error.AlreadyUnmounting")},
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
    // An empty type has the service find out what is on the card.
    return createCall(deviceName, mountMethod, fileSystemTypeOption);
}

QDBusMessage DiskService::unmountCall(const QString &deviceName)
{
    // The option without a name is on purpose, and so sent for as long as cards are unmounted; the
    // service passes it over.
    return createCall(deviceName, unmountMethod, QString());
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
