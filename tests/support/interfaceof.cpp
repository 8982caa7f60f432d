// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "interfaceof.h"

#include <QMetaMethod>
#include <QMetaObject>
#include <QMetaProperty>

QStringList interfaceOf(const QMetaObject &type)
{
    QStringList lines;
    for (int i = type.propertyOffset(); i < type.propertyCount(); ++i) {
        const QMetaProperty property = type.property(i);
        QByteArray line = property.typeName() + QByteArray(" ") + property.name();
        line += property.isWritable() ? "" : " readonly";
        line += property.isConstant() ? " constant" : "";
        if (property.hasNotifySignal()) {
            line += ' ' + property.notifySignal().methodSignature();
        }
        lines.append(QString::fromLatin1(line));
    }
    for (int i = type.methodOffset(); i < type.methodCount(); ++i) {
        const QMetaMethod method = type.method(i);
        QByteArray line = method.access() == QMetaMethod::Private ? "private " : "";
        line += method.methodType() == QMetaMethod::Signal ? "signal " : "";
        line += method.typeName() + QByteArray(" ") + method.methodSignature();
        lines.append(QString::fromLatin1(line));
    }
    return lines;
}
