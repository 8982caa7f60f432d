// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "readerlog.h"

namespace {

// Global, because a message handler is a plain function.
int warnings = 0;
QtMessageHandler previousHandler = nullptr;

void count(QtMsgType type, const QMessageLogContext &context, const QString &text)
{
    if (type == QtWarningMsg) {
        ++warnings;
    } else {
        previousHandler(type, context, text);
    }
}

} // namespace

ReaderLog::ReaderLog()
{
    warnings = 0;
    previousHandler = qInstallMessageHandler(count);
}

ReaderLog::~ReaderLog()
{
    qInstallMessageHandler(previousHandler);
}

bool ReaderLog::hasWarnings() const
{
    return warnings > 0;
}
