// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "definitionfiles.h"

#include "eventswidgets/eventswidgetsfile.h"
#include "quickactions/quickaction.h"

#include <QDir>
#include <QFileInfo>

bool DefinitionFiles::isQuickAction(const QString &path)
{
    return QDir::match(QuickAction::nameFilter, QFileInfo(path).fileName());
}

bool DefinitionFiles::isEventsWidgets(const QString &path)
{
    return QDir::match(EventsWidgetsFile::nameFilter, QFileInfo(path).fileName());
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
