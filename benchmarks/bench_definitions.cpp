// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Compares checking definition files with loading the same files with their models.

#include "definitions-tool/definitionschecker.h"
#include "eventswidgets/eventswidgetsmodel.h"
#include "quickactions/quickactionsmodel.h"
#include "rounds.h"

#include <QCoreApplication>
#include <QDir>
#include <QFile>

namespace {

const QString quickActions = QStringLiteral("/usr/share/glimmera/quickactions");
const QString eventsWidgets = QStringLiteral("/usr/share/glimmera/eventswidgets");
constexpr int files = 500; // of each kind

void write(const QString &path, const QString &content)
{
    QFile file(path);
    if (!file.open(QIODevice::WriteOnly) || file.write(content.toLatin1()) < 0) {
        qFatal("cannot write %s", qPrintable(path));
    }
}

void writeDefinitions()
{
    QDir().mkpath(quickActions);
    QDir().mkpath(eventsWidgets);
    for (int i = 0; i < files; ++i) {
        write(QStringLiteral("%1/action-%2.conf").arg(quickActions).arg(i),
              QStringLiteral("title=action-title-%1\n"
                             "translation-catalog=action\n"
                             "icon=icon-action\n"
                             "priority=%2\n"
                             "remote-service=org.example.action\n"
                             "remote-path=/action\n"
                             "remote-interface=org.example.Action\n"
                             "remote-method=run\n"
                             "[remote-arguments]\nsize=1\n1\\argument=bright\n")
                  .arg(i)
                  .arg(i * 7 % 100));
        write(QStringLiteral("%1/widget-%2.json").arg(eventsWidgets).arg(i),
              QStringLiteral("{\n    \"translation_catalog\": \"widgets\",\n    \"widgets\": [\n"
                             "        {\n"
                             "            \"path\": \"/usr/share/widgets/%1/main.qml\",\n"
                             "            \"title\": \"Title of %1\",\n"
                             "            \"translation_id\": \"widget-%1-title\",\n"
                             "            \"description_id\": \"widget-%1-description\",\n"
                             "            \"icon\": \"image://theme/icon-%1\",\n"
                             "            \"order\": %2,\n"
                             "            \"default_enabled\": true\n"
                             "        }\n    ]\n}\n")
                  .arg(i)
                  .arg(i * 7919LL % 1000));
    }
}

void load()
{
    QuickActionsModel actions;
    actions.setShowPotential(true);
    actions.componentComplete();
    EventsWidgetsModel widgets;
    widgets.componentComplete();
    if (actions.count() != files || widgets.rowCount() != files) {
        qFatal("%d actions and %d widgets", actions.count(), widgets.rowCount());
    }
}

void check()
{
    DefinitionsChecker checker(QStringLiteral("/"));
    // The catalogs and QML files that the definitions name are not installed.
    if (!checker.checkInstalled() || checker.findings().size() != 3 * files) {
        qFatal("%zu findings", checker.findings().size());
    }
}

} // namespace

int main(int argc, char *argv[])
{
    if (!qEnvironmentVariableIsSet("MARLO_THROW_AWAY_ROOT")) {
        qFatal("runs only in the throw-away root of simulator");
    }
    const QCoreApplication application(argc, argv);
    writeDefinitions();
    const std::vector<Rounds::Times> times = Rounds::times({{load}, {check}});
    return Rounds::report("check 1,000 definition files", "loading them with the models", times[1],
                          times[0])
        ? 0
        : 1;
}
