// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef INIFILE_H
#define INIFILE_H

#include <QtGlobal>

class QByteArray;
class QString;

constexpr qint64 maximumIniSize = qint64(1024) * 1024;

/*
    Whether QSettings may be let loose on what lies at the path. Of a pipe it waits for somebody to
    write, and a value such as @Variant(...) it unpacks whatever is in there: a few bytes make it
    ask for all memory, or nest until the stack is full, and end the process. A file of more than a
    mebibyte is no settings file either.

    True also where there is nothing, or nothing that may be opened: QSettings can tell.
*/
bool isPlainIni(const QString &path);

// Where in the text of a settings file the first value is that QSettings would unpack; negative if
// there is none.
int findPackedValue(const QByteArray &data);

#endif
