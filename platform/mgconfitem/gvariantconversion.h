// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef GVARIANTCONVERSION_H
#define GVARIANTCONVERSION_H

#include <QVariant>
#include <memory>

class QString;
using GVariant = struct _GVariant; // NOLINT(bugprone-reserved-identifier): as GLib declares it

struct GVariantUnref {
    void operator()(GVariant *value) const;
};
using GVariantPtr = std::unique_ptr<GVariant, GVariantUnref>;

/*
    The value as the settings database holds it: bool, int, uint, 64 bit integers, floating point
    numbers, strings, string lists, and lists and maps of these. Null, with a reason, for a value
    of any other type, text that is no Unicode or holds a NUL, and nesting beyond 32 levels.
*/
GVariantPtr toGVariant(const QVariant &value, QString *reason);

/*
    The value as Qt holds it, whatever its type; invalid if the data is damaged.

    Small integers become int or uint. An array becomes a QVariantList, but an array of strings a
    QStringList and one of bytes a QByteArray with every byte it has. A dictionary becomes a
    QVariantMap whatever its keys: numbers and booleans stand there as their text. A tuple becomes
    a QVariantList; a variant or a maybe what it holds, and an empty maybe an invalid value.
*/
QVariant toQVariant(GVariant *value);

/*
    The same value, known to GLib to be undamaged; null if it is damaged. Of data that it does not
    trust, GLib checks for each element of an array all those before it: to look through a list of
    100,000 would hold up the main thread for half a minute.
*/
GVariantPtr trusted(GVariant *value);

#endif
