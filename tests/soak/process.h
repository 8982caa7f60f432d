// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef PROCESS_H
#define PROCESS_H

#include <QtGlobal>

// What this process holds.
namespace Process {

// KiB of memory, once what is free has been given back.
qint64 residentMemory();
int openFiles();

} // namespace Process

#endif
