// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef SYSTEMSETTINGSPLUGIN_H
#define SYSTEMSETTINGSPLUGIN_H

#include <QQmlExtensionPlugin>

// Registers the types of the QML module com.marlo.settings.system and gives each engine that
// imports it the translators of the settings pages' catalog.
class SystemSettingsPlugin : public QQmlExtensionPlugin
{
    Q_OBJECT
    Q_PLUGIN_METADATA(IID "com.marlo.settings.system")

public:
    void registerTypes(const char *uri) override;
    void initializeEngine(QQmlEngine *engine, const char *uri) override;
};

#endif
