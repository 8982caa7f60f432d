// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef MOUNTTABLE_H
#define MOUNTTABLE_H

#include <QByteArray>
#include <QString>

namespace MountTable {

// Empty if the device is not mounted.
QString directoryOf(const QByteArray &devicePath);
// Replaces the table, which is a link to the kernel's, by a copy that lists the directory in memory as
// where the device is mounted; with an empty directory, one that does not list the device.
bool setDirectoryOf(const QByteArray &devicePath, const QByteArray &directory);

} // namespace MountTable

#endif
