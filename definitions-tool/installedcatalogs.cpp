// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "installedcatalogs.h"

#include "files/literals.h"
#include "rules.h"
#include "translations/catalogfiles.h"

#include <QDir>
#include <QFileInfo>
#include <QLocale>

#include <algorithm>
#include <utility>

using Severity = Finding::Severity;

namespace {

using CatalogFiles::suffix;

// All names under which Qt looks for the catalogs of a locale.
QStringList fileNames(const QLocale &locale)
{
    QStringList names;
    const QStringList fullNames = CatalogFiles::localeNames(locale);
    for (QString name : fullNames) {
        for (; !name.isEmpty(); name.truncate(qMax(0, name.lastIndexOf(QLatin1Char('_'))))) {
            names.append(name);
        }
    }
    return names;
}

// Returns the right name of a file whose name differs from that of a file of the catalog only in case
// or separators. Returns an empty text for other files.
QString similarName(const QString &fileName, const QString &catalog)
{
    const QString end = fileName.mid(catalog.size()).chopped(suffix.size());
    if (end.isEmpty() || !QStringLiteral("-_.").contains(end.at(0))) {
        return {};
    }
    const QString name = end.mid(1).replace(QLatin1Char('-'), QLatin1Char('_'));
    if (name.compare(CatalogFiles::engineeringEnglishSuffix.mid(1), Qt::CaseInsensitive) == 0) {
        return catalog + CatalogFiles::engineeringEnglishSuffix + suffix;
    }
    const QLocale locale(name);
    if (locale.language() == QLocale::C || name.endsWith(CatalogFiles::engineeringEnglishSuffix)) {
        return {};
    }
    const QStringList names = fileNames(locale);
    return catalog + CatalogFiles::localePrefix + (names.contains(name) ? name : names.constFirst())
        + suffix;
}

} // namespace

QString InstalledCatalogs::Language::text(const QString &id) const
{
    return translator->translate(nullptr, id.toUtf8().constData());
}

bool InstalledCatalogs::Catalog::holds(const QString &id) const
{
    return std::any_of(languages.cbegin(), languages.cend(),
                       [&id](const Language &language) { return !language.text(id).isNull(); });
}

InstalledCatalogs::InstalledCatalogs(const QString &root)
    : m_directory(QDir::cleanPath(root + CatalogFiles::systemDirectory))
{
    m_fileNames = QDir(m_directory).entryList(QDir::Files);
}

const InstalledCatalogs::Catalog &InstalledCatalogs::find(const QString &catalog)
{
    const auto known = m_catalogs.constFind(catalog);
    if (known != m_catalogs.constEnd()) {
        return *known;
    }
    Catalog found;
    // Qt also accepts files with shorter names.
    const QString engineeringEnglish = CatalogFiles::findEngineeringEnglish(catalog, m_directory);
    if (!engineeringEnglish.isEmpty()) {
        addLanguage(&found, {}, engineeringEnglish);
        found.hasEngineeringEnglish = found.isInstalled();
    }
    for (const QString &fileName : qAsConst(m_fileNames)) {
        if (!fileName.startsWith(catalog, Qt::CaseInsensitive)
            || !fileName.endsWith(suffix, Qt::CaseInsensitive)) {
            continue;
        }
        const QString path = m_directory + QLatin1Char('/') + fileName;
        const QString rightName = similarName(fileName, catalog);
        if (fileName == rightName) {
            if (!QFileInfo(path).permission(QFile::ReadOther)) {
                addFinding(path, Severity::Error, Rule::permissions,
                           QStringLiteral("not every user can read this file"));
            }
            if (path != engineeringEnglish) {
                const int start = catalog.size() + CatalogFiles::localePrefix.size();
                addLanguage(&found, fileName.mid(start).chopped(suffix.size()), path);
            }
        } else if (!rightName.isEmpty()) {
            addFinding(path, Severity::Warning, Rule::catalog,
                       QStringLiteral("no model loads a file of this name; is %1 meant?")
                           .arg(quoted(rightName)));
        }
    }
    return *m_catalogs.insert(catalog, found);
}

std::vector<Finding> InstalledCatalogs::takeFindings()
{
    return std::exchange(m_findings, {});
}

void InstalledCatalogs::addLanguage(Catalog *catalog, const QString &name, const QString &path)
{
    auto translator = std::make_shared<CheckedTranslator>();
    const QString refusal = translator->loadFile(path);
    if (refusal.isEmpty()) {
        catalog->languages.push_back({name, QFileInfo(path).fileName(), std::move(translator)});
    } else {
        addFinding(path, Severity::Error, Rule::catalog,
                   QStringLiteral("the catalog is not used: %1").arg(refusal));
    }
}

void InstalledCatalogs::addFinding(const QString &path, Severity severity, QLatin1String rule,
                                   const QString &text)
{
    Findings findings(path);
    findings.add(1, severity, rule, text);
    m_findings.push_back(findings.take().front());
}
