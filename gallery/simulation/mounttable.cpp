// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "mounttable.h"

#include <QFile>

#include <cstdio>

#include <mntent.h>

QString MountTable::directoryOf(const QByteArray &devicePath)
{
    QString directory;
    if (FILE *table = setmntent("/proc/self/mounts", "r")) {
        while (const mntent *entry = getmntent(table)) {
            if (devicePath == entry->mnt_fsname) {
                directory = QFile::decodeName(entry->mnt_dir);
            }
        }
        endmntent(table);
    }
    return directory;
}
