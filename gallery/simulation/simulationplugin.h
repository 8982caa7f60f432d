// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef SIMULATIONPLUGIN_H
#define SIMULATIONPLUGIN_H

#include <QQmlExtensionPlugin>

/*
    The QML module gallery.simulation, for the gallery alone.
*/
class SimulationPlugin : public QQmlExtensionPlugin
{
    Q_OBJECT
    Q_PLUGIN_METADATA(IID QQmlExtensionInterface_iid)

public:
    void registerTypes(const char *uri) override;
};

#endif
