// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "mounttable.h"

#include <QFile>

#include <cstdio>

#include <mntent.h>

namespace {

constexpr const char *path = "/etc/mtab";
constexpr const char *draftPath = "/etc/mtab.draft";

} // namespace

QString MountTable::directoryOf(const QByteArray &devicePath)
{
    QString directory;
    if (FILE *table = setmntent(path, "r")) {
        while (const mntent *entry = getmntent(table)) {
            if (devicePath == entry->mnt_fsname) {
                directory = QFile::decodeName(entry->mnt_dir);
            }
        }
        endmntent(table);
    }
    return directory;
}

bool MountTable::setDirectoryOf(const QByteArray &devicePath, const QByteArray &directory)
{
    QFile table(QString::fromLatin1(path));
    QFile draft(QString::fromLatin1(draftPath));
    if (!table.open(QIODevice::ReadOnly) || !draft.open(QIODevice::WriteOnly)) {
        return false;
    }
    const QList<QByteArray> lines = table.readAll().split('\n');
    for (const QByteArray &line : lines) {
        if (!line.isEmpty() && !line.startsWith(devicePath + ' ')) {
            draft.write(line + '\n');
        }
    }
    if (!directory.isEmpty()) {
        draft.write(devicePath + ' ' + directory + " tmpfs rw 0 0\n");
    }
    return draft.flush() && std::rename(draftPath, path) == 0;
}
