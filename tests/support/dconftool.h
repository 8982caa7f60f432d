// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DCONFTOOL_H
#define DCONFTOOL_H

#include <QByteArray>
#include <QString>
#include <QStringList>

/*
    Reads and writes dconf from another process, the dconf tool. Logs a warning if the tool fails.
*/
namespace DconfTool {

// Runs the tool with this input and returns what it prints.
QByteArray run(const QStringList &arguments, const QByteArray &input = {});

// A value in GVariant's text format; empty if nothing is stored.
QByteArray read(const QString &key);
void write(const QString &key, const QByteArray &value);
void write(const QString &key, const QStringList &value);
// Resets a key, or everything below a path that ends with a slash.
void reset(const QString &path);

// dconf stores the changes of this process one by one in the background. Once this function
// returns, a write of another process comes after all of them.
void waitUntilStored();

} // namespace DconfTool

#endif
