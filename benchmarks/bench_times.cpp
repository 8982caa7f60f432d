// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Measures for authors of pages how many milliseconds the module takes on this machine. Each round
// is a process of its own, like an application that shows its first page.

#include "files.h"
#include "memorycard/fileremover.h"
#include "rounds.h"

#include <QAbstractItemModel>
#include <QCoreApplication>
#include <QDir>
#include <QElapsedTimer>
#include <QFile>
#include <QProcess>
#include <QQmlComponent>
#include <QQmlEngine>
#include <QTemporaryDir>

#include <cstdio>
#include <memory>
#include <vector>

namespace {

constexpr int rounds = 5;
constexpr int actionCount = 30;
constexpr int widgetCount = 10;
constexpr int photoCount = 10000;

const QString roundOption = QStringLiteral("--round");

template<typename Work> void print(const Work &work)
{
    QElapsedTimer timer;
    timer.start();
    work();
    std::printf("%f\n", double(timer.nsecsElapsed()) / 1e6);
}

std::unique_ptr<QObject> create(QQmlEngine *engine, const QByteArray &object)
{
    QQmlComponent component(engine);
    component.setData("import QtQml 2.15\nimport com.marlo.settings.system 1.0\n" + object,
                      QUrl(QStringLiteral("page.qml")));
    std::unique_ptr<QObject> created(component.create());
    if (created == nullptr) {
        qFatal("%s", qPrintable(component.errorString()));
    }
    return created;
}

void requireRows(const QObject *object, int count)
{
    const auto *model = qobject_cast<const QAbstractItemModel *>(object);
    if (model == nullptr || model->rowCount() != count) {
        qFatal("not %d rows", count);
    }
}

void writePhotos(const QDir &card)
{
    const QByteArray content(16 * 1024, 'p');
    for (int i = 0; i < photoCount; ++i) {
        const QString directory = QStringLiteral("DCIM/%1MEDIA").arg(100 + i / 500);
        card.mkpath(directory);
        QFile photo(card.filePath(directory + QStringLiteral("/IMG_%1.jpg").arg(i)));
        if (!photo.open(QIODevice::WriteOnly) || photo.write(content) != content.size()) {
            qFatal("cannot write %s", qPrintable(photo.fileName()));
        }
    }
}

// Prints a line for each workload that main() names.
int runRound()
{
    QQmlEngine engine;
    engine.addImportPath(QStringLiteral(MODULES));
    // The start of the engine is not measured.
    QQmlComponent warm(&engine);
    warm.setData("import QtQml 2.15\nQtObject {}", QUrl(QStringLiteral("page.qml")));
    delete warm.create();

    std::unique_ptr<QObject> actions;
    std::unique_ptr<QObject> widgets;
    std::unique_ptr<QObject> view;
    print([&] { view = create(&engine, "QtObject {}"); });
    print([&] { actions = create(&engine, "QuickActionsModel { showPotential: true }"); });
    requireRows(actions.get(), actionCount);
    print([&] { widgets = create(&engine, "EventsWidgetsModel {}"); });
    requireRows(widgets.get(), widgetCount);
    view = create(&engine, "TitlesView { role: 'title' }");
    view->setProperty("model", QVariant::fromValue<QObject *>(widgets.get()));
    print([&] { QMetaObject::invokeMethod(view.get(), "update"); });
    if (view->property("values").toStringList().size() != widgetCount) {
        qFatal("not %d titles", widgetCount);
    }

    const QTemporaryDir card;
    writePhotos(QDir(card.path()));
    print([&] {
        if (!FileRemover::removeAllEntries(card.path())) {
            qFatal("the photos are not removed");
        }
    });
    return 0;
}

} // namespace

int main(int argc, char *argv[])
{
    const QCoreApplication application(argc, argv);
    if (!qEnvironmentVariableIsSet("MARLO_THROW_AWAY_ROOT")) {
        qFatal("runs only in the throw-away root of simulator");
    }
    if (QCoreApplication::arguments().contains(roundOption)) {
        return runRound();
    }

    for (int i = 0; i < actionCount; ++i) {
        Files::write(QStringLiteral("/usr/share/glimmera/quickactions/action-%1.conf").arg(i),
                     "title=action\nicon=image://theme/action\npriority="
                         + QByteArray::number(i * 7 % actionCount)
                         + "\nremote-service=org.example.action\nremote-path=/\n"
                           "remote-interface=org.example.Action\nremote-method=run\n");
    }
    for (int i = 0; i < widgetCount; ++i) {
        const QByteArray number = QByteArray::number(i);
        Files::write(QStringLiteral("/usr/share/glimmera/eventswidgets/widget-%1.json").arg(i),
                     R"({ "widgets": [ { "path": "/usr/share/widget-)" + number
                         + R"(/main.qml", "title": "Widget )" + number + R"(", "order": )" + number
                         + " } ] }");
    }

    const std::vector<const char *> works = {
        "import the module",
        "create the first model, 30 quick actions",
        "create a model of 10 events widgets",
        "update() of a titles view of 10 rows",
        "remove 10,000 photos from a card",
    };
    std::vector<std::vector<double>> times(works.size());
    for (int round = 0; round < rounds; ++round) {
        QProcess process;
        process.setProcessChannelMode(QProcess::ForwardedErrorChannel);
        process.start(QCoreApplication::applicationFilePath(), {roundOption});
        process.waitForFinished(-1);
        const QList<QByteArray> lines = process.readAllStandardOutput().trimmed().split('\n');
        if (lines.size() != int(works.size())) {
            qFatal("a round failed");
        }
        for (size_t work = 0; work < works.size(); ++work) {
            times[work].push_back(lines.at(int(work)).toDouble());
        }
    }
    for (size_t work = 0; work < works.size(); ++work) {
        Rounds::reportTimes(works[work], times[work]);
    }
    return 0;
}
