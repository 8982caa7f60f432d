// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef ROUNDS_H
#define ROUNDS_H

#include <functional>
#include <vector>

/*
    Ratios between things that are timed in one run: no time says anything by itself. What is timed
    is work, not waiting, in processor time, which other users of the machine disturb least.
*/
namespace Rounds {

// Runs everything once for warming up, then in rounds, each in an order of its own. Gives for each
// work what it took in each round, in seconds.
std::vector<std::vector<double>> times(const std::vector<std::function<void()>> &works);

// Prints a line: the median of the rounds' ratios, the lowest and the highest, and the bar. The bar
// counts as missed only when all rounds but one miss it: a lone round tells of the machine.
bool report(const char *work, const std::vector<double> &times,
            const std::vector<double> &referenceTimes, double bar);

} // namespace Rounds

#endif
