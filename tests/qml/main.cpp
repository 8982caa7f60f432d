// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "texts.h"
#include "throwawayroot.h"

#include <QQmlContext>
#include <QQmlEngine>
#include <QtQuickTest>

// Gives every test the object that sets up its environment.
class Setup : public QObject
{
    Q_OBJECT

public Q_SLOTS:
    void qmlEngineAvailable(QQmlEngine *engine)
    {
        engine->rootContext()->setContextProperty("root"_s,
                                                  new ThrowAwayRoot(engine));
    }
};

QUICK_TEST_MAIN_WITH_SETUP(qml, Setup)

#include "main.moc"
