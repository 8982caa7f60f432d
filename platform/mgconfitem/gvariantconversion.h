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

// The value as dconf stores it: a boolean, a 32-bit integer, a string, a string list, or a map of
// these. Null, with a reason, for any other type and for text that is not Unicode or contains a NUL.
GVariantPtr toGVariant(const QVariant &value, QString *reason);

// The value as a QVariant, which is invalid only if the data is damaged. A dictionary with strings as
// keys becomes a QVariantMap, any other container a QVariantList. A variant is replaced by its
// content. A value of another type, which the module never stores, becomes an empty QVariantList.
QVariant toQVariant(GVariant *value);

#endif
