// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef EVENTSWIDGETSCHECK_H
#define EVENTSWIDGETSCHECK_H

#include "definitionschecker.h"

// Finds mistakes in a definition file of events widgets.
void checkEventsWidgets(const QString &path, CheckContext *context, Findings *findings);

#endif
