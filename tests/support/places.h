// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef PLACES_H
#define PLACES_H

#include "texts.h"

// Where a device keeps definition files, and the dconf keys of the user's choices.
namespace Places {

inline const QString quickActions = "/usr/share/glimmera/quickactions"_s;
inline const QString enabledActions = "/desktop/glimmera-marlo-home/events_screen_actions"_s;
inline const QString blockedActions = "/desktop/glimmera-marlo-home/blocked_actions"_s;
inline const QString userActions = "/desktop/glimmera-marlo-home/events_screen_actions_user"_s;

inline const QString eventsWidgets = "/usr/share/glimmera/eventswidgets"_s;
inline const QString enabledWidgets = "/desktop/glimmera-marlo-home/events_screen_widgets"_s;

} // namespace Places

#endif
