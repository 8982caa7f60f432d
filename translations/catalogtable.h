// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef CATALOGTABLE_H
#define CATALOGTABLE_H

#include <QHash>
#include <QSet>
#include <QString>

class QObject;
class QTranslator;

// The translation catalogs that a model's definition files name, installed in the application for
// as long as a definition uses them. A catalog keeps the language of the moment when its first user
// was added.
class CatalogTable
{
public:
    // The translators become children of the owner, which must outlive the table.
    explicit CatalogTable(QObject *owner);
    ~CatalogTable();
    Q_DISABLE_COPY_MOVE(CatalogTable)

    // Each catalog has two translators: engineering English, and above it the language of the
    // default locale. A definition without a catalog name uses none, and so does one with a name
    // that leads out of the directory of catalogs, with one warning for each name.
    void addDefinition(const QString &user, const QString &catalog);
    void removeDefinition(const QString &user, const QString &catalog);

    // Removes every translator from the application.
    void clear();

    // The identifier itself if no installed catalog has a text.
    static QString text(const QString &id);

private:
    struct Entry {
        QTranslator *translator;
        // A set: one removal removes a user however often it was added.
        QSet<QString> users;
    };

    // Loads and installs a catalog for its first user.
    template<typename Find> void add(const QString &user, const QString &key, Find findFile);
    // Removes the translator with the last user.
    void remove(const QString &user, const QString &key);

    QObject *m_owner;
    QHash<QString, Entry> m_entries;
    QSet<QString> m_refused; // names that a warning has named
};

#endif
