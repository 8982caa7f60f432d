// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef RUNNINGMAXIMUM_H
#define RUNNINGMAXIMUM_H

#include <QtGlobal>

#include <vector>

/*
    A number for each row of a model, by which the place of a new row is found: before the first row
    with a higher number, in rows that need not be sorted. What is found is the first place where
    the highest number so far is higher, and those are sorted whatever the rows are.
*/
class RunningMaximum
{
public:
    void clear();
    void insert(int row, uint number);
    void replace(int row, uint number);
    // The number of rows if there is none.
    int firstAbove(uint number) const;

private:
    void update(std::size_t row);

    std::vector<uint> m_numbers;
    // The highest of the numbers down to each row.
    std::vector<uint> m_highest;
};

#endif
