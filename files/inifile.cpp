// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "inifile.h"

#include "regularfile.h"

#include <QByteArray>

#include <optional>

namespace {

int digitOf(char character)
{
    if (character >= '0' && character <= '9') {
        return character - '0';
    }
    const char lower = char(character | 0x20);
    return lower >= 'a' && lower <= 'f' ? lower - 'a' + 10 : 16;
}

// The next character of a value as QSettings understands it: quotes are not part of it, a character
// may be escaped by its number, and a backslash before most others stands for nothing at all.
std::optional<uint> nextCharacter(const QByteArray &data, int *position)
{
    while (*position < data.size()) {
        const char character = data.at((*position)++);
        if (character == '"') {
            continue;
        }
        if (character != '\\') {
            return uchar(character);
        }
        if (*position == data.size()) {
            break;
        }
        const char escaped = data.at((*position)++);
        const uint base = escaped == 'x' ? 16 : 8;
        if (escaped == '\\' || escaped == '"') {
            return uchar(escaped);
        }
        if (escaped != 'x' && digitOf(escaped) >= 8) {
            continue;
        }
        uint number = escaped == 'x' ? 0 : uint(digitOf(escaped));
        while (*position < data.size() && uint(digitOf(data.at(*position))) < base) {
            number = number * base + uint(digitOf(data.at((*position)++)));
        }
        return number;
    }
    return {};
}

bool isSpace(uint character)
{
    return character == ' ' || character == '\t' || character == '\r' || character == '\n';
}

// Whether a value that begins at the position, or the element of a list, is one to unpack.
bool isPacked(const QByteArray &data, int position)
{
    std::optional<uint> character;
    do {
        character = nextCharacter(data, &position);
    } while (character && isSpace(*character));
    if (character != uint('@')) {
        return false;
    }
    QByteArray word;
    while (word.size() < 9 && (character = nextCharacter(data, &position))) {
        word += char(*character);
    }
    return word.startsWith("Variant(") || word.startsWith("DateTime(");
}

bool isPlain(const RegularFile &file)
{
    return file.state == RegularFile::State::NotOpened
        || (file.state == RegularFile::State::Read && findPackedValue(file.content) < 0);
}

bool isSpaceAt(const QByteArray &data, int position)
{
    return position < data.size() && isSpace(uchar(data.at(position)));
}

bool isBreakAt(const QByteArray &data, int position)
{
    return position < data.size() && (data.at(position) == '\n' || data.at(position) == '\r');
}

// As in nearly all files, which need no closer look then: their lines end where these end or later.
bool closesEveryBracket(const QByteArray &data)
{
    for (int start = data.indexOf('['); start >= 0; start = data.indexOf('[', start + 1)) {
        int end = start;
        while (end < data.size() && data.at(end) != ']') {
            if (data.at(end) == ';' || isBreakAt(data, end)) {
                return false;
            }
            ++end;
        }
        if (end == data.size()) {
            return false;
        }
    }
    return true;
}

} // namespace

bool isPlainIni(const QString &path)
{
    return isPlain(readRegularFile(path, maximumIniSize));
}

bool isWellFormedIni(const QString &path)
{
    const RegularFile file = readRegularFile(path, maximumIniSize);
    return isPlain(file) && findBrokenSection(file.content) < 0;
}

IniSpan nextIniLine(const QByteArray &data, int position)
{
    while (isSpaceAt(data, position)) {
        ++position;
    }
    int start = position;
    bool quoted = false;
    while (position < data.size()) {
        const char character = data.at(position);
        if (character == '\\') {
            ++position;
            // A break of two characters is passed as one.
            const bool isPair = isBreakAt(data, position) && isBreakAt(data, position + 1)
                && data.at(position) != data.at(position + 1);
            position += isPair ? 2 : 1;
        } else if (character == ';' && position == start) {
            while (position < data.size() && !isBreakAt(data, position)) {
                ++position;
            }
            while (isSpaceAt(data, position)) {
                ++position;
            }
            start = position;
        } else if ((character == ';' || isBreakAt(data, position)) && !quoted) {
            break;
        } else {
            quoted = quoted != (character == '"');
            ++position;
        }
    }
    return {start, qMin(position, data.size())};
}

int findPackedValue(const QByteArray &data)
{
    for (int position = 0; position < data.size(); ++position) {
        const char character = data.at(position);
        if ((character == '=' || character == ',') && isPacked(data, position + 1)) {
            return position;
        }
    }
    return -1;
}

int findBrokenSection(const QByteArray &data)
{
    if (closesEveryBracket(data)) {
        return -1;
    }
    const bool isMarked = data.startsWith(iniByteOrderMark);
    IniSpan line = nextIniLine(data, isMarked ? int(qstrlen(iniByteOrderMark)) : 0);
    while (line.start < line.end) {
        if (data.at(line.start) == '[') {
            const int end = data.indexOf(']', line.start);
            if (end < 0 || end >= line.end) {
                return line.start;
            }
        }
        line = nextIniLine(data, line.end);
    }
    return -1;
}
