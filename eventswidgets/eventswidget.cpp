// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "eventswidget.h"

#include "files/regularfile.h"
#include "translations/catalogtable.h"

namespace {

QString translation(const QString &id, const QString &fallback)
{
    if (id.isEmpty()) {
        return fallback;
    }
    const QString text = CatalogTable::text(id);
    return text == id ? fallback : text;
}

} // namespace

QString EventsWidget::translatedTitle() const
{
    return translation(translationId, title);
}

QString EventsWidget::translatedDescription() const
{
    return translation(descriptionId, QLatin1String(""));
}

bool EventsWidget::isAvailable() const
{
    return availablePath.isEmpty() || fileExists(availablePath);
}

bool EventsWidget::operator!=(const EventsWidget &other) const
{
    return title != other.title || translationId != other.translationId
        || descriptionId != other.descriptionId || icon != other.icon || path != other.path
        || availablePath != other.availablePath || order != other.order || enabled != other.enabled
        || defaultEnabled != other.defaultEnabled || available != other.available;
}
