// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "regularfile.h"

#include <QFile>

#include <cerrno>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

// Otherwise files of more than 2 GiB could not be opened at all.
static_assert(sizeof(off_t) == 8, "this needs _FILE_OFFSET_BITS=64");

namespace {

RegularFile readDescriptor(int descriptor, qint64 maximumSize)
{
    using State = RegularFile::State;
    struct stat entry = {};
    if (fstat(descriptor, &entry) != 0 || !S_ISREG(entry.st_mode)) {
        return {State::NotRegular,
                {},
                S_ISDIR(entry.st_mode) ? QStringLiteral("file to open is a directory")
                                       : QStringLiteral("file to open is no regular file")};
    }
    RegularFile tooLarge = {
        State::TooLarge,
        {},
        QStringLiteral("file to open is larger than %1 bytes").arg(maximumSize)};
    if (entry.st_size > maximumSize) {
        return tooLarge;
    }
    // In /proc, files of any size claim to be empty.
    QByteArray content(int(entry.st_size > 0 ? entry.st_size : maximumSize + 1), Qt::Uninitialized);
    int size = 0;
    ssize_t count = 0;
    // Some file systems return fewer bytes at a time than requested.
    do {
        count = read(descriptor, content.data() + size, size_t(content.size() - size));
        size += int(qMax(count, ssize_t(0)));
    } while (count > 0 && size < content.size());
    if (count < 0) {
        return {State::Failed, {}, qt_error_string(errno)};
    }
    content.truncate(size);
    return size > maximumSize ? tooLarge : RegularFile{State::Read, content, {}};
}

} // namespace

RegularFile readRegularFile(const QString &path, qint64 maximumSize)
{
    // Cut at the NUL, the path would name another file.
    if (path.contains(QChar::Null)) {
        return {RegularFile::State::NotOpened, {}, qt_error_string(EINVAL)};
    }
    const int descriptor =
        open(QFile::encodeName(path).constData(), O_RDONLY | O_NONBLOCK | O_NOCTTY | O_CLOEXEC);
    if (descriptor < 0) {
        return {RegularFile::State::NotOpened, {}, qt_error_string(errno)};
    }
    RegularFile file = readDescriptor(descriptor, maximumSize);
    close(descriptor);
    return file;
}
