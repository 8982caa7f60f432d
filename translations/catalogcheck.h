// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef CATALOGCHECK_H
#define CATALOGCHECK_H

class QByteArray;
class QString;

// In a catalog that lrelease compressed, QTranslator may read this far beyond the end. Zeros must be
// there.
constexpr int catalogPadding = 256;

/*
    Returns why QTranslator must not read the content of a .qm file; empty if it may.

    QTranslator trusts the lengths and positions in a catalog and reads outside one that is damaged.
    A catalog that depends on others is refused, too, because QTranslator would load those files
    itself. Plural rules are left to QTranslator::load(), which checks them.
*/
QString whyUnusableCatalog(const QByteArray &content);

#endif
