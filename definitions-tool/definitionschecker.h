// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DEFINITIONSCHECKER_H
#define DEFINITIONSCHECKER_H

#include "finding.h"
#include "installedcatalogs.h"

#include <QHash>
#include <QSet>

/*
    What the checks of several files share.
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
    // The widgets of the files checked so far.
    QHash<QString, Place> widgets;
};

/*
    Finds what a model ignores or misreads in definition files, and probable mistakes of their authors.
    The files are read by the readers of the models.
*/
class DefinitionsChecker
{
public:
    // Looks for catalogs and installed definitions below the root directory.
    explicit DefinitionsChecker(const QString &root);

    // For sources, whose catalogs are not compiled yet.
    void ignoreCatalogs() { m_context.ignoresCatalogs = true; }

    // A file, or all definition files in a directory; the name of any other file is
    // a finding. Checks each file once. False if the path does not exist.
    bool check(const QString &path);
    // The definitions that are installed below the root; false if it has no directory for any.
    bool checkInstalled();

    const std::vector<Finding> &findings() const { return m_findings; }

private:
    bool checkDirectory(const QString &path);
    void checkFile(const QString &path);

    QString m_root;
    CheckContext m_context;
    QSet<QString> m_checked;
    std::vector<Finding> m_findings;
};

#endif
