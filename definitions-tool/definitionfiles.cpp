// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "definitionfiles.h"

#include "files/literals.h"

#include <QDir>
#include <QFileInfo>

namespace {

constexpr auto quickActionSuffix = ".conf"_L1;
constexpr auto eventsWidgetsSuffix = ".json"_L1;

} // namespace

bool DefinitionFiles::isQuickAction(const QString &path)
{
    // The models do not look at the case either.
    return path.endsWith(quickActionSuffix, Qt::CaseInsensitive);
}

bool DefinitionFiles::isEventsWidgets(const QString &path)
{
    return path.endsWith(eventsWidgetsSuffix, Qt::CaseInsensitive);
}

QStringList DefinitionFiles::inDirectory(const QString &path)
{
    const QDir directory(path);
    QStringList files;
    // As in the models: hidden files and broken links are left out, and widgets must be in regular
    // files.
    const QStringList names = directory.entryList();
    for (const QString &name : names) {
        const QString file = directory.filePath(name);
        if (isQuickAction(name) || (isEventsWidgets(name) && QFileInfo(file).isFile())) {
            files.append(file);
        }
    }
    return files;
}
