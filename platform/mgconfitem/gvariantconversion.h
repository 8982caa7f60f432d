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

// The value as dconf stores it: a boolean, an integer, a string, a string list, or a map of these.
// Null, with a reason, for any other type and for text that is not Unicode or contains a NUL.
GVariantPtr toGVariant(const QVariant &value, QString *reason);

// The value as a QVariant, which is invalid only if the data is damaged. An array of strings
// becomes a QStringList, and a dictionary with strings as keys becomes a QVariantMap. A variant is
// replaced by its content. All other containers become a QVariantList. A value of an unknown type
// becomes an empty QVariantList.
QVariant toQVariant(GVariant *value);

// The same value, marked as trusted; null if it is damaged. GLib needs half a minute to read a list
// of 100,000 elements that is not marked.
GVariantPtr verified(GVariant *value);

#endif
