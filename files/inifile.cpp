// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "inifile.h"

#include "characters.h"
#include "regularfile.h"

#include <QByteArray>

#include <algorithm>

namespace {

bool isBreak(char character)
{
    return character == '\n' || character == '\r';
}

// Whether "\r\n" or "\n\r" is at the position. Such a pair is a single line break.
bool isBreakOfTwo(const QByteArray &text, int position, int end)
{
    return position + 1 < end && isBreak(text.at(position)) && isBreak(text.at(position + 1))
        && text.at(position) != text.at(position + 1);
}

int skipSpaces(const QByteArray &text, int position)
{
    while (position < text.size() && isSpace(text.at(position))) {
        ++position;
    }
    return position;
}

int skipComment(const QByteArray &text, int position)
{
    while (position < text.size() && !isBreak(text.at(position))) {
        ++position;
    }
    return skipSpaces(text, position);
}

// The value of a character as a digit, or 16 for any other character.
int digit(char character)
{
    if (character >= '0' && character <= '9') {
        return character - '0';
    }
    const char lower = char(character | 0x20);
    return lower >= 'a' && lower <= 'f' ? lower - 'a' + 10 : 16;
}

// What QSettings would make of a value, without all that it might leave out: quotes, white space,
// byte-order marks, and escapes that are not numbers.
QByteArray withoutEscapes(const QByteArray &value)
{
    const QByteArray leftOut = "\" \t\r\n\xef\xbb\xbf";
    QByteArray plain;
    for (int at = 0; at < value.size(); ++at) {
        if (value.at(at) != '\\') {
            plain += leftOut.contains(value.at(at)) ? QByteArray() : value.mid(at, 1);
            continue;
        }
        ++at; // to the first digit, or to the character that the backslash escapes
        const bool isHexadecimal = value.mid(at, 1) == "x";
        const int base = isHexadecimal ? 16 : 8;
        int next = isHexadecimal ? at + 1 : at;
        ushort number = 0; // QSettings, too, drops the upper bits.
        bool isNumber = false;
        for (; next < value.size() && digit(value.at(next)) < base; ++next) {
            number = ushort(number * base + digit(value.at(next)));
            isNumber = true;
        }
        if (isNumber) {
            plain += number < 0x80 ? char(number) : '?';
            at = next - 1;
        }
    }
    return plain;
}

// QSettings unpacks fewer values: only those that begin and end so, as a whole or in a list.
bool mentionsPackedValue(const QByteArray &value)
{
    // Nearly every value has neither an "@" nor a backslash, which may encode an "@".
    if (!value.contains('@') && !value.contains('\\')) {
        return false;
    }
    const QByteArray plain = withoutEscapes(value);
    return plain.contains("@Variant(") || plain.contains("@DateTime(");
}

} // namespace

IniFault findIniFault(const QString &path)
{
    const RegularFile file = readRegularFile(path, maximumIniSize);
    if (file.state == RegularFile::State::NotOpened) {
        return IniFault::None;
    }
    if (file.state != RegularFile::State::Read) {
        return IniFault::Unreadable;
    }
    IniFault fault = IniFault::None;
    for (IniLine line = nextIniLine(file.content, 0); line.kind != IniLine::Kind::None;
         line = nextIniLine(file.content, line.end)) {
        if (line.isPacked) {
            return IniFault::PackedValue;
        }
        fault = line.isClosed ? fault : IniFault::UnclosedSection;
    }
    return fault;
}

IniLine nextIniLine(const QByteArray &text, int position)
{
    if (position == 0 && text.startsWith(byteOrderMark)) {
        position = int(qstrlen(byteOrderMark));
    }
    position = skipSpaces(text, position);
    while (position < text.size() && text.at(position) == ';') {
        position = skipComment(text, position);
    }

    IniLine line;
    line.start = position;
    int equals = -1;
    for (bool isQuoted = false; position < text.size(); ++position) {
        const char character = text.at(position);
        if (!isQuoted && (character == ';' || isBreak(character))) {
            break;
        }
        if (character == '\\') {
            position += isBreakOfTwo(text, position + 1, text.size()) ? 2 : 1;
        } else if (character == '"') {
            isQuoted = !isQuoted;
        } else if (character == '=' && !isQuoted && equals < 0) {
            equals = position;
        }
    }
    line.end = qMin(position, text.size());
    if (line.start == line.end) {
        return line;
    }
    if (text.at(line.start) == '[') {
        line.kind = IniLine::Kind::Section;
        const auto lineEnd = text.cbegin() + line.end;
        const auto nameEnd = std::find(text.cbegin() + line.start, lineEnd, ']');
        line.isClosed = nameEnd != lineEnd;
        line.nameEnd = int(nameEnd - text.cbegin());
    } else if (equals >= 0) {
        line.kind = IniLine::Kind::Key;
        line.nameEnd = equals;
        line.isPacked = mentionsPackedValue(text.mid(equals + 1, line.end - equals - 1));
    } else {
        line.kind = IniLine::Kind::Other;
    }
    return line;
}
