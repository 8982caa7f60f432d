// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "catalogtable.h"

#include "catalogfiles.h"
#include "checkedtranslator.h"

#include <QCoreApplication>
#include <QLocale>
#include <QtDebug>

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
    if (catalog.isEmpty()) {
        return;
    }
    if (!isCatalogName(catalog)) {
        if (!m_refused.contains(catalog)) {
            m_refused.insert(catalog);
            qWarning() << "The translation catalog" << catalog << "of" << user
                       << "is not used: its name leads out of" << QString(systemDirectory);
        }
        return;
    }
    add(user, catalog + engineeringEnglishSuffix,
        [&catalog] { return findEngineeringEnglish(catalog); });
    add(user, catalog, [&catalog] { return findLanguage(catalog, QLocale()); });
}

void CatalogTable::removeDefinition(const QString &user, const QString &catalog)
{
    remove(user, catalog + engineeringEnglishSuffix);
    remove(user, catalog);
}

template<typename Find>
void CatalogTable::add(const QString &user, const QString &key, Find findFile)
{
    const auto known = m_entries.find(key);
    if (known != m_entries.end()) {
        known->users.insert(user);
        return;
    }

    auto *translator = new CheckedTranslator(m_owner);
    m_entries.insert(key, {translator, {user}});
    translator->loadFileIfFound(findFile());
    // Last, because handlers of the language change may call back.
    QCoreApplication::installTranslator(translator);
}

void CatalogTable::remove(const QString &user, const QString &key)
{
    const auto known = m_entries.find(key);
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
