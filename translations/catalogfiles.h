// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef CATALOGFILES_H
#define CATALOGFILES_H

#include <QLatin1String>

// The directory of the translation catalogs and the names of their files: a catalog "maps" has
// maps_eng_en.qm for engineering English, and a file such as maps-fi.qm for each language.
namespace CatalogFiles {

const QLatin1String directory("/usr/share/translations");
const QLatin1String engineeringEnglishSuffix("_eng_en");
const QLatin1String localePrefix("-");

} // namespace CatalogFiles

#endif
