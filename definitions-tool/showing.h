// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef SHOWING_H
#define SHOWING_H

#include <QString>

#include <optional>

// Returns a definition file as its model reads it, with the texts of the default locale, as text for
// a terminal. For a quick action, a shell command for the D-Bus call follows. Returns nothing if no
// model reads the file.
std::optional<QString> showDefinition(const QString &path);

#endif
