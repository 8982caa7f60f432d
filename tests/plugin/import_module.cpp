// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Evaluates the QML given on the command line. The exit code is 0 if that succeeds.

#include <QCoreApplication>
#include <QQmlComponent>
#include <QQmlEngine>

#include <memory>

int main(int argc, char *argv[])
{
    const QCoreApplication application(argc, argv);
    const QStringList arguments = QCoreApplication::arguments();
    QQmlEngine engine;
    engine.addImportPath(arguments.at(1));
    QQmlComponent component(&engine);
    component.setData(arguments.at(2).toUtf8(), QUrl());
    const std::unique_ptr<QObject> object(component.create());
    if (object == nullptr) {
        qWarning("%s", qPrintable(component.errorString()));
    }
    return object == nullptr ? 1 : 0;
}
