// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "eventswidgetsfile.h"

#include "files/regularfile.h"

#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QtDebug>

#include <cstring>

namespace {

const QLatin1String translationCatalogKey("translation_catalog");
const QLatin1String widgetsKey("widgets");

const QLatin1String pathKey("path");
const QLatin1String titleKey("title");
const QLatin1String translationIdKey("translation_id");
const QLatin1String descriptionIdKey("description_id");
const QLatin1String iconKey("icon");
const QLatin1String orderKey("order");
const QLatin1String defaultEnabledKey("default_enabled");
const QLatin1String availablePathKey("available_path");

constexpr int noOrder = -1;

// The main thread waits while the log is written, so the number of lines is limited.
constexpr int maximumWarnings = 1000;

EventsWidget readWidget(const QJsonObject &object)
{
    EventsWidget widget;
    widget.path = object.value(pathKey).toString();
    widget.title = object.value(titleKey).toString();
    widget.translationId = object.value(translationIdKey).toString();
    widget.descriptionId = object.value(descriptionIdKey).toString();
    widget.icon = object.value(iconKey).toString();
    widget.order = object.value(orderKey).toInt(noOrder);
    widget.defaultEnabled = object.value(defaultEnabledKey).toBool();
    widget.availablePath = object.value(availablePathKey).toString();
    return widget;
}

} // namespace

bool isTooComplex(const QByteArray &json)
{
    // A loop over the characters would take a twentieth of the time that reading a file takes.
    const auto next = [&json](const char *from, char bracket) {
        return static_cast<const char *>(
            std::memchr(from, bracket, std::size_t(json.cend() - from)));
    };
    int containers = 0;
    for (const char bracket : {'{', '['}) {
        for (const char *at = next(json.cbegin(), bracket);
             at != nullptr && containers <= maximumContainers; at = next(at + 1, bracket)) {
            ++containers;
        }
    }
    return containers > maximumContainers;
}

std::optional<EventsWidgetsFile> readEventsWidgetsFile(const QString &path)
{
    const RegularFile text = readRegularFile(path, maximumEventsWidgetsSize);
    if (text.state == RegularFile::State::NotOpened
        || text.state == RegularFile::State::NotRegular) {
        qWarning() << "Failed to open" << path;
        return {};
    }
    // The content of a file that is too large is empty.
    const QJsonDocument document =
        isTooComplex(text.content) ? QJsonDocument() : QJsonDocument::fromJson(text.content);
    if (!document.isObject()) {
        qWarning() << "Invalid Events Widget" << path;
        return {};
    }

    EventsWidgetsFile file;
    file.translationCatalog = document[translationCatalogKey].toString();
    int rejected = 0;
    const QJsonArray entries = document[widgetsKey].toArray();
    file.widgets.reserve(std::size_t(entries.size()));
    for (const QJsonValue &entry : entries) {
        EventsWidget widget = readWidget(entry.toObject());
        if (widget.path.isEmpty()) {
            if (++rejected <= maximumWarnings) {
                qWarning() << "Invalid widget defined in" << path;
            }
            continue;
        }
        widget.file = path;
        widget.translationCatalog = file.translationCatalog;
        widget.available = widget.isAvailable();
        file.widgets.push_back(std::move(widget));
    }
    return file;
}
