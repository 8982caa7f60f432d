// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef NAIVECATALOGS_H
#define NAIVECATALOGS_H

#include "texts.h"

#include <QHash>
#include <QLocale>
#include <QStringList>
#include <QTranslator>

#include <memory>
#include <vector>

/*
    Looks up a text in a model's catalogs without installing them. For this it keeps the list of
    translators as the application would.
*/
class NaiveCatalogs
{
public:
    void add(const QString &user, const QString &catalog)
    {
        if (!catalog.isEmpty()) {
            addOne(user, catalog + "_eng_en"_s, QString());
            addOne(user, catalog, "-"_s);
        }
    }
    void remove(const QString &user, const QString &catalog)
    {
        if (!catalog.isEmpty()) {
            removeOne(user, catalog + "_eng_en"_s);
            removeOne(user, catalog);
        }
    }

    QString text(const QString &id) const
    {
        for (auto it = m_installed.rbegin(); it != m_installed.rend(); ++it) {
            const QString text = it->translator->translate(nullptr, id.toLocal8Bit().constData());
            if (!text.isEmpty()) {
                return text;
            }
        }
        return id;
    }

private:
    struct Entry {
        QString catalog;
        QStringList users;
        std::shared_ptr<QTranslator> translator;
    };

    void addOne(const QString &user, const QString &catalog, const QString &prefix)
    {
        for (Entry &entry : m_installed) {
            if (entry.catalog == catalog) {
                entry.users.append(user);
                return;
            }
        }
        const QString directory = "/usr/share/translations"_s;
        Entry entry{catalog, {user}, std::make_shared<QTranslator>()};
        if (prefix.isEmpty()) {
            static_cast<void>(entry.translator->load(catalog, directory));
        } else {
            static_cast<void>(entry.translator->load(QLocale(), catalog, prefix, directory));
        }
        m_installed.push_back(entry);
    }
    void removeOne(const QString &user, const QString &catalog)
    {
        for (auto entry = m_installed.begin(); entry != m_installed.end(); ++entry) {
            if (entry->catalog == catalog) {
                entry->users.removeAll(user);
                if (entry->users.isEmpty()) {
                    m_installed.erase(entry);
                }
                return;
            }
        }
    }

    // The application asks the last one first.
    std::vector<Entry> m_installed;
};

#endif
