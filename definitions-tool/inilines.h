// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef INILINES_H
#define INILINES_H

#include "files/inifile.h"

#include <QString>

#include <vector>

/*
    A line of a settings file, with the name that QSettings gives to its key. The checks use it to
    find the line of a key that QSettings has read.
*/
struct NamedIniLine : IniLine {
    int number = 0; // From 1.
    // For a section, the prefix of its keys, such as "remote-arguments/"; empty for General. For a
    // key, its name with that prefix, such as "remote-arguments/1/argument". Otherwise the text of
    // the line.
    QString name;
    bool isAscii = true;
    // Whether the byte-order mark in front of a key has become a part of its name.
    bool isMarked = false;
    // Whether a semicolon that follows no space ends the value.
    bool isCut = false;
};

std::vector<NamedIniLine> readIniLines(const QByteArray &text);

#endif
