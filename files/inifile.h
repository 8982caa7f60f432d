// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef INIFILE_H
#define INIFILE_H

#include <QtGlobal>

class QByteArray;
class QString;

constexpr qint64 maximumIniSize = qint64(1024) * 1024;

// If a file begins with this mark, QSettings reads values as UTF-8, otherwise as Latin-1.
constexpr const char *iniByteOrderMark = "\xef\xbb\xbf";

/*
    Whether QSettings may read the file: it is regular, not larger than a mebibyte, and has no value
    that QSettings would unpack. A few bytes of @Variant(...) or @DateTime(...) make it allocate all
    memory, or recurse until the process ends.

    Also true if the file cannot be opened: QSettings reports that.
*/
bool isPlainIni(const QString &path);

// Whether the file is plain and closes the name of each section. QSettings reports an unclosed name
// only the first time that it reads a file. It then reads an unchanged file from a cache.
bool isWellFormedIni(const QString &path);

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
    // Whether QSettings would unpack the value of a key, or an element of a list.
    bool isPacked = false;
};

// Starts at the end of the previous line, or at 0.
IniLine nextIniLine(const QByteArray &text, int position);

#endif
