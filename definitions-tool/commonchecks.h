// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef COMMONCHECKS_H
#define COMMONCHECKS_H

#include "definitionschecker.h"

/*
    Checks that both kinds of definition files share.
*/

// Reports why a reader refused a file before it looked at the content. If the file can be read,
// returns false and sets the content.
bool reportUnreadable(const QString &path, qint64 maximumSize, QByteArray *content,
                      Findings *findings);

// Warns of a key that no model reads, and suggests the most similar known one.
void reportUnknownKey(const QString &what, const QString &name, const QStringList &known, int line,
                      Findings *findings);

// Warns of a catalog that is not installed, that lacks engineering English, or whose name is wrong.
void checkCatalog(const QString &catalog, int line, CheckContext *context, Findings *findings);

struct TextId {
    QString id; // May be empty.
    int line;
};

// Warns of texts that the catalog lacks in every language. Adds a note, in the line of the catalog,
// for each language that lacks some of the texts.
void checkTextIds(const std::vector<TextId> &ids, const QString &catalog, int line,
                  CheckContext *context, Findings *findings);

// Returns the scheme in lower case, or an empty text if the text is not a URL.
QString schemeOf(const QString &text);

// Warns of an absolute path or a URL that cannot be loaded. The schemes are those that can.
void checkLocation(const QString &what, const QString &location, const QStringList &schemes,
                   int line, CheckContext *context, Findings *findings);

// Warns of an icon that is a relative path or cannot be loaded.
void checkIcon(const QString &icon, int line, CheckContext *context, Findings *findings);

#endif
