// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DISKSERVICE_H
#define DISKSERVICE_H

#include "memorycardformatter.h"

#include <QDBusMessage>

#include <optional>

/*
    The language of the disk service, UDisks2 on the system bus.
*/
namespace DiskService {

// The calls that mount and unmount a block device, given by its kernel name.
QDBusMessage mountCall(const QString &deviceName);
QDBusMessage unmountCall(const QString &deviceName);

// Nothing for an error that is not the disk service's own.
std::optional<MemoryCardFormatter::MountError> errorCode(const QString &errorName);

} // namespace DiskService

#endif
