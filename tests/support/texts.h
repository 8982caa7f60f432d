// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef TEXTS_H
#define TEXTS_H

#include <QString>

// A literal as a text: "title"_s.
inline QString operator""_s(const char *text, std::size_t length)
{
    return QString::fromUtf8(text, int(length));
}

#endif
