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
    // Like the models, matches suffixes case-insensitively.
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
    // Like the models, leaves out hidden files and broken links, and for widgets everything but
    // regular files.
    const QStringList names = directory.entryList();
    for (const QString &name : names) {
        const QString file = directory.filePath(name);
        if (isQuickAction(name) || (isEventsWidgets(name) && QFileInfo(file).isFile())) {
            files.append(file);
        }
    }
    return files;
}
