// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "installedcatalogs.h"

#include "translations/catalogfiles.h"

#include <QDir>
#include <QTranslator>

#include <algorithm>

namespace {

const QLatin1String suffix(".qm");

} // namespace

InstalledCatalogs::InstalledCatalogs(const QString &root)
    : m_directory(QDir::cleanPath(root + CatalogFiles::directory))
{
    m_fileNames = QDir(m_directory).entryList(QDir::Files);
}

InstalledCatalogs::~InstalledCatalogs() = default;

bool InstalledCatalogs::hasEngineeringEnglish(const QString &catalog)
{
    return find(catalog).hasEngineeringEnglish;
}

QStringList InstalledCatalogs::languages(const QString &catalog)
{
    return find(catalog).languages;
}

bool InstalledCatalogs::holds(const QString &catalog, const QString &id)
{
    const auto &translators = find(catalog).translators;
    const QByteArray key = id.toUtf8();
    return std::any_of(translators.cbegin(), translators.cend(), [&key](const auto &translator) {
        return !translator->translate(nullptr, key.constData()).isNull();
    });
}

const InstalledCatalogs::Catalog &InstalledCatalogs::find(const QString &catalog)
{
    const auto known = m_catalogs.constFind(catalog);
    if (known != m_catalogs.constEnd()) {
        return *known;
    }
    Catalog found;
    // Loaded as the models load it: Qt also accepts files with shorter names.
    found.hasEngineeringEnglish = load(&found, catalog + CatalogFiles::engineeringEnglishSuffix);
    const QString prefix = catalog + CatalogFiles::localePrefix;
    for (const QString &fileName : qAsConst(m_fileNames)) {
        if (fileName.startsWith(prefix) && fileName.endsWith(suffix) && load(&found, fileName)) {
            found.languages.append(
                fileName.mid(prefix.size(), fileName.size() - prefix.size() - suffix.size()));
        }
    }
    return *m_catalogs.insert(catalog, found);
}

bool InstalledCatalogs::load(Catalog *catalog, const QString &fileName) const
{
    auto translator = std::make_shared<QTranslator>();
    if (!translator->load(fileName, m_directory)) {
        return false;
    }
    catalog->translators.push_back(std::move(translator));
    return true;
}
