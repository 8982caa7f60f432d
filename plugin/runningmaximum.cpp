// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "runningmaximum.h"

#include <algorithm>

void RunningMaximum::clear()
{
    m_numbers.clear();
    m_highest.clear();
}

void RunningMaximum::insert(int row, uint number)
{
    const auto index = std::size_t(row);
    const uint before = index == 0 ? number : m_highest[index - 1];
    m_numbers.insert(m_numbers.begin() + row, number);
    m_highest.insert(m_highest.begin() + row, std::max(before, number));
    update(index + 1);
}

void RunningMaximum::replace(int row, uint number)
{
    m_numbers[std::size_t(row)] = number;
    update(std::size_t(row));
}

int RunningMaximum::firstAbove(uint number) const
{
    return int(std::upper_bound(m_highest.cbegin(), m_highest.cend(), number) - m_highest.cbegin());
}

void RunningMaximum::update(std::size_t row)
{
    for (; row < m_numbers.size(); ++row) {
        const uint number = m_numbers[row];
        const uint highest = row == 0 ? number : std::max(number, m_highest[row - 1]);
        if (m_highest[row] == highest) {
            return; // and so it is for all that follow
        }
        m_highest[row] = highest;
    }
}
