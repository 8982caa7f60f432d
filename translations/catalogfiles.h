// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef CATALOGFILES_H
#define CATALOGFILES_H

#include "files/literals.h"

#include <QStringList>

class QLocale;

// The directory of the translation catalogs and the names of their files: a catalog "maps" has
// maps_eng_en.qm for engineering English, and a file such as maps-fi.qm for each language.
namespace CatalogFiles {

constexpr QLatin1String systemDirectory = "/usr/share/translations"_L1;
constexpr QLatin1String engineeringEnglishSuffix = "_eng_en"_L1;
constexpr QLatin1String localePrefix = "-"_L1;
constexpr QLatin1String suffix = ".qm"_L1;

// Whether the name keeps the files of the catalog inside the directory.
bool isCatalogName(const QString &name);

// These return the path of the file that QTranslator::load() would choose, and an empty string if
// there is none. QTranslator would also parse the file, and thereby trust it.
QString findEngineeringEnglish(const QString &catalog,
                               const QString &directory = CatalogFiles::systemDirectory);
QString findLanguage(const QString &catalog, const QLocale &locale,
                     const QString &directory = CatalogFiles::systemDirectory);

// The names of a locale in file names. A name in lower case comes after the name itself.
QStringList localeNames(const QLocale &locale);

} // namespace CatalogFiles

#endif
