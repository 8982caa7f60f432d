// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "cardhelper.h"
#include "files.h"
#include "formattertest.h"
#include "ownprocess.h"
#include "simulator/diskservicepeer.h"
#include "usedupdescriptors.h"
#include "words.h"

#include <QDBusConnection>
#include <QLoggingCategory>
#include <QPointer>
#include <QProcess>
#include <QQmlComponent>
#include <QQmlEngine>
#include <QSemaphore>
#include <QTemporaryDir>
#include <QThreadPool>
#include <QtTest>

#include <array>
#include <atomic>
#include <cerrno>
#include <csignal>
#include <cstdarg>
#include <functional>
#include <initializer_list>

#include <dlfcn.h>
#include <pthread.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

namespace {

const QString card = QStringLiteral("/dev/testcard1");
const QString otherCard = QStringLiteral("/dev/testcard2");
const QString mountTable = QStringLiteral("/etc/mtab");
const QString cardName = QStringLiteral("testcard1");
const QString otherCardName = QStringLiteral("testcard2");
const QString vfat = QStringLiteral("vfat");
const QString ext4 = QStringLiteral("ext4");
const QString done = QStringLiteral("done");
const QString held = QStringLiteral("held");

const QString debugRule = QStringLiteral("org.tarnwickos.settings.memorycard.debug=true");
const QByteArray debug = QByteArrayLiteral("debug [org.tarnwickos.settings.memorycard] ");
// The verbs are swapped on purpose.
const QByteArray mountWithoutName = QByteArrayLiteral(
    "critical [org.tarnwickos.settings.memorycard] Cannot unmount without device name");
const QByteArray unmountWithoutName = QByteArrayLiteral(
    "critical [org.tarnwickos.settings.memorycard] Cannot mount without device name");

// The signals of operations that succeed. The first one says that the request was accepted.
constexpr char mounted[] = "not busy, Mounting, busy, Idle, not busy";
constexpr char unmounted[] = "not busy, Unmounting, busy, Idle, not busy";
constexpr char formatted[] = "not busy, Unmounting, busy, Formatting, Mounting, Idle, not busy";
constexpr char emptied[] = "not busy, Mounting, busy, RemovingFiles, Idle, not busy";

// The timeouts of the calls that were sent and wait for a reply, in milliseconds.
QList<int> timeouts;
bool signalledAllProcesses = false;
bool cloneFails = false;
std::atomic<bool> threadsFail = false;

QString objectPath(const QString &name)
{
    return QStringLiteral("/org/freedesktop/UDisks2/block_devices/") + name;
}

// A directory in memory with one file, which the mount table lists as a card for the lifetime of this
// object.
class MountedCard
{
public:
    explicit MountedCard(const QString &device) : m_tableBefore(readMountTable())
    {
        writeMountTable(m_tableBefore + device.toUtf8() + ' ' + m_dir.path().toUtf8()
                        + " tmpfs rw 0 0\n");
        write("file");
    }
    ~MountedCard() { writeMountTable(m_tableBefore); }
    Q_DISABLE_COPY_MOVE(MountedCard)

    void write(const char *name) { Files::write(m_dir.filePath(QString::fromLatin1(name)), "x"); }
    QStringList files() const
    {
        return QDir(m_dir.path()).entryList(QDir::AllEntries | QDir::Hidden | QDir::NoDotAndDotDot);
    }

private:
    static QByteArray readMountTable()
    {
        QFile table(mountTable);
        if (!table.open(QIODevice::ReadOnly)) {
            qFatal("cannot read the mount table");
        }
        return table.readAll();
    }
    // The table of the system is a link to one that cannot be written.
    static void writeMountTable(const QByteArray &content)
    {
        Files::remove(mountTable);
        Files::write(mountTable, content);
    }

    QTemporaryDir m_dir{qEnvironmentVariable("XDG_RUNTIME_DIR") + QStringLiteral("/XXXXXX")};
    const QByteArray m_tableBefore;
};

} // namespace

// Replaces the function of the D-Bus library to record timeouts, which messages do not contain.
extern "C" Q_DECL_EXPORT unsigned dbus_connection_send_with_reply(void *connection, void *message,
                                                                  void **reply, int timeout)
{
    using Function = unsigned (*)(void *, void *, void **, int);
    static const auto original =
        reinterpret_cast<Function>(dlsym(RTLD_NEXT, "dbus_connection_send_with_reply"));
    timeouts.append(timeout);
    return original(connection, message, reply, timeout);
}

// Replaces kill() of the C library: this process must never send a signal to all processes.
extern "C" Q_DECL_EXPORT int kill(pid_t pid, int signal) noexcept
{
    if (pid <= 0) {
        signalledAllProcesses = true;
        errno = EPERM;
        return -1;
    }
    return int(syscall(SYS_kill, pid, signal));
}

// QProcess starts programs with clone(), which it calls in this way.
extern "C" Q_DECL_EXPORT long syscall(long number, ...) noexcept
{
    if (cloneFails && number == SYS_clone) {
        errno = EAGAIN;
        return -1;
    }
    std::array<long, 6> arguments = {};
    va_list rest;
    va_start(rest, number);
    for (long &argument : arguments) {
        argument = va_arg(rest, long);
    }
    va_end(rest);
    static const auto original = reinterpret_cast<decltype(&syscall)>(dlsym(RTLD_NEXT, "syscall"));
    return original(number, arguments[0], arguments[1], arguments[2], arguments[3], arguments[4],
                    arguments[5]);
}

extern "C" Q_DECL_EXPORT int pthread_create(pthread_t *thread, const pthread_attr_t *attributes,
                                            void *(*function)(void *), void *argument) noexcept
{
    static const auto original =
        reinterpret_cast<decltype(&pthread_create)>(dlsym(RTLD_NEXT, "pthread_create"));
    return threadsFail ? EAGAIN : original(thread, attributes, function, argument);
}

class TestMemoryCardFormatter : public FormatterTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void startsIdle();
    void interface();
    void errorsInQml();

    void deviceName();
    void newPathIsProbed();
    void pathIsKeptWhileBusy();
    void probe_data();
    void probe();
    void helperWithFewDescriptors();
    void helperBeyondTheProcessLimit();
    void otherHandlerOfChildren();
    void retriesWhenTheStatusIsError_data();
    void retriesWhenTheStatusIsError();
    void supportedFormatTypes_data();
    void supportedFormatTypes();

    void format_data();
    void format();
    void failedFormat_data();
    void failedFormat();
    void removeAllFiles();
    void removeAllFilesNeedsADescriptor();
    void removeAllFilesNeedsAThread();
    void removalTakenFromThePool();
    void mountAndUnmount();
    void operationsWhileBusy();
    void operationsNeedAPathAndAType();

    void requestsOnTheWire();
    void errorsOfTheDiskService_data();
    void errorsOfTheDiskService();
    void errorEndsTheSequence();
    void alreadyDoneGoesOn_data();
    void alreadyDoneGoesOn();
    void namesThatMakeNoObjectPath_data();
    void namesThatMakeNoObjectPath();
    void withoutASystemBus();

    void withoutADeviceName();
    void refusedCommandLeavesItsQueueBehind();
    void emptyTypeDuringARequest();
    void formatsOneAfterTheOther();
    void probeWaitsForTheRequest();
    void probeSurvivesAFailedRequest_data();
    void probeSurvivesAFailedRequest();
    void probeSurvivesAFailedStep();
    void refusedOperationInAHandler();
    void requestInAHandlerWhileAProbeWaits();
    void probeThatIsOverWhenARequestFails();
    void errorsOfARunningHelper();
    void commandsKeepTheirPath();
    void nameIsReadWhenAStepStarts();
    void nameThatIsEmptyInTheMiddleOfASequence();
    void emptiesTheCardOfTheRequest();
    void retriesFromAHandlerOfAnError_data();
    void retriesFromAHandlerOfAnError();
    void asksForMoreWhenBusyChanges();

    void oneProcessForAll();
    void statusIsLogged();

    void goesInAHandler_data();
    void goesInAHandler();
    void goesDuringARequest();
    void goesDuringAProbe_data();
    void goesDuringAProbe();
    void goesDuringAFormat_data();
    void goesDuringAFormat();
    void goesWhileFilesAreRemoved();

private:
    // Starts a disk service with these scenarios, alone or with a card for the formatter.
    void startDiskService(const char *scenarios);
    void start(const char *scenarios);
    void startWithoutPath(const char *scenarios);
    // Waits until the disk service has received these calls, and lets it reply.
    void replyAfter(const char *calls);
    // Mounts or unmounts.
    void request(bool mounts);
    // The scenarios "missing" and "not executable" are helpers that cannot be started.
    void installHelper(const QString &scenario, const QByteArray &output = QByteArray());
    // What is logged when a helper of a scenario has failed.
    static QByteArray helperFailed(const QString &scenario, const QByteArray &command,
                                   const QByteArray &partition);
    static void addScenarios(std::initializer_list<const char *> scenarios);
    // Installs a helper that works, with the output of its probe.
    void installProbe(const QByteArray &output) { m_helper->install(done, output); }
    std::unique_ptr<QObject> createFromQml(const QByteArray &source);
    // Calls the function after each signal.
    void onEvent(const std::function<void()> &answer);
    // Calls the function on each change to the given status.
    void onStatus(Formatter::Status status, const std::function<void()> &answer);

    QQmlEngine m_engine;
    std::unique_ptr<CardHelper> m_helper;
    std::unique_ptr<DiskServicePeer> m_diskService;
};

void TestMemoryCardFormatter::init()
{
    FormatterTest::init();
    m_helper = std::make_unique<CardHelper>();
    m_helper->install(done);
    makeFormatter();
}

void TestMemoryCardFormatter::cleanup()
{
    cloneFails = false;
    threadsFail = false;
    // No more signals may follow.
    const QByteArray before = events();
    QTest::qWait(0);
    const QByteArray after = events();
    m_formatter.reset();
    m_diskService.reset();
    m_helper.reset();
    QLoggingCategory::setFilterRules(QString());
    FormatterTest::cleanup();
    QCOMPARE(after, before);
}

void TestMemoryCardFormatter::startDiskService(const char *scenarios)
{
    m_diskService.reset();
    m_diskService = std::make_unique<DiskServicePeer>(words(scenarios));
}

void TestMemoryCardFormatter::start(const char *scenarios)
{
    startDiskService(scenarios);
    setCard(cardName, card);
}

void TestMemoryCardFormatter::startWithoutPath(const char *scenarios)
{
    startDiskService(scenarios);
    m_formatter->setDeviceName(cardName);
    forgetEvents();
}

void TestMemoryCardFormatter::replyAfter(const char *calls)
{
    TRY_COMPARE(m_diskService->members(), words(calls));
    m_diskService->replyToKept();
}

void TestMemoryCardFormatter::request(bool mounts)
{
    (m_formatter.get()->*(mounts ? &Formatter::mount : &Formatter::unmount))();
}

void TestMemoryCardFormatter::installHelper(const QString &scenario, const QByteArray &output)
{
    if (scenario == QLatin1String("missing")) {
        m_helper->remove();
    } else if (scenario == QLatin1String("not executable")) {
        m_helper->installNotExecutable();
    } else {
        m_helper->install(scenario, output);
    }
}

QByteArray TestMemoryCardFormatter::helperFailed(const QString &scenario, const QByteArray &command,
                                                 const QByteArray &partition)
{
    const QByteArray notStarted = "warning [com.marlo.settings.system.memorycard] Cannot start "
                                  "\"/usr/libexec/sdcardhelper\" because ";
    if (scenario == QLatin1String("missing")) {
        return notStarted + "\"execvp: No such file or directory\"";
    }
    if (scenario == QLatin1String("not executable")) {
        return notStarted + "\"execvp: Permission denied\"";
    }
    if (scenario == QLatin1String("crash")) {
        return helperEnded(command, partition, "was ended by signal 11 with the error \"\"");
    }
    const QByteArray code = scenario.mid(5).toUtf8(); // of exit=N
    return helperEnded(command, partition,
                       "exited with " + code + " and the error \"cannot use the card\"");
}

void TestMemoryCardFormatter::addScenarios(std::initializer_list<const char *> scenarios)
{
    QTest::addColumn<QString>("scenario");
    for (const char *scenario : scenarios) {
        QTest::newRow(scenario) << QString::fromLatin1(scenario);
    }
}

std::unique_ptr<QObject> TestMemoryCardFormatter::createFromQml(const QByteArray &source)
{
    qmlRegisterType<Formatter>("Test", 1, 0, "MemoryCardFormatter");
    QQmlComponent component(&m_engine);
    component.setData("import QtQml 2.15\nimport Test 1.0\n" + source,
                      QUrl(QStringLiteral("test.qml")));
    std::unique_ptr<QObject> object(component.create());
    if (object == nullptr) {
        qFatal("%s", qPrintable(component.errorString()));
    }
    return object;
}

void TestMemoryCardFormatter::onStatus(Formatter::Status status,
                                       const std::function<void()> &answer)
{
    connect(m_formatter.get(), &Formatter::statusChanged, this, [this, status, answer] {
        if (m_formatter->status() == status) {
            answer();
        }
    });
}

void TestMemoryCardFormatter::onEvent(const std::function<void()> &answer)
{
    connect(m_formatter.get(), &Formatter::statusChanged, this, answer);
    connect(m_formatter.get(), &Formatter::busyChanged, this, answer);
    connect(m_formatter.get(), &Formatter::deviceNameChanged, this, answer);
    connect(m_formatter.get(), &Formatter::devicePathChanged, this, answer);
    connect(m_formatter.get(), &Formatter::filesystemTypeChanged, this, answer);
    connect(m_formatter.get(), &Formatter::mountError, this, answer);
    connect(m_formatter.get(), &Formatter::unmountError, this, answer);
}

void TestMemoryCardFormatter::startsIdle()
{
    QCOMPARE(m_formatter->status(), Formatter::Idle);
    QCOMPARE(m_formatter->busy(), false);
    QCOMPARE(m_formatter->deviceName(), QString());
    QCOMPARE(m_formatter->devicePath(), QString());
    QCOMPARE(m_formatter->filesystemType(), QString());
    QVERIFY(m_formatter->children().isEmpty());
}

void TestMemoryCardFormatter::interface()
{
    const QMetaObject &meta = Formatter::staticMetaObject;
    const QStringList slotNames = {QStringLiteral("commandError(QProcess::ProcessError)"),
                                   QStringLiteral("commandFinished(int,QProcess::ExitStatus)"),
                                   QStringLiteral("fileRemoverFinished()"),
                                   QStringLiteral("fileRemoverError()")};
    for (const QString &name : slotNames) {
        QVERIFY2(meta.indexOfSlot(name.toLatin1()) >= 0, qPrintable(name));
    }
}

void TestMemoryCardFormatter::errorsInQml()
{
    startDiskService("Mount=DeviceBusy Unmount=NotMounted");
    const auto object = createFromQml(R"(
        MemoryCardFormatter {
            property string seen
            deviceName: 'testcard1'
            onUnmountError: {
                seen += error === MemoryCardFormatter.ErrorNotMounted
                seen += status === MemoryCardFormatter.Idle
            }
            onMountError: seen += error === MemoryCardFormatter.ErrorDeviceBusy
            onStatusChanged: {
                seen += status === MemoryCardFormatter.Error
                mount()
            }
        })");
    QVERIFY(QMetaObject::invokeMethod(object.get(), "unmount"));
    TRY_COMPARE(object->property("seen").toString(), QStringLiteral("truetruetruetrue"));
    QCOMPARE(takeLog(),
             diskServiceError("Unmount", "NotMounted") + '\n'
                 + diskServiceError("Mount", "DeviceBusy"));
}

void TestMemoryCardFormatter::deviceName()
{
    m_formatter->setDeviceName(cardName);
    QCOMPARE(m_formatter->deviceName(), cardName);
    m_formatter->setDeviceName(cardName);
    QCOMPARE(events(), QByteArray("name testcard1"));

    // It can be set while the formatter is busy.
    m_helper->install(held);
    forgetEvents()->setDevicePath(card);
    TRY_EVENTS("path /dev/testcard1, Probing, busy");
    QLoggingCategory::setFilterRules(debugRule);
    m_formatter->setDeviceName(cardName);
    QCOMPARE(takeLog(), QByteArray());
    m_formatter->setDeviceName(otherCardName);
    QCOMPARE(takeLog(), debug + "New device name \"testcard2\"");
    QLoggingCategory::setFilterRules(QString());
    QCOMPARE(m_formatter->deviceName(), otherCardName);
    m_helper->release();
    TRY_EVENTS("path /dev/testcard1, Probing, busy, name testcard2, Idle, not busy");
    QCOMPARE(m_helper->runs().size(), 1);
}

void TestMemoryCardFormatter::newPathIsProbed()
{
    m_formatter->setDevicePath(QString());
    QCOMPARE(events(), QByteArray());

    installProbe("vfat\n");
    m_formatter->setDevicePath(card);
    QCOMPARE(m_formatter->devicePath(), card);
    TRY_EVENTS("path /dev/testcard1, Probing, busy, type vfat, Idle, not busy");
    QCOMPARE(m_formatter->filesystemType(), vfat);
    forgetEvents()->setDevicePath(card);
    QCOMPARE(events(), QByteArray());

    // The type is the same.
    m_formatter->setDevicePath(otherCard);
    TRY_EVENTS("path /dev/testcard2, Probing, busy, Idle, not busy");

    installProbe("ext4\n");
    forgetEvents()->setDevicePath(QString());
    TRY_EVENTS("path , Probing, busy, type ext4, Idle, not busy");
    QCOMPARE(m_helper->runs(),
             (QList<QStringList>{words("probe testcard1"),
                                 words("probe testcard2"),
                                 {QStringLiteral("probe"), QString()}}));
}

void TestMemoryCardFormatter::pathIsKeptWhileBusy()
{
    start("done");
    m_helper->install(held);
    m_formatter->format(vfat);
    TRY_EVENTS("not busy, Unmounting, busy, Formatting");
    m_formatter->setDevicePath(card);
    QCOMPARE(takeLog(), QByteArray());
    m_formatter->setDevicePath(otherCard);
    QCOMPARE(takeLog(),
             warning("Cannot change device path when not idle. Status is "
                     "MemoryCardFormatter::Formatting"));
    QCOMPARE(m_formatter->devicePath(), card);
    m_helper->release();
    TRY_EVENTS(formatted);
    QCOMPARE(m_helper->runs().size(), 2);
}

void TestMemoryCardFormatter::probe_data()
{
    QTest::addColumn<QString>("scenario");
    QTest::addColumn<QByteArray>("output");
    QTest::addColumn<QString>("type");
    QTest::addColumn<QByteArray>("status");
    const QString old = QStringLiteral("old");
    const QByteArray large = QByteArray(3000000, 'x');

    const auto succeeds = [](const char *tag, const QByteArray &output, const QString &type) {
        QTest::newRow(tag) << done << output << type << QByteArray("Idle");
    };
    succeeds("line", "vfat\n", vfat);
    succeeds("bare", "vfat", vfat);
    succeeds("nothing", " \n", {});
    succeeds("white space", " \t\r\n\v\f ext4 \r\n\n", ext4);
    succeeds("white space within", " a  b\nc ", QStringLiteral("a  b\nc"));
    succeeds("letters outside ASCII", "\xe9t\xe9\n", QStringLiteral(u"été"));
    // As text, this would be white space, too.
    succeeds("no white space as a byte", "\xa0vfat\x85\n", QStringLiteral(u"\u00a0vfat\u0085"));
    succeeds("not UTF-8", "\xc3\xa9", QStringLiteral(u"Ã©"));
    succeeds("null byte", QByteArray("vfat\0ext4", 9), vfat);
    succeeds("large", large + '\n', QString::fromLatin1(large));
    QTest::newRow("in pieces") << QStringLiteral("slow") << QByteArray("ext4\n") << ext4
                               << QByteArray("Idle");
    QTest::newRow("with errors") << QStringLiteral("noisy") << QByteArray("ext4\n") << ext4
                                 << QByteArray("Idle");

    const auto fails = [](const char *scenario, const QByteArray &output, const QString &type) {
        QTest::addRow("%s %s", scenario, output.trimmed().constData())
            << QString::fromLatin1(scenario) << output << type << QByteArray("Error");
    };
    // The output is read even if the helper exits with an error.
    fails("exit=1", {}, {});
    fails("exit=255", "swap\n", QStringLiteral("swap"));
    fails("exit=2", "old", old);
    fails("crash", "ext4\n", old);
    fails("missing", {}, old);
    fails("not executable", {}, old);
}

void TestMemoryCardFormatter::probe()
{
    QFETCH(QString, scenario);
    QFETCH(QByteArray, output);
    QFETCH(QString, type);
    QFETCH(QByteArray, status);
    installProbe("old\n");
    setCard(cardName, card);

    installHelper(scenario, output);
    m_formatter->setDevicePath(otherCard);
    // Even a start that has failed is reported later.
    QCOMPARE(m_formatter->status(), Formatter::Probing);
    const QByteArray typeChange =
        type == QLatin1String("old") ? QByteArray() : "type " + type.toUtf8() + ", ";
    const QByteArray expected =
        "path /dev/testcard2, Probing, busy, " + typeChange + status + ", not busy";
    TRY_EVENTS(expected);
    QCOMPARE(m_formatter->filesystemType(), type);
    QCOMPARE(m_formatter->devicePath(), otherCard);
    QCOMPARE(m_formatter->busy(), false);
    // Nothing follows when the process has really ended.
    TRY_COMPARE(m_formatter->findChild<QProcess *>()->state(), QProcess::NotRunning);
    QTest::qWait(100);
    QCOMPARE(events(), expected);
    QCOMPARE(takeLog(),
             status == "Idle" ? QByteArray() : helperFailed(scenario, "probe", "testcard2"));

    installProbe("next\n");
    forgetEvents()->setDevicePath(card);
    TRY_EVENTS("path /dev/testcard1, Probing, busy, type next, Idle, not busy");
}

void TestMemoryCardFormatter::helperWithFewDescriptors()
{
    startWithoutPath("done");
    m_formatter->unmount();
    TRY_EVENTS(unmounted);
    bool started = false;
    bool failed = false;
    for (int left = 0; left < 24; ++left) {
        const UsedUpDescriptors used(left);
        makeFormatter();
        m_formatter->setDeviceName(cardName);
        m_formatter->setDevicePath(card);
        TRY(events().contains("Error") || events().endsWith("Idle, not busy"));
        const bool probed = m_formatter->status() == Formatter::Idle;
        forgetEvents()->format(vfat);
        TRY(events().endsWith(probed ? "Mounting, Idle, not busy" : "Error, not busy"));
        started = started || probed;
        failed = failed || !probed;

        // Destroying this formatter ends its probe and no other process.
        Formatter another;
        another.setDevicePath(card);
    }
    QVERIFY(started && failed);
    QVERIFY(!signalledAllProcesses);
    QVERIFY(
        takeLog().startsWith("warning [com.marlo.settings.system.memorycard] Cannot start "
                             "\"/usr/libexec/sdcardhelper\" because \"too many files are open\""));
}

void TestMemoryCardFormatter::helperBeyondTheProcessLimit()
{
    installProbe("ext4\n");
    cloneFails = true;
    m_formatter->setDevicePath(card);
    TRY_EVENTS("path /dev/testcard1, Error");
    QCOMPARE(takeLog(),
             QByteArray("warning [com.marlo.settings.system.memorycard] Cannot start "
                        "\"/usr/libexec/sdcardhelper\" because \"no process can be started\""));
    // Destroying the formatter signals no process.
    makeFormatter();
    m_formatter->setDevicePath(card);
    m_formatter.reset();
    QTest::qWait(100);
    QVERIFY(!signalledAllProcesses);

    makeFormatter();
    m_formatter->setDevicePath(card);
    TRY_EVENTS("path /dev/testcard1, Error");
    takeLog();
    cloneFails = false;
    forgetEvents()->setDevicePath(otherCard);
    TRY_EVENTS("path /dev/testcard2, Probing, busy, type ext4, Idle, not busy");
}

void TestMemoryCardFormatter::otherHandlerOfChildren()
{
    // Code of the application replaces the handler that Qt may have installed.
    installProbe("ext4\n");
    m_formatter->setDevicePath(otherCard);
    TRY_EVENTS("path /dev/testcard2, Probing, busy, type ext4, Idle, not busy");
    const auto before = signal(SIGCHLD, SIG_DFL);
    forgetEvents()->setDevicePath(card);
    TRY_EVENTS("path /dev/testcard1, Probing, busy, Idle, not busy");
    signal(SIGCHLD, before);
}

void TestMemoryCardFormatter::retriesWhenTheStatusIsError_data()
{
    QTest::addColumn<QString>("scenario");
    QTest::addColumn<int>("retries");
    QTest::newRow("missing") << QStringLiteral("missing") << 1;
    QTest::newRow("missing again and again") << QStringLiteral("missing") << 20;
    QTest::newRow("crash") << QStringLiteral("crash") << 1;
    QTest::newRow("exit code") << QStringLiteral("exit=1") << 1;
}

void TestMemoryCardFormatter::retriesWhenTheStatusIsError()
{
    QFETCH(QString, scenario);
    QFETCH(int, retries);
    const auto path = [](int retry) { return QStringLiteral("/dev/testcard%1").arg(retry); };
    installHelper(scenario);
    int retry = 0;
    onStatus(Formatter::Error, [&] {
        if (++retry == retries) {
            installProbe("ext4\n");
        }
        m_formatter->setDevicePath(path(retry));
    });
    m_formatter->setDevicePath(path(0));
    TRY(m_formatter->status() == Formatter::Idle && m_formatter->filesystemType() == ext4);
    QVERIFY(!m_formatter->busy());
    QCOMPARE(retry, retries);
    QCOMPARE(m_helper->runs().last(),
             (QStringList{QStringLiteral("probe"), QStringLiteral("testcard%1").arg(retries)}));
    QCOMPARE(m_helper->runs().size(), scenario == QLatin1String("missing") ? 1 : 2);
    // busyChanged() is emitted at most once in between: the step may be over by then.
    QVERIFY2(events().endsWith("Probing, busy, type ext4, Idle, not busy")
                 || events().endsWith("not busy, Probing, busy, type ext4, Idle, not busy"),
             events().constData());
    QCOMPARE(takeLog().count('\n'), retries - 1);
}

void TestMemoryCardFormatter::supportedFormatTypes_data()
{
    QTest::addColumn<int>("vfatMode");
    QTest::addColumn<int>("ext4Mode");
    QTest::addColumn<QStringList>("types");
    QTest::newRow("none") << -1 << -1 << QStringList();
    QTest::newRow("both") << 0755 << 0755 << QStringList{vfat, ext4};
    QTest::newRow("vfat") << 0755 << -1 << QStringList{vfat};
    QTest::newRow("ext4") << -1 << 0755 << QStringList{ext4};
    QTest::newRow("only ext4 executable") << 0644 << 0755 << QStringList{ext4};
    QTest::newRow("only vfat executable") << 0755 << 0644 << QStringList{vfat};
    QTest::newRow("none executable") << 0644 << 0644 << QStringList();
}

void TestMemoryCardFormatter::supportedFormatTypes()
{
    QFETCH(int, vfatMode);
    QFETCH(int, ext4Mode);
    QFETCH(QStringList, types);
    const auto install = [](const char *name, int mode) {
        const QString path = QStringLiteral("/sbin/mkfs.") + QLatin1String(name);
        Files::remove(path);
        if (mode >= 0) {
            Files::write(path, "#!/bin/sh\n");
            QCOMPARE(chmod(QFile::encodeName(path).constData(), mode_t(mode)), 0);
        }
    };
    install("vfat", vfatMode);
    install("ext4", ext4Mode);
    QCOMPARE(m_formatter->supportedFormatTypes(), types);
    QCOMPARE(m_formatter->property("supportedFormatTypes").toStringList(), types);
    // Each read checks the programs again.
    install("vfat", 0755);
    install("ext4", 0755);
    QCOMPARE(m_formatter->supportedFormatTypes(), (QStringList{vfat, ext4}));
}

void TestMemoryCardFormatter::format_data()
{
    QTest::addColumn<QString>("type");
    QTest::addColumn<QString>("command");
    QTest::addColumn<QString>("path");
    QTest::addColumn<QString>("name");

    const auto type = [](const char *type, const char *command) {
        QTest::addRow("type %s", type)
            << QString::fromLatin1(type) << QString::fromLatin1(command) << card << cardName;
    };
    type("vfat", "format_vfat");
    type("ext4", "format_ext4");
    // The helper decides on these.
    type("VFAT", "");
    type("Ext4", "");
    type(" vfat", "");
    type("ntfs", "");

    const auto path = [](const char *path, const char *name) {
        QTest::addRow("path %s", path) << vfat << QStringLiteral("format_vfat")
                                       << QString::fromUtf8(path) << QString::fromUtf8(name);
    };
    path("/dev/mmcblk1p1", "mmcblk1p1");
    path("mmcblk1p1", "mmcblk1p1");
    path("/dev/mapper/a b", "a b");
    path("/dev/mmcblk1p1/", "");
    path("/", "");
    path("/dev/..", "..");
    path("/dev/k\xc3\xa4rte", "k\xc3\xa4rte");
    path("/dev/; rm -r *", "; rm -r *");
    path("/dev/--help", "--help");
}

void TestMemoryCardFormatter::format()
{
    QFETCH(QString, type);
    QFETCH(QString, command);
    QFETCH(QString, path);
    QFETCH(QString, name);
    startDiskService("done");
    setCard(cardName, path);
    m_formatter->format(type);
    // The signal is emitted although the property has not changed yet.
    QCOMPARE(events(), QByteArray("not busy"));
    QCOMPARE(m_formatter->status(), Formatter::Idle);
    TRY_EVENTS(formatted);
    QCOMPARE(m_diskService->members(), words("Unmount Mount"));
    QStringList arguments(name);
    if (!command.isEmpty()) {
        arguments.prepend(command);
    }
    QCOMPARE(m_helper->runs(), (QList<QStringList>{{QStringLiteral("probe"), name}, arguments}));
}

void TestMemoryCardFormatter::failedFormat_data()
{
    addScenarios({"missing", "crash", "exit=1", "exit=255"});
}

void TestMemoryCardFormatter::failedFormat()
{
    QFETCH(QString, scenario);
    installProbe("vfat\n");
    start("done");
    installHelper(scenario, "ext4\n");
    m_formatter->format(vfat);
    const QByteArray expected = "not busy, Unmounting, busy, Formatting, Error, not busy";
    TRY_EVENTS(expected);
    QTest::qWait(100);
    QCOMPARE(events(), expected);
    QCOMPARE(takeLog(), helperFailed(scenario, "format_vfat", "testcard1"));
    QCOMPARE(m_diskService->members(), words("Unmount"));
    QCOMPARE(m_formatter->deviceName(), cardName);
    QCOMPARE(m_formatter->devicePath(), card);
    QCOMPARE(m_formatter->filesystemType(), vfat);
}

void TestMemoryCardFormatter::removeAllFiles()
{
    start("done");
    {
        MountedCard mountedCard(card);
        mountedCard.write(".hidden");
        mountedCard.write("folder/file");
        m_formatter->removeAllFiles();
        QCOMPARE(events(), QByteArray("not busy"));
        TRY_EVENTS(emptied);
        QCOMPARE(mountedCard.files(), QStringList());
        QCOMPARE(m_diskService->members(), words("Mount"));
    }
    // The disk service says that the card is mounted, but it is not.
    forgetEvents()->removeAllFiles();
    TRY_EVENTS("not busy, Mounting, busy, RemovingFiles, Error, not busy");
    QCOMPARE(takeLog(), notEmptied("/dev/testcard1", "because it is not mounted"));
    forgetEvents()->mount();
    TRY_EVENTS(mounted);
}

void TestMemoryCardFormatter::removeAllFilesNeedsADescriptor()
{
    MountedCard mountedCard(card);
    start("done");
    // Without descriptors QtDBus cannot connect to a bus, and ends the process.
    m_formatter->mount();
    TRY_EVENTS(mounted);
    // Before the pool has a thread, and when it has one that waits for work.
    for (int i = 0; i < 2; ++i) {
        mountedCard.write("file");
        {
            const UsedUpDescriptors none;
            forgetEvents()->removeAllFiles();
            // The removal does not start, because a thread without descriptors would end the
            // process.
            TRY_EVENTS("not busy, Mounting, busy, Error, not busy");
        }
        QCOMPARE(takeLog(), notEmptied("/dev/testcard1", "because too many files are open"));
        QCOMPARE(mountedCard.files(), words("file"));
        forgetEvents()->removeAllFiles();
        TRY_EVENTS(emptied);
        QCOMPARE(mountedCard.files(), QStringList());
    }
}

void TestMemoryCardFormatter::removeAllFilesNeedsAThread()
{
    MountedCard mountedCard(card);
    start("done");
    threadsFail = true;
    m_formatter->removeAllFiles();
    TRY_EVENTS("not busy, Mounting, busy, Error, not busy");
    threadsFail = false;
    QCOMPARE(takeLog(), notEmptied("/dev/testcard1", "because no thread can be started"));
    QCOMPARE(mountedCard.files(), words("file"));
    // The thread pool waits for nothing, so the process can end.
    QVERIFY(QThreadPool::globalInstance()->waitForDone(patience));
    forgetEvents()->removeAllFiles();
    TRY_EVENTS(emptied);
    QCOMPARE(mountedCard.files(), QStringList());
}

void TestMemoryCardFormatter::removalTakenFromThePool()
{
    const MountedCard mountedCard(card);
    start("done");
    QThreadPool *const pool = QThreadPool::globalInstance();
    QSemaphore end;
    for (int i = 0; i < pool->maxThreadCount(); ++i) {
        pool->start([&end] { end.acquire(); });
    }
    m_formatter->removeAllFiles();
    TRY_EVENTS("not busy, Mounting, busy, RemovingFiles");
    pool->clear();
    TRY_EVENTS("not busy, Mounting, busy, RemovingFiles, Error, not busy");
    QCOMPARE(takeLog(), notEmptied("/dev/testcard1", "because it was taken from the thread pool"));
    end.release(pool->maxThreadCount());
    QVERIFY(pool->waitForDone(patience));
    QCOMPARE(mountedCard.files(), words("file"));
}

void TestMemoryCardFormatter::mountAndUnmount()
{
    // No path is needed.
    startWithoutPath("done");
    for (const bool mounts : {true, false}) {
        forgetEvents();
        request(mounts);
        QCOMPARE(events(), QByteArray("not busy"));
        TRY_EVENTS(mounts ? mounted : unmounted);
    }
    QCOMPARE(m_diskService->members(), words("Mount Unmount"));
}

void TestMemoryCardFormatter::operationsWhileBusy()
{
    startWithoutPath("done");
    m_helper->install(held);
    m_formatter->setDevicePath(card);
    TRY_EVENTS("path /dev/testcard1, Probing, busy");

    const auto refused = [](const QByteArray &operation) {
        return warning(operation + " called when not idle. Status is MemoryCardFormatter::Probing");
    };
    m_formatter->format(vfat);
    QCOMPARE(takeLog(), refused("format()"));
    // Whether the formatter is busy is checked before the arguments.
    m_formatter->format(QString());
    QCOMPARE(takeLog(), refused("format()"));
    m_formatter->removeAllFiles();
    QCOMPARE(takeLog(), refused("removeAllFiles()"));
    m_formatter->mount();
    QCOMPARE(takeLog(), refused("mount()"));
    m_formatter->unmount();
    QCOMPARE(takeLog(), refused("unmount()"));

    m_helper->release();
    TRY_EVENTS("path /dev/testcard1, Probing, busy, Idle, not busy");
    QCOMPARE(m_diskService->members(), QStringList());
    QCOMPARE(m_helper->runs().size(), 1);
}

void TestMemoryCardFormatter::operationsNeedAPathAndAType()
{
    startWithoutPath("done");
    m_formatter->removeAllFiles();
    QCOMPARE(takeLog(), warning("devicePath is empty."));
    QCOMPARE(events(), QByteArray("Error"));
    // An operation is accepted in this status. It does not change until the disk service replies.
    forgetEvents()->mount();
    QCOMPARE(m_formatter->status(), Formatter::Error);
    TRY_EVENTS(mounted);

    forgetEvents()->format(vfat);
    QCOMPARE(takeLog(), warning("devicePath is empty."));
    // The path is checked first. The status stays Error, so no signal is emitted.
    m_formatter->format(QString());
    QCOMPARE(takeLog(), warning("devicePath is empty."));
    QCOMPARE(events(), QByteArray("Error"));

    setCard(cardName, card);
    m_formatter->format(QString());
    QCOMPARE(takeLog(), warning("type is empty."));
    QCOMPARE(events(), QByteArray("Error"));
    QCOMPARE(m_formatter->status(), Formatter::Error);
    QCOMPARE(m_formatter->busy(), false);
    QCOMPARE(m_diskService->members(), words("Mount"));
}

void TestMemoryCardFormatter::requestsOnTheWire()
{
    start("done");
    timeouts.clear();
    m_formatter->format(vfat);
    TRY_EVENTS(formatted);
    const auto calls = m_diskService->calls();
    QCOMPARE(calls.size(), 2);
    for (const auto &call : calls) {
        QCOMPARE(call.path, QStringLiteral("/org/freedesktop/UDisks2/block_devices/testcard1"));
        QCOMPARE(call.interface, QStringLiteral("org.freedesktop.UDisks2.Filesystem"));
        QCOMPARE(call.signature, QStringLiteral("a{sv}"));
    }
    QCOMPARE(calls[0].member, QStringLiteral("Unmount"));
    QCOMPARE(calls[0].arguments, (QVariantList{QVariantMap{{QString(), QLatin1String("")}}}));
    QCOMPARE(calls[1].member, QStringLiteral("Mount"));
    QCOMPARE(calls[1].arguments,
             (QVariantList{QVariantMap{{QStringLiteral("fstype"), QLatin1String("")}}}));
    // A slow card has five minutes.
    QCOMPARE(timeouts, (QList<int>{300000, 300000}));
}

void TestMemoryCardFormatter::errorsOfTheDiskService_data()
{
    QTest::addColumn<bool>("mounts");
    QTest::addColumn<QByteArray>("scenario");
    QTest::addColumn<QByteArray>("name");
    QTest::addColumn<QByteArray>("key");
    QTest::addColumn<Formatter::Status>("status");
    const QMetaEnum codes = QMetaEnum::fromType<Formatter::MountError>();
    QCOMPARE(codes.keyCount(), 15);
    for (const bool mounts : {true, false}) {
        const auto row = [mounts](const QByteArray &scenario, const QByteArray &name,
                                  const QByteArray &key = {}) {
            QTest::addRow("%s %s", mounts ? "Mount" : "Unmount", scenario.constData())
                << mounts << scenario << name << key
                << (scenario.startsWith("AlreadyMounted") || scenario == "AlreadyUnmounting"
                        ? Formatter::Idle
                        : Formatter::Error);
        };
        for (int i = 0; i < codes.keyCount(); ++i) {
            const QByteArray error = QByteArray(codes.key(i)).mid(int(strlen("Error")));
            row(error, "org.freedesktop.UDisks2.Error." + error, codes.key(i));
        }
        row("UnknownError", "org.freedesktop.UDisks2.Error.UnknownError");
        row("failed", "org.freedesktop.DBus.Error.Failed");
        row("gone", "org.freedesktop.DBus.Error.NoReply");
        row("absent", "org.freedesktop.DBus.Error.ServiceUnknown");
    }
}

void TestMemoryCardFormatter::errorsOfTheDiskService()
{
    QFETCH(bool, mounts);
    QFETCH(QByteArray, scenario);
    QFETCH(QByteArray, name);
    QFETCH(QByteArray, key);
    QFETCH(Formatter::Status, status);
    startWithoutPath(scenario.constData());
    request(mounts);
    // The error comes before the status. A sequence that is over does not change Idle to Idle.
    QByteArrayList expected = {"not busy"};
    if (!key.isEmpty()) {
        expected.append((mounts ? "mount " : "unmount ") + key);
    }
    if (status == Formatter::Error) {
        expected.append("Error");
    }
    TRY_EVENTS(expected.join(", "));
    QCOMPARE(m_formatter->status(), status);
    QCOMPARE(takeLog(), warning((mounts ? "\"Mount\" error: " : "\"Unmount\" error: ") + name));
}

void TestMemoryCardFormatter::errorEndsTheSequence()
{
    start("Unmount=NotMounted Mount=DeviceBusy");
    m_formatter->format(vfat);
    TRY_EVENTS("not busy, unmount ErrorNotMounted, Error");
    QCOMPARE(takeLog(), diskServiceError("Unmount", "NotMounted"));
    QCOMPARE(m_helper->runs().size(), 1);

    startDiskService("Unmount=done Mount=DeviceBusy");
    forgetEvents()->format(vfat);
    TRY_EVENTS("not busy, Unmounting, busy, Formatting, mount ErrorDeviceBusy, Error, not busy");
    QCOMPARE(takeLog(), diskServiceError("Mount", "DeviceBusy"));

    // The queue contains nothing of either sequence.
    startDiskService("done");
    forgetEvents()->unmount();
    TRY_EVENTS(unmounted);
    QCOMPARE(m_diskService->members(), words("Unmount"));
    QCOMPARE(m_helper->runs().size(), 2);
}

void TestMemoryCardFormatter::alreadyDoneGoesOn_data()
{
    addScenarios({"AlreadyMounted", "AlreadyUnmounting"});
}

void TestMemoryCardFormatter::alreadyDoneGoesOn()
{
    QFETCH(QString, scenario);
    const QByteArray error = scenario.toLatin1();
    start(error.constData());
    m_formatter->format(vfat);
    // The status skips the steps that failed.
    TRY_EVENTS("not busy, unmount Error" + error + ", Formatting, busy, mount Error" + error
               + ", Idle, not busy");
    QCOMPARE(takeLog(),
             diskServiceError("Unmount", error) + '\n' + diskServiceError("Mount", error));
    QCOMPARE(m_helper->runs().last(), words("format_vfat testcard1"));

    const MountedCard mountedCard(card);
    forgetEvents()->removeAllFiles();
    TRY_EVENTS("not busy, mount Error" + error + ", RemovingFiles, busy, Idle, not busy");
    QCOMPARE(mountedCard.files(), QStringList());
    QCOMPARE(takeLog(), diskServiceError("Mount", error));
}

void TestMemoryCardFormatter::namesThatMakeNoObjectPath_data()
{
    QTest::addColumn<QString>("name");
    const auto row = [](const char *tag, const QString &name) { QTest::newRow(tag) << name; };
    row("parent", QStringLiteral(".."));
    row("hyphen", QStringLiteral("dm-0"));
    row("blank", QStringLiteral("a b"));
    row("slash behind", QStringLiteral("mmcblk1p1/"));
    row("slashes", QStringLiteral("a//b"));
    row("outside ASCII", QStringLiteral(u"kärte"));
    row("null character", QStringLiteral("a").append(QChar()));
    row("half a pair", QStringLiteral("a").append(QChar(0xd800)));
    row("place marker", QStringLiteral("%1"));
}

void TestMemoryCardFormatter::namesThatMakeNoObjectPath()
{
    QFETCH(QString, name);
    startDiskService("done");
    m_formatter->setDeviceName(name);
    forgetEvents()->unmount();
    TRY_EVENTS("not busy, Error");
    // Qt logs a warning of its own first.
    const QByteArrayList log = takeLog().split('\n');
    QCOMPARE(log.size(), 2);
    QVERIFY2(log.first().startsWith("warning [default] "), log.first().constData());
    QCOMPARE(log.last(),
             warning("\"Unmount\" error: org.qtproject.QtDBus.Error.InvalidObjectPath"));
    QCOMPARE(m_diskService->members(), QStringList());

    m_formatter->setDeviceName(cardName);
    forgetEvents()->unmount();
    TRY_EVENTS(unmounted);
}

void TestMemoryCardFormatter::withoutASystemBus()
{
    IN_A_PROCESS_OF_ITS_OWN()
    qputenv("DBUS_SYSTEM_BUS_ADDRESS", "unix:path=/nonexistent");
    QVERIFY(!QDBusConnection::systemBus().isConnected());
    m_formatter->setDeviceName(cardName);
    forgetEvents()->mount();
    QCOMPARE(events(), QByteArray("not busy"));
    TRY_EVENTS("not busy, Error");
    QCOMPARE(takeLog(), warning("\"Mount\" error: org.freedesktop.DBus.Error.Disconnected"));
}

void TestMemoryCardFormatter::withoutADeviceName()
{
    m_formatter->mount();
    QCOMPARE(takeLog(), mountWithoutName);
    m_formatter->unmount();
    QCOMPARE(takeLog(), unmountWithoutName);
    QCOMPARE(events(), QByteArray("not busy, not busy"));
    QCOMPARE(m_formatter->status(), Formatter::Idle);

    // The status is not Idle again, either.
    m_formatter->format(vfat);
    QCOMPARE(takeLog(), warning("devicePath is empty."));
    forgetEvents()->mount();
    QCOMPARE(takeLog(), mountWithoutName);
    QCOMPARE(events(), QByteArray("not busy"));
    QCOMPARE(m_formatter->status(), Formatter::Error);
}

void TestMemoryCardFormatter::refusedCommandLeavesItsQueueBehind()
{
    startDiskService("done");
    setCard(QString(), card);
    m_formatter->format(ext4);
    QCOMPARE(takeLog(), unmountWithoutName);
    QCOMPARE(events(), QByteArray("not busy"));
    QCOMPARE(m_formatter->status(), Formatter::Idle);

    // The rest of the queue runs before the next request, with the name set since then and the path
    // set before.
    m_formatter->setDeviceName(otherCardName);
    forgetEvents()->setDevicePath(otherCard);
    TRY_EVENTS("path /dev/testcard2, Formatting, busy, Mounting, Probing, Idle, not busy");
    QCOMPARE(m_helper->runs(),
             (QList<QStringList>{words("probe testcard1"), words("format_ext4 testcard1"),
                                 words("probe testcard2")}));
    QCOMPARE(m_diskService->members(), words("Mount"));
    QCOMPARE(m_diskService->calls().first().path, objectPath(otherCardName));

    // If the rest fails, the next request is dropped, unless it is a probe.
    m_formatter->setDeviceName(QString());
    m_formatter->removeAllFiles();
    QCOMPARE(takeLog(), mountWithoutName);
    forgetEvents()->setDevicePath(card);
    TRY_EVENTS("path /dev/testcard1, RemovingFiles, busy, Error, not busy, Probing, busy, Idle, "
               "not busy");
    QCOMPARE(takeLog(), notEmptied("/dev/testcard2", "because it is not mounted"));
    QCOMPARE(m_helper->runs().size(), 4);
}

void TestMemoryCardFormatter::emptyTypeDuringARequest()
{
    start("hung");
    m_formatter->unmount();
    m_formatter->format(QString());
    QCOMPARE(takeLog(), warning("type is empty."));
    QCOMPARE(events(), QByteArray("not busy, Error"));
    replyAfter("Unmount");
    TRY_EVENTS("not busy, Error, Unmounting, busy, Idle, not busy");
}

void TestMemoryCardFormatter::formatsOneAfterTheOther()
{
    start("hung");
    m_formatter->format(vfat);
    m_formatter->format(ext4);
    TRY_COMPARE(m_diskService->members(), words("Unmount"));
    QTest::qWait(100);
    // A card that is still mounted is not formatted.
    QCOMPARE(m_helper->runs().size(), 1);

    replyAfter("Unmount");
    TRY_COMPARE(m_diskService->members(), words("Unmount Mount"));
    QCOMPARE(m_helper->runs().last(), words("format_vfat testcard1"));
    replyAfter("Unmount Mount");
    TRY_COMPARE(m_diskService->members(), words("Unmount Mount Unmount"));
    QCOMPARE(m_helper->runs().size(), 2);
    replyAfter("Unmount Mount Unmount");
    replyAfter("Unmount Mount Unmount Mount");
    QCOMPARE(m_helper->runs().last(), words("format_ext4 testcard1"));
    TRY_EVENTS("not busy, not busy, Unmounting, busy, Formatting, Mounting, Unmounting, "
               "Formatting, Mounting, Idle, not busy");
}

void TestMemoryCardFormatter::probeWaitsForTheRequest()
{
    startWithoutPath("hung");
    installProbe("vfat\n");
    m_formatter->mount();
    m_formatter->setDevicePath(card);
    TRY_COMPARE(m_diskService->members(), words("Mount"));
    QTest::qWait(100);
    QCOMPARE(m_helper->runs().size(), 0);
    QCOMPARE(events(), QByteArray("not busy, path /dev/testcard1"));
    replyAfter("Mount");
    TRY_EVENTS("not busy, path /dev/testcard1, Mounting, busy, Probing, type vfat, Idle, "
               "not busy");
}

void TestMemoryCardFormatter::probeSurvivesAFailedRequest_data()
{
    QTest::addColumn<bool>("mounts");
    QTest::addColumn<QByteArray>("scenario");
    QTest::addColumn<QByteArray>("error");
    QTest::newRow("mount") << true << QByteArray("DeviceBusy")
                           << QByteArray("mount ErrorDeviceBusy, ");
    QTest::newRow("unmount") << false << QByteArray("DeviceBusy")
                             << QByteArray("unmount ErrorDeviceBusy, ");
    QTest::newRow("lost disk service") << true << QByteArray("gone") << QByteArray();
}

void TestMemoryCardFormatter::probeSurvivesAFailedRequest()
{
    QFETCH(bool, mounts);
    QFETCH(QByteArray, scenario);
    QFETCH(QByteArray, error);
    start(scenario.constData());
    installProbe("ext4\n");
    // The next card is set before the request for this one fails.
    request(mounts);
    m_formatter->format(vfat);
    m_formatter->setDevicePath(otherCard);
    m_formatter->unmount();
    TRY_EVENTS("not busy, not busy, path /dev/testcard2, not busy, " + error
               + "Error, Probing, busy, type ext4, Idle, not busy");
    // Everything else is dropped.
    QCOMPARE(m_helper->runs().mid(1), QList<QStringList>{words("probe testcard2")});
    QCOMPARE(m_diskService->members().size(), 1);
    takeLog();
}

void TestMemoryCardFormatter::probeSurvivesAFailedStep()
{
    // The path of the next card is set before the helper or the remover fails, or is the second of
    // two new paths.
    start("hung");
    m_formatter->format(vfat);
    m_formatter->setDevicePath(otherCard);
    m_formatter->unmount();
    m_helper->install(QStringLiteral("exit=1"), "old");
    replyAfter("Unmount");
    TRY_EVENTS("not busy, path /dev/testcard2, not busy, Unmounting, busy, Formatting, Error, not "
               "busy, Probing, busy, type old, Error, not busy");
    takeLog();

    installProbe("ext4\n");
    forgetEvents()->removeAllFiles();
    m_formatter->setDevicePath(card);
    replyAfter("Unmount Mount");
    TRY_EVENTS("not busy, path /dev/testcard1, Mounting, busy, RemovingFiles, Error, not busy, "
               "Probing, busy, type ext4, Idle, not busy");
    takeLog();

    installHelper(QStringLiteral("missing"));
    forgetEvents()->mount();
    m_formatter->setDevicePath(otherCard);
    m_formatter->setDevicePath(card);
    onStatus(Formatter::Error, [this] { installProbe("vfat\n"); });
    replyAfter("Unmount Mount Mount");
    TRY_EVENTS("not busy, path /dev/testcard2, path /dev/testcard1, Mounting, busy, Probing, "
               "Error, not busy, Probing, busy, type vfat, Idle, not busy");
    QCOMPARE(m_helper->runs().last(), words("probe testcard1"));
    takeLog();
}

void TestMemoryCardFormatter::refusedOperationInAHandler()
{
    // Without a device name, the operation only logs that it is refused.
    m_helper->install(QStringLiteral("exit=1"));
    startDiskService("done");
    onStatus(Formatter::Error, [this] { m_formatter->format(vfat); });
    m_formatter->setDevicePath(card);
    TRY_EVENTS("path /dev/testcard1, Probing, busy, Error, not busy, not busy");
    QTest::qWait(100);
    QCOMPARE(takeLog(),
             helperFailed(QStringLiteral("exit=1"), "probe", "testcard1") + '\n'
                 + unmountWithoutName);
    QCOMPARE(m_formatter->status(), Formatter::Error);
    QCOMPARE(m_helper->runs(), (QList<QStringList>{words("probe testcard1")}));
}

void TestMemoryCardFormatter::requestInAHandlerWhileAProbeWaits()
{
    // The request starts the probe that waits. No second command may start next to it.
    start("hung");
    m_formatter->format(vfat);
    m_formatter->setDevicePath(otherCard);
    m_helper->install(QStringLiteral("exit=1"));
    onStatus(Formatter::Error, [this] {
        installProbe("ext4\n");
        m_formatter->unmount();
    });
    replyAfter("Unmount");
    TRY_EVENTS("not busy, path /dev/testcard2, Unmounting, busy, Formatting, Error, not busy, "
               "Probing, busy, type ext4");
    replyAfter("Unmount Unmount");
    TRY_EVENTS("not busy, path /dev/testcard2, Unmounting, busy, Formatting, Error, not busy, "
               "Probing, busy, type ext4, Unmounting, Idle, not busy");
    takeLog();
}

void TestMemoryCardFormatter::probeThatIsOverWhenARequestFails()
{
    // The status still says that the probe runs while the second request is under way.
    startWithoutPath("AlreadyUnmounting");
    installProbe("vfat\n");
    m_formatter->unmount();
    m_formatter->setDevicePath(card);
    m_formatter->unmount();
    TRY_EVENTS("not busy, path /dev/testcard1, not busy, unmount ErrorAlreadyUnmounting, Probing, "
               "busy, type vfat, unmount ErrorAlreadyUnmounting, Idle, not busy");
    QCOMPARE(m_formatter->filesystemType(), vfat);
    takeLog();
}

void TestMemoryCardFormatter::errorsOfARunningHelper()
{
    // The process reports every end of a helper that has started by finished().
    const auto report = [this](QProcess::ProcessError error) {
        Q_EMIT m_formatter->findChild<QProcess *>()->errorOccurred(error);
    };
    m_helper->install(held, "ext4\n");
    m_formatter->setDevicePath(card);
    TRY(m_helper->running().size() == 1);
    for (const auto error : {QProcess::FailedToStart, QProcess::Crashed, QProcess::Timedout,
                             QProcess::ReadError, QProcess::WriteError, QProcess::UnknownError}) {
        report(error);
    }
    m_helper->release();
    TRY_EVENTS("path /dev/testcard1, Probing, busy, type ext4, Idle, not busy");

    // A second report of a failed start comes while the next command runs.
    startWithoutPath("hung");
    m_formatter->mount();
    report(QProcess::FailedToStart);
    replyAfter("Mount");
    TRY_EVENTS(mounted);
}

void TestMemoryCardFormatter::commandsKeepTheirPath()
{
    start("hung");
    installProbe("ext4\n");
    m_formatter->format(vfat);
    // QML moves on to another card before the first one is unmounted.
    m_formatter->setDevicePath(otherCard);
    QCOMPARE(m_formatter->devicePath(), otherCard);
    replyAfter("Unmount");
    replyAfter("Unmount Mount");
    // Only the output of the probe is read.
    TRY_EVENTS("not busy, path /dev/testcard2, Unmounting, busy, Formatting, Mounting, Probing, "
               "type ext4, Idle, not busy");
    QCOMPARE(m_helper->runs(),
             (QList<QStringList>{words("probe testcard1"), words("format_vfat testcard1"),
                                 words("probe testcard2")}));
}

void TestMemoryCardFormatter::nameIsReadWhenAStepStarts()
{
    start("hung");
    m_formatter->format(vfat);
    TRY_COMPARE(m_diskService->members(), words("Unmount"));
    m_formatter->setDeviceName(otherCardName);
    replyAfter("Unmount");
    replyAfter("Unmount Mount");
    TRY_EVENTS("not busy, name testcard2, Unmounting, busy, Formatting, Mounting, Idle, not busy");

    // The same for a request that waits behind another one.
    m_formatter->unmount();
    m_formatter->mount();
    m_formatter->setDeviceName(cardName);
    replyAfter("Unmount Mount Unmount");
    replyAfter("Unmount Mount Unmount Mount");
    TRY(m_formatter->status() == Formatter::Idle);
    QStringList paths;
    const auto calls = m_diskService->calls();
    for (const auto &call : calls) {
        paths.append(call.path);
    }
    QCOMPARE(paths,
             (QStringList{objectPath(cardName), objectPath(otherCardName),
                          objectPath(otherCardName), objectPath(cardName)}));
}

void TestMemoryCardFormatter::nameThatIsEmptyInTheMiddleOfASequence()
{
    start("hung");
    m_formatter->format(vfat);
    TRY_COMPARE(m_diskService->members(), words("Unmount"));
    m_formatter->setDeviceName(QString());
    m_diskService->replyToKept();
    QByteArray log;
    TRY((log += takeLog()) == mountWithoutName);
    const QByteArray expected = "not busy, name , Unmounting, busy, Formatting";
    QCOMPARE(events(), expected);

    // The formatter stays as it is, whatever is set or requested afterwards.
    m_formatter->setDeviceName(cardName);
    m_formatter->mount();
    QCOMPARE(takeLog(),
             warning("mount() called when not idle. Status is MemoryCardFormatter::Formatting"));
    QTest::qWait(100);
    QCOMPARE(events(), expected + ", name testcard1");
    QCOMPARE(m_diskService->members(), words("Unmount"));

    // A new formatter works.
    makeFormatter();
    m_formatter->setDeviceName(cardName);
    forgetEvents()->mount();
    replyAfter("Unmount Mount");
    TRY_EVENTS(mounted);
}

void TestMemoryCardFormatter::emptiesTheCardOfTheRequest()
{
    const MountedCard mountedCard(card);
    const MountedCard other(otherCard);
    start("hung");
    m_formatter->removeAllFiles();
    m_formatter->setDevicePath(otherCard);
    replyAfter("Mount");
    TRY_EVENTS("not busy, path /dev/testcard2, Mounting, busy, RemovingFiles, Probing, Idle, "
               "not busy");
    QCOMPARE(mountedCard.files(), QStringList());
    QCOMPARE(other.files(), words("file"));
}

void TestMemoryCardFormatter::retriesFromAHandlerOfAnError_data()
{
    QTest::addColumn<bool>("mounts");
    QTest::addColumn<bool>("byStatus");
    QTest::newRow("mount, by the error") << true << false;
    QTest::newRow("mount, by the status") << true << true;
    QTest::newRow("unmount, by the error") << false << false;
    QTest::newRow("unmount, by the status") << false << true;
}

void TestMemoryCardFormatter::retriesFromAHandlerOfAnError()
{
    QFETCH(bool, mounts);
    QFETCH(bool, byStatus);
    startWithoutPath("Mount=NotAuthorized Unmount=DeviceBusy");
    const auto retry = [this, mounts] {
        startDiskService("done");
        request(mounts);
    };
    if (byStatus) {
        onStatus(Formatter::Error, retry);
    } else {
        connect(m_formatter.get(), mounts ? &Formatter::mountError : &Formatter::unmountError, this,
                retry);
    }
    request(mounts);
    const QByteArray error = mounts ? "mount ErrorNotAuthorized" : "unmount ErrorDeviceBusy";
    const QByteArray success = mounts ? "Mounting" : "Unmounting";
    // The failed sequence is dropped without the new request.
    TRY_EVENTS("not busy, " + error + (byStatus ? ", Error, not busy, " : ", not busy, Error, ")
               + success + ", busy, Idle, not busy");
    takeLog();
}

void TestMemoryCardFormatter::asksForMoreWhenBusyChanges()
{
    startWithoutPath("done");
    int left = 3;
    connect(m_formatter.get(), &Formatter::busyChanged, this, [this, &left] {
        if (left > 0 && !m_formatter->busy()) {
            --left;
            m_formatter->unmount();
        }
    });
    m_formatter->mount();
    TRY_EVENTS(
        "not busy, not busy, not busy, not busy, Mounting, busy, Unmounting, Idle, not busy");
    QCOMPARE(m_diskService->members(), words("Mount Unmount Unmount Unmount"));
}

void TestMemoryCardFormatter::oneProcessForAll()
{
    const auto processes = [this] { return m_formatter->findChildren<QProcess *>(); };
    startWithoutPath("done");
    m_formatter->mount();
    TRY_EVENTS(mounted);
    QCOMPARE(processes().size(), 0);

    setCard(cardName, card);
    QCOMPARE(processes().size(), 1);
    QProcess *process = processes().constFirst();
    m_formatter->format(vfat);
    TRY_EVENTS(formatted);
    setCard(cardName, otherCard);
    QCOMPARE(processes(), QList<QProcess *>{process});
    QCOMPARE(process->parent(), m_formatter.get());
    // The objects of the replies have been deleted.
    TRY_COMPARE(m_formatter->children().size(), 1);
}

void TestMemoryCardFormatter::statusIsLogged()
{
    QLoggingCategory::setFilterRules(debugRule);
    start("done");
    m_formatter->format(vfat);
    TRY_EVENTS(formatted);
    forgetEvents()->removeAllFiles();
    TRY_EVENTS("not busy, Mounting, busy, RemovingFiles, Error, not busy");
    QByteArrayList expected = {debug + "New device name \"testcard1\""};
    for (const char *status : {"Probing", "Idle", "Unmounting", "Formatting", "Mounting", "Idle",
                               "Mounting", "RemovingFiles", "Error"}) {
        expected.append(debug + "New status MemoryCardFormatter::" + status);
    }
    // The remover logs on its thread, before or after the new status.
    QByteArrayList log = takeLog().split('\n');
    QVERIFY(log.removeOne(notEmptied("/dev/testcard1", "because it is not mounted")));
    QCOMPARE(log.join('\n'), expected.join('\n'));

    // Debug messages are off by default.
    QLoggingCategory::setFilterRules(QString());
    setCard(otherCardName, otherCard);
    QCOMPARE(takeLog(), QByteArray());
}

void TestMemoryCardFormatter::goesInAHandler_data()
{
    QTest::addColumn<QByteArray>("event");
    QTest::addColumn<QByteArray>("scenarios");
    QTest::addColumn<QString>("helper");
    const auto row = [](const char *event, const char *scenarios = "done",
                        const QString &helper = done) {
        QTest::addRow("%s, %s, %s", event, scenarios, qPrintable(helper))
            << QByteArray(event) << QByteArray(scenarios) << helper;
    };
    for (const char *event :
         {"path /dev/testcard2", "name testcard2", "Probing", "type vfat", "Idle", "not busy",
          "Unmounting", "busy", "Formatting", "Mounting", "RemovingFiles"}) {
        row(event);
    }
    row("Error", "done", QStringLiteral("exit=1"));
    row("Error", "done", QStringLiteral("missing"));
    row("unmount ErrorNotMounted", "Unmount=NotMounted");
    row("unmount ErrorAlreadyUnmounting", "AlreadyUnmounting");
    row("mount ErrorDeviceBusy", "Mount=DeviceBusy Unmount=done");
    row("Error", "Mount=DeviceBusy Unmount=done");
}

void TestMemoryCardFormatter::goesInAHandler()
{
    QFETCH(QByteArray, event);
    QFETCH(QByteArray, scenarios);
    QFETCH(QString, helper);
    const MountedCard mountedCard(otherCard);
    startDiskService(scenarios.constData());
    installHelper(helper, "vfat");
    // Every operation runs up to the event, in whose handler its object is deleted.
    using Operation = std::function<void(Formatter *)>;
    const QVector<Operation> operations = {
        [](Formatter *formatter) { formatter->setDeviceName(otherCardName); },
        [](Formatter *formatter) { formatter->setDevicePath(otherCard); },
        [](Formatter *formatter) { formatter->mount(); },
        [](Formatter *formatter) { formatter->format(vfat); },
        [](Formatter *formatter) { formatter->removeAllFiles(); },
        [this](Formatter *formatter) {
            formatter->format(vfat);
            if (m_formatter) {
                m_formatter->setDevicePath(card);
            }
        },
        [](Formatter *formatter) { formatter->format(QString()); },
    };
    int gone = 0;
    for (const Operation &operation : operations) {
        makeFormatter();
        m_formatter->setDeviceName(cardName);
        if (&operation > &operations.at(1)) {
            m_formatter->setDevicePath(otherCard);
            TRY(!m_formatter->busy());
        }
        forgetEvents();
        onEvent([&] {
            if (m_formatter && events().endsWith(event)) {
                ++gone;
                m_formatter.reset();
            }
        });
        operation(m_formatter.get());
        TRY(!m_formatter || (!m_formatter->busy() && events() != "not busy"));
        QTest::qWait(10);
        m_formatter.reset();
    }
    QVERIFY(gone > 0);
    QVERIFY(QThreadPool::globalInstance()->waitForDone(patience));
    takeLog();
}

void TestMemoryCardFormatter::goesDuringARequest()
{
    // Before the disk service replies.
    startWithoutPath("hung");
    m_formatter->mount();
    TRY_COMPARE(m_diskService->members(), words("Mount"));
    m_formatter.reset();
    m_diskService->replyToKept();
    QTest::qWait(100);

    // Before the request has been sent.
    makeFormatter();
    startWithoutPath("gone");
    m_formatter->mount();
    m_formatter.reset();
    QTest::qWait(100);

    // Right after a failure, when a handler has queued a request.
    makeFormatter();
    startWithoutPath("Failed");
    onStatus(Formatter::Error, [this] { m_formatter->mount(); });
    m_formatter->mount();
    while (m_formatter->status() != Formatter::Error) {
        QCoreApplication::processEvents(QEventLoop::WaitForMoreEvents);
    }
    m_formatter.reset();
    QTest::qWait(100);
    takeLog();
}

void TestMemoryCardFormatter::goesDuringAProbe_data()
{
    addScenarios({"hung", "held", "crash", "missing"});
}

void TestMemoryCardFormatter::goesDuringAProbe()
{
    QFETCH(QString, scenario);
    const bool isThere = scenario != QLatin1String("missing");
    // While it is being started, and while it runs.
    for (const bool runs : {false, true}) {
        installHelper(scenario, "vfat\n");
        makeFormatter();
        m_formatter->setDevicePath(card);
        QPointer<QProcess> process = m_formatter->findChild<QProcess *>();
        if (runs && isThere) {
            TRY(m_helper->runs().size() > 0);
        }
        m_formatter.reset();
        // A probe is stopped when its formatter is destroyed.
        TRY(process == nullptr);
        QCOMPARE(m_helper->running(), QList<qint64>());
    }
    if (scenario == QLatin1String("crash")) {
        m_log->takeAll(); // the probe may have ended before its formatter
    }
}

void TestMemoryCardFormatter::goesDuringAFormat_data()
{
    QTest::addColumn<bool>("runs");
    QTest::newRow("that is being started") << false;
    QTest::newRow("that runs") << true;
}

void TestMemoryCardFormatter::goesDuringAFormat()
{
    QFETCH(bool, runs);
    start("done");
    m_helper->install(held, QByteArray(1000000, 'x'));
    QPointer<QProcess> process;
    onStatus(Formatter::Formatting,
             [this, &process] { process = m_formatter->findChild<QProcess *>(); });
    m_formatter->format(ext4);
    TRY(process != nullptr && (!runs || m_helper->runs().size() == 2));
    QCOMPARE(m_formatter->status(), Formatter::Formatting);
    m_formatter.reset();
    // The helper finishes formatting, but the destroyed formatter does not mount the card.
    TRY(m_helper->running().size() == 1);
    QTest::qWait(100);
    QCOMPARE(m_helper->running().size(), 1);
    // The helper writes to /dev/null, so it can continue even after the application has ended.
    QCOMPARE(QFile::symLinkTarget(QStringLiteral("/proc/%1/fd/1").arg(m_helper->running().first())),
             QStringLiteral("/dev/null"));
    QVERIFY(process != nullptr);
    m_helper->release();
    TRY(process == nullptr);
    QCOMPARE(m_helper->running(), QList<qint64>());
    QCOMPARE(m_diskService->members(), words("Unmount"));
}

void TestMemoryCardFormatter::goesWhileFilesAreRemoved()
{
    const MountedCard mountedCard(card);
    start("done");
    bool removing = false;
    onStatus(Formatter::RemovingFiles, [&removing] { removing = true; });
    m_formatter->removeAllFiles();
    TRY(removing);
    m_formatter.reset();
    // Destroying the formatter neither waits for the removal nor stops it.
    TRY_COMPARE(mountedCard.files(), QStringList());
    TRY(QThreadPool::globalInstance()->activeThreadCount() == 0);
}

QTEST_GUILESS_MAIN(TestMemoryCardFormatter)

#include "tst_memorycardformatter.moc"
