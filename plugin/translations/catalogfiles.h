// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef CATALOGFILES_H
#define CATALOGFILES_H

#include <QLatin1String>

/*
    Where translation catalogs lie, and what their files are called: for a catalog "maps",
    maps_eng_en.qm with engineering English and maps-fi.qm and so on for the languages.
*/
namespace CatalogFiles {

const QLatin1String directory("/usr/share/translations");
const QLatin1String engineeringEnglishSuffix("_eng_en");
const QLatin1String localePrefix("-");

} // namespace CatalogFiles

#endif
