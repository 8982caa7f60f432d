// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// How long the main thread is held up by each constructor, property and method while every service
// that a type uses is stopped, beside the same while all of them answer. Whoever waits for a
// service shows as a difference; what the machine does besides shows in both, and mostly in the
// longest of the rounds, so that the bar is held to the shortest. It is not held to the end of an
// object, which is measured too: the kernel lets go of a model's inotify watches in its own time.

#include "everytype.h"
#include "simulator/serviceprocess.h"

#include <QCoreApplication>
#include <QDBusConnection>
#include <QDBusConnectionInterface>
#include <QElapsedTimer>
#include <QLoggingCategory>

#include <algorithm>
#include <csignal>
#include <cstdio>

#include <sys/types.h>

namespace {

constexpr int rounds = 10;
constexpr double bar = 4; // ms, a quarter of a frame

struct Pauses {
    double shortest = 1e9;
    double longest = 0;

    void add(double pause)
    {
        shortest = std::min(shortest, pause);
        longest = std::max(longest, pause);
    }
};

template<typename Work> double milliseconds(const Work &work)
{
    QElapsedTimer timer;
    timer.start();
    work();
    return double(timer.nsecsElapsed()) / 1e6;
}

// All that the types speak to, dconf's own included.
class Services
{
public:
    Services()
        : m_dconf(pid_t(QDBusConnection::sessionBus()
                            .interface()
                            ->servicePid(QStringLiteral("ca.desrt.dconf"))
                            .value()))
    {
        if (m_dconf <= 0) {
            qFatal("the service of dconf does not run");
        }
    }
    ~Services() { goOn(); }
    Q_DISABLE_COPY_MOVE(Services)

    void stop()
    {
        for (ServiceProcess *service : {&m_cover, &m_disk, &m_lamp, &m_store}) {
            service->stop();
        }
        kill(m_dconf, SIGSTOP);
    }
    void goOn()
    {
        for (ServiceProcess *service : {&m_cover, &m_disk, &m_lamp, &m_store}) {
            service->goOn();
        }
        kill(m_dconf, SIGCONT);
    }

private:
    ServiceProcess m_cover{"system", QStringLiteral("com.marlo.kivd"), "replies"};
    ServiceProcess m_disk{"system", QStringLiteral("org.freedesktop.UDisks2"), "replies"};
    ServiceProcess m_lamp{"session", QStringLiteral("org.example.lamp"), "replies"};
    ServiceProcess m_store{"session", QStringLiteral("com.marlo.marlostore"), "replies"};
    const pid_t m_dconf;
};

// Everything once; the pauses are those of a fresh set of objects.
void measure(std::vector<Pauses> *pauses, QStringList *names)
{
    const EveryType types;
    size_t at = 0;
    const auto note = [&](const QString &name, double pause) {
        if (at == pauses->size()) {
            pauses->emplace_back();
            names->append(name);
        }
        (*pauses)[at++].add(pause);
    };
    const QStringList all = EveryType::names();
    for (const QString &name : all) {
        std::unique_ptr<QObject> made;
        note(name, milliseconds([&] { made = types.make(name); }));
        const auto uses = types.uses(name);
        for (const EveryType::Use &use : uses) {
            note(use.name, milliseconds(use.run));
        }
        note(QLatin1Char('~') + name, milliseconds([&] { made.reset(); }));
    }
    // Not under the timer: what the calls have left to do.
    QCoreApplication::processEvents();
}

void dropMessage(QtMsgType, const QMessageLogContext &, const QString &)
{
}

} // namespace

int main(int argc, char *argv[])
{
    const QCoreApplication application(argc, argv);
    if (!qEnvironmentVariableIsSet("MARLO_THROW_AWAY_ROOT")) {
        qFatal("runs only in the throw-away root of simulator");
    }
    // The arguments are any, and the messages about that many.
    qInstallMessageHandler(dropMessage);
    EveryType::installFiles();
    std::vector<Pauses> answering;
    std::vector<Pauses> hanging;
    QStringList names;
    {
        // Starts the service of dconf, and warms up.
        std::vector<Pauses> unused;
        QStringList unusedNames;
        measure(&unused, &unusedNames);
        QElapsedTimer timer;
        timer.start();
        while (!QDBusConnection::sessionBus().interface()->isServiceRegistered(
                   QStringLiteral("ca.desrt.dconf"))
               && !timer.hasExpired(60000)) {
            QCoreApplication::processEvents(QEventLoop::AllEvents, 10);
        }
    }
    Services services;
    for (int round = 0; round < rounds; ++round) {
        measure(&answering, &names);
        services.stop();
        QStringList again;
        measure(&hanging, &again);
        services.goOn();
    }

    int missed = 0;
    double longest = 0;
    for (size_t i = 0; i < hanging.size(); ++i) {
        const bool isEnd = names.at(int(i)).startsWith(QLatin1Char('~'));
        const bool misses = !isEnd && hanging[i].shortest > bar;
        missed += misses ? 1 : 0;
        if (!isEnd) {
            longest = std::max(longest, hanging[i].shortest);
        }
        // Lines of the table that ./dev bench prints.
        std::printf("| %s, services hanging | services answering: %.2f ms (to %.2f) | %.2f ms (to "
                    "%.2f) | %s | %s |\n",
                    qPrintable(names.at(int(i))), answering[i].shortest, answering[i].longest,
                    hanging[i].shortest, hanging[i].longest,
                    isEnd ? "none" : qPrintable(QString::number(bar, 'f', 2)),
                    misses ? "MISSED" : "");
    }
    std::printf(
        "| the longest of these, services hanging | one frame: 16.67 ms | %.2f ms | %.2f | %s |\n",
        longest, bar, missed > 0 ? "MISSED" : "");
    return missed == 0 ? 0 : 1;
}
