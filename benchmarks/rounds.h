// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef ROUNDS_H
#define ROUNDS_H

#include <functional>
#include <vector>

/*
    Ratios of two workloads timed in the same run; absolute times depend on the machine.

    Prints the rows of a Markdown table; ./dev bench prints its head. The bar of a ratio is its usual
    value, which is in medians.txt, times a factor. A ratio that the file does not contain counts as
    missed.
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

// How far a ratio may be above its usual value.
constexpr double usualFactor = 1.25;

enum class WarmUp { Yes, No };

// Runs everything in rounds, each in a random order, and with WarmUp::Yes once before that.
std::vector<Times> times(const std::vector<Work> &works, int rounds = 9,
                         WarmUp warmUp = WarmUp::Yes);

// Prints the median of the rounds' ratios, the lowest and the highest, and the bar. The bar is missed
// only when all rounds but one miss it: the machine may disturb a single round. Returns whether the
// ratio is within its bar.
bool report(const char *work, const char *beside, const Times &times, const Times &references,
            double factor = usualFactor, double Time::*clock = &Time::processor);

// Prints the median of times on this machine, the lowest and the highest, which have no bar.
void reportTimes(const char *work, std::vector<double> milliseconds);

// Prints a figure that is not a ratio. Its bar is missed as soon as the figure is above it.
bool reportFigure(const char *work, const char *unit, double figure, double bar);

} // namespace Rounds

#endif
