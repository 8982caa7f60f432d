// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef INIFILE_H
#define INIFILE_H

#include <QtGlobal>

class QByteArray;
class QString;

constexpr qint64 maximumIniSize = qint64(1024) * 1024;

// QSettings reads the values behind it as UTF-8, and as Latin-1 without.
constexpr const char *iniByteOrderMark = "\xef\xbb\xbf";

/*
    Whether QSettings may read the file. It must never read a file with a value that it would unpack:
    a few bytes of @Variant(...) or @DateTime(...) make it allocate all memory, or recurse until the
    stack is full, and end the process. Nor may it open a pipe, which blocks. A file of more than a
    mebibyte is no settings file.

    True also if there is no such file, or if it cannot be opened: QSettings reports that.
*/
bool isPlainIni(const QString &path);

/*
    Whether the file is plain, and each of its sections has a name that ends.

    QSettings has an error status for the latter, but only the first time that it reads the file:
    an unchanged file comes from a cache, without the error.
*/
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
    // Where the name of a section or of a key ends.
    int nameEnd = 0;
    // Whether the name of a section ends on its line. If not, QSettings calls the file broken.
    bool isClosed = true;
    // Whether QSettings would unpack the value of a key, or an element of a list.
    bool isPacked = false;
};

// Starts at the end of the previous line, or at 0.
IniLine nextIniLine(const QByteArray &text, int position);

#endif
