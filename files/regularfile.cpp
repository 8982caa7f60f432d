// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "regularfile.h"

#include <QFile>

#include <algorithm>
#include <cerrno>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

// Otherwise files of more than 2 GiB could not be opened at all.
static_assert(sizeof(off_t) == 8, "this needs _FILE_OFFSET_BITS=64");

namespace {

using State = RegularFile::State;

// Opens a regular file, reads it with the function, and checks the size of the result.
template<typename Read> RegularFile openAndRead(const QString &path, qint64 maximumSize, Read read)
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
    QFile file;
    file.open(descriptor, QIODevice::ReadOnly, QFileDevice::AutoCloseHandle);
    struct stat entry = {};
    if (fstat(descriptor, &entry) != 0 || !S_ISREG(entry.st_mode)) {
        return {State::NotRegular,
                {},
                S_ISDIR(entry.st_mode) ? QStringLiteral("file to open is a directory")
                                       : QStringLiteral("file to open is not a regular file")};
    }
    const QByteArray content = read(&file);
    if (file.error() != QFileDevice::NoError) {
        return {State::Failed, {}, file.errorString()};
    }
    if (content.size() > maximumSize) {
        return {State::TooLarge,
                {},
                QStringLiteral("file to open is larger than %1 bytes").arg(maximumSize)};
    }
    return {State::Read, content, {}};
}

} // namespace

RegularFile readRegularFile(const QString &path, qint64 maximumSize)
{
    return openAndRead(path, maximumSize, [maximumSize](QFile *file) {
        // In /proc, files of any size claim to be empty.
        const qint64 claimed = file->size() > 0 ? file->size() : maximumSize + 1;
        const qint64 size = std::min(claimed, maximumSize + 1);
        QByteArray content;
        QByteArray piece;
        // Some file systems return fewer bytes at a time than requested.
        do {
            piece = file->read(size - content.size());
            content += piece;
        } while (!piece.isEmpty() && content.size() < size);
        return content;
    });
}

RegularFile readFirstLine(const QString &path, qint64 maximumSize)
{
    return openAndRead(path, maximumSize, [maximumSize](QFile *file) {
        // With room for the line break. As a C string: a NUL ends the line.
        QByteArray line = file->readLine(maximumSize + 2).constData();
        line.chop(line.endsWith('\n') ? 1 : 0);
        return line;
    });
}

QString textUpToNul(const QByteArray &content)
{
    return QString::fromUtf8(content.constData());
}

bool fileExists(const QString &path)
{
    return !path.contains(QChar::Null) && access(QFile::encodeName(path).constData(), F_OK) == 0;
}
