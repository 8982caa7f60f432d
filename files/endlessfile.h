// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef ENDLESSFILE_H
#define ENDLESSFILE_H

class QString;

/*
    Whether reading what lies at the path could wait for ever or never end: a pipe, a socket or a
    device, also behind a symbolic link. Readers on the main thread do not open such a thing; files,
    folders and what is not there are left to QFile to judge.
*/
bool isEndless(const QString &path);

#endif
