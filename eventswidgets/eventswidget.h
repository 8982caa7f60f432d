// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef EVENTSWIDGET_H
#define EVENTSWIDGET_H

#include <QString>

// An events widget as a definition file describes it, and its state. The path is its identity.
struct EventsWidget {
    QString title; // Shown where translationId has no translation.
    QString translationId; // Of the title.
    QString descriptionId;
    QString translationCatalog; // That of the file.
    QString icon;
    QString path;
    QString availablePath;
    int order = -1; // The place among the widgets; negative for none.
    bool enabled = false; // By the user or by default. Only the model sets it.
    bool defaultEnabled = false; // While the user has not chosen.
    bool available = false; // The last result of isAvailable().

    // The texts for the user, from the catalogs that are installed in the application now.
    QString translatedTitle() const;
    QString translatedDescription() const;

    // Whether a file exists at availablePath now; always true if the path is empty.
    bool isAvailable() const;

    // Ignores translationCatalog on purpose: it does not change the row.
    bool operator!=(const EventsWidget &other) const;
};

#endif
