// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef TEXTFILEREADER_H
#define TEXTFILEREADER_H

#include <QObject>

class QUrl;

/*
    Reads plain text files for QML: a file, or all the files of a folder.
*/
class TextFileReader : public QObject
{
    Q_OBJECT

public:
    explicit TextFileReader(QObject *parent = nullptr);

    // Null if the file cannot be opened; an empty file reads as an empty text.
    Q_INVOKABLE QString readContent(const QString &filePath) const;
    // Null if there is no folder or no text in it.
    Q_INVOKABLE QString collate(const QUrl &directory, const QString &separator,
                                const QString &prefix) const;
};

#endif
