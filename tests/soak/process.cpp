// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "process.h"
#include "texts.h"

#include <QByteArray>
#include <QDir>
#include <QFile>

#include <malloc.h>
#include <unistd.h>

qint64 Process::residentMemory()
{
    malloc_trim(0);
    QFile file("/proc/self/statm"_s);
    if (!file.open(QIODevice::ReadOnly)) {
        qFatal("cannot read %s", qPrintable(file.fileName()));
    }
    constexpr int residentField = 1;
    return file.readAll().split(' ').value(residentField).toLongLong() * sysconf(_SC_PAGESIZE)
        / 1024;
}

int Process::openFiles()
{
    const QDir directory("/proc/self/fd"_s);
    // Without the descriptor that reads the directory.
    return int(directory.entryList(QDir::AllEntries | QDir::System | QDir::NoDotAndDotDot).size())
        - 1;
}
