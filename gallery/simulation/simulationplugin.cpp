// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "simulationplugin.h"

#include "messages.h"
#include "simulatedcard.h"
#include "simulatedfiles.h"
#include "simulation.h"

#include <QQmlEngine>

void SimulationPlugin::registerTypes(const char *uri)
{
    qmlRegisterSingletonType<Simulation>(
        uri, 1, 0, "Simulation",
        [](QQmlEngine *engine, QJSEngine *) -> QObject * { return new Simulation(engine); });
    qmlRegisterSingletonType<SimulatedCard>(
        uri, 1, 0, "SimulatedCard",
        [](QQmlEngine *, QJSEngine *) -> QObject * { return new SimulatedCard; });
    qmlRegisterSingletonType<Messages>(
        uri, 1, 0, "Messages", [](QQmlEngine *, QJSEngine *) -> QObject * { return new Messages; });
    qmlRegisterType<SimulatedFiles>(uri, 1, 0, "SimulatedFiles");
}
