// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "stageplugin.h"

#include "messages.h"
#include "stage.h"
#include "stagedcard.h"
#include "stagedfiles.h"

#include <QQmlEngine>

void StagePlugin::registerTypes(const char *uri)
{
    qmlRegisterSingletonType<Stage>(
        uri, 1, 0, "Stage",
        [](QQmlEngine *engine, QJSEngine *) -> QObject * { return new Stage(engine); });
    qmlRegisterSingletonType<StagedCard>(
        uri, 1, 0, "StagedCard",
        [](QQmlEngine *, QJSEngine *) -> QObject * { return new StagedCard; });
    qmlRegisterSingletonType<Messages>(
        uri, 1, 0, "Messages", [](QQmlEngine *, QJSEngine *) -> QObject * { return new Messages; });
    qmlRegisterType<StagedFiles>(uri, 1, 0, "StagedFiles");
}
