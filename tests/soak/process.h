// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef PROCESS_H
#define PROCESS_H

#include <QtGlobal>

// The memory and files that this process uses.
namespace Process {

// In KiB, after the process has returned its free memory to the system.
qint64 residentMemory();
int openFiles();

} // namespace Process

#endif
