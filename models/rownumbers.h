// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef ROWNUMBERS_H
#define ROWNUMBERS_H

#include <algorithm>
#include <vector>

/*
    The numbers that order the rows of a model. insert() finds the place of a new row.

    The rows need not be sorted. The class keeps the highest number up to each row. These numbers
    are sorted, so that a binary search finds the first row with a higher number.
*/
template<typename Number> class RowNumbers
{
public:
    int count() const { return int(m_highest.size()); }
    void clear() { m_highest.clear(); }

    void append(Number number)
    {
        m_highest.push_back(m_highest.empty() ? number : std::max(number, m_highest.back()));
    }

    // Inserts a number before the first row with a higher number, or at the end if there is no such
    // row or the number is negative. Returns its row.
    int insert(Number number)
    {
        const auto place = std::upper_bound(m_highest.cbegin(), m_highest.cend(), number);
        if (number < 0 || place == m_highest.cend()) {
            append(number);
            return count() - 1;
        }
        const int row = int(place - m_highest.cbegin());
        m_highest.insert(place, number);
        return row;
    }

private:
    std::vector<Number> m_highest;
};

#endif
