// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef LITERALS_H
#define LITERALS_H

#include <QLatin1String>

// A literal as a constant: "title"_L1. Newer versions of Qt have the same operator.
constexpr QLatin1String operator""_L1(const char *text, std::size_t length) noexcept
{
    return QLatin1String(text, int(length));
}

#endif
