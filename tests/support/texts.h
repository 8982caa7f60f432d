// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef TEXTS_H
#define TEXTS_H

#include <QString>
#include <QStringList>

// A literal as a text: "title"_s.
inline QString operator""_s(const char *text, std::size_t length)
{
    return QString::fromUtf8(text, int(length));
}

// A literal as the list of its words: "a b c"_words.
inline QStringList operator""_words(const char *text, std::size_t length)
{
    return QString::fromUtf8(text, int(length)).split(QLatin1Char(' '), Qt::SkipEmptyParts);
}

#endif
