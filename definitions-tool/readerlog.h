// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef READERLOG_H
#define READERLOG_H

#include <QStringList>

/*
    Intercepts warnings while it exists. The readers of definition files log a warning when they refuse
    a file, which an empty result does not show.
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
