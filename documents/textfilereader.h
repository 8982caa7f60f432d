// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef TEXTFILEREADER_H
#define TEXTFILEREADER_H

#include <QObject>

class QUrl;

// Reads plain text files for QML: one file, or all files of a directory.
class TextFileReader : public QObject
{
    Q_OBJECT

public:
    using QObject::QObject;

    // Null if the file cannot be read; the text of an empty file is empty, not null.
    Q_INVOKABLE QString readContent(const QString &filePath) const;
    // Null if there is no such directory, or no text in it.
    Q_INVOKABLE QString collate(const QUrl &directory, const QString &separator,
                                const QString &prefix) const;
};

#endif
