// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DEFINITIONFILES_H
#define DEFINITIONFILES_H

#include <QLatin1String>
#include <QStringList>

/*
    The files that the models read.
*/
namespace DefinitionFiles {

const QLatin1String quickActionsDirectory("/usr/share/glimmera/quickactions");
const QLatin1String eventsWidgetsDirectory("/usr/share/glimmera/eventswidgets");

// These look only at the name.
bool isQuickAction(const QString &path);
bool isEventsWidgets(const QString &path);

// The files of a directory that a model would read if they were installed, sorted by name.
QStringList inDirectory(const QString &path);

} // namespace DefinitionFiles

#endif
