// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "textfilereader.h"

#include "files/endlessfile.h"

#include <QDir>
#include <QFile>
#include <QTextStream>
#include <QUrl>

namespace {

// Qt warns of paths like these, and takes what precedes a NUL for a path of its own.
bool isPath(const QString &path)
{
    return !path.isEmpty() && !path.contains(QChar::Null);
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
*/

TextFileReader::TextFileReader(QObject *parent) : QObject(parent)
{
}

/*!
    \qmlmethod string TextFileReader::readContent(string filePath)

    Returns the text of the file \a filePath, a local path and no URL, without its line breaks: the
    lines follow each other with nothing in between. The text is empty if the file cannot be opened,
    as pipes, sockets and devices cannot; nothing is logged. It is read in the encoding of the
    system's locale, or in the one that a byte-order mark tells.
*/
QString TextFileReader::readContent(const QString &filePath) const
{
    QFile file(filePath);
    if (!isPath(filePath) || isEndless(filePath) || !file.open(QIODevice::ReadOnly)) {
        return {};
    }
    // Not null from the start: this file can be read, however little is in it.
    QString content = QLatin1String("");
    QTextStream stream(&file);
    QString line;
    while (!(line = stream.readLine()).isNull()) {
        // Nothing between the lines, on purpose: pages wrap the text to their own width.
        content += line;
    }
    return content;
}

/*!
    \qmlmethod string TextFileReader::collate(url directory, string separator, string prefix)

    Returns \a prefix and after it the texts of all files of the local folder \a directory, as
    readContent() gives them, with \a separator between each two. The files are taken in the order
    of their names, upper case before lower case; hidden files, folders and files without text are
    left out. The text is empty if no file has any, or if \a directory is no local folder.
*/
QString TextFileReader::collate(const QUrl &directory, const QString &separator,
                                const QString &prefix) const
{
    // Empty for what is no local file; and of no path at all QDir would make the current folder.
    const QString path = directory.toLocalFile();
    if (!isPath(path)) {
        return {};
    }
    QStringList contents;
    const QFileInfoList files = QDir(path).entryInfoList(QDir::Files, QDir::Name);
    for (const QFileInfo &file : files) {
        const QString content = readContent(file.absoluteFilePath());
        if (!content.isEmpty()) {
            contents.append(content);
        }
    }
    return contents.isEmpty() ? QString() : prefix + contents.join(separator);
}
