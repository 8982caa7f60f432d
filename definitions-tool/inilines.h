// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef INILINES_H
#define INILINES_H

#include <QString>

#include <vector>

class QByteArray;

/*
    What stands in which line of a settings file, for finding the place of what QSettings has read;
    what the values are only QSettings tells.
*/
struct IniLine {
    enum class Kind {
        Section, // A header.
        Key,
        Neither, // Passed over by QSettings.
    };

    Kind kind;
    int number; // From 1.
    // As QSettings names it: of a section what its keys begin with, as "remote-arguments/", nothing for
    // General; a key with its section, as "remote-arguments/1/argument"; else what stands there.
    QString name;
    bool isClosed = true; // A section's header.
    bool isAscii = true;
    // Whether the byte-order mark in front of a key has become a part of it.
    bool isMarked = false;
    // Whether a semicolon that follows no space ends the value.
    bool isCut = false;
};

std::vector<IniLine> readIniLines(const QByteArray &text);

#endif
