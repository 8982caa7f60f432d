// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "moduletypes.h"
#include "texts.h"

#include <QFile>
#include <QRegularExpression>
#include <QStringList>

namespace {

std::vector<ModuleType> readTypes()
{
    QFile file(QLatin1String(QMLTYPES_FILE));
    if (!file.open(QIODevice::ReadOnly)) {
        qFatal("cannot open %s", qPrintable(file.fileName()));
    }
    static const QRegularExpression className("^\\s*name: \"(\\w+)\""_s);
    static const QRegularExpression exported("exports: \\[\"[\\w.]+/(\\w+) "_s);
    std::vector<ModuleType> types;
    const QStringList components = QString::fromUtf8(file.readAll()).split("\n    Component {"_s);
    for (const QString &component : components) {
        const QRegularExpressionMatch match = exported.match(component);
        if (match.hasMatch()) {
            types.push_back({match.captured(1), className.match(component).captured(1).toLatin1(),
                             component.contains(QLatin1String("isSingleton: true"))});
        }
    }
    if (types.empty()) {
        qFatal("no type in %s", qPrintable(file.fileName()));
    }
    return types;
}

} // namespace

const std::vector<ModuleType> &ModuleType::all()
{
    static const std::vector<ModuleType> types = readTypes();
    return types;
}
