// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef MODULETYPES_H
#define MODULETYPES_H

#include <QByteArray>
#include <QString>

#include <vector>

/*
    The QML types of the module, read from plugin/plugins.qmltypes. A test compares that file with
    the types that the plugin registers, so programs that need a list of the types use this one.
*/
struct ModuleType {
    QString name;
    QByteArray className;
    bool isSingleton = false;

    // Sorted by class name. Ends the program if the file cannot be read; it is read only once.
    static const std::vector<ModuleType> &all();
};

#endif
