// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef LISTING_H
#define LISTING_H

#include <QString>

/*
    Text for a terminal: what the models list on this machine.
*/

// The rows of both models in their order, with their state from dconf.
QString listDefinitions();

// For each catalog that an installed definition names, the files that a model loads: for
// engineering English, for the current locale, and for each installed language.
QString listCatalogs();

#endif
