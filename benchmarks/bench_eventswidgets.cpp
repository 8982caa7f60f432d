// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Compares loading and rescanning events widgets with only parsing their files, and a titles view
// with a bare loop over the data of its rows.

#include "eventswidgets/eventswidgetsmodel.h"
#include "eventswidgets/titlesview.h"
#include "rounds.h"

#include <QCoreApplication>
#include <QDir>
#include <QFile>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QStringListModel>

#include <memory>

namespace {

const QLatin1String directory("/usr/share/glimmera/eventswidgets");

constexpr int few = 100;
constexpr int many = 1000;
constexpr int total = 5000; // for times that can be measured

enum class Layout { OneFile, OneFileEach };

// Stores results that nothing reads. Otherwise the compiler would drop their computation.
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
        // Not sorted, so that most rows are inserted between others.
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

// Both sides repeat a count until they have read the same total, so that every count takes about as
// long.
Rounds::Work parsing(Layout layout, int count)
{
    return {[=] {
                for (int i = 0; i < total / count; ++i) {
                    parseAll();
                }
            },
            [=] { writeDefinitions(layout, count); }};
}

using Models = std::vector<std::unique_ptr<EventsWidgetsModel>>;

void makeModels(Layout layout, int count, Models *models)
{
    models->clear();
    writeDefinitions(layout, count);
    for (int i = 0; i < total / count; ++i) {
        models->push_back(std::make_unique<EventsWidgetsModel>());
    }
}

void load(const Models &models, int count)
{
    for (const auto &model : models) {
        model->componentComplete();
        if (model->rowCount() != count) {
            qFatal("%d rows instead of %d", model->rowCount(), count);
        }
    }
}

Rounds::Work loading(Layout layout, int count)
{
    const auto models = std::make_shared<Models>();
    return {[=] { load(*models, count); }, [=] { makeModels(layout, count, models.get()); }};
}

Rounds::Work rescanning(Layout layout, int count)
{
    const auto models = std::make_shared<Models>();
    return {[=] {
                for (const auto &model : *models) {
                    model->directoryChanged();
                }
            },
            [=] {
                makeModels(layout, count, models.get());
                load(*models, count);
            }};
}

bool compareLoading(Layout layout)
{
    const QString files =
        layout == Layout::OneFile ? QStringLiteral("one file") : QStringLiteral("one file each");
    const auto times =
        Rounds::times({loading(layout, few), rescanning(layout, few), parsing(layout, few),
                       loading(layout, many), rescanning(layout, many), parsing(layout, many)});
    bool kept = true;
    for (const size_t first : {0, 3}) {
        for (const size_t work : {0, 1}) {
            const QString text =
                QStringLiteral("%1 %2 widgets, %3")
                    .arg(work == 0 ? QStringLiteral("load") : QStringLiteral("rescan"))
                    .arg(first == 0 ? few : many)
                    .arg(files);
            kept &= Rounds::report(qPrintable(text), "QJsonDocument on the same files",
                                   times[first + work], times[first + 2]);
            if (first > 0) {
                kept &= Rounds::report(qPrintable(text), "as long for each as 100",
                                       times[first + work], times[work]);
            }
        }
    }
    return kept;
}

// The least that a view of these roles must read: the second role of every row, if there are two,
// and the first role of the rows that match.
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

bool compareTitles(const char *kind, QAbstractListModel *model, const QVector<int> &roles)
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
    const int rows = model->rowCount();
    const int expected = roles.size() > 1 ? rows / 2 : rows;
    if (view.values().size() != expected) {
        qFatal("%d titles instead of %d", view.values().size(), expected);
    }

    const int repetitions = 100000 / rows; // for a time that can be measured
    const auto times = Rounds::times({
        {[&view, repetitions] {
            for (int i = 0; i < repetitions; ++i) {
                view.update();
            }
        }},
        {[model, &roles, repetitions] {
            for (int i = 0; i < repetitions; ++i) {
                readTitles(*model, roles);
            }
        }},
    });
    const QString work =
        QStringLiteral("titles of %1 widgets, %2").arg(rows).arg(QLatin1String(kind));
    return Rounds::report(qPrintable(work), "a bare loop of data()", times[0], times[1]);
}

} // namespace

int main(int argc, char *argv[])
{
    if (!qEnvironmentVariableIsSet("MARLO_THROW_AWAY_ROOT")) {
        qFatal("runs only in the throw-away root of simulator");
    }
    const QCoreApplication application(argc, argv);
    bool kept = compareLoading(Layout::OneFile);
    kept &= compareLoading(Layout::OneFileEach);
    for (const int count : {few, many}) {
        writeDefinitions(Layout::OneFile, count);
        EventsWidgetsModel widgets;
        widgets.componentComplete();
        kept &= compareTitles("all of them", &widgets, {EventsWidgetsModel::TitleRole});
        kept &= compareTitles("the enabled half", &widgets,
                              {EventsWidgetsModel::TitleRole, EventsWidgetsModel::EnabledRole});
    }
    return kept ? 0 : 1;
}
