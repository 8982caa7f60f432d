// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef INSTALLEDCATALOGS_H
#define INSTALLEDCATALOGS_H

#include <QHash>
#include <QString>
#include <QStringList>

#include <memory>
#include <vector>

class QTranslator;

/*
    The translation catalogs of a system, their languages and the text identifiers that they hold.
*/
class InstalledCatalogs
{
public:
    // Finds the catalogs below a root directory.
    explicit InstalledCatalogs(const QString &root);
    ~InstalledCatalogs();
    Q_DISABLE_COPY_MOVE(InstalledCatalogs)

    QString directory() const { return m_directory; }

    bool hasEngineeringEnglish(const QString &catalog);
    // As in file names: "fi" or "pt_BR".
    QStringList languages(const QString &catalog);
    // Whether the catalog has a text for the identifier in any language.
    bool holds(const QString &catalog, const QString &id);

private:
    struct Catalog {
        bool hasEngineeringEnglish = false;
        QStringList languages;
        std::vector<std::shared_ptr<QTranslator>> translators;
    };

    const Catalog &find(const QString &catalog);
    bool load(Catalog *catalog, const QString &fileName) const;

    QString m_directory;
    QStringList m_fileNames;
    QHash<QString, Catalog> m_catalogs;
};

#endif
