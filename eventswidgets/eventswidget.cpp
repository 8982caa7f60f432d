// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "eventswidget.h"

#include <QFileInfo>

bool EventsWidget::isAvailable() const
{
    return availablePath.isEmpty() || QFileInfo::exists(availablePath);
}

bool EventsWidget::operator!=(const EventsWidget &other) const
{
    return title != other.title || translationId != other.translationId
        || descriptionId != other.descriptionId || icon != other.icon || path != other.path
        || availablePath != other.availablePath || order != other.order || enabled != other.enabled
        || defaultEnabled != other.defaultEnabled || available != other.available;
}
