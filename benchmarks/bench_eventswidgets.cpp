// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

/*
    Loading events widgets, by their number and beside the parsing of their files alone, and a
    titles view beside a bare loop over the data of its rows. Runs in the tests' throw-away root.

    The two sides of a ratio take turns, and a figure is the median of the rounds' ratios, with the
    lowest and the highest. The exit status is 1 when a bar is clearly missed: by the median and by
    all rounds but one at most.
*/

#include "eventswidgetsmodel.h"
#include "titlesview.h"

#include <QCoreApplication>
#include <QDir>
#include <QFile>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QStringListModel>

#include <algorithm>
#include <array>
#include <cstdio>
#include <ctime>
#include <functional>

namespace {

const QLatin1String directory("/usr/share/glimmera/eventswidgets");

constexpr int rounds = 9;
constexpr int few = 500;
constexpr int many = 5000;
constexpr int titles = 10000;
// So many times is the shorter side run in a round, for a time that can be measured.
constexpr int repetitions = many / few;

constexpr double growthBar = 1.5;
constexpr double parsingBar = 1.5;
constexpr double titlesBar = 1.3;

enum class Layout { OneFile, OneFileEach };

// Keeps what is computed for its time alone.
volatile qint64 sink = 0;

QJsonObject widget(int number)
{
    const QString name = QStringLiteral("widget-%1").arg(number);
    return {
        {QStringLiteral("path"), QStringLiteral("/usr/share/widgets/%1/main.qml").arg(name)},
        {QStringLiteral("title"), QStringLiteral("Title of %1").arg(name)},
        {QStringLiteral("translation_id"), QStringLiteral("%1-title").arg(name)},
        {QStringLiteral("description_id"), QStringLiteral("%1-description").arg(name)},
        {QStringLiteral("icon"), QStringLiteral("image://theme/icon-%1").arg(name)},
        // Out of order, so that most are inserted between others.
        {QStringLiteral("order"), int(number * 7919LL % 1000)},
        {QStringLiteral("default_enabled"), number % 2 == 0},
    };
}

void writeFile(const QString &name, const QJsonArray &widgets)
{
    QFile file(directory + QLatin1Char('/') + name);
    const QJsonObject definition = {
        {QStringLiteral("translation_catalog"), QStringLiteral("widgets")},
        {QStringLiteral("widgets"), widgets},
    };
    if (!file.open(QIODevice::WriteOnly) || file.write(QJsonDocument(definition).toJson()) < 0) {
        qFatal("cannot write %s", qPrintable(file.fileName()));
    }
}

void writeDefinitions(Layout layout, int count)
{
    QDir(directory).removeRecursively();
    QDir().mkpath(directory);
    QJsonArray widgets;
    for (int i = 0; i < count; ++i) {
        if (layout == Layout::OneFileEach) {
            writeFile(QStringLiteral("widget-%1.json").arg(i), {widget(i)});
        } else {
            widgets.append(widget(i));
        }
    }
    if (layout == Layout::OneFile) {
        writeFile(QStringLiteral("widgets.json"), widgets);
    }
}

// Of processor time, with the kernel's: what else the machine does at the moment is left out.
double nanoseconds(const std::function<void()> &work)
{
    const auto now = [] {
        timespec time = {};
        clock_gettime(CLOCK_THREAD_CPUTIME_ID, &time);
        return double(time.tv_sec) * 1e9 + double(time.tv_nsec);
    };
    const double start = now();
    work();
    return now() - start;
}

double loadingTime(int expectedRows)
{
    EventsWidgetsModel model;
    const double time = nanoseconds([&model] { model.componentComplete(); });
    if (model.rowCount() != expectedRows) {
        qFatal("%d rows instead of %d", model.rowCount(), expectedRows);
    }
    return time;
}

void parseAll()
{
    const QDir definitions(directory);
    const QStringList names = definitions.entryList(QDir::Files, QDir::Unsorted);
    for (const QString &name : names) {
        QFile file(definitions.filePath(name));
        if (!file.open(QIODevice::ReadOnly)) {
            qFatal("cannot read %s", qPrintable(name));
        }
        sink = sink + QJsonDocument::fromJson(file.readAll()).object().size();
    }
}

struct Row {
    const char *work;
    const char *comparedTo;
    double bar;
};

// Prints the row; false if its bar is clearly missed.
bool report(const Row &row, double time, std::array<double, rounds> ratios)
{
    std::sort(ratios.begin(), ratios.end());
    const double median = ratios.at(rounds / 2);
    const auto held = std::count_if(ratios.cbegin(), ratios.cend(),
                                    [&row](double ratio) { return ratio <= row.bar; });
    const bool missed = median > row.bar && held <= 1;
    std::printf("%-46s %8.2f ms  %.2f x %s (%.2f-%.2f, bar %.2f)%s\n", row.work, time / 1e6, median,
                row.comparedTo, ratios.front(), ratios.back(), row.bar, missed ? " MISSED" : "");
    std::fflush(stdout);
    return !missed;
}

bool compareLoading(Layout layout)
{
    const bool oneFile = layout == Layout::OneFile;
    std::array<double, rounds> growth = {};
    std::array<double, rounds> parsing = {};
    std::array<double, rounds> times = {};
    for (int round = -1; round < rounds; ++round) {
        writeDefinitions(layout, few);
        double fewTime = 0;
        for (int i = 0; i < repetitions; ++i) {
            fewTime += loadingTime(few);
        }
        writeDefinitions(layout, many);
        const double parsingTime = nanoseconds(parseAll);
        const double manyTime = loadingTime(many);
        // The first round is for warming up.
        if (round >= 0) {
            growth.at(size_t(round)) = manyTime / fewTime;
            parsing.at(size_t(round)) = manyTime / parsingTime;
            times.at(size_t(round)) = manyTime;
        }
    }
    std::sort(times.begin(), times.end());
    const double time = times.at(rounds / 2);
    const bool growthHeld =
        report({oneFile ? "load 5,000 widgets, one file" : "load 5,000 widgets, one file each",
                "as long per widget as 500", growthBar},
               time, growth);
    const bool parsingHeld =
        report({oneFile ? "load 5,000 widgets, one file" : "load 5,000 widgets, one file each",
                "parsing", parsingBar},
               time, parsing);
    return growthHeld && parsingHeld;
}

// What a view of these roles has to ask at least: the second one of every row, if there are two,
// and the first one of those that match.
void readTitles(const QAbstractListModel &model, const QVector<int> &roles)
{
    const int count = model.rowCount();
    for (int row = 0; row < count; ++row) {
        const QModelIndex index = model.index(row, 0);
        if (roles.size() == 1 || model.data(index, roles.at(1)).toBool()) {
            sink = sink + model.data(index, roles.at(0)).userType();
        }
    }
}

bool compareTitles(const char *work, QAbstractListModel *model, const QVector<int> &roles)
{
    const auto roleName = [model, &roles](int i) {
        return QString::fromLatin1(model->roleNames().value(roles.at(i)));
    };
    TitlesView view;
    view.setModel(model);
    view.setRole(roleName(0));
    if (roles.size() > 1) {
        view.setMatchRole(roleName(1));
        view.setMatch(true);
    }
    const int expected = roles.size() > 1 ? titles / 2 : titles;
    if (view.values().size() != expected) {
        qFatal("%d titles instead of %d", view.values().size(), expected);
    }

    std::array<double, rounds> ratios = {};
    std::array<double, rounds> times = {};
    for (int round = -1; round < rounds; ++round) {
        double viewTime = 0;
        double loopTime = 0;
        for (int i = 0; i < repetitions; ++i) {
            viewTime += nanoseconds([&view] { view.update(); });
            loopTime += nanoseconds([model, &roles] { readTitles(*model, roles); });
        }
        if (round >= 0) {
            ratios.at(size_t(round)) = viewTime / loopTime;
            times.at(size_t(round)) = viewTime / repetitions;
        }
    }
    std::sort(times.begin(), times.end());
    return report({work, "a bare loop", titlesBar}, times.at(rounds / 2), ratios);
}

} // namespace

int main(int argc, char *argv[])
{
    if (!qEnvironmentVariableIsSet("MARLO_THROW_AWAY_ROOT")) {
        qFatal("runs only in the throw-away root of tests/sandbox");
    }
    const QCoreApplication application(argc, argv);
    bool held = compareLoading(Layout::OneFile);
    held = compareLoading(Layout::OneFileEach) && held;

    writeDefinitions(Layout::OneFile, titles);
    EventsWidgetsModel widgets;
    widgets.componentComplete();
    held = compareTitles("titles of 10,000 widgets", &widgets, {EventsWidgetsModel::TitleRole})
        && held;
    held = compareTitles("titles of 10,000 widgets, half of them match", &widgets,
                         {EventsWidgetsModel::TitleRole, EventsWidgetsModel::EnabledRole})
        && held;
    return held ? 0 : 1;
}
