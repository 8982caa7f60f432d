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
    Whether QSettings may be let loose on what lies at the path. Of a pipe it waits for somebody to
    write, and a value such as @Variant(...) it unpacks whatever is in there: a few bytes make it
    ask for all memory, or nest until the stack is full, and end the process. A file of more than a
    mebibyte is no settings file either.

    True also where there is nothing, or nothing that may be opened: QSettings can tell.
*/
bool isPlainIni(const QString &path);

/*
    Whether it is a plain settings file, or none, and each of its sections has a name that ends.

    QSettings has a status for the latter, but only where it has read the file: what it remembers of
    an unchanged one it takes for good, so that the same file would be an error and then none.
*/
bool isWellFormedIni(const QString &path);

struct IniSpan {
    int start;
    int end;
};

// The next line from a position, as QSettings parts the text of a settings file: quotes and
// backslashes join what would be several, and a semicolon, which begins a comment, parts what would
// be one. Empty at the end.
IniSpan nextIniLine(const QByteArray &data, int position);

// Where in the text of a settings file the first value is that QSettings would unpack; negative if
// there is none.
int findPackedValue(const QByteArray &data);

// Where in the text of a settings file the first section begins whose name does not end on its line;
// negative if there is none.
int findBrokenSection(const QByteArray &data);

#endif
