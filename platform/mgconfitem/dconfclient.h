// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DCONFCLIENT_H
#define DCONFCLIENT_H

#include "gvariantconversion.h"

#include <QByteArray>
#include <QLoggingCategory>

using DConfClient =
    struct _DConfClient; // NOLINT(bugprone-reserved-identifier): as dconf declares it

Q_DECLARE_LOGGING_CATEGORY(lcPlatformLog)

// The only client of the process, by which an item sees at once what another item sets.
DConfClient *dconfClient();

// Warns once, as soon as there is an event dispatcher, if the process cannot follow or store
// settings.
void checkDconfOnce();

// Null if no value is stored. The value may be damaged.
GVariantPtr readDconf(const QByteArray &path);

// The type and the data of a value, by which it can be compared; null without a value.
QByteArray dataOf(GVariant *value);

// Announces the change before it returns; null unsets the key.
void writeDconf(const QByteArray &path, GVariant *value);

// Stops watching the key after a moment.
void unwatchDconfLater(const QByteArray &path);

#endif
