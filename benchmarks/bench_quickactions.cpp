// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Loading quick actions, beside reading the same files with QSettings and doing nothing more.

#include "mgconfitem.h"
#include "quickactionsmodel.h"
#include "rounds.h"

#include <QCoreApplication>
#include <QDir>
#include <QFile>
#include <QSettings>

#include <cstdio>

namespace {

const QString directory = QStringLiteral("/usr/share/glimmera/quickactions");
const QString blockedKey = QStringLiteral("/desktop/glimmera-marlo-home/blocked_actions");
const QString enabledKey = QStringLiteral("/desktop/glimmera-marlo-home/events_screen_actions");

QStringList write(int count)
{
    if (!qEnvironmentVariableIsSet("MARLO_THROW_AWAY_ROOT")) {
        qFatal("runs only in the throw-away root of tests/sandbox");
    }
    QDir(directory).removeRecursively();
    QDir().mkpath(directory);
    QStringList paths;
    for (int i = 0; i < count; ++i) {
        QFile file(QStringLiteral("%1/action-%2.conf").arg(directory).arg(i, 5, 10, QChar(u'0')));
        if (!file.open(QIODevice::WriteOnly)) {
            qFatal("cannot write %s", qPrintable(file.fileName()));
        }
        file.write(QStringLiteral("title=action-title-%1\n"
                                  "translation-catalog=action\n"
                                  "icon=icon-action\n"
                                  "priority=%2\n"
                                  "remote-service=org.example.action\n"
                                  "remote-path=/action\n"
                                  "remote-interface=org.example.Action\n"
                                  "remote-method=run\n"
                                  "[remote-arguments]\nsize=1\n1\\argument=%1\n")
                       .arg(i)
                       .arg(i * 7 % 100)
                       .toLatin1());
        paths.append(file.fileName());
    }
    return paths;
}

void readWithSettings(const QStringList &paths)
{
    for (const QString &path : paths) {
        QSettings settings(path, QSettings::IniFormat);
        const QStringList keys = settings.childKeys();
        for (const QString &key : keys) {
            settings.value(key);
        }
        const int size = settings.beginReadArray(QStringLiteral("remote-arguments"));
        for (int i = 0; i < size; ++i) {
            settings.setArrayIndex(i);
            settings.value(QStringLiteral("argument"));
        }
        settings.endArray();
    }
}

void load(bool showPotential, int expected)
{
    QuickActionsModel model;
    model.setShowPotential(showPotential);
    model.componentComplete();
    if (model.count() != expected) {
        qFatal("%d rows instead of %d", model.count(), expected);
    }
}

// Loads the actions as often as makes 2,000 files in all, so that every count takes about as long.
std::function<void()> repeatedly(int count, const std::function<void()> &work)
{
    return [count, work] {
        for (int i = 0; i < 2000 / count; ++i) {
            work();
        }
    };
}

// Gives the times of reading with the model and says whether the bar is kept.
bool measure(int count, bool enabled, std::vector<double> *modelTimes)
{
    const QStringList paths = write(count);
    MGConfItem(enabledKey).set(enabled ? paths : QStringList());
    const auto times = Rounds::times({repeatedly(count, [&] { readWithSettings(paths); }),
                                      repeatedly(count, [&] { load(!enabled, count); })});
    *modelTimes = times[1];
    const QString work = QStringLiteral("load %1 quick actions, %2, beside QSettings")
                             .arg(count)
                             .arg(enabled ? QStringLiteral("enabled") : QStringLiteral("offered"));
    // A model costs something of its own: with a hundred definitions that shows.
    return Rounds::report(qPrintable(work), times[1], times[0], count < 1000 ? 2.5 : 1.5);
}

} // namespace

int main(int argc, char *argv[])
{
    const QCoreApplication application(argc, argv);
    // Held by somebody else as well, as where there are several models: the bus is asked once to tell
    // of the keys' changes, and not for each model anew.
    const MGConfItem enabledItem(enabledKey);
    const MGConfItem blockedItem(blockedKey);

    bool passed = true;
    for (const bool enabled : {true, false}) {
        std::vector<double> few;
        std::vector<double> many;
        passed &= measure(100, enabled, &few);
        passed &= measure(1000, enabled, &many);
        passed &= measure(2000, enabled, &many);
        // Both read 2,000 files in all.
        passed &= Rounds::report(enabled ? "time per definition, 2,000 enabled beside 100"
                                         : "time per definition, 2,000 offered beside 100",
                                 many, few, 1.5);
    }
    return passed ? 0 : 1;
}
