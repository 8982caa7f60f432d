// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "jsonwalker.h"

#include "files/characters.h"

#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>

#include <utility>

namespace {

bool isOpening(char character)
{
    return character == '{' || character == '[';
}

bool isClosing(char character)
{
    return character == '}' || character == ']';
}

} // namespace

JsonWalker::JsonWalker(QByteArray text, int position)
    : m_text(std::move(text)), m_isObject(m_text.at(position) == '{'), m_end(position + 1)
{
}

bool JsonWalker::next()
{
    int start = skipSpace(m_end);
    if (m_text.at(start) == ',') {
        start = skipSpace(start + 1);
    }
    if (isClosing(m_text.at(start))) {
        return false;
    }
    if (m_isObject) {
        m_key = start;
        const int colon = skipSpace(endOfString(start));
        start = skipSpace(colon + 1);
    }
    m_position = start;
    m_end = endOfValue(start);
    return true;
}

QString JsonWalker::key() const
{
    return valueAt(m_key, endOfString(m_key)).toString();
}

QJsonValue JsonWalker::value() const
{
    switch (m_text.at(m_position)) {
    case '{':
        return QJsonObject();
    case '[':
        return QJsonArray();
    default:
        return valueAt(m_position, m_end);
    }
}

int JsonWalker::skipSpace(int position) const
{
    while (isSpace(m_text.at(position))) {
        ++position;
    }
    return position;
}

int JsonWalker::endOfString(int position) const
{
    do {
        // A quote after a backslash does not end the string.
        position += m_text.at(position) == '\\' ? 2 : 1;
    } while (m_text.at(position) != '"');
    return position + 1;
}

// Returns the position of the comma or bracket that follows the value. One of them does, because every
// value is in an object or an array.
int JsonWalker::endOfValue(int position) const
{
    int depth = 0;
    do {
        const char character = m_text.at(position);
        if (character == '"') {
            position = endOfString(position);
        } else {
            depth += isOpening(character) ? 1 : isClosing(character) ? -1 : 0;
            ++position;
        }
    } while (depth > 0 || !(isClosing(m_text.at(position)) || m_text.at(position) == ','));
    return position;
}

QJsonValue JsonWalker::valueAt(int position, int end) const
{
    return QJsonDocument::fromJson('[' + m_text.mid(position, end - position) + ']').array().at(0);
}
