// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef LISTING_H
#define LISTING_H

#include <QString>

/*
    What the models list on this machine, as text for a terminal.
*/

// The rows of either model in its order, with the state that dconf gives them.
QString listDefinitions();

// For each catalog that an installed definition names, the files that a model loads: of engineering
// English, for the current locale, and for every language that is there.
QString listCatalogs();

#endif
