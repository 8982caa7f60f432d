// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "textfilereader.h"

#include "files/regularfile.h"

#include <QDir>
#include <QTextStream>
#include <QUrl>

namespace {

// The text of a file without its line breaks; null if the file cannot be read or is larger than
// maximumSize. Subtracts the size of the file from maximumSize.
QString readText(const QString &path, qint64 *maximumSize)
{
    const RegularFile file = readRegularFile(path, *maximumSize);
    if (file.state != RegularFile::State::Read) {
        return {};
    }
    *maximumSize -= file.content.size();
    // Not null: an empty file is one that can be read.
    QString content = QLatin1String("");
    QTextStream stream(file.content);
    QString line;
    while (!(line = stream.readLine()).isNull()) {
        // Nothing is added between the lines, on purpose: pages wrap the text to their own width.
        content += line;
    }
    return content;
}

} // namespace

/*!
    \qmltype TextFileReader
    \inqmlmodule com.marlo.settings.system
    \brief Reads plain text files.

    A singleton, one for each engine.

    \qml
    Label {
        text: TextFileReader.collate("file:///usr/share/marlo-settings/licenses", "\n",
                                     "Licenses:\n")
    }
    \endqml

    \image gallery-text-files.png The gallery's page for this type

    \section1 What may surprise
    \section2 Lines run together
    The line breaks of a file are removed: pages wrap the text to their own width. A text must end
    its lines with a blank to keep their words apart.

    \section2 Files that cannot be read cause no message
    They count as empty, and collate() skips them. If nothing is left, collate() returns an empty
    text without the prefix, so that a page can hide the whole section.
*/

/*!
    \qmlmethod string TextFileReader::readContent(string filePath)

    Returns the text of the file \a filePath, a local path and not a URL, without its line breaks.
    The text is empty if the file cannot be read, is not a regular file or is larger than 16 MiB.
    The encoding is that of the system's locale, unless the file has a byte-order mark.
*/
QString TextFileReader::readContent(const QString &filePath) const
{
    qint64 maximumSize = maximumTextSize;
    return readText(filePath, &maximumSize);
}

/*!
    \qmlmethod string TextFileReader::collate(url directory, string separator, string prefix)

    Returns \a prefix and the texts of all files of the local directory \a directory, as
    readContent() reads them, with \a separator between them. The files are sorted by name, upper
    case before lower case. collate() leaves out hidden files, directories, files without text, and
    each file that would make the total size exceed 16 MiB. The text is empty if no file has any
    text, or if \a directory is not a local directory.
*/
QString TextFileReader::collate(const QUrl &directory, const QString &separator,
                                const QString &prefix) const
{
    // Without a path QDir would list the current directory. Qt warns about a NUL.
    const QString path = directory.toLocalFile();
    if (path.isEmpty() || path.contains(QChar::Null)) {
        return {};
    }
    QStringList contents;
    qint64 maximumSize = maximumTextSize;
    const QFileInfoList files = QDir(path).entryInfoList(QDir::Files, QDir::Name);
    for (const QFileInfo &file : files) {
        const QString content = readText(file.absoluteFilePath(), &maximumSize);
        if (!content.isEmpty()) {
            contents.append(content);
        }
    }
    return contents.isEmpty() ? QString() : prefix + contents.join(separator);
}
