// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "faultlog.h"

Q_LOGGING_CATEGORY(lcCardFaults, "com.marlo.settings.system.memorycard", QtWarningMsg)
