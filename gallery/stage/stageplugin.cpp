// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "stageplugin.h"

#include "stage.h"

#include <QQmlEngine>

void StagePlugin::registerTypes(const char *uri)
{
    qmlRegisterSingletonType<Stage>(
        uri, 1, 0, "Stage",
        [](QQmlEngine *engine, QJSEngine *) -> QObject * { return new Stage(engine); });
}
