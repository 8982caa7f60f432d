// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "catalogfiles.h"

#include <QFileInfo>
#include <QLocale>
#include <QStringList>

namespace {

bool isReadableFile(const QString &path)
{
    const QFileInfo file(path);
    return file.isReadable() && file.isFile();
}

// Tries the name with and without the suffix of catalogs, then without its last part, and so on.
QString findFile(const QString &base, QString name, const QString &separators)
{
    while (!name.isEmpty()) {
        for (QString path : {base + name + CatalogFiles::suffix, base + name}) {
            if (isReadableFile(path)) {
                return path;
            }
        }
        int end = 0;
        for (const QChar separator : separators) {
            end = qMax(end, name.lastIndexOf(separator));
        }
        name.truncate(end);
    }
    return {};
}

} // namespace

bool CatalogFiles::isCatalogName(const QString &name)
{
    return !name.isEmpty() && !name.contains(QLatin1Char('/')) && !name.contains(QChar::Null);
}

QString CatalogFiles::findEngineeringEnglish(const QString &catalog, const QString &directory)
{
    return findFile(directory + QLatin1Char('/'), catalog + engineeringEnglishSuffix,
                    QStringLiteral("_."));
}

QString CatalogFiles::findLanguage(const QString &catalog, const QLocale &locale,
                                   const QString &directory)
{
    const QString catalogPath = directory + QLatin1Char('/') + catalog;
    const QStringList names = localeNames(locale);
    for (const QString &name : names) {
        QString path = findFile(catalogPath + localePrefix, name, QStringLiteral("_"));
        if (!path.isEmpty()) {
            return path;
        }
    }
    for (QString path : {catalogPath + localePrefix, catalogPath}) {
        if (isReadableFile(path)) {
            return path;
        }
    }
    return {};
}

QStringList CatalogFiles::localeNames(const QLocale &locale)
{
    QStringList names;
    const QStringList languages = locale.uiLanguages();
    for (QString name : languages) {
        name.replace(QLatin1Char('-'), QLatin1Char('_'));
        names.append(name);
        if (name.toLower() != name) {
            names.append(name.toLower());
        }
    }
    return names;
}
