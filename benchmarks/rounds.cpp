// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "rounds.h"

#include <QElapsedTimer>
#include <QFile>
#include <QHash>
#include <QString>

#include <algorithm>
#include <cstdio>
#include <numeric>
#include <random>

#include <sys/resource.h>

namespace {

double processorTime()
{
    double seconds = 0;
    for (const auto who : {RUSAGE_SELF, RUSAGE_CHILDREN}) {
        rusage usage = {};
        getrusage(who, &usage);
        for (const timeval &time : {usage.ru_utime, usage.ru_stime}) {
            seconds += double(time.tv_sec) + double(time.tv_usec) / 1e6;
        }
    }
    return seconds;
}

Rounds::Time timeOf(const Rounds::Work &work)
{
    work.prepare();
    const double processorBefore = processorTime();
    QElapsedTimer timer;
    timer.start();
    work.run();
    const double wall = double(timer.nsecsElapsed()) / 1e9;
    return {wall, processorTime() - processorBefore};
}

// The usual ratios by "work | compared with".
QHash<QByteArray, double> readMedians()
{
    QFile file(QStringLiteral(MEDIANS));
    if (!file.open(QIODevice::ReadOnly)) {
        qFatal("cannot read %s", MEDIANS);
    }
    QHash<QByteArray, double> medians;
    const QList<QByteArray> lines = file.readAll().split('\n');
    for (const QByteArray &line : lines) {
        const int last = line.lastIndexOf(" | ");
        if (last > 0 && !line.startsWith('#')) {
            medians.insert(line.left(last), line.mid(last + 3).toDouble());
        }
    }
    return medians;
}

constexpr double noBar = -1;

void printRow(const char *work, const char *beside, const QString &figure, double bar, bool kept)
{
    const QString barText = bar >= 0 ? QString::number(bar, 'f', 2) : QStringLiteral("none");
    std::printf("| %s | %s | %s | %s | %s |\n", work, beside, qPrintable(figure),
                qPrintable(barText), kept ? "" : "MISSED");
    std::fflush(stdout);
}

} // namespace

std::vector<Rounds::Times> Rounds::times(const std::vector<Work> &works, int rounds, WarmUp warmUp)
{
    std::vector<Times> times(works.size());
    std::vector<size_t> order(works.size());
    std::iota(order.begin(), order.end(), 0);
    std::mt19937 random(std::random_device{}());
    if (warmUp == WarmUp::Yes) {
        for (const Work &work : works) {
            timeOf(work);
        }
    }
    for (int round = 0; round < rounds; ++round) {
        std::shuffle(order.begin(), order.end(), random);
        for (const size_t work : order) {
            times[work].push_back(timeOf(works[work]));
        }
    }
    return times;
}

void Rounds::reportTimes(const char *work, std::vector<double> milliseconds)
{
    std::sort(milliseconds.begin(), milliseconds.end());
    printRow(work, "time on this machine",
             QStringLiteral("%1 ms (%2 to %3)")
                 .arg(milliseconds[milliseconds.size() / 2], 0, 'f', 2)
                 .arg(milliseconds.front(), 0, 'f', 2)
                 .arg(milliseconds.back(), 0, 'f', 2),
             noBar, true);
}

bool Rounds::report(const char *work, const char *beside, const Times &times,
                    const Times &references, double factor, double Time::*clock)
{
    static const QHash<QByteArray, double> medians = readMedians();
    const double usual = medians.value(QByteArray(work) + " | " + beside, noBar);
    const double bar = usual < 0 ? noBar : usual * factor;
    std::vector<double> ratios;
    for (size_t round = 0; round < times.size(); ++round) {
        ratios.push_back(times[round].*clock / references[round].*clock);
    }
    std::sort(ratios.begin(), ratios.end());
    const double median = ratios[ratios.size() / 2];
    const bool kept = median <= bar || ratios[1] <= bar;
    printRow(work, beside,
             QStringLiteral("%1 (%2 to %3)")
                 .arg(median, 0, 'f', 2)
                 .arg(ratios.front(), 0, 'f', 2)
                 .arg(ratios.back(), 0, 'f', 2),
             bar, kept);
    return kept;
}

bool Rounds::reportFigure(const char *work, const char *unit, double figure, double bar)
{
    const bool kept = bar < 0 || figure <= bar;
    printRow(work, unit, QString::number(figure, 'g', 5), bar, kept);
    return kept;
}
