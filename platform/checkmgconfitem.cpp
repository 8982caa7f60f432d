// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Compiles if a device's MGConfItem has what the module needs. docs/devices.md lists the same members.
#include "requiremember.h"

#if __has_include(<mgconfitem.h>)
#include <mgconfitem.h>
#else
#error "the package lacks the header mgconfitem.h"
#endif

#include <QObject>
#include <QString>
#include <QStringList>
#include <QVariant>

REQUIRE_MEMBER(MGConfItem, "the base class QObject", static_cast<QObject &>(object));
REQUIRE_MEMBER(MGConfItem, "the constructor MGConfItem(const QString &key)",
               Of<decltype(object)>(QString()));
REQUIRE_MEMBER(MGConfItem, "QVariant value() const",
               static_cast<const Of<decltype(object)> &>(object).value().toStringList());
REQUIRE_MEMBER(MGConfItem, "void set(const QVariant &value)", object.set(QVariant(QStringList())));
REQUIRE_MEMBER(MGConfItem, "the signal valueChanged()",
               QObject::connect(&object, &Of<decltype(object)>::valueChanged, &object,
                                &QObject::deleteLater));
