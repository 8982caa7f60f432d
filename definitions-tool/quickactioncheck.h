// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef QUICKACTIONCHECK_H
#define QUICKACTIONCHECK_H

#include "definitionschecker.h"

// Finds mistakes in the definition file of a quick action.
void checkQuickAction(const QString &path, CheckContext *context, Findings *findings);

#endif
