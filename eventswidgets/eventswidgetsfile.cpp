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

constexpr auto translationCatalogKey = "translation_catalog"_L1;
constexpr auto widgetsKey = "widgets"_L1;

constexpr auto pathKey = "path"_L1;
constexpr auto titleKey = "title"_L1;
constexpr auto translationIdKey = "translation_id"_L1;
constexpr auto descriptionIdKey = "description_id"_L1;
constexpr auto iconKey = "icon"_L1;
constexpr auto orderKey = "order"_L1;
constexpr auto defaultEnabledKey = "default_enabled"_L1;
constexpr auto availablePathKey = "available_path"_L1;

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
    // memchr(), because a character loop would add 5 % to reading a file.
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
    file.path = path;
    file.translationCatalog = document[translationCatalogKey].toString();
    int rejected = 0;
    const QJsonArray entries = document[widgetsKey].toArray();
    file.widgets.reserve(std::size_t(entries.size()));
    for (const QJsonValue &entry : entries) {
        EventsWidget widget = readWidget(entry.toObject());
        if (widget.path.isEmpty()) {
            if (++rejected <= maximumWarnings) {
                qWarning() << "Invalid widget defined in" << path;
            } else if (rejected == maximumWarnings + 1) {
                qWarning() << "No further invalid widgets are reported in" << path;
            }
            continue;
        }
        widget.translationCatalog = file.translationCatalog;
        widget.available = widget.isAvailable();
        file.widgets.push_back(std::move(widget));
    }
    return file;
}
