// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef READERLOG_H
#define READERLOG_H

#include <QStringList>

/*
    Takes what the readers of definition files log while it lives: with that they tell a file that
    they refuse from one with nothing in it.
*/
class ReaderLog
{
public:
    ReaderLog();
    ~ReaderLog();
    Q_DISABLE_COPY_MOVE(ReaderLog)

    // Whether there was a warning.
    bool hasWarnings() const;
};

#endif
