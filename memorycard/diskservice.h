// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DISKSERVICE_H
#define DISKSERVICE_H

#include "memorycardformatter.h"

#include <QDBusMessage>
#include <QDBusPendingCall>

#include <optional>

// The calls to the disk service, UDisks2 on the system bus, and the errors that it replies with.
namespace DiskService {

// The calls that mount and unmount a block device, given by its kernel name.
QDBusMessage mountCall(const QString &deviceName);
QDBusMessage unmountCall(const QString &deviceName);

// Sends a call without waiting. There is always a reply: without a system bus, it is an error.
QDBusPendingCall send(const QDBusMessage &call);

// Nothing for an error that is not the disk service's own.
std::optional<MemoryCardFormatter::MountError> errorCode(const QString &errorName);

} // namespace DiskService

#endif
