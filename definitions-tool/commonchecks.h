// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef COMMONCHECKS_H
#define COMMONCHECKS_H

#include "definitionschecker.h"

/*
    What both kinds of definition files are checked for.
*/

// Says why a reader refused a file before it looked at what is in it; false if it did not.
bool reportUnreadable(const QString &path, qint64 maximumSize, QByteArray *content,
                      Findings *findings);

// Warns of a key that nobody reads, and names the known one that was meant if any is near.
void reportUnknownKey(const QString &what, const QString &name, const QStringList &known, int line,
                      Findings *findings);

// Warns of a catalog that is not installed, that lacks engineering English, or whose name is wrong.
void checkCatalog(const QString &catalog, int line, CheckContext *context, Findings *findings);

// Warns of a text that the catalog does not hold; no identifier or no catalog has none.
void checkTextId(const QString &id, const QString &catalog, int line, CheckContext *context,
                 Findings *findings);

// Warns of a picture that is found only from some folder: names and URLs are found from everywhere.
void checkIcon(const QString &icon, int line, Findings *findings);

#endif
