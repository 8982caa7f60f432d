// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include <QQmlExtensionPlugin>
#include <qqml.h>

// The smallest plugin that can be imported. Every module costs at least as much.
class EmptyPlugin : public QQmlExtensionPlugin
{
    Q_OBJECT
    Q_PLUGIN_METADATA(IID QQmlExtensionInterface_iid)

public:
    void registerTypes(const char *uri) override { qmlRegisterModule(uri, 1, 0); }
};

#include "emptyplugin.moc"
