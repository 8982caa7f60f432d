// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef SYSTEMSETTINGSPLUGIN_H
#define SYSTEMSETTINGSPLUGIN_H

#include <QQmlExtensionPlugin>

/*
    The entry point of the QML module com.marlo.settings.system: it registers the module's types and
    gives each engine that imports the module the translators of the settings pages' catalog.
*/
class SystemSettingsPlugin : public QQmlExtensionPlugin
{
    Q_OBJECT
    Q_PLUGIN_METADATA(IID "com.marlo.settings.system")

public:
    void registerTypes(const char *uri) override;
    void initializeEngine(QQmlEngine *engine, const char *uri) override;
};

#endif
