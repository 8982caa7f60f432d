// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DEFINITIONFILES_H
#define DEFINITIONFILES_H

#include <QStringList>

/*
    The names of the files that the models read.
*/
namespace DefinitionFiles {

// Whether a model reads files of this name.
bool isQuickAction(const QString &path);
bool isEventsWidgets(const QString &path);

// The files of a directory that a model would read if they were installed, sorted by name.
QStringList inDirectory(const QString &path);

} // namespace DefinitionFiles

#endif
