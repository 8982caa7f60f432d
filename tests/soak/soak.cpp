// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// usage: soak [--seed NUMBER] SECONDS

#include "members.h"
#include "moduletypes.h"
#include "texts.h"
#include "world.h"

#include <QAbstractItemModel>
#include <QCommandLineParser>
#include <QCoreApplication>
#include <QDir>
#include <QElapsedTimer>
#include <QEvent>
#include <QFile>
#include <QLocale>
#include <QPointer>
#include <QQmlComponent>
#include <QQmlEngine>
#include <QRandomGenerator>
#include <QThreadPool>
#include <QUrl>

#include <algorithm>
#include <cstdio>
#include <memory>
#include <vector>

#include <malloc.h>
#include <unistd.h>

namespace {

const char *const module = "com.marlo.settings.system";

constexpr std::size_t maximumObjects = 24;
constexpr int eventTime = 10; // ms, for the events that a step causes
constexpr int measurements = 20;
// The longest time until unanswered calls and ended programs have disappeared.
constexpr int settleTime = 2000; // ms
constexpr int quietTime = 300; // ms

#ifdef __SANITIZE_ADDRESS__
constexpr bool measuresMemory = false; // the sanitizer keeps freed memory a while, to catch its use
#else
constexpr bool measuresMemory = true;
#endif
// For the heap, whose layout differs each time.
constexpr qint64 memoryTolerance = 2048; // KiB
// For files that Qt and GLib open on first use and keep open.
constexpr int fileTolerance = 2;

// In KiB, after the process has returned its free memory to the system.
qint64 residentMemory()
{
    malloc_trim(0);
    QFile file("/proc/self/statm"_s);
    if (!file.open(QIODevice::ReadOnly)) {
        qFatal("cannot read %s", qPrintable(file.fileName()));
    }
    constexpr int residentField = 1;
    return file.readAll().split(' ').value(residentField).toLongLong() * sysconf(_SC_PAGESIZE)
        / 1024;
}

int openFiles()
{
    const QDir directory("/proc/self/fd"_s);
    // Without the descriptor that reads the directory.
    return int(directory.entryList(QDir::AllEntries | QDir::System | QDir::NoDotAndDotDot).size())
        - 1;
}

void processEvents(int time)
{
    QElapsedTimer timer;
    timer.start();
    do {
        QCoreApplication::processEvents(QEventLoop::AllEvents | QEventLoop::WaitForMoreEvents, 1);
        QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    } while (timer.elapsed() < time);
}

/*
    At random, makes objects of all the module's types, sets their properties and calls their
    methods, while their environment changes. From time to time it deletes all objects. The process
    must then use no more memory and files than before.
*/
class Soak
{
public:
    explicit Soak(quint32 seed);

    // Prints a line for each measurement. Returns whether nothing has grown.
    bool run(int seconds);

private:
    struct Measurement {
        qint64 memory; // KiB
        int files;
    };

    int random(int bound) { return int(m_random.bounded(bound)); }
    template<typename List> auto anyOf(const List &list)
    {
        return *(list.begin() + random(int(list.size())));
    }
    void step();
    void makeObject();
    void changeLanguage();
    void useProperty(QObject *object);
    void callMethod(QObject *object);
    void readModel(QObject *object);
    QVariant argumentFor(int type);
    void settle();
    Measurement measure();

    QRandomGenerator m_random;
    World m_world;
    QQmlEngine m_engine;
    QStringList m_creatable;
    QStringList m_singletons;
    std::vector<QPointer<QObject>> m_objects;
    QElapsedTimer m_time;
    qint64 m_steps = 0;
};

Soak::Soak(quint32 seed) : m_random(seed), m_world(&m_random)
{
    m_engine.addImportPath(QLatin1String(QML_BUILD_DIR));
    for (const ModuleType &type : ModuleType::all()) {
        (type.isSingleton ? m_singletons : m_creatable).append(type.name);
    }
}

bool Soak::run(int seconds)
{
    m_time.start();
    std::vector<Measurement> all;
    std::puts("seconds  operations  memory/KiB  open files");
    for (int i = 1; i <= measurements; ++i) {
        while (m_time.elapsed() < qint64(seconds) * 1000 * i / measurements) {
            step();
        }
        all.push_back(measure());
    }
    // At the start of the comparison, everything that is allocated only once has been allocated.
    const auto start = all.begin() + measurements / 4;
    const auto least = [](auto from, auto to) {
        return std::min_element(from, to,
                                [](const Measurement &one, const Measurement &other) {
                                    return one.memory < other.memory;
                                })
            ->memory;
    };
    const qint64 growth =
        least(all.end() - measurements / 4, all.end()) - least(start, start + measurements / 4);
    const int filesBefore = start->files;
    const int filesAfter = all.back().files;
    std::printf("growth: %lld KiB, %d open files\n", growth, filesAfter - filesBefore);
    return filesAfter - filesBefore <= fileTolerance
        && (!measuresMemory || growth <= memoryTolerance);
}

void Soak::step()
{
    ++m_steps;
    const int choice = random(20);
    if (choice < 5) {
        m_world.changeSomething();
    } else if (m_objects.empty() || choice == 5) {
        makeObject();
    } else if (choice == 6) {
        changeLanguage();
    } else {
        const std::size_t index = std::size_t(random(int(m_objects.size())));
        QObject *const object = m_objects[index];
        if (choice == 7 && m_objects.size() > maximumObjects / 2) {
            delete object;
        } else if (object != nullptr && choice < 12) {
            useProperty(object);
        } else if (object != nullptr && choice < 17) {
            callMethod(object);
        } else if (object != nullptr) {
            readModel(object);
        }
        if (m_objects[index] == nullptr) {
            m_objects.erase(m_objects.begin() + int(index));
        }
    }
    processEvents(random(4) == 0 ? eventTime : 0);
}

void Soak::makeObject()
{
    if (m_objects.size() >= maximumObjects) {
        return;
    }
    const QString type = anyOf(m_creatable);
    QQmlComponent component(&m_engine);
    component.setData(QByteArray("import ") + module + " 1.0\n" + type.toLatin1() + " { }", QUrl());
    QObject *const object = component.create();
    if (object == nullptr) {
        qFatal("cannot make an object: %s", qPrintable(component.errorString()));
    }
    QQmlEngine::setObjectOwnership(object, QQmlEngine::CppOwnership);
    m_objects.emplace_back(object);
}

void Soak::changeLanguage()
{
    QLocale::setDefault(QLocale(anyOf(QStringList{"fi_FI"_s, "de_DE"_s, "en_GB"_s})));
    QEvent change(QEvent::LanguageChange);
    QCoreApplication::sendEvent(&m_engine, &change);
}

void Soak::useProperty(QObject *object)
{
    const auto properties = Members::properties(*object);
    if (properties.empty()) {
        return;
    }
    const QMetaProperty property = anyOf(properties);
    property.read(object);
    if (property.isWritable()) {
        property.write(object, argumentFor(property.userType()));
    }
}

void Soak::callMethod(QObject *object)
{
    if (random(8) == 0) {
        const QByteArray singleton = anyOf(m_singletons).toLatin1();
        object =
            m_engine.singletonInstance<QObject *>(qmlTypeId(module, 1, 0, singleton.constData()));
    }
    const auto methods = Members::methods(*object);
    if (!methods.empty()) {
        Members::call(object, anyOf(methods), [this](int type) { return argumentFor(type); });
    }
}

void Soak::readModel(QObject *object)
{
    const auto *const model = qobject_cast<QAbstractItemModel *>(object);
    if (model == nullptr) {
        useProperty(object);
        return;
    }
    const QList<int> roles = model->roleNames().keys();
    for (int row = 0; row < model->rowCount(); ++row) {
        for (const int role : roles) {
            model->index(row, 0).data(role);
        }
    }
}

QVariant Soak::argumentFor(int type)
{
    switch (type) {
    case QMetaType::Bool:
        return random(2) == 0;
    case QMetaType::Int:
        return random(8) - 2;
    case QMetaType::QString:
        return m_world.text();
    case QMetaType::QStringList:
        return QStringList{m_world.text(), m_world.text()};
    case QMetaType::QUrl:
        return QUrl::fromLocalFile(m_world.text());
    case QMetaType::QObjectStar:
        return QVariant::fromValue<QObject *>(anyOf(m_objects));
    case QMetaType::QVariant:
        return m_world.value();
    default:
        return random(3); // an enumeration
    }
}

void Soak::settle()
{
    for (const QPointer<QObject> &object : m_objects) {
        delete object;
    }
    m_objects.clear();
    m_world.settle();
    QThreadPool::globalInstance()->waitForDone();
    m_engine.collectGarbage();
    m_engine.clearComponentCache();
    // Waits until no more files are closed.
    QElapsedTimer timer;
    timer.start();
    int files = 0;
    do {
        files = openFiles();
        processEvents(quietTime);
    } while (openFiles() != files && timer.elapsed() < settleTime);
}

Soak::Measurement Soak::measure()
{
    settle();
    const Measurement now = {residentMemory(), openFiles()};
    std::printf("%7lld  %10lld  %10lld  %10d\n", m_time.elapsed() / 1000, m_steps, now.memory,
                now.files);
    std::fflush(stdout);
    return now;
}

// Much of what happens here makes the module log warnings.
void keepQuiet(QtMsgType type, const QMessageLogContext &context, const QString &text)
{
    Q_UNUSED(context)
    if (type == QtFatalMsg) {
        std::fprintf(stderr, "%s\n", qPrintable(text));
    }
}

} // namespace

int main(int argc, char *argv[])
{
    if (!qEnvironmentVariableIsSet("MARLO_THROW_AWAY_ROOT")) {
        qFatal("this program runs only in the throw-away root of simulator");
    }
    const QCoreApplication application(argc, argv);
    QCommandLineParser parser;
    const QCommandLineOption seedOption("seed"_s, "of all chance"_s, "number"_s);
    parser.addOption(seedOption);
    parser.addPositionalArgument("seconds"_s, "how long to run"_s);
    parser.process(application);

    bool isNumber = false;
    const int seconds = parser.positionalArguments().value(0).toInt(&isNumber);
    const quint32 seed = parser.isSet(seedOption) ? parser.value(seedOption).toUInt()
                                                  : QRandomGenerator::global()->generate();
    if (!isNumber || seconds <= 0) {
        parser.showHelp(2);
    }
    std::printf("seed: %u\n", seed);
    std::fflush(stdout);
    qInstallMessageHandler(keepQuiet);
    if (!Soak(seed).run(seconds)) {
        std::fprintf(stderr, "more is held at the end than at the start\n");
        return 1;
    }
    return 0;
}
