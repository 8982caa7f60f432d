// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The mount table with a C library like musl 1.2.3: it decodes no escapes, and skips a line that is
// longer than the buffer with an error. tst_fileremover reads tables with the library of the system.

#include "memorycard/mounttable.h"

#include <QByteArrayList>
#include <QTemporaryFile>
#include <QTest>

#include <cerrno>
#include <cstring>

// Replaces the function of the C library.
extern "C" mntent *getmntent_r(FILE *table, mntent *entry, char *buffer, int size) noexcept
{
    char *fields[4] = {};
    while (!fields[1]) {
        if (!fgets(buffer, size, table)) {
            return nullptr;
        }
        if (!strchr(buffer, '\n') && !feof(table)) {
            for (int c = 0; c != '\n' && c != EOF;) {
                c = fgetc(table);
            }
            errno = ERANGE;
            return nullptr;
        }
        char *rest = buffer;
        for (char *&field : fields) {
            field = strtok_r(rest, " \t\n", &rest);
        }
    }
    static char nothing[] = "";
    *entry = {fields[0], fields[1], fields[2] ? fields[2] : nothing, nothing, 0, 0};
    return entry;
}

class tst_MountTable : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void anotherCLibrary();
};

void tst_MountTable::anotherCLibrary()
{
    QTemporaryFile file;
    QVERIFY(file.open());
    const QByteArray longLine = "overlay /" + QByteArray(30000, 'x') + " overlay rw 0 0\n";
    file.write(longLine
               + "/dev/a\\040b /my\\011card\\040\\134040 vfat rw 0 0\n"
                 "/dev/none /without/a/type\n"
                 "/dev/c\\04 /d\\9\\ ext4 rw 0 0\n"
               + longLine);
    file.close();
    MountTable table(QFile::encodeName(file.fileName()).constData());
    QVERIFY(table.isOpen());
    QByteArrayList entries;
    while (const mntent *entry = table.next()) {
        entries.append(
            QByteArrayList{entry->mnt_fsname, entry->mnt_dir, entry->mnt_type}.join('|'));
    }
    QCOMPARE(entries, (QByteArrayList{"/dev/a b|/my\tcard \\040|vfat", "/dev/c\\04|/d\\9\\|ext4"}));
}

QTEST_GUILESS_MAIN(tst_MountTable)

#include "tst_mounttable.moc"
