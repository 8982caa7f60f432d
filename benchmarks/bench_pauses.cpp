// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Measures how long each constructor, property, method and destructor blocks the main thread while
// every service that a type uses is stopped; how often a page of all types wakes up while nothing
// happens; and how many inotify instances 100 models take.

#include "everytype.h"
#include "rounds.h"
#include "simulator/serviceprocess.h"

#include <QCoreApplication>
#include <QDBusConnection>
#include <QDBusConnectionInterface>
#include <QDir>
#include <QElapsedTimer>
#include <QFile>
#include <QFileInfo>
#include <QLoggingCategory>
#include <QProcess>
#include <QThread>

#include <algorithm>
#include <csignal>
#include <cstdio>
#include <ctime>
#include <vector>

#include <sys/resource.h>
#include <sys/types.h>

namespace {

constexpr int rounds = 10;
constexpr double bar = 4; // ms, a quarter of a frame

const QString pageOption = QStringLiteral("--page");
constexpr int restTime = 10; // s

using Pauses = std::vector<double>;

// The second longest, because other programs may disturb a single round.
double longest(Pauses pauses)
{
    std::sort(pauses.begin(), pauses.end());
    return pauses[pauses.size() - 2];
}

double processorTime() // ms
{
    timespec time = {};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &time);
    return double(time.tv_sec) * 1e3 + double(time.tv_nsec) / 1e6;
}

long waits()
{
    rusage usage = {};
    getrusage(RUSAGE_THREAD, &usage);
    return usage.ru_nvcsw;
}

// In milliseconds. Without waiting, only the processor time counts: the rest went to other processes.
template<typename Work> double pauseOf(const Work &work)
{
    const long waitsBefore = waits();
    const double processorBefore = processorTime();
    QElapsedTimer timer;
    timer.start();
    work();
    const double wall = double(timer.nsecsElapsed()) / 1e6;
    return waits() == waitsBefore ? processorTime() - processorBefore : wall;
}

// All services that the types use, including that of dconf.
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

// Measures every operation once, with new objects.
void measure(std::vector<Pauses> *pauses, QStringList *names)
{
    const EveryType types;
    size_t at = 0;
    const auto note = [&](const QString &name, double pause) {
        if (at == pauses->size()) {
            pauses->emplace_back();
            names->append(name);
        }
        (*pauses)[at++].push_back(pause);
    };
    const QStringList all = EveryType::names();
    for (const QString &name : all) {
        std::unique_ptr<QObject> made;
        note(name, pauseOf([&] { made = types.make(name); }));
        const auto uses = types.uses(name);
        for (const EveryType::Use &use : uses) {
            note(use.name, pauseOf(use.run));
        }
        note(QLatin1Char('~') + name, pauseOf([&] { made.reset(); }));
    }
    // Handles the events that the calls have posted. This is not measured.
    QCoreApplication::processEvents();
}

// Creates a page with an object of each type, and runs until the process is ended.
int showPage()
{
    const EveryType types;
    std::puts("shown");
    std::fflush(stdout);
    return QCoreApplication::exec();
}

// The number of context switches of the threads of a process. As long as it does not change, none
// of the threads has run, and so none has made a system call.
long switches(qint64 process)
{
    long count = 0;
    const QDir threads(QStringLiteral("/proc/%1/task").arg(process));
    const QStringList names = threads.entryList(QDir::Dirs | QDir::NoDotAndDotDot);
    for (const QString &name : names) {
        QFile status(threads.filePath(name) + QStringLiteral("/status"));
        if (!status.open(QIODevice::ReadOnly)) {
            qFatal("cannot read %s", qPrintable(status.fileName()));
        }
        const QList<QByteArray> lines = status.readAll().split('\n');
        for (const QByteArray &line : lines) {
            if (line.contains("ctxt_switches:")) {
                count += line.simplified().split(' ').at(1).toLong();
            }
        }
    }
    return count;
}

bool measureRest()
{
    QProcess page;
    page.start(QCoreApplication::applicationFilePath(), {pageOption});
    if (!page.waitForReadyRead()) {
        qFatal("the page is not shown");
    }
    // Waits until all work that its creation started has ended.
    long before = -1;
    for (int i = 0; i < 30 && switches(page.processId()) != before; ++i) {
        before = switches(page.processId());
        QThread::sleep(1);
    }
    before = switches(page.processId());
    QThread::sleep(restTime);
    const long after = switches(page.processId());
    page.kill();
    page.waitForFinished();
    return Rounds::reportFigure("a page of all eleven types at rest", "wake-ups in ten seconds",
                                double(after - before), 0);
}

bool countInstances()
{
    const EveryType types;
    std::vector<std::unique_ptr<QObject>> models;
    for (int i = 0; i < 50; ++i) {
        models.push_back(types.make(QStringLiteral("QuickActionsModel")));
        models.push_back(types.make(QStringLiteral("EventsWidgetsModel")));
    }
    int instances = 0;
    const QFileInfoList descriptors =
        QDir(QStringLiteral("/proc/self/fd")).entryInfoList(QDir::Files | QDir::System);
    for (const QFileInfo &descriptor : descriptors) {
        instances += descriptor.symLinkTarget().contains(QLatin1String("inotify")) ? 1 : 0;
    }
    return Rounds::reportFigure("100 models", "inotify instances", instances, 1);
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
    // The calls have arbitrary arguments, which cause many messages.
    qInstallMessageHandler(dropMessage);
    if (QCoreApplication::arguments().contains(pageOption)) {
        return showPage();
    }
    EveryType::installFiles();
    std::vector<Pauses> hanging;
    QStringList names;
    {
        // Starts dconf-service, and warms up.
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
        // Handles what the services answer after the previous round.
        std::vector<Pauses> unused;
        QStringList unusedNames;
        measure(&unused, &unusedNames);
        services.stop();
        measure(&hanging, &names);
        services.goOn();
    }

    const auto slowest =
        std::max_element(hanging.begin(), hanging.end(),
                         [](const Pauses &a, const Pauses &b) { return longest(a) < longest(b); });
    const auto at = std::distance(hanging.begin(), slowest);
    const QString work =
        QStringLiteral("the longest pause with hanging services, %1").arg(names.at(int(at)));
    bool kept =
        Rounds::reportFigure(qPrintable(work), "ms of the main thread", longest(*slowest), bar);
    kept &= measureRest();
    kept &= countInstances();
    return kept ? 0 : 1;
}
