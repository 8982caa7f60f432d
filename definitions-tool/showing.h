// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef SHOWING_H
#define SHOWING_H

#include <QString>

#include <optional>

// A definition file as its model reads it, as text for a terminal; for a quick action also the D-Bus
// call, as a line for a shell. Nothing if no model reads the file.
std::optional<QString> showDefinition(const QString &path);

#endif
