// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "regularfile.h"

#include <QFile>

#include <algorithm>
#include <array>
#include <cerrno>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

// Otherwise files of more than 2 GiB could not be opened at all.
static_assert(sizeof(off_t) == 8, "this needs _FILE_OFFSET_BITS=64");

namespace {

using State = RegularFile::State;

RegularFile tooLarge(qint64 maximumSize)
{
    return {State::TooLarge,
            {},
            QStringLiteral("file to open is larger than %1 bytes").arg(maximumSize)};
}

RegularFile readAll(int descriptor, const struct stat &entry, qint64 maximumSize)
{
    if (entry.st_size > maximumSize) {
        return tooLarge(maximumSize);
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
    return size > maximumSize ? tooLarge(maximumSize) : RegularFile{State::Read, content, {}};
}

RegularFile readLine(int descriptor, const struct stat & /*entry*/, qint64 maximumSize)
{
    QByteArray line;
    std::array<char, 4096> buffer;
    ssize_t count = 0;
    while ((count = read(descriptor, buffer.data(), buffer.size())) > 0) {
        const auto *const end = std::find_if(buffer.data(), buffer.data() + count,
                                             [](char c) { return c == '\n' || c == '\0'; });
        line.append(buffer.data(), int(end - buffer.data()));
        if (line.size() > maximumSize) {
            return tooLarge(maximumSize);
        }
        if (end != buffer.data() + count) {
            break;
        }
    }
    return count < 0 ? RegularFile{State::Failed, {}, qt_error_string(errno)}
                     : RegularFile{State::Read, line, {}};
}

template<typename Reader>
RegularFile readWith(Reader reader, const QString &path, qint64 maximumSize)
{
    // open() would cut the path at the NUL and open another file.
    if (path.contains(QChar::Null)) {
        return {State::NotOpened, {}, qt_error_string(EINVAL)};
    }
    const int descriptor =
        open(QFile::encodeName(path).constData(), O_RDONLY | O_NONBLOCK | O_NOCTTY | O_CLOEXEC);
    if (descriptor < 0) {
        return {State::NotOpened, {}, qt_error_string(errno)};
    }
    struct stat entry = {};
    RegularFile file;
    if (fstat(descriptor, &entry) == 0 && S_ISREG(entry.st_mode)) {
        file = reader(descriptor, entry, maximumSize);
    } else {
        file = {State::NotRegular,
                {},
                S_ISDIR(entry.st_mode) ? QStringLiteral("file to open is a directory")
                                       : QStringLiteral("file to open is not a regular file")};
    }
    close(descriptor);
    return file;
}

} // namespace

RegularFile readRegularFile(const QString &path, qint64 maximumSize)
{
    return readWith(readAll, path, maximumSize);
}

RegularFile readFirstLine(const QString &path, qint64 maximumSize)
{
    return readWith(readLine, path, maximumSize);
}
