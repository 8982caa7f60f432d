// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef CHARACTERS_H
#define CHARACTERS_H

// A text in UTF-8 may begin with this mark. If a settings file does, QSettings reads values as
// UTF-8, otherwise as Latin-1.
constexpr const char *byteOrderMark = "\xef\xbb\xbf";

// White space in settings files and in JSON.
constexpr bool isSpace(char character)
{
    return character == ' ' || character == '\t' || character == '\n' || character == '\r';
}

#endif
