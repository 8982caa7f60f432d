// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef FAULTLOG_H
#define FAULTLOG_H

#include <QLoggingCategory>

// Why the helper program or the removal of files failed. The lines of the category
// org.tarnwickos.settings.memorycard are fixed: programs read them.
Q_DECLARE_LOGGING_CATEGORY(lcCardFaults)

#endif
