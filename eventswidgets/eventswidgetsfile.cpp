// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "eventswidgetsfile.h"

#include "files/regularfile.h"
#include "jsonreader.h"

#include <QtDebug>

#include <algorithm>
#include <string_view>

namespace {

constexpr std::string_view translationCatalogKey("translation_catalog");
constexpr std::string_view widgetsKey("widgets");

constexpr std::string_view pathKey("path");
constexpr std::string_view titleKey("title");
constexpr std::string_view translationIdKey("translation_id");
constexpr std::string_view descriptionIdKey("description_id");
constexpr std::string_view iconKey("icon");
constexpr std::string_view orderKey("order");
constexpr std::string_view defaultEnabledKey("default_enabled");
constexpr std::string_view availablePathKey("available_path");

constexpr int noOrder = -1;

// The log is written while the main thread waits: no more lines than anybody reads.
constexpr int maximumWarnings = 1000;

EventsWidget readWidget(JsonReader *reader)
{
    EventsWidget widget;
    if (!reader->beginObject()) {
        return widget;
    }
    std::string_view key;
    while (reader->nextMember(&key)) {
        if (key == pathKey) {
            widget.path = reader->readString();
        } else if (key == titleKey) {
            widget.title = reader->readString();
        } else if (key == translationIdKey) {
            widget.translationId = reader->readString();
        } else if (key == descriptionIdKey) {
            widget.descriptionId = reader->readString();
        } else if (key == iconKey) {
            widget.icon = reader->readString();
        } else if (key == orderKey) {
            widget.order = reader->readInt(noOrder);
        } else if (key == defaultEnabledKey) {
            widget.defaultEnabled = reader->readBool();
        } else if (key == availablePathKey) {
            widget.availablePath = reader->readString();
        } else {
            reader->skip();
        }
    }
    return widget;
}

// Counts the entries that are no widgets.
std::vector<EventsWidget> readWidgets(JsonReader *reader, int *rejected)
{
    std::vector<EventsWidget> widgets;
    *rejected = 0;
    if (reader->beginArray()) {
        while (reader->nextElement()) {
            EventsWidget widget = readWidget(reader);
            if (widget.path.isEmpty()) {
                ++*rejected;
            } else {
                widgets.push_back(std::move(widget));
            }
        }
    }
    return widgets;
}

} // namespace

std::optional<EventsWidgetsFile> readEventsWidgetsFile(const QString &path)
{
    const RegularFile text = readRegularFile(path, maximumEventsWidgetsSize);
    if (text.state == RegularFile::State::NotOpened
        || text.state == RegularFile::State::NotRegular) {
        qWarning() << "Failed to open" << path;
        return {};
    }
    EventsWidgetsFile file;
    // Of a file that is too large there is none.
    JsonReader reader(text.content);
    int rejected = 0;
    const bool isObject = reader.beginObject();
    std::string_view key;
    while (isObject && reader.nextMember(&key)) {
        if (key == translationCatalogKey) {
            file.translationCatalog = reader.readString();
        } else if (key == widgetsKey) {
            file.widgets = readWidgets(&reader, &rejected);
        } else {
            reader.skip();
        }
    }
    if (!isObject || !reader.atEnd()) {
        qWarning() << "Invalid Events Widget" << path;
        return {};
    }

    for (int i = 0; i < std::min(rejected, maximumWarnings); ++i) {
        qWarning() << "Invalid widget defined in" << path;
    }
    for (EventsWidget &widget : file.widgets) {
        widget.file = path;
        widget.translationCatalog = file.translationCatalog;
        widget.available = widget.isAvailable();
    }
    return file;
}
