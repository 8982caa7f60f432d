// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef INSERTIONINDEX_H
#define INSERTIONINDEX_H

#include <QtGlobal>

#include <algorithm>
#include <vector>

// Where to insert a row: before the first row with a higher number, or at the end without such a
// row or with a negative number. The rows need not be sorted.
template<typename Number> int insertionIndex(const std::vector<Number> &rows, qint64 number)
{
    const auto isHigher = [number](Number row) { return row > number; };
    const auto place =
        number < 0 ? rows.cend() : std::find_if(rows.cbegin(), rows.cend(), isHigher);
    return int(place - rows.cbegin());
}

#endif
