// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DEFINITIONSCHECKER_H
#define DEFINITIONSCHECKER_H

#include "finding.h"
#include "installedcatalogs.h"

#include <QHash>
#include <QSet>

#include <utility>

/*
    State that the checks of all files share.
*/
struct CheckContext {
    struct Place {
        QString file;
        int line;
    };

    explicit CheckContext(QString directory) : root(std::move(directory)), catalogs(root) { }

    const QString root;
    InstalledCatalogs catalogs;
    // Whether the checks ignore which catalogs are installed.
    bool ignoresCatalogs = false;
    // Whether the definitions are installed below the root, so that the files that they name must
    // be there.
    bool isInstalled = false;
    // The widgets of the files checked so far.
    QHash<QString, Place> widgets;
};

/*
    Finds what a model ignores or misreads in definition files, and probable mistakes of their
    authors. It uses the models' own readers.
*/
class DefinitionsChecker
{
public:
    // Looks for catalogs and installed definitions below the root directory.
    explicit DefinitionsChecker(const QString &root);

    // For source trees, in which catalogs are not compiled yet.
    void ignoreCatalogs() { m_context.ignoresCatalogs = true; }

    // Checks a file, or all definition files in a directory, each file only once. A single file with
    // another suffix is an error. Returns false if the path does not exist.
    bool check(const QString &path);
    // Checks the definitions that are installed below the root. Returns false if the root contains
    // no directory for definitions. Later checks of files expect installed definitions, too.
    bool checkInstalled();

    const std::vector<Finding> &findings() const { return m_findings; }

private:
    bool checkDirectory(const QString &path);
    bool checkInstalledDirectory(QLatin1String directory, bool (*isDefinition)(const QString &));
    void checkFile(const QString &path);
    void addFindings(std::vector<Finding> findings);

    CheckContext m_context;
    QSet<QString> m_checked;
    std::vector<Finding> m_findings;
};

#endif
