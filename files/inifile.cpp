// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "inifile.h"

#include "files/regularfile.h"

#include <QByteArray>
#include <QTextCodec>

#include <algorithm>

namespace {

bool isBlank(char character)
{
    return character == ' ' || character == '\t';
}

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
    while (position < text.size() && (isBlank(text.at(position)) || isBreak(text.at(position)))) {
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

// Reads the elements of a value as QSettings decodes them.
class ValueReader
{
public:
    ValueReader(const QByteArray &text, int start, int end, bool isUtf8)
        : m_text(text), m_position(start), m_end(end), m_isUtf8(isUtf8)
    {
    }

    bool atEnd() const { return m_position >= m_end; }
    QString readElement();

private:
    void skipBlanks();
    QString readPlain();
    QString readEscape();
    QChar readNumber(int base);
    // The value of the next character as a digit, or 16 for any other character.
    int digit() const;

    const QByteArray &m_text;
    int m_position;
    const int m_end;
    const bool m_isUtf8;
};

QString ValueReader::readElement()
{
    QString element;
    bool hasQuotes = false;
    bool isQuoted = false;
    int escaped = 0; // The end of the last escape, up to which blanks are kept.
    skipBlanks();
    while (!atEnd()) {
        const char character = m_text.at(m_position);
        if (character == ',' && !isQuoted) {
            ++m_position;
            break;
        }
        if (character == '"') {
            ++m_position;
            hasQuotes = true;
            isQuoted = !isQuoted;
            if (!isQuoted) {
                skipBlanks();
            }
        } else if (character == '\\') {
            ++m_position;
            element += readEscape();
            escaped = element.size();
        } else {
            element += readPlain();
        }
    }
    int size = element.size();
    while (!hasQuotes && size > escaped
           && (element.at(size - 1) == QLatin1Char(' ')
               || element.at(size - 1) == QLatin1Char('\t'))) {
        --size;
    }
    element.truncate(size);
    return element;
}

void ValueReader::skipBlanks()
{
    while (!atEnd() && isBlank(m_text.at(m_position))) {
        ++m_position;
    }
}

QString ValueReader::readPlain()
{
    const auto text = m_text.cbegin();
    const auto start = text + m_position;
    const auto end = std::find_if(start + 1, text + m_end, [](char character) {
        return character == '\\' || character == '"' || character == ',';
    });
    m_position = int(end - text);
    const int size = int(end - start);
    // The codec also removes a byte-order mark from each piece of text.
    return m_isUtf8 ? QTextCodec::codecForName("UTF-8")->toUnicode(start, size)
                    : QString::fromLatin1(start, size);
}

QString ValueReader::readEscape()
{
    if (atEnd()) {
        return {};
    }
    const char character = m_text.at(m_position);
    if (isBreak(character)) {
        m_position += isBreakOfTwo(m_text, m_position, m_end) ? 2 : 1;
        return {};
    }
    if (digit() < 8) {
        return readNumber(8);
    }
    ++m_position;
    if (character == 'x') {
        return digit() < 16 ? QString(readNumber(16)) : QString();
    }
    // QSettings ignores a backslash before any other character, together with that character.
    const QByteArray letters = QByteArrayLiteral("abfnrtv\"?'\\");
    const QByteArray meanings = QByteArrayLiteral("\a\b\f\n\r\t\v\"?'\\");
    const int letter = letters.indexOf(character);
    return letter < 0 ? QString() : QString(QLatin1Char(meanings.at(letter)));
}

QChar ValueReader::readNumber(int base)
{
    uint number = 0;
    for (; digit() < base; ++m_position) {
        number = number * uint(base) + uint(digit());
    }
    // QSettings drops the upper bits.
    return {ushort(number)};
}

int ValueReader::digit() const
{
    const char character = atEnd() ? ' ' : m_text.at(m_position);
    if (character >= '0' && character <= '9') {
        return character - '0';
    }
    const char lower = char(character | 0x20);
    return lower >= 'a' && lower <= 'f' ? lower - 'a' + 10 : 16;
}

bool isPackedElement(const QString &element)
{
    return element.endsWith(QLatin1Char(')'))
        && (element.startsWith(QLatin1String("@Variant("))
            || element.startsWith(QLatin1String("@DateTime(")));
}

bool isPackedValue(const QByteArray &text, int start, int end)
{
    // Nearly every value has neither an "@" nor a backslash, which may encode an "@".
    const auto value = text.cbegin();
    if (std::none_of(value + start, value + end,
                     [](char character) { return character == '@' || character == '\\'; })) {
        return false;
    }
    ValueReader reader(text, start, end, text.startsWith(iniByteOrderMark));
    bool isPacked = false;
    while (!isPacked && !reader.atEnd()) {
        isPacked = isPackedElement(reader.readElement());
    }
    return isPacked;
}

bool isPlain(const RegularFile &file, bool needsClosedSections)
{
    if (file.state != RegularFile::State::Read) {
        return file.state == RegularFile::State::NotOpened;
    }
    IniLine line = nextIniLine(file.content, 0);
    while (line.kind != IniLine::Kind::None && !line.isPacked
           && (line.isClosed || !needsClosedSections)) {
        line = nextIniLine(file.content, line.end);
    }
    return line.kind == IniLine::Kind::None;
}

} // namespace

bool isPlainIni(const QString &path)
{
    return isPlain(readRegularFile(path, maximumIniSize), false);
}

bool isWellFormedIni(const QString &path)
{
    return isPlain(readRegularFile(path, maximumIniSize), true);
}

IniLine nextIniLine(const QByteArray &text, int position)
{
    if (position == 0 && text.startsWith(iniByteOrderMark)) {
        position = int(qstrlen(iniByteOrderMark));
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
        line.isPacked = isPackedValue(text, equals + 1, line.end);
    } else {
        line.kind = IniLine::Kind::Other;
    }
    return line;
}
