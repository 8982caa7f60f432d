// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "inilines.h"

#include <QByteArray>

#include <algorithm>

namespace {

bool isSpace(char character)
{
    return character == ' ' || character == '\t' || character == '\r' || character == '\n';
}

bool endsLine(char character)
{
    return character == '\n' || character == '\r';
}

// Zeroes and all.
QString fromLatin1(const QByteArray &text)
{
    return QString::fromLatin1(text.constData(), text.size());
}

// Keys and sections are escaped like in a URL, and a backslash is what parts groups.
QString unescaped(const QByteArray &name)
{
    return fromLatin1(QByteArray::fromPercentEncoding(name.trimmed()).replace('\\', '/'));
}

// The end of what begins at the position, which may go on over several lines in quotes or behind a
// backslash. Tells where its first equals sign is, or -1.
int findEnd(const QByteArray &text, int position, int *equals)
{
    *equals = -1;
    bool inQuotes = false;
    for (; position < text.size(); ++position) {
        const char character = text.at(position);
        if (character == '\\') {
            ++position;
            // A line may end in two characters.
            if (position + 1 < text.size() && endsLine(text.at(position))
                && endsLine(text.at(position + 1)) && text.at(position) != text.at(position + 1)) {
                ++position;
            }
        } else if (character == '"') {
            inQuotes = !inQuotes;
        } else if (!inQuotes && (endsLine(character) || character == ';')) {
            break;
        } else if (!inQuotes && character == '=' && *equals < 0) {
            *equals = position;
        }
    }
    return qMin(position, text.size());
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
    int position = start;
    while (position < text.size()) {
        if (isSpace(text.at(position))) {
            ++position;
            continue;
        }
        if (text.at(position) == ';') {
            while (position < text.size() && !endsLine(text.at(position))) {
                ++position;
            }
            continue;
        }
        int equals = -1;
        const int end = findEnd(text, position, &equals);
        const QByteArray content = text.mid(position, end - position);
        number += int(std::count(text.cbegin() + counted, text.cbegin() + position, '\n'));
        counted = position;

        IniLine line = {IniLine::Kind::Neither, 0, fromLatin1(content)};
        if (content.startsWith('[')) {
            line = readHeader(content);
            section = line.name;
        } else if (equals >= 0) {
            const bool isMarked = start > 0 && !text.left(position).contains('\n')
                && !text.left(position).contains('\r');
            const int keyStart = isMarked ? 0 : position;
            const QString key = unescaped(text.mid(keyStart, equals - keyStart));
            line = {IniLine::Kind::Key, 0, section + key};
            line.isMarked = isMarked;
            line.isCut = end < text.size() && text.at(end) == ';' && !isSpace(text.at(end - 1));
        }
        line.number = number;
        line.isAscii = std::all_of(content.cbegin(), content.cend(), [](char character) {
            return static_cast<signed char>(character) >= 0;
        });
        lines.push_back(line);
        position = qMax(end, position + 1);
    }
    return lines;
}
