// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "jsonreader.h"

#include <QTextCodec>

#include <algorithm>
#include <limits>

namespace {

// As deep as QJsonDocument goes; deeper texts are attacks.
constexpr int maximumDepth = 1024;
constexpr std::string_view byteOrderMark("\xef\xbb\xbf");
constexpr std::string_view otherTokens("{[\"tfn");
constexpr int utf8Mib = 106;

bool isSpace(char character)
{
    return character == ' ' || character == '\t' || character == '\n' || character == '\r';
}

bool isDigit(char character)
{
    return character >= '0' && character <= '9';
}

int hexValue(char digit)
{
    if (isDigit(digit)) {
        return digit - '0';
    }
    const char lower = char(digit | ('a' - 'A'));
    return lower >= 'a' && lower <= 'f' ? lower - 'a' + 10 : -1;
}

bool isAscii(char character)
{
    return static_cast<signed char>(character) >= 0;
}

} // namespace

JsonReader::JsonReader(const QByteArray &text)
    : m_start(text.constData()), m_at(m_start), m_end(m_start + text.size())
{
    takeWord(byteOrderMark);
}

bool JsonReader::beginObject()
{
    return begin('{');
}

bool JsonReader::beginArray()
{
    return begin('[');
}

bool JsonReader::nextMember(std::string_view *key)
{
    if (!next('}')) {
        return false;
    }
    if (peek() != '"') {
        fail();
        return false;
    }
    const Literal literal = takeLiteral();
    if (literal.isPlain) {
        *key = literal.text;
    } else {
        m_key = decode(literal.text).toUtf8();
        *key = std::string_view(m_key.constData(), size_t(m_key.size()));
    }
    if (!take(':')) {
        fail();
    }
    return !m_failed;
}

bool JsonReader::nextElement()
{
    return next(']');
}

QString JsonReader::readString()
{
    if (peek() != '"') {
        skip();
        return {};
    }
    const Literal literal = takeLiteral();
    return literal.isPlain ? QString::fromLatin1(literal.text.data(), int(literal.text.size()))
                           : decode(literal.text);
}

bool JsonReader::readBool()
{
    if (peek() == 't' && takeWord("true")) {
        return true;
    }
    skip();
    return false;
}

int JsonReader::readInt(int defaultValue)
{
    // Whatever begins like nothing else is meant for a number.
    if (otherTokens.find(peek()) != std::string_view::npos) {
        skip();
        return defaultValue;
    }
    const double number = takeNumber();
    const bool fits =
        number >= std::numeric_limits<int>::min() && number <= std::numeric_limits<int>::max();
    return fits && int(number) == number ? int(number) : defaultValue;
}

void JsonReader::skip()
{
    std::string_view key;
    switch (peek()) {
    case '{':
        beginObject();
        while (nextMember(&key)) {
            skip();
        }
        break;
    case '[':
        beginArray();
        while (nextElement()) {
            skip();
        }
        break;
    case '"': {
        const Literal literal = takeLiteral();
        if (!literal.isPlain) {
            decode(literal.text);
        }
        break;
    }
    case 't':
    case 'f':
    case 'n':
        if (!takeWord("true") && !takeWord("false") && !takeWord("null")) {
            fail();
        }
        break;
    default:
        takeNumber();
    }
}

bool JsonReader::atEnd()
{
    peek();
    return !m_failed && m_at == m_end;
}

int JsonReader::position()
{
    peek();
    return int((m_failed ? m_failedAt : m_at) - m_start);
}

bool JsonReader::begin(char token)
{
    if (!take(token)) {
        skip();
        return false;
    }
    if (++m_depth > maximumDepth) {
        fail();
    }
    m_isFirst = true;
    return !m_failed;
}

bool JsonReader::next(char end)
{
    const bool isFirst = m_isFirst;
    m_isFirst = false;
    if (take(end)) {
        --m_depth;
        return false;
    }
    if (!isFirst && !take(',')) {
        fail();
    }
    return !m_failed;
}

// The next character that is no space, or zero at the end.
char JsonReader::peek()
{
    while (m_at < m_end && isSpace(*m_at)) {
        ++m_at;
    }
    return m_at < m_end ? *m_at : '\0';
}

bool JsonReader::take(char token)
{
    if (peek() != token || m_at == m_end) {
        return false;
    }
    ++m_at;
    return true;
}

// Nothing is left to read: every loop comes to its end.
void JsonReader::fail()
{
    if (!m_failed) {
        m_failedAt = m_at;
    }
    m_failed = true;
    m_at = m_end;
}

JsonReader::Literal JsonReader::takeLiteral()
{
    const char *start = ++m_at;
    bool isPlain = true;
    while (m_at < m_end && *m_at != '"') {
        if (*m_at == '\\') {
            isPlain = false;
            // Even a quote does not end the string there.
            ++m_at;
        } else if (!isAscii(*m_at)) {
            isPlain = false;
        }
        ++m_at;
    }
    if (m_at >= m_end) {
        m_at = start;
        fail();
        return {{}, true};
    }
    return {std::string_view(start, size_t(m_at++ - start)), isPlain};
}

QString JsonReader::decode(std::string_view text)
{
    const QTextCodec *const codec = QTextCodec::codecForMib(utf8Mib);
    QString decoded;
    const char *at = text.data();
    const char *const end = at + text.size();
    while (at < end) {
        const char *const escape = std::find(at, end, '\\');
        QTextCodec::ConverterState state(QTextCodec::IgnoreHeader);
        decoded += codec->toUnicode(at, int(escape - at), &state);
        if (state.invalidChars > 0 || state.remainingChars > 0) {
            fail();
            return {};
        }
        at = escape;
        if (at < end) {
            decoded += decodeEscape(&at, end);
        }
    }
    return m_failed ? QString() : decoded;
}

QString JsonReader::decodeEscape(const char **at, const char *end)
{
    // The backslash has something behind it, or it would have been the end of no string.
    const char escaped = *++*at;
    ++*at;
    switch (escaped) {
    case 'b':
        return QStringLiteral("\b");
    case 'f':
        return QStringLiteral("\f");
    case 'n':
        return QStringLiteral("\n");
    case 'r':
        return QStringLiteral("\r");
    case 't':
        return QStringLiteral("\t");
    case 'u': {
        constexpr int digits = 4;
        ushort character = 0;
        for (int i = 0; i < digits; ++i) {
            const int value = *at < end ? hexValue(*(*at)++) : -1;
            if (value < 0) {
                fail();
            }
            character = ushort(character * 16 + qMax(value, 0));
        }
        return QChar(character);
    }
    default:
        // Any other character stands for itself.
        if (!isAscii(escaped)) {
            fail();
        }
        return QChar(QLatin1Char(escaped));
    }
}

double JsonReader::takeNumber()
{
    const char *const start = m_at;
    const auto takeDigits = [this] {
        while (m_at < m_end && isDigit(*m_at)) {
            ++m_at;
        }
    };
    const auto takeAnyOf = [this](std::string_view characters) {
        const bool taken = m_at < m_end && characters.find(*m_at) != std::string_view::npos;
        m_at += taken ? 1 : 0;
        return taken;
    };
    takeAnyOf("-");
    if (!takeAnyOf("0")) {
        takeDigits();
    }
    if (takeAnyOf(".")) {
        takeDigits();
    }
    if (takeAnyOf("eE")) {
        takeAnyOf("+-");
        takeDigits();
    }
    bool isNumber = false;
    const double number = QByteArray::fromRawData(start, int(m_at - start)).toDouble(&isNumber);
    if (!isNumber) {
        fail();
    }
    return number;
}

bool JsonReader::takeWord(std::string_view word)
{
    if (size_t(m_end - m_at) < word.size() || !std::equal(word.begin(), word.end(), m_at)) {
        return false;
    }
    m_at += word.size();
    return true;
}
