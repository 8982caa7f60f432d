// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "definitionschecker.h"

#include "definitionfiles.h"
#include "eventswidgetscheck.h"
#include "quickactioncheck.h"

#include <QDir>
#include <QFileInfo>

DefinitionsChecker::DefinitionsChecker(const QString &root) : m_root(root), m_context(root)
{
}

bool DefinitionsChecker::check(const QString &path)
{
    const QFileInfo entry(path);
    // The model of quick actions lists a directory named *.conf like a file.
    if (entry.isDir() && !DefinitionFiles::isQuickAction(path)) {
        return checkDirectory(path);
    }
    if (entry.exists()) {
        checkFile(path);
    }
    return entry.exists();
}

bool DefinitionsChecker::checkInstalled()
{
    using namespace DefinitionFiles;
    const bool hasQuickActions = checkDirectory(QDir::cleanPath(m_root + quickActionsDirectory));
    const bool hasEventsWidgets = checkDirectory(QDir::cleanPath(m_root + eventsWidgetsDirectory));
    return hasQuickActions || hasEventsWidgets;
}

bool DefinitionsChecker::checkDirectory(const QString &path)
{
    if (!QFileInfo(path).isDir()) {
        return false;
    }
    const QStringList files = DefinitionFiles::inDirectory(path);
    for (const QString &file : files) {
        checkFile(file);
    }
    return true;
}

void DefinitionsChecker::checkFile(const QString &path)
{
    // A second check would report the file's widgets as duplicates. It would also miss errors,
    // because QSettings caches what it has read.
    const QString canonicalPath = QFileInfo(path).canonicalFilePath();
    if (m_checked.contains(canonicalPath)) {
        return;
    }
    m_checked.insert(canonicalPath);

    Findings findings(path);
    if (DefinitionFiles::isQuickAction(path)) {
        checkQuickAction(path, &m_context, &findings);
    } else if (DefinitionFiles::isEventsWidgets(path)) {
        checkEventsWidgets(path, &m_context, &findings);
    } else {
        findings.add(1, Finding::Severity::Error, QLatin1String("file-name"),
                     QStringLiteral("the name ends neither in \".conf\" nor in \".json\": no model "
                                    "reads the file"));
    }
    const std::vector<Finding> found = findings.take();
    m_findings.insert(m_findings.end(), found.cbegin(), found.cend());
}
