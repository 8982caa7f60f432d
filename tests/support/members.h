// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef MEMBERS_H
#define MEMBERS_H

#include <QMetaMethod>
#include <QMetaProperty>
#include <QVariant>

#include <functional>
#include <vector>

/*
    The members that a type of the module has besides those of QObject and QAbstractListModel, for use
    through the meta-object, as QML uses them.
*/
namespace Members {

std::vector<QMetaProperty> properties(const QObject &object);
std::vector<QMetaMethod> methods(const QObject &object);
std::vector<QMetaMethod> signalsOf(const QObject &object);

// Calls a method with a value for the type of each argument.
void call(QObject *object, const QMetaMethod &method,
          const std::function<QVariant(int type)> &anyValue);

} // namespace Members

#endif
