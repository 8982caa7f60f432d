// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DISKSERVICE_H
#define DISKSERVICE_H

#include "files/literals.h"
#include "memorycardformatter.h"

#include <QDBusPendingCall>
#include <QString>

#include <optional>

// The calls to the disk service, UDisks2 on the system bus, and the errors that it replies with.
namespace DiskService {

constexpr QLatin1String mountMethod = "Mount"_L1;
constexpr QLatin1String unmountMethod = "Unmount"_L1;

// Calls one of the methods for a block device, given by its kernel name, without waiting. There is
// always a reply: without a system bus, it is an error.
QDBusPendingCall call(QLatin1String method, const QString &deviceName);

// Nothing for an error that is not the disk service's own.
std::optional<MemoryCardFormatter::MountError> errorCode(const QString &errorName);

} // namespace DiskService

#endif
