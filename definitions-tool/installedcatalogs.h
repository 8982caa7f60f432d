// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef INSTALLEDCATALOGS_H
#define INSTALLEDCATALOGS_H

#include "finding.h"

#include "translations/checkedtranslator.h"

#include <QHash>
#include <QString>
#include <QStringList>

#include <memory>
#include <vector>

/*
    The translation catalogs of a system, their languages and the text identifiers that they hold.
*/
class InstalledCatalogs
{
public:
    struct Language {
        QString name; // As in file names: "fi" or "pt_BR".
        QString fileName;
        std::shared_ptr<CheckedTranslator> translator;

        QString text(const QString &id) const;
    };

    struct Catalog {
        bool hasEngineeringEnglish = false;
        // Engineering English comes first, and has no name.
        std::vector<Language> languages;

        bool isInstalled() const { return !languages.empty(); }
        // Whether the catalog has a text for the identifier in any language.
        bool holds(const QString &id) const;
    };

    // Finds the catalogs below a root directory.
    explicit InstalledCatalogs(const QString &root);

    QString directory() const { return m_directory; }
    // The name must not lead out of the directory.
    const Catalog &find(const QString &catalog);
    // Returns the findings about the files of all catalogs that find() has read since the last call.
    std::vector<Finding> takeFindings();

private:
    void addLanguage(Catalog *catalog, const QString &name, const QString &path);
    void addFinding(const QString &path, Finding::Severity severity, QLatin1String rule,
                    const QString &text);

    QString m_directory;
    QStringList m_fileNames;
    QHash<QString, Catalog> m_catalogs;
    std::vector<Finding> m_findings;
};

#endif
