// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef EVENTSWIDGETSFILE_H
#define EVENTSWIDGETSFILE_H

#include "eventswidget.h"

#include <optional>
#include <vector>

// A definition takes a few hundred bytes a widget. The main thread reads it, and in memory it may
// take ten times its size: whatever is larger than this is none.
constexpr qint64 maximumEventsWidgetsSize = qint64(32) * 1024 * 1024;

/*
    A definition file of events widgets: a value that is read once and needs no model.
*/
struct EventsWidgetsFile {
    QString translationCatalog; // Empty for none.
    // In the order of the file. Which of them are enabled only a model can tell.
    std::vector<EventsWidget> widgets;
};

// Nothing if the file cannot be read or is no definition. That, and every entry of the file that is
// no widget, is logged as a warning; the entries beside it are read all the same.
std::optional<EventsWidgetsFile> readEventsWidgetsFile(const QString &path);

#endif
