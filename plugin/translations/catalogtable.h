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
    The translation catalogs that a model's definition files name, each installed in the application
    for as long as a definition uses it. The catalogs lie in /usr/share/translations.

    A translator is asked before those that were installed earlier: definitions loaded later win
    over earlier ones, and all of them over the settings pages' own catalog. A catalog keeps the
    language that was current when its first user was added.
*/
class CatalogTable
{
public:
    // The translators become children of owner, which has to outlive the table.
    explicit CatalogTable(QObject *owner);
    ~CatalogTable();
    Q_DISABLE_COPY_MOVE(CatalogTable)

    // The catalog of a definition is two translators: engineering English below the language of the
    // default locale. No name, no catalog.
    void addDefinition(const QString &user, const QString &catalog);
    void removeDefinition(const QString &user, const QString &catalog);

    // Removes every translator from the application.
    void clear();

    // The text of an identifier in the installed catalogs; the identifier itself without one.
    static QString text(const QString &id);

private:
    struct Entry {
        QTranslator *translator;
        // One removal takes a user out however often it was added, so once is enough to know.
        QSet<QString> users;
    };

    // Registers a user of one catalog file and, for its first user, loads and installs it: for the
    // default locale if there is a prefix (what stands between the name and the locale), else the
    // file of just that name. A file that does not exist counts like any other.
    void addCatalogTranslator(const QString &user, const QString &catalog, const QString &prefix);
    // Takes out a user, however often it was added, and with the last one the translator.
    void removeCatalogTranslator(const QString &user, const QString &catalog);

    QObject *m_owner;
    QHash<QString, Entry> m_entries;
};

#endif
