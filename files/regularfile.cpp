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

RegularFile tooLarge(qint64 maximumSize)
{
    return {State::TooLarge,
            {},
            QStringLiteral("file to open is larger than %1 bytes").arg(maximumSize)};
}

// The content is empty, and the file is open unless the state is another one than Read.
RegularFile openRegularFile(QFile *file, const QString &path)
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
    const bool isRegular = fstat(descriptor, &entry) == 0 && S_ISREG(entry.st_mode);
    file->open(descriptor, QIODevice::ReadOnly, QFileDevice::AutoCloseHandle);
    return {isRegular ? State::Read : State::NotRegular,
            {},
            isRegular                    ? QString()
                : S_ISDIR(entry.st_mode) ? QStringLiteral("file to open is a directory")
                                         : QStringLiteral("file to open is not a regular file")};
}

} // namespace

RegularFile readRegularFile(const QString &path, qint64 maximumSize)
{
    QFile file;
    RegularFile result = openRegularFile(&file, path);
    if (result.state != State::Read) {
        return result;
    }
    if (file.size() > maximumSize) {
        return tooLarge(maximumSize);
    }
    // In /proc, files of any size claim to be empty.
    const qint64 size = file.size() > 0 ? file.size() : maximumSize + 1;
    QByteArray piece;
    // Some file systems return fewer bytes at a time than requested.
    do {
        piece = file.read(size - result.content.size());
        result.content += piece;
    } while (!piece.isEmpty() && result.content.size() < size);
    if (file.error() != QFileDevice::NoError) {
        return {State::Failed, {}, file.errorString()};
    }
    return result.content.size() > maximumSize ? tooLarge(maximumSize) : result;
}

RegularFile readFirstLine(const QString &path, qint64 maximumSize)
{
    QFile file;
    RegularFile result = openRegularFile(&file, path);
    if (result.state != State::Read) {
        return result;
    }
    // With room for the line break.
    const QByteArray line = file.readLine(maximumSize + 2);
    if (file.error() != QFileDevice::NoError) {
        return {State::Failed, {}, file.errorString()};
    }
    const auto end = std::find_if(line.cbegin(), line.cend(), [](char character) {
        return character == '\n' || character == '\0';
    });
    result.content = line.left(int(end - line.cbegin()));
    return result.content.size() > maximumSize ? tooLarge(maximumSize) : result;
}

QString textUpToNul(const QByteArray &content)
{
    return QString::fromUtf8(content.constData());
}

bool fileExists(const QString &path)
{
    return !path.contains(QChar::Null) && access(QFile::encodeName(path).constData(), F_OK) == 0;
}
