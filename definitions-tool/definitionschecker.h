// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DEFINITIONSCHECKER_H
#define DEFINITIONSCHECKER_H

#include "finding.h"
#include "installedcatalogs.h"

#include <QHash>
#include <QSet>

/*
    What the checks of several files have in common, which is also what they may contradict each
    other in.
*/
struct CheckContext {
    struct Place {
        QString file;
        int line;
    };

    explicit CheckContext(const QString &root) : catalogs(root) { }

    InstalledCatalogs catalogs;
    // Whether it does not matter which catalogs are installed.
    bool ignoresCatalogs = false;
    // Where the widgets are defined that were met.
    QHash<QString, Place> widgets;
};

/*
    Finds what a model would pass over or misread in definition files, and what their authors will
    hardly have meant. What a file holds the models' own readers say.
*/
class DefinitionsChecker
{
public:
    // Catalogs and installed definitions are looked for below the root folder.
    explicit DefinitionsChecker(const QString &root);

    // For sources, whose catalogs are not compiled yet.
    void ignoreCatalogs() { m_context.ignoresCatalogs = true; }

    // A file, or all definition files in a folder; a name that is no definition file's is a finding.
    // What was checked is not checked again. False if there is nothing there.
    bool check(const QString &path);
    // The definitions that are installed below the root; false if it has no folder for any.
    bool checkInstalled();

    const std::vector<Finding> &findings() const { return m_findings; }

private:
    bool checkFolder(const QString &path);
    void checkFile(const QString &path);

    QString m_root;
    CheckContext m_context;
    QSet<QString> m_checked;
    std::vector<Finding> m_findings;
};

#endif
