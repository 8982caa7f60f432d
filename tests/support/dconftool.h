// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DCONFTOOL_H
#define DCONFTOOL_H

#include <QByteArray>
#include <QString>
#include <QStringList>

/*
    What another program does with dconf: that program is the dconf tool. A warning is logged if it
    fails.
*/
namespace DconfTool {

// What the tool prints, given the input.
QByteArray run(const QStringList &arguments, const QByteArray &input = {});

// A value in GVariant's text format; empty if nothing is stored.
QByteArray read(const QString &key);
void write(const QString &key, const QByteArray &value);
void write(const QString &key, const QStringList &value);
// Resets a key, or everything below a path that ends with a slash.
void reset(const QString &path);

// dconf stores the changes of this process one by one in the background. Only after that does a
// write of another process come last.
void waitUntilStored();

} // namespace DconfTool

#endif
