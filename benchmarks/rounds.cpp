// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "rounds.h"

#include <algorithm>
#include <cstdio>
#include <ctime>
#include <numeric>
#include <random>

namespace {

constexpr size_t rounds = 25;

double processorTime(const std::function<void()> &work)
{
    const std::clock_t before = std::clock();
    work();
    return double(std::clock() - before) / CLOCKS_PER_SEC;
}

} // namespace

std::vector<std::vector<double>> Rounds::times(const std::vector<std::function<void()>> &works)
{
    std::vector<std::vector<double>> times(works.size());
    std::vector<size_t> order(works.size());
    std::iota(order.begin(), order.end(), 0);
    std::mt19937 random(std::random_device{}());
    for (const auto &work : works) {
        work();
    }
    for (size_t round = 0; round < rounds; ++round) {
        std::shuffle(order.begin(), order.end(), random);
        for (const size_t work : order) {
            times[work].push_back(processorTime(works[work]));
        }
    }
    return times;
}

bool Rounds::report(const char *work, const std::vector<double> &times,
                    const std::vector<double> &referenceTimes, double bar)
{
    std::vector<double> ratios;
    for (size_t round = 0; round < times.size(); ++round) {
        ratios.push_back(times[round] / referenceTimes[round]);
    }
    std::sort(ratios.begin(), ratios.end());
    const double median = ratios[ratios.size() / 2];
    const bool missed = median > bar && ratios[1] > bar;
    std::printf("%-62s %5.2f (%.2f to %.2f), bar %.2f%s\n", work, median, ratios.front(),
                ratios.back(), bar, missed ? ", MISSED" : "");
    return !missed;
}
