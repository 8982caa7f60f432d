// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef INTERFACEOF_H
#define INTERFACEOF_H

#include <QStringList>

struct QMetaObject;

/*
    What a type adds to its base class, in the order of its declaration: a property as
    "bool visible readonly constant" or "QString path pathChanged()", then signals and methods as
    "signal void pathChanged()", "private void update()" or "QString read(QString)".
*/
QStringList interfaceOf(const QMetaObject &type);

#endif
