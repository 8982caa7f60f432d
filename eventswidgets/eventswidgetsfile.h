// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef EVENTSWIDGETSFILE_H
#define EVENTSWIDGETSFILE_H

#include "eventswidget.h"
#include "files/literals.h"

#include <optional>
#include <vector>

// The limits of a file, in bytes and in objects and arrays: QJsonDocument takes up to 16 bytes per
// byte of the file and 160 per container.
constexpr qint64 maximumEventsWidgetsSize = qint64(32) * 1024 * 1024;
constexpr int maximumContainers = 1000000;

// Whether a text has too many objects and arrays. Brackets in strings are counted, too.
bool isTooComplex(const QByteArray &json);

// The content of a definition file of events widgets.
struct EventsWidgetsFile {
    // Packages install definition files here, under names that match the filter.
    static constexpr QLatin1String directory = "/usr/share/glimmera/eventswidgets"_L1;
    static constexpr QLatin1String nameFilter = "*.json"_L1;

    QString path;
    QString translationCatalog; // May be empty.
    // In the order of the file. Only a model knows which ones are enabled.
    std::vector<EventsWidget> widgets;
};

// Returns nothing if the file cannot be read or is not a definition file. Entries that are not
// widgets are skipped. Both cases are logged as warnings.
std::optional<EventsWidgetsFile> readEventsWidgetsFile(const QString &path);

#endif
