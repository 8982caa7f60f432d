// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "definitionschecker.h"

#include "definitionfiles.h"
#include "eventswidgets/eventswidgetsfile.h"
#include "eventswidgetscheck.h"
#include "quickactioncheck.h"
#include "quickactions/quickaction.h"
#include "rules.h"

#include <QDir>
#include <QDirIterator>
#include <QFileInfo>

#include <algorithm>
#include <iterator>

DefinitionsChecker::DefinitionsChecker(const QString &root) : m_context(root)
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
    m_context.isInstalled = true;
    const bool hasQuickActions = checkInstalledDirectory(QuickAction::directory, isQuickAction);
    const bool hasEventsWidgets =
        checkInstalledDirectory(EventsWidgetsFile::directory, isEventsWidgets);
    return hasQuickActions || hasEventsWidgets;
}

bool DefinitionsChecker::checkInstalledDirectory(QLatin1String directory,
                                                 bool (*isDefinition)(const QString &))
{
    const QString path = QDir::cleanPath(m_context.root + directory);
    QStringList misplaced;
    QDirIterator files(path, QDir::Files, QDirIterator::Subdirectories);
    while (files.hasNext()) {
        const QString file = files.next();
        const bool isRead = files.fileInfo().path() == path && isDefinition(file);
        if (!isRead
            && (DefinitionFiles::isQuickAction(file) || DefinitionFiles::isEventsWidgets(file))) {
            misplaced.append(file);
        }
    }
    misplaced.sort();
    for (const QString &file : qAsConst(misplaced)) {
        Findings findings(file);
        findings.add(1, Finding::Severity::Error, Rule::place,
                     QStringLiteral("no model reads the file here; *.conf belongs in %1, *.json in "
                                    "%2, and neither in a directory below")
                         .arg(QuickAction::directory, EventsWidgetsFile::directory));
        addFindings(findings.take());
    }
    return checkDirectory(path);
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
    if (m_context.isInstalled && !QFileInfo(path).permission(QFile::ReadOther)) {
        findings.add(1, Finding::Severity::Error, Rule::permissions,
                     QStringLiteral("not every user can read this file"));
    }
    if (DefinitionFiles::isQuickAction(path)) {
        checkQuickAction(path, &m_context, &findings);
    } else if (DefinitionFiles::isEventsWidgets(path)) {
        checkEventsWidgets(path, &m_context, &findings);
    } else {
        findings.add(1, Finding::Severity::Error, Rule::fileName,
                     QStringLiteral("the name ends neither in \".conf\" nor in \".json\": no model "
                                    "reads the file"));
    }
    addFindings(findings.take());
    addFindings(m_context.catalogs.takeFindings());
}

void DefinitionsChecker::addFindings(std::vector<Finding> findings)
{
    std::move(findings.begin(), findings.end(), std::back_inserter(m_findings));
}
