// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef INIFILE_H
#define INIFILE_H

#include <QtGlobal>

class QByteArray;
class QString;

constexpr qint64 maximumIniSize = qint64(1024) * 1024;

// Why a file is not read with QSettings.
enum class IniFault {
    None,
    Unreadable, // Not a regular file, larger than a mebibyte, or damaged.
    PackedValue,
    // QSettings reports it only the first time that it reads a file. It then reads an unchanged file
    // from a cache.
    UnclosedSection,
};

/*
    Returns the worst fault of a file.

    A few bytes of @Variant(...) or @DateTime(...) make QSettings allocate all memory, or recurse
    until the process ends. The file is refused if a value mentions either, however it is spelt, even
    where QSettings would not unpack it.

    A file that cannot be opened has no fault: QSettings reports that.
*/
IniFault findIniFault(const QString &path);

// A line of a settings file as QSettings reads it: quotes and backslashes may join several lines of
// the text, and a semicolon ends one. Comments and empty lines are left out.
struct IniLine {
    enum class Kind {
        None, // The end of the text.
        Section,
        Key,
        Other, // Ignored by QSettings.
    };

    Kind kind = Kind::None;
    int start = 0;
    int end = 0;
    int nameEnd = 0; // Of a section or a key.
    // Whether the name of a section ends on its line.
    bool isClosed = true;
    // Whether the value of a key mentions a packed value.
    bool isPacked = false;
};

// Starts at the end of the previous line, or at 0.
IniLine nextIniLine(const QByteArray &text, int position);

#endif
