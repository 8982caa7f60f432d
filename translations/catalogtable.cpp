// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "catalogtable.h"

#include "catalogfiles.h"

#include <QCoreApplication>
#include <QLocale>
#include <QTranslator>

using namespace CatalogFiles;

CatalogTable::CatalogTable(QObject *owner) : m_owner(owner)
{
}

CatalogTable::~CatalogTable()
{
    clear();
}

void CatalogTable::addDefinition(const QString &user, const QString &catalog)
{
    if (!catalog.isEmpty()) {
        addCatalogTranslator(user, catalog + engineeringEnglishSuffix, QString());
        addCatalogTranslator(user, catalog, localePrefix);
    }
}

void CatalogTable::removeDefinition(const QString &user, const QString &catalog)
{
    if (!catalog.isEmpty()) {
        removeCatalogTranslator(user, catalog + engineeringEnglishSuffix);
        removeCatalogTranslator(user, catalog);
    }
}

void CatalogTable::addCatalogTranslator(const QString &user, const QString &catalog,
                                        const QString &prefix)
{
    const auto known = m_entries.find(catalog);
    if (known != m_entries.end()) {
        known->users.insert(user);
        return;
    }

    auto *translator = new QTranslator(m_owner);
    m_entries.insert(catalog, {translator, {user}});
    if (prefix.isEmpty()) {
        static_cast<void>(translator->load(catalog, directory));
    } else {
        static_cast<void>(translator->load(QLocale(), catalog, prefix, directory));
    }
    // Last, because handlers of the language change may call back.
    QCoreApplication::installTranslator(translator);
}

void CatalogTable::removeCatalogTranslator(const QString &user, const QString &catalog)
{
    const auto known = m_entries.find(catalog);
    if (known == m_entries.end()) {
        return;
    }
    known->users.remove(user);
    if (known->users.isEmpty()) {
        // The translator is not deleted before its owner, because this may run in a handler of the
        // language change that it caused.
        QTranslator *translator = known->translator;
        m_entries.erase(known);
        QCoreApplication::removeTranslator(translator);
    }
}

void CatalogTable::clear()
{
    QHash<QString, Entry> entries;
    entries.swap(m_entries);
    for (const Entry &entry : qAsConst(entries)) {
        QCoreApplication::removeTranslator(entry.translator);
    }
}

QString CatalogTable::text(const QString &id)
{
    return qtTrId(id.toLocal8Bit().constData());
}
