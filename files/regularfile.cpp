// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "regularfile.h"

#include <QFile>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

RegularFile readRegularFile(const QString &path, qint64 maximumSize)
{
    RegularFile file;
    const int descriptor =
        open(QFile::encodeName(path).constData(), O_RDONLY | O_NONBLOCK | O_NOCTTY | O_CLOEXEC);
    if (descriptor < 0) {
        return file;
    }
    struct stat entry = {};
    if (fstat(descriptor, &entry) != 0 || !S_ISREG(entry.st_mode)) {
        file.state = RegularFile::State::NotRegular;
    } else if (entry.st_size > maximumSize) {
        file.state = RegularFile::State::TooLarge;
    } else {
        file.state = RegularFile::State::Read;
        file.content = QByteArray(int(entry.st_size), Qt::Uninitialized);
        int size = 0;
        ssize_t taken = 0;
        // Some file systems give less at a time than they are asked for.
        while (size < file.content.size()
               && (taken = read(descriptor, file.content.data() + size,
                                size_t(file.content.size() - size)))
                   > 0) {
            size += int(taken);
        }
        file.content.truncate(size);
    }
    close(descriptor);
    return file;
}
