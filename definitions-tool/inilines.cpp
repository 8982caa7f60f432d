// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "inilines.h"

#include "files/inifile.h"

#include <QByteArray>

#include <algorithm>

namespace {

bool isSpace(char character)
{
    return character == ' ' || character == '\t' || character == '\r' || character == '\n';
}

// Zeroes and all.
QString fromLatin1(const QByteArray &text)
{
    return QString::fromLatin1(text.constData(), text.size());
}

// Keys and sections are escaped like in a URL, and a backslash is what parts groups.
QString unescaped(const QByteArray &name)
{
    return fromLatin1(QByteArray::fromPercentEncoding(name).replace('\\', '/'));
}

// Of a line, the first one outside quotes; negative if there is none.
int findEquals(const QByteArray &text, IniSpan line)
{
    bool inQuotes = false;
    for (int position = line.start; position < line.end; ++position) {
        const char character = text.at(position);
        if (character == '\\') {
            ++position;
        } else if (character == '"') {
            inQuotes = !inQuotes;
        } else if (character == '=' && !inQuotes) {
            return position;
        }
    }
    return -1;
}

IniLine readHeader(const QByteArray &content)
{
    const int end = content.indexOf(']');
    const QByteArray section = content.mid(1, end < 0 ? -1 : end - 1).trimmed();
    IniLine line = {IniLine::Kind::Section, 0, unescaped(section) + QLatin1Char('/')};
    if (section.compare("general", Qt::CaseInsensitive) == 0) {
        line.name.clear();
    } else if (section.compare("%general", Qt::CaseInsensitive) == 0) {
        line.name = fromLatin1(section.mid(1)) + QLatin1Char('/');
    }
    line.isClosed = end >= 0;
    return line;
}

} // namespace

std::vector<IniLine> readIniLines(const QByteArray &text)
{
    std::vector<IniLine> lines;
    QString section;
    int number = 1;
    int counted = 0;
    const int start = text.startsWith(iniByteOrderMark) ? int(qstrlen(iniByteOrderMark)) : 0;
    for (IniSpan span = nextIniLine(text, start); span.start < span.end;
         span = nextIniLine(text, span.end)) {
        const QByteArray content = text.mid(span.start, span.end - span.start);
        number += int(std::count(text.cbegin() + counted, text.cbegin() + span.start, '\n'));
        counted = span.start;

        IniLine line = {IniLine::Kind::Neither, 0, fromLatin1(content)};
        if (content.startsWith('[')) {
            line = readHeader(content);
            section = line.name;
        } else if (const int equals = findEquals(text, span); equals >= 0) {
            const bool isMarked = start > 0 && !text.left(span.start).contains('\n')
                && !text.left(span.start).contains('\r');
            const int keyStart = isMarked ? 0 : span.start;
            int keyEnd = equals;
            // No other white space is taken off.
            while (keyEnd > keyStart
                   && (text.at(keyEnd - 1) == ' ' || text.at(keyEnd - 1) == '\t')) {
                --keyEnd;
            }
            const QString key = unescaped(text.mid(keyStart, keyEnd - keyStart));
            line = {IniLine::Kind::Key, 0, section + key};
            line.isMarked = isMarked;
            line.isCut = span.end < text.size() && text.at(span.end) == ';'
                && !isSpace(text.at(span.end - 1));
        }
        line.number = number;
        line.isAscii = std::all_of(content.cbegin(), content.cend(), [](char character) {
            return static_cast<signed char>(character) >= 0;
        });
        lines.push_back(line);
    }
    return lines;
}
