// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef WORDS_H
#define WORDS_H

#include <QStringList>

// The words of a text that are separated by blanks.
inline QStringList words(const QString &text)
{
    return text.split(QLatin1Char(' '), Qt::SkipEmptyParts);
}

inline QStringList words(const char *text)
{
    return words(QString::fromUtf8(text));
}

#endif
