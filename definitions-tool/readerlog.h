// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef READERLOG_H
#define READERLOG_H

#include <QStringList>

/*
    Intercepts warnings while it exists. When the readers of definition files refuse a file, they
    log a warning. Their empty result alone does not show that.
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
