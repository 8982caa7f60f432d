// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef MOUNTTABLE_H
#define MOUNTTABLE_H

#include <QByteArray>
#include <QString>

namespace MountTable {

// Empty if the device is not mounted.
QString directoryOf(const QByteArray &devicePath);

} // namespace MountTable

#endif
