// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef CATALOGTABLE_H
#define CATALOGTABLE_H

#include <QHash>
#include <QSet>
#include <QString>

class QObject;
class QTranslator;

/*
    The translation catalogs that a model's definition files name. Each is installed in the application
    for as long as a definition uses it. The catalogs are in /usr/share/translations.

    A translator is asked before those that were installed earlier. Definitions loaded later therefore
    win over earlier ones, and all of them over the catalog of the settings pages. A catalog keeps the
    language that was current when its first user was added.
*/
class CatalogTable
{
public:
    // The translators become children of the owner, which must outlive the table.
    explicit CatalogTable(QObject *owner);
    ~CatalogTable();
    Q_DISABLE_COPY_MOVE(CatalogTable)

    // Each catalog has two translators: engineering English, and above it the language of the default
    // locale. A definition without a catalog name uses none.
    void addDefinition(const QString &user, const QString &catalog);
    void removeDefinition(const QString &user, const QString &catalog);

    // Removes every translator from the application.
    void clear();

    // The text of an identifier in the installed catalogs; the identifier itself without one.
    static QString text(const QString &id);

private:
    struct Entry {
        QTranslator *translator;
        // A set, because one removal removes a user however often it was added.
        QSet<QString> users;
    };

    // Registers a user of one catalog and, for its first user, loads and installs the catalog. A prefix
    // separates the name from the default locale; without a prefix the file has just that name. A
    // file that does not exist counts like any other.
    void addCatalogTranslator(const QString &user, const QString &catalog, const QString &prefix);
    // Removes a user, however often it was added, and the translator with the last user.
    void removeCatalogTranslator(const QString &user, const QString &catalog);

    QObject *m_owner;
    QHash<QString, Entry> m_entries;
};

#endif
