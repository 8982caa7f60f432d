// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "members.h"

#include <QAbstractListModel>

#include <array>

namespace {

const QMetaObject &base(const QObject &object)
{
    return qobject_cast<const QAbstractListModel *>(&object) != nullptr
        ? QAbstractListModel::staticMetaObject
        : QObject::staticMetaObject;
}

std::vector<QMetaMethod> select(const QObject &object, bool areSignals)
{
    const QMetaObject *meta = object.metaObject();
    std::vector<QMetaMethod> methods;
    for (int i = base(object).methodCount(); i < meta->methodCount(); ++i) {
        const QMetaMethod method = meta->method(i);
        if ((method.methodType() == QMetaMethod::Signal) == areSignals
            && method.access() == QMetaMethod::Public) {
            methods.push_back(method);
        }
    }
    return methods;
}

} // namespace

std::vector<QMetaProperty> Members::properties(const QObject &object)
{
    const QMetaObject *meta = object.metaObject();
    std::vector<QMetaProperty> properties;
    for (int i = base(object).propertyCount(); i < meta->propertyCount(); ++i) {
        properties.push_back(meta->property(i));
    }
    return properties;
}

std::vector<QMetaMethod> Members::methods(const QObject &object)
{
    return select(object, false);
}

std::vector<QMetaMethod> Members::signalsOf(const QObject &object)
{
    return select(object, true);
}

void Members::call(QObject *object, const QMetaMethod &method,
                   const std::function<QVariant(int type)> &anyValue)
{
    std::array<QVariant, 3> values;
    std::array<QGenericArgument, 3> arguments;
    const QList<QByteArray> types = method.parameterTypes();
    for (int i = 0; i < types.size(); ++i) {
        QVariant &value = values.at(size_t(i));
        value = anyValue(method.parameterType(i));
        if (!value.convert(method.parameterType(i))) {
            qFatal("no argument for %s", method.methodSignature().constData());
        }
        arguments.at(size_t(i)) = QGenericArgument(types.at(i).constData(), value.constData());
    }
    if (!method.invoke(object, Qt::DirectConnection, arguments[0], arguments[1], arguments[2])) {
        qFatal("cannot call %s", method.methodSignature().constData());
    }
}
