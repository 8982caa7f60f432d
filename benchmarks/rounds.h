// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef ROUNDS_H
#define ROUNDS_H

#include <functional>
#include <vector>

/*
    Ratios between works that are timed in one run: a single time depends on the machine.

    Prints the rows of a Markdown table; ./dev bench prints its head.
*/
namespace Rounds {

// In seconds. Other processes disturb processor time, which includes that of children, the least.
// Only the wall time includes waiting.
struct Time {
    double wall = 0;
    double processor = 0;
};
// A time for each round.
using Times = std::vector<Time>;

struct Work {
    std::function<void()> run;
    // Runs before every run and is not measured.
    std::function<void()> prepare = [] {};
};

// For figures that are printed but not checked.
constexpr double noBar = -1;

enum class WarmUp { Yes, No };

// Runs everything in rounds, each in a random order, and with WarmUp::Yes once before that.
std::vector<Times> times(const std::vector<Work> &works, int rounds = 9,
                         WarmUp warmUp = WarmUp::Yes);

// Prints the median of the rounds' ratios, the lowest and the highest, and the bar. The bar is missed
// only when all rounds but one miss it: the machine may disturb a single round. Returns whether the
// bar is kept.
bool report(const char *work, const char *beside, const Times &times, const Times &references,
            double bar, double Time::*clock = &Time::processor);

// Prints the median of times on this machine, the lowest and the highest, which have no bar.
void reportTimes(const char *work, std::vector<double> milliseconds);

// Prints a figure that is not a ratio. Its bar is missed as soon as the figure is above it.
bool report(const char *work, const char *unit, double figure, double bar);

} // namespace Rounds

#endif
