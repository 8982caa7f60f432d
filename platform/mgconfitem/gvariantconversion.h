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
    The value as the settings database holds it: a boolean, an integer, a string, a string list, or a
    map of these. Null, with a reason, for a value of any other type and for text that is not Unicode
    or contains a NUL.
*/
GVariantPtr toGVariant(const QVariant &value, QString *reason);

/*
    The value as Qt holds it; invalid only if the data is damaged, because any stored value may count
    as a choice.

    Small integers become int or uint. An array of strings becomes a QStringList, a dictionary with
    strings as keys a QVariantMap, and a variant what it contains. All other containers become a
    QVariantList, and all other values an empty one.
*/
QVariant toQVariant(GVariant *value);

/*
    The same value, marked as trusted; null if it is damaged. In data that it does not trust, GLib
    checks all previous elements of an array for each element: reading a list of 100,000 elements
    would block the main thread for half a minute.
*/
GVariantPtr trusted(GVariant *value);

#endif
