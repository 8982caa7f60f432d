// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Compares loading quick actions with only reading the same files with QSettings.

#include "mgconfitem.h"
#include "quickactions/quickactionsmodel.h"
#include "rounds.h"

#include <QCoreApplication>
#include <QDir>
#include <QFile>
#include <QSettings>

#include <memory>

namespace {

const QString directory = QStringLiteral("/usr/share/glimmera/quickactions");
const QString blockedKey = QStringLiteral("/desktop/glimmera-marlo-home/blocked_actions");
const QString enabledKey = QStringLiteral("/desktop/glimmera-marlo-home/events_screen_actions");

constexpr int few = 100;
constexpr int many = 1000;
constexpr int total = 5000; // for times that can be measured

QStringList write(int count)
{
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

// Both sides repeat a count until they have read the same total, so that every count takes about as
// long.
Rounds::Work reading(int count)
{
    const auto paths = std::make_shared<QStringList>();
    return {[=] {
                for (int i = 0; i < total / count; ++i) {
                    readWithSettings(*paths);
                }
            },
            [=] { *paths = write(count); }};
}

Rounds::Work loading(int count, bool enabled)
{
    const auto models = std::make_shared<std::vector<std::unique_ptr<QuickActionsModel>>>();
    return {[=] {
                for (const auto &model : *models) {
                    model->componentComplete();
                    if (model->count() != count) {
                        qFatal("%d rows instead of %d", model->count(), count);
                    }
                }
            },
            [=] {
                models->clear();
                const QStringList paths = write(count);
                MGConfItem(enabledKey).set(enabled ? paths : QStringList());
                for (int i = 0; i < total / count; ++i) {
                    models->push_back(std::make_unique<QuickActionsModel>());
                    models->back()->setShowPotential(!enabled);
                }
            }};
}

// Models from construction to destruction.
Rounds::Work lifetimes(int count)
{
    return {[=] {
                for (int i = 0; i < total / count; ++i) {
                    QuickActionsModel model;
                    model.setShowPotential(true);
                    model.componentComplete();
                    if (model.count() != count) {
                        qFatal("%d rows instead of %d", model.count(), count);
                    }
                }
            },
            [=] { write(count); }};
}

bool measureLoading(bool enabled)
{
    const std::vector<int> counts{few, many};
    std::vector<Rounds::Work> works;
    for (const int count : counts) {
        works.push_back(loading(count, enabled));
        works.push_back(reading(count));
    }
    const auto times = Rounds::times(works);

    const QString kind = enabled ? QStringLiteral("enabled") : QStringLiteral("offered");
    bool kept = true;
    for (size_t i = 0; i < counts.size(); ++i) {
        const QString work = QStringLiteral("load %1 quick actions, %2").arg(counts[i]).arg(kind);
        kept &= Rounds::report(qPrintable(work), "QSettings on the same files", times[2 * i],
                               times[2 * i + 1]);
    }
    const QString growth = QStringLiteral("load %1 quick actions, %2").arg(many).arg(kind);
    kept &= Rounds::report(qPrintable(growth), "as long for each as 100", times[2], times[0]);
    return kept;
}

bool measureLifetime()
{
    const auto times = Rounds::times({lifetimes(many), reading(many)});
    return Rounds::report("create, load and destroy a model of 1000 quick actions",
                          "QSettings on the same files", times[0], times[1]);
}

} // namespace

int main(int argc, char *argv[])
{
    if (!qEnvironmentVariableIsSet("MARLO_THROW_AWAY_ROOT")) {
        qFatal("runs only in the throw-away root of simulator");
    }
    const QCoreApplication application(argc, argv);
    // Keep the keys watched, as other models do: otherwise each model subscribes to them again.
    const MGConfItem enabledItem(enabledKey);
    const MGConfItem blockedItem(blockedKey);

    bool kept = measureLoading(true);
    kept &= measureLoading(false);
    kept &= measureLifetime();
    return kept ? 0 : 1;
}
