// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef REGULARFILE_H
#define REGULARFILE_H

#include <QByteArray>
#include <QString>

// The size limit for texts that pages show: agreements, terms of use, licences.
constexpr qint64 maximumTextSize = qint64(16) * 1024 * 1024;

// The content of a file. Reading it neither blocks nor takes more memory than allowed, even if the
// path leads to a pipe, a device or an endless file.
struct RegularFile {
    enum class State {
        Read,
        NotOpened,
        NotRegular, // A directory, a pipe, a device.
        Failed, // While it was being read.
        TooLarge,
    };

    State state = State::NotOpened;
    QByteArray content; // Empty unless the file was read.
    QString error; // Empty if the file was read.
};

RegularFile readRegularFile(const QString &path, qint64 maximumSize);

// Reads up to the first newline or NUL, without it. The size limit applies only to this part.
RegularFile readFirstLine(const QString &path, qint64 maximumSize);

// Decodes UTF-8 up to the first NUL.
QString textUpToNul(const QByteArray &content);

// Whether there is an entry of any kind. QFile::exists() would also accept resources of the program,
// and log messages about a NUL in the path.
bool fileExists(const QString &path);

#endif
