// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef STAGEPLUGIN_H
#define STAGEPLUGIN_H

#include <QQmlExtensionPlugin>

/*
    The QML module gallery.stage, for the gallery alone.
*/
class StagePlugin : public QQmlExtensionPlugin
{
    Q_OBJECT
    Q_PLUGIN_METADATA(IID QQmlExtensionInterface_iid)

public:
    void registerTypes(const char *uri) override;
};

#endif
