// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "cardhelper.h"
#include "files.h"
#include "formattertest.h"
#include "ownprocess.h"
#include "simulator/diskservicepeer.h"
#include "texts.h"
#include "usedupdescriptors.h"
#include "words.h"

#include <QDBusConnection>
#include <QLoggingCategory>
#include <QPointer>
#include <QProcess>
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

#include <dlfcn.h>
#include <pthread.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

enum class Start { Unset, Named, WithCard }; // what the formatter knows at first
Q_DECLARE_METATYPE(Start)

namespace {

const QString card = "/dev/testcard1"_s;
const QString otherCard = "/dev/testcard2"_s;
const QString mountTable = "/etc/mtab"_s;
const QString cardName = "testcard1"_s;
const QString vfat = "vfat"_s;
const QString ext4 = "ext4"_s;

const QString debugRule = "org.tarnwickos.settings.memorycard.debug=true"_s;
const QByteArray debug = "debug [org.tarnwickos.settings.memorycard] ";
// The verbs are swapped on purpose.
const QByteArray mountWithoutName =
    "critical [org.tarnwickos.settings.memorycard] Cannot unmount without device name";
const QByteArray unmountWithoutName =
    "critical [org.tarnwickos.settings.memorycard] Cannot mount without device name";

// The signals of operations that succeed. The first one says that the request was accepted.
constexpr char formatted[] = "not busy, Unmounting, busy, Formatting, Mounting, Idle, not busy";
constexpr char emptied[] = "not busy, Mounting, busy, RemovingFiles, Idle, not busy";
// The timeouts of the calls that were sent and wait for a reply, in milliseconds.
QList<int> timeouts;
bool signalledAllProcesses = false;
bool cloneFails = false;
std::atomic<bool> threadsFail = false;

// A directory in memory with two files, which the mount table lists as a card for the lifetime of this
// object.
class MountedCard
{
public:
    explicit MountedCard(const QString &device) : m_tableBefore(readMountTable())
    {
        writeMountTable(m_tableBefore + device.toUtf8() + ' ' + m_dir.path().toUtf8()
                        + " tmpfs rw 0 0\n");
        fill();
    }
    ~MountedCard() { writeMountTable(m_tableBefore); }
    Q_DISABLE_COPY_MOVE(MountedCard)

    void fill()
    {
        Files::write(m_dir.filePath(".hidden"_s), "x");
        Files::write(m_dir.filePath("directory/file"_s), "x");
    }
    bool isFull() const { return entries() == words(".hidden directory"); }
    bool isEmpty() const { return entries().isEmpty(); }

private:
    QStringList entries() const
    {
        return QDir(m_dir.path()).entryList(QDir::AllEntries | QDir::Hidden | QDir::NoDotAndDotDot);
    }
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

    QTemporaryDir m_dir{qEnvironmentVariable("XDG_RUNTIME_DIR") + "/XXXXXX"_s};
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
    void scripts_data();
    void scripts();

    void probe_data();
    void probe();
    void helperWithFewDescriptors();
    void helperBeyondTheProcessLimit();
    void otherHandlerOfChildren();
    void errorsOfARunningHelper();
    void retriesAgainAndAgain();
    void supportedFormatTypes();

    void removeAllFilesNeedsADescriptor();
    void removeAllFilesNeedsAThread();
    void removalTakenFromThePool();

    void requestsOnTheWire();
    void namesThatMakeNoObjectPath_data();
    void namesThatMakeNoObjectPath();
    void withoutASystemBus();
    void asksForMoreWhenBusyChanges();

    void oneProcessForAll();
    void statusIsLogged();

    void goesInAHandler_data();
    void goesInAHandler();
    void goesDuringARequest();
    void goesDuringAProbe();
    void goesDuringAFormat();
    void goesWhileFilesAreRemoved();

private:
    // Starts a disk service with these scenarios, and gives the formatter a card or only its name.
    void start(const QByteArray &scenarios, Start initially = Start::WithCard);
    void perform(const QString &request);
    // The methods that the disk service has been called with, each with the name of the card.
    QString calls();
    // The arguments of each run of the helper.
    QString runs() const;
    // The messages of the test function so far.
    QByteArrayList logged();
    // The scenarios "missing" and "not executable" are helpers that cannot be started.
    void installHelper(const QByteArray &scenario, const QByteArray &output = {});
    // What is logged when a helper of a scenario has failed.
    static QByteArray helperFailed(const QByteArray &scenario, const QByteArray &command,
                                   const QByteArray &partition);
    // Calls the function after each signal, or on each change to the given status.
    void onEvent(const std::function<void()> &answer);
    void onStatus(Formatter::Status status, const std::function<void()> &answer);

    std::unique_ptr<CardHelper> m_helper;
    std::unique_ptr<DiskServicePeer> m_diskService;
    QByteArrayList m_logged; // see logged()
};

void TestMemoryCardFormatter::init()
{
    FormatterTest::init();
    m_logged.clear();
    m_helper = std::make_unique<CardHelper>();
    installHelper("done");
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

void TestMemoryCardFormatter::start(const QByteArray &scenarios, Start initially)
{
    perform("service "_s + QString::fromUtf8(scenarios));
    if (initially == Start::WithCard) {
        setCard(cardName, card);
    } else if (initially == Start::Named) {
        m_formatter->setDeviceName(cardName);
    }
    forgetEvents();
}

void TestMemoryCardFormatter::perform(const QString &request)
{
    const QString verb = request.section(" "_s, 0, 0);
    const QString rest = request.section(" "_s, 1);
    if (verb == "name"_s) {
        m_formatter->setDeviceName(rest);
    } else if (verb == "path"_s) {
        m_formatter->setDevicePath(rest);
    } else if (verb == "format"_s) {
        m_formatter->format(rest);
    } else if (verb == "empty"_s) {
        m_formatter->removeAllFiles();
    } else if (verb == "mount"_s) {
        m_formatter->mount();
    } else if (verb == "unmount"_s) {
        m_formatter->unmount();
    } else if (verb == "service"_s) { // starts another disk service with these scenarios
        m_diskService.reset();
        m_diskService = std::make_unique<DiskServicePeer>(words(rest));
    } else if (verb == "reply"_s) { // replies when the disk service has received these calls
        TRY_COMPARE(m_diskService->members(), words(rest));
        m_diskService->replyToKept();
    } else if (verb == "helper"_s) { // installs a helper for this scenario, with this output
        installHelper(rest.section(" "_s, 0, 0).toUtf8(), rest.section(" "_s, 1).toUtf8());
    } else if (verb == "release"_s) {
        m_helper->release();
    } else if (verb == "isEmpty"_s) {
        // From this line on, the card has to be empty.
    } else if (verb == "wait"_s) {
        QTest::qWait(100);
    } else if (verb == "logged"_s) { // waits for this number of messages
        TRY(logged().size() == rest.toInt());
    } else if (verb == "when"_s) { // performs requests in the handler of a signal
        const QStringList parts = rest.split(": "_s);
        onEvent([this, event = parts.first().toUtf8(), requests = parts.last().split("; "_s)] {
            if (events().endsWith(event)) {
                for (const QString &answer : requests) {
                    perform(answer);
                }
            }
        });
    } else {
        QFAIL(qPrintable(request));
    }
}

QString TestMemoryCardFormatter::calls()
{
    QStringList described;
    const auto calls = m_diskService->calls();
    for (const auto &call : calls) {
        described.append(call.member + " "_s + call.path.section("/"_s, -1));
    }
    return described.join(", "_s);
}

QByteArrayList TestMemoryCardFormatter::logged()
{
    m_logged += takeLog().split('\n');
    m_logged.removeAll({});
    return m_logged;
}

QString TestMemoryCardFormatter::runs() const
{
    QStringList described;
    const auto runs = m_helper->runs();
    for (const QStringList &arguments : runs) {
        described.append(arguments.join("|"_s));
    }
    return described.join(", "_s);
}

void TestMemoryCardFormatter::installHelper(const QByteArray &scenario, const QByteArray &output)
{
    if (scenario == "missing") {
        m_helper->remove();
    } else if (scenario == "not executable") {
        m_helper->installNotExecutable();
    } else {
        m_helper->install(QString::fromUtf8(scenario), output);
    }
}

QByteArray TestMemoryCardFormatter::helperFailed(const QByteArray &scenario,
                                                 const QByteArray &command,
                                                 const QByteArray &partition)
{
    const QByteArray notStarted = "warning [com.marlo.settings.system.memorycard] Cannot start "
                                  "\"/usr/libexec/sdcardhelper\" because ";
    if (scenario == "missing") {
        return notStarted + "\"execvp: No such file or directory\"";
    }
    if (scenario == "not executable") {
        return notStarted + "\"execvp: Permission denied\"";
    }
    if (scenario == "crash") {
        return helperEnded(command, partition, "was ended by signal 11 with the error \"\"");
    }
    return helperEnded(command, partition,
                       "exited with " + scenario.mid(5) // of exit=N
                           + " and the error \"cannot use the card\"");
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
    for (const char *slot :
         {"commandError(QProcess::ProcessError)", "commandFinished(int,QProcess::ExitStatus)",
          "fileRemoverFinished()", "fileRemoverError()"}) {
        QVERIFY2(Formatter::staticMetaObject.indexOfSlot(slot) >= 0, slot);
    }
}

// A line of a script has requests, and the signals that are emitted since the line before.
void TestMemoryCardFormatter::scripts_data()
{
    QTest::addColumn<Start>("initially");
    QTest::addColumn<QByteArray>("diskService");
    QTest::addColumn<QByteArray>("script");
    // What the last disk service and the helper have been called with, and the messages.
    QTest::addColumn<QString>("calls");
    QTest::addColumn<QString>("runs");
    QTest::addColumn<QByteArrayList>("log");
    constexpr auto unset = Start::Unset;
    constexpr auto named = Start::Named;
    constexpr auto withCard = Start::WithCard;
    const auto row = [](const QByteArray &name, Start initially, const char *diskService,
                        const QByteArray &script, const QByteArray &calls,
                        const QByteArray &runs = {}, const QByteArrayList &log = {}) {
        QTest::newRow(name.constData())
            << initially << QByteArray(diskService) << script << QString::fromUtf8(calls)
            << QString::fromUtf8(runs) << log;
    };
    const QByteArray noPath = warning("devicePath is empty.");
    const QByteArray noType = warning("type is empty.");
    const auto notIdle = [](const QByteArray &request, const QByteArray &status) {
        return warning(request + " when not idle. Status is MemoryCardFormatter::" + status);
    };
    const QByteArray otherNotMounted = notEmptied("/dev/testcard2", "because it is not mounted");

    // Setting properties
    row("a name, also while busy", unset, "done",
        "name testcard1, name testcard1 -> name testcard1\n"
        "helper held, path /dev/testcard1 -> path /dev/testcard1, Probing, busy\n"
        "name testcard2 -> name testcard2\n"
        "release -> Idle, not busy",
        "", "probe|testcard1");
    row("each new path is probed", unset, "done",
        "path, helper done vfat, path /dev/testcard1 -> path /dev/testcard1, Probing, busy, type "
        "vfat, Idle, not busy\n"
        "path /dev/testcard1, path /dev/testcard2 -> path /dev/testcard2, Probing, busy, Idle, not "
        "busy\n"
        "helper done ext4, path -> path , Probing, busy, type ext4, Idle, not busy",
        "", "probe|testcard1, probe|testcard2, probe|");
    // Both probes are for the path that the formatter has then.
    row("a handler sets another path", unset, "done",
        "when path /dev/testcard1: path /dev/testcard2, path /dev/testcard1 -> path "
        "/dev/testcard1, path /dev/testcard2, Probing, busy, Idle, not busy",
        "", "probe|testcard2, probe|testcard2");
    row("the path is kept while busy", withCard, "done",
        "helper held, format vfat -> not busy, Unmounting, busy, Formatting\n"
        "path /dev/testcard1, path /dev/testcard2, release -> Mounting, Idle, not busy\n"
        "helper done, path /dev/testcard2 -> path /dev/testcard2, Probing, busy, Idle, not busy",
        "Unmount testcard1, Mount testcard1",
        "probe|testcard1, format_vfat|testcard1, probe|testcard2",
        {notIdle("Cannot change device path", "Formatting")});

    // Operations
    row("mount and unmount without a path", named, "done",
        "mount -> not busy, Mounting, busy, Idle, not busy\n"
        "unmount -> not busy, Unmounting, busy, Idle, not busy",
        "Mount testcard1, Unmount testcard1");
    const auto addType = [&](const QByteArray &type, const QByteArray &command) {
        row("type " + type, withCard, "done", "format " + type + " -> " + formatted,
            "Unmount testcard1, Mount testcard1", "probe|testcard1, " + command + "testcard1");
    };
    addType("vfat", "format_vfat|");
    addType("ext4", "format_ext4|");
    // The helper decides on these.
    for (const char *other : {"VFAT", "Ext4", " vfat", "ntfs"}) {
        addType(other, "");
    }
    const auto addPath = [&](const QByteArray &path, const QByteArray &name) {
        row("path " + path, named, "done",
            "path " + path + " -> path " + path + ", Probing, busy, Idle, not busy\nformat vfat -> "
                + formatted,
            "Unmount testcard1, Mount testcard1", "probe|" + name + ", format_vfat|" + name);
    };
    addPath("/dev/mmcblk1p1", "mmcblk1p1");
    addPath("mmcblk1p1", "mmcblk1p1");
    addPath("/dev/mapper/a b", "a b");
    addPath("/dev/mmcblk1p1/", "");
    addPath("/", "");
    addPath("/dev/..", "..");
    addPath("/dev/k\xc3\xa4rte", "k\xc3\xa4rte");
    addPath("/dev/; rm -r *", "; rm -r *");
    addPath("/dev/--help", "--help");
    for (const QByteArray scenario : {"missing", "crash", "exit=1", "exit=255"}) {
        row("failed format: " + scenario, withCard, "done",
            "helper " + scenario
                + " ext4, format vfat, wait -> not busy, Unmounting, busy, Formatting, Error, not "
                  "busy",
            "Unmount testcard1",
            scenario == "missing" ? "probe|testcard1" : "probe|testcard1, format_vfat|testcard1",
            {helperFailed(scenario, "format_vfat", "testcard1")});
    }
    // The disk service says that the other card is mounted, but it is not.
    row("removing all files", withCard, "done",
        "empty, isEmpty -> not busy, Mounting, busy, RemovingFiles, Idle, not busy\n"
        "path /dev/testcard2 -> path /dev/testcard2, Probing, busy, Idle, not busy\n"
        "empty -> not busy, Mounting, busy, RemovingFiles, Error, not busy\n"
        "mount -> not busy, Mounting, busy, Idle, not busy",
        "Mount testcard1, Mount testcard1, Mount testcard1", "probe|testcard1, probe|testcard2",
        {otherNotMounted});
    // Whether the formatter is busy is checked before the arguments.
    row("operations while busy", named, "done",
        "helper held, path /dev/testcard1 -> path /dev/testcard1, Probing, busy\n"
        "format vfat, format, empty, mount, unmount, release -> Idle, not busy",
        "", "probe|testcard1",
        {notIdle("format() called", "Probing"), notIdle("format() called", "Probing"),
         notIdle("removeAllFiles() called", "Probing"), notIdle("mount() called", "Probing"),
         notIdle("unmount() called", "Probing")});
    row("operations without a path while busy", withCard, "done",
        "helper held, path -> path , Probing, busy\n"
        "format vfat, empty, release -> Idle, not busy",
        "", "probe|testcard1, probe|",
        {notIdle("format() called", "Probing"), notIdle("removeAllFiles() called", "Probing")});
    // The path is checked first. The second refusal does not change the status, so there is no
    // signal. An operation is accepted in this status, which lasts until the disk service replies.
    row("operations need a path and a type", named, "done",
        "empty -> Error\n"
        "mount -> not busy, Mounting, busy, Idle, not busy\n"
        "format vfat, format -> Error\n"
        "path /dev/testcard1 -> path /dev/testcard1, Probing, busy, Idle, not busy\n"
        "format -> Error",
        "Mount testcard1", "probe|testcard1", {noPath, noPath, noPath, noType});

    // Errors of the disk service. Each comes before the status. Two are forgiven: a sequence that is
    // over does not change Idle to Idle.
    const QMetaEnum codes = QMetaEnum::fromType<Formatter::MountError>();
    QCOMPARE(codes.keyCount(), 15);
    for (const QByteArray method : {"Mount", "Unmount"}) {
        const auto fails = [&](const QByteArray &scenario, const QByteArray &name,
                               const QByteArray &events) {
            row(method + ' ' + scenario, named, scenario.constData(),
                method.toLower() + " -> not busy, " + events,
                scenario == "absent" ? "" : method + " testcard1", "",
                {warning('"' + method + "\" error: " + name)});
        };
        for (int i = 0; i < codes.keyCount(); ++i) {
            const QByteArray error = QByteArray(codes.key(i)).mid(int(strlen("Error")));
            const bool isForgiven = error == "AlreadyMounted" || error == "AlreadyUnmounting";
            fails(error, "org.freedesktop.UDisks2.Error." + error,
                  method.toLower() + " Error" + error + (isForgiven ? "" : ", Error"));
        }
        fails("UnknownError", "org.freedesktop.UDisks2.Error.UnknownError", "Error");
        fails("failed", "org.freedesktop.UDisks3.Error.Failed", "Error");
        fails("gone", "org.freedesktop.DBus.Error.NoReply", "Error");
        fails("absent", "org.freedesktop.DBus.Error.ServiceUnknown", "Error");
    }
    // The queue contains nothing of a sequence that failed.
    row("an error ends the sequence", withCard, "Unmount=NotMounted Mount=DeviceBusy",
        "format vfat -> not busy, unmount ErrorNotMounted, Error\n"
        "service Unmount=done Mount=DeviceBusy, format vfat -> not busy, Unmounting, busy, "
        "Formatting, mount ErrorDeviceBusy, Error, not busy\n"
        "service done, unmount -> not busy, Unmounting, busy, Idle, not busy",
        "Unmount testcard1", "probe|testcard1, format_vfat|testcard1",
        {diskServiceError("Unmount", "NotMounted"), diskServiceError("Mount", "DeviceBusy")});
    // The status skips the steps that failed.
    for (const QByteArray error : {"AlreadyMounted", "AlreadyUnmounting"}) {
        row(error + " does not end it", withCard, error.constData(),
            "format vfat -> not busy, unmount Error" + error + ", Formatting, busy, mount Error"
                + error + ", Idle, not busy\nempty, isEmpty -> not busy, mount Error" + error
                + ", RemovingFiles, busy, Idle, not busy",
            "Unmount testcard1, Mount testcard1, Mount testcard1",
            "probe|testcard1, format_vfat|testcard1",
            {diskServiceError("Unmount", error), diskServiceError("Mount", error),
             diskServiceError("Mount", error)});
    }

    // Without a device name, the status is not Idle again, either.
    row("no device name", unset, "done",
        "mount, unmount -> not busy, not busy\n"
        "format vfat -> Error\n"
        "mount, wait -> not busy",
        "", "", {mountWithoutName, unmountWithoutName, noPath, mountWithoutName});
    // The rest of the queue runs before the next request, with the name set since then and the path
    // set before. If the rest fails, the next request is dropped, unless it is a probe.
    row("a refused command leaves its queue behind", unset, "done",
        "path /dev/testcard1 -> path /dev/testcard1, Probing, busy, Idle, not busy\n"
        "format ext4, name testcard2, path /dev/testcard2 -> not busy, name testcard2, path "
        "/dev/testcard2, Formatting, busy, Mounting, Probing, Idle, not busy\n"
        "name, empty, path /dev/testcard1 -> name , not busy, path /dev/testcard1, RemovingFiles, "
        "busy, Error, not busy, Probing, busy, Idle, not busy",
        "Mount testcard2",
        "probe|testcard1, format_ext4|testcard1, probe|testcard2, probe|testcard1",
        {unmountWithoutName, mountWithoutName, otherNotMounted});
    // The formatter stays as it is, whatever is set or requested afterwards.
    row("a name that is empty in the middle of a sequence", withCard, "hung",
        "format vfat, name, reply Unmount -> not busy, name , Unmounting, busy, Formatting\n"
        "logged 1, name testcard1, mount, wait -> name testcard1",
        "Unmount testcard1", "probe|testcard1, format_vfat|testcard1",
        {mountWithoutName, notIdle("mount() called", "Formatting")});

    // Requests while a command runs
    row("an empty type during a request", withCard, "hung",
        "unmount, format -> not busy, Error\n"
        "reply Unmount -> Unmounting, busy, Idle, not busy",
        "Unmount testcard1", "probe|testcard1", {noType});
    // A card that is still mounted is not formatted.
    row("formats one after the other", withCard, "hung",
        "format vfat, format ext4, wait -> not busy, not busy\n"
        "reply Unmount -> Unmounting, busy, Formatting\n"
        "reply Unmount Mount -> Mounting\n"
        "reply Unmount Mount Unmount -> Unmounting, Formatting\n"
        "reply Unmount Mount Unmount Mount -> Mounting, Idle, not busy",
        "Unmount testcard1, Mount testcard1, Unmount testcard1, Mount testcard1",
        "probe|testcard1, format_vfat|testcard1, format_ext4|testcard1");
    row("a probe waits for the request", named, "hung",
        "helper done vfat, mount, path /dev/testcard1, wait -> not busy, path /dev/testcard1\n"
        "reply Mount -> Mounting, busy, Probing, type vfat, Idle, not busy",
        "Mount testcard1", "probe|testcard1");
    // The status still says that the probe runs while the second request is under way.
    row("a probe that is over when a request fails", named, "AlreadyUnmounting",
        "helper done vfat, unmount, path /dev/testcard1, unmount -> not busy, path "
        "/dev/testcard1, not busy, unmount ErrorAlreadyUnmounting, Probing, busy, type vfat, "
        "unmount ErrorAlreadyUnmounting, Idle, not busy",
        "Unmount testcard1, Unmount testcard1", "probe|testcard1",
        {diskServiceError("Unmount", "AlreadyUnmounting"),
         diskServiceError("Unmount", "AlreadyUnmounting")});
    // QML moves on to another card before the first one is unmounted. Only the output of the probe
    // is read.
    row("commands keep their path", withCard, "hung",
        "helper done ext4, format vfat, path /dev/testcard2, reply Unmount, reply Unmount Mount -> "
        "not busy, path /dev/testcard2, Unmounting, busy, Formatting, Mounting, Probing, type "
        "ext4, Idle, not busy",
        "Unmount testcard1, Mount testcard1",
        "probe|testcard1, format_vfat|testcard1, probe|testcard2");
    row("the card of the request is emptied", withCard, "hung",
        "empty, path /dev/testcard2, reply Mount, isEmpty -> not busy, path /dev/testcard2, "
        "Mounting, busy, RemovingFiles, Probing, Idle, not busy",
        "Mount testcard1", "probe|testcard1, probe|testcard2");
    row("the name is read when a step starts", withCard, "hung",
        "format vfat, name testcard2, reply Unmount, reply Unmount Mount -> not busy, name "
        "testcard2, Unmounting, busy, Formatting, Mounting, Idle, not busy\n"
        "unmount, mount, name testcard1 -> not busy, not busy, name testcard1\n"
        "reply Unmount Mount Unmount, reply Unmount Mount Unmount Mount -> Unmounting, busy, "
        "Mounting, Idle, not busy",
        "Unmount testcard1, Mount testcard2, Unmount testcard2, Mount testcard1",
        "probe|testcard1, format_vfat|testcard1");

    // The next card is set before the request for this one fails. Everything but its probe is
    // dropped.
    const auto survives = [&](const QByteArray &method, const char *scenario,
                              const QByteArray &event, const QByteArray &name) {
        row("a probe survives a failed request: " + method + ' ' + scenario, withCard, scenario,
            "helper done ext4, " + method.toLower()
                + ", format vfat, path /dev/testcard2, unmount -> not busy, not busy, path "
                  "/dev/testcard2, not busy, "
                + event + "Error, Probing, busy, type ext4, Idle, not busy",
            method + " testcard1", "probe|testcard1, probe|testcard2",
            {warning('"' + method + "\" error: org.freedesktop." + name)});
    };
    survives("Mount", "DeviceBusy", "mount ErrorDeviceBusy, ", "UDisks2.Error.DeviceBusy");
    survives("Unmount", "DeviceBusy", "unmount ErrorDeviceBusy, ", "UDisks2.Error.DeviceBusy");
    survives("Mount", "gone", "", "DBus.Error.NoReply");
    // The path of the next card is set before the helper or the remover fails, or is the second of
    // two new paths.
    row("a probe survives a failed step", withCard, "hung",
        "format vfat, path /dev/testcard2, unmount, helper exit=1 old, reply Unmount -> not busy, "
        "path /dev/testcard2, not busy, Unmounting, busy, Formatting, Error, not busy, Probing, "
        "busy, type old, Error, not busy\n"
        "helper done ext4, empty, path /dev/testcard1, reply Unmount Mount -> not busy, path "
        "/dev/testcard1, Mounting, busy, RemovingFiles, Error, not busy, Probing, busy, type ext4, "
        "Idle, not busy\n"
        "helper missing, mount, path /dev/testcard2, path /dev/testcard1, when Error: helper done "
        "vfat, reply Unmount Mount Mount -> not busy, path /dev/testcard2, path /dev/testcard1, "
        "Mounting, busy, Probing, Error, not busy, Probing, busy, type vfat, Idle, not busy",
        "Unmount testcard1, Mount testcard1, Mount testcard1",
        "probe|testcard1, format_vfat|testcard1, probe|testcard2, probe|testcard1, probe|testcard1",
        {helperFailed("exit=1", "format_vfat", "testcard1"),
         helperFailed("exit=1", "probe", "testcard2"), otherNotMounted,
         helperFailed("missing", "probe", "testcard2")});

    // Requests from handlers. Without a device name, the operation only logs that it is refused.
    row("a refused operation in a handler", unset, "done",
        "helper exit=1, when Error: format vfat, path /dev/testcard1, wait -> path /dev/testcard1, "
        "Probing, busy, Error, not busy, not busy",
        "", "probe|testcard1", {helperFailed("exit=1", "probe", "testcard1"), unmountWithoutName});
    // One that is refused leaves nothing to start, either.
    row("a refused operation in a handler while another waits", named, "NotAuthorized",
        "when mount ErrorNotAuthorized: mount, when Error: name; mount; name testcard1, mount, "
        "wait "
        "-> not busy, mount ErrorNotAuthorized, not busy, Error, name , not busy, name testcard1",
        "Mount testcard1", "", {diskServiceError("Mount", "NotAuthorized"), mountWithoutName});
    // The request starts the probe that waits. No second command may start next to it.
    row("a request in a handler while a probe waits", withCard, "hung",
        "format vfat, path /dev/testcard2, helper exit=1, when Error: helper done ext4; unmount, "
        "reply Unmount -> not busy, path /dev/testcard2, Unmounting, busy, Formatting, Error, not "
        "busy, Probing, busy, type ext4\n"
        "reply Unmount Unmount -> Unmounting, Idle, not busy",
        "Unmount testcard1, Unmount testcard1",
        "probe|testcard1, format_vfat|testcard1, probe|testcard2",
        {helperFailed("exit=1", "format_vfat", "testcard1")});
    for (const QByteArray scenario : {"missing", "crash", "exit=1"}) {
        row("another path in a handler: " + scenario, unset, "done",
            "helper " + scenario
                + ", when Error: helper done ext4; path /dev/testcard2, path "
                  "/dev/testcard1 -> path /dev/testcard1, Probing, busy, Error, path "
                  "/dev/testcard2, Probing, busy, type ext4, Idle, not busy",
            "", scenario == "missing" ? "probe|testcard2" : "probe|testcard1, probe|testcard2",
            {helperFailed(scenario, "probe", "testcard1")});
    }
    // The failed sequence is dropped without the new request.
    for (const QByteArray method : {"Mount", "Unmount"}) {
        const QByteArray verb = method.toLower();
        const auto retries = [&](const QByteArray &event, const QByteArray &order) {
            row("retries when " + verb + " has failed, in the handler of " + event, named,
                "NotAuthorized",
                "when " + event + ": service done; " + verb + ", " + verb + " -> not busy, " + verb
                    + " ErrorNotAuthorized, " + order + method + "ing, busy, Idle, not busy",
                method + " testcard1", "", {diskServiceError(method, "NotAuthorized")});
        };
        retries(verb + " ErrorNotAuthorized", "not busy, Error, ");
        retries("Error", "Error, not busy, ");
    }
}

void TestMemoryCardFormatter::scripts()
{
    QFETCH(Start, initially);
    QFETCH(QByteArray, diskService);
    QFETCH(QByteArray, script);
    QFETCH(QByteArrayList, log);
    const MountedCard mountedCard(card);
    start(diskService, initially);
    bool isEmpty = false;
    for (const QByteArray &line : script.split('\n')) {
        const int end = line.indexOf(" -> ");
        const QStringList requests = QString::fromUtf8(line.mid(0, end)).split(", "_s);
        for (const QString &request : requests) {
            perform(request);
            QVERIFY2(!QTest::currentTestFailed(), qPrintable(request));
            isEmpty |= request == "isEmpty"_s;
        }
        if (end >= 0) {
            TRY_EVENTS(line.mid(end + 4));
            forgetEvents();
        }
        QVERIFY2(mountedCard.isEmpty() == isEmpty && mountedCard.isFull() != isEmpty,
                 line.constData());
    }
    TRY(logged().size() >= log.size());
    QCOMPARE(logged(), log);
    QTEST(calls(), "calls");
    QTEST(runs(), "runs");
}

void TestMemoryCardFormatter::probe_data()
{
    QTest::addColumn<QByteArray>("scenario");
    QTest::addColumn<QByteArray>("output");
    QTest::addColumn<QString>("type");
    const auto row = [](const char *tag, const char *scenario, const QByteArray &output,
                        const QString &type) {
        QTest::newRow(tag) << QByteArray(scenario) << output << type;
    };
    row("line", "done", "vfat\n", vfat);
    row("bare", "done", "vfat", vfat);
    row("nothing", "done", " \n", {});
    row("white space", "done", " \t\r\n\v\f ext4 \r\n\n", ext4);
    row("white space within", "done", " a  b\nc ", "a  b\nc"_s);
    row("letters outside ASCII", "done", "\xe9t\xe9\n", "été"_s);
    // As text, this would be white space, too.
    row("no white space as a byte", "done", "\xa0vfat\x85\n", "\u00a0vfat\u0085"_s);
    row("not UTF-8", "done", "\xc3\xa9", "Ã©"_s);
    row("null byte", "done", QByteArray("vfat\0ext4", 9), vfat);
    row("large", "done", QByteArray(3000000, 'x') + '\n', QString(3000000, QLatin1Char('x')));
    row("in pieces", "slow", "ext4\n", ext4);
    row("with errors", "noisy", "ext4\n", ext4);
    // The output is read even if the helper exits with an error.
    row("exits with 1", "exit=1", {}, {});
    row("exits with 255", "exit=255", "swap\n", "swap"_s);
    row("exits with 2, the same type", "exit=2", "old", "old"_s);
    row("crashes", "crash", "ext4\n", "old"_s);
    row("missing", "missing", {}, "old"_s);
    row("not executable", "not executable", {}, "old"_s);
}

void TestMemoryCardFormatter::probe()
{
    QFETCH(QByteArray, scenario);
    QFETCH(QByteArray, output);
    QFETCH(QString, type);
    installHelper("done", "old\n");
    setCard(cardName, card);

    installHelper(scenario, output);
    m_formatter->setDevicePath(otherCard);
    // Even a start that has failed is reported later.
    QCOMPARE(m_formatter->status(), Formatter::Probing);
    const bool succeeds = scenario == "done" || scenario == "slow" || scenario == "noisy";
    const QByteArray expected = "path /dev/testcard2, Probing, busy, "
        + (type == "old"_s ? "" : "type " + type.toUtf8() + ", ")
        + (succeeds ? "Idle, not busy" : "Error, not busy");
    TRY_EVENTS(expected);
    QCOMPARE(m_formatter->filesystemType(), type);
    QCOMPARE(m_formatter->devicePath(), otherCard);
    QCOMPARE(m_formatter->busy(), false);
    // Nothing follows when the process has really ended.
    TRY_COMPARE(m_formatter->findChild<QProcess *>()->state(), QProcess::NotRunning);
    QTest::qWait(100);
    QCOMPARE(events(), expected);
    QCOMPARE(takeLog(), succeeds ? QByteArray() : helperFailed(scenario, "probe", "testcard2"));

    installHelper("done", "next\n");
    forgetEvents()->setDevicePath(card);
    TRY_EVENTS("path /dev/testcard1, Probing, busy, type next, Idle, not busy");
}

void TestMemoryCardFormatter::helperWithFewDescriptors()
{
    start("done", Start::Named);
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
    const QByteArray none = "warning [com.marlo.settings.system.memorycard] Cannot start "
                            "\"/usr/libexec/sdcardhelper\" because \"no process can be started\"";
    installHelper("done", "ext4\n");
    // A process that cannot be started costs descriptors, so none is tried where threads cannot be.
    threadsFail = true;
    m_formatter->setDevicePath(card);
    TRY_EVENTS("path /dev/testcard1, Error");
    QCOMPARE(takeLog(), none);
    QVERIFY(m_formatter->findChildren<QProcess *>().isEmpty());
    threadsFail = false;
    cloneFails = true;
    makeFormatter();
    m_formatter->setDevicePath(card);
    TRY_EVENTS("path /dev/testcard1, Error");
    QCOMPARE(takeLog(), none);
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
    installHelper("done", "ext4\n");
    m_formatter->setDevicePath(otherCard);
    TRY_EVENTS("path /dev/testcard2, Probing, busy, type ext4, Idle, not busy");
    const auto before = signal(SIGCHLD, SIG_DFL);
    forgetEvents()->setDevicePath(card);
    TRY_EVENTS("path /dev/testcard1, Probing, busy, Idle, not busy");
    signal(SIGCHLD, before);
}

void TestMemoryCardFormatter::errorsOfARunningHelper()
{
    // The process reports every end of a helper that has started by finished().
    const auto report = [this](QProcess::ProcessError error) {
        Q_EMIT m_formatter->findChild<QProcess *>()->errorOccurred(error);
    };
    installHelper("held", "ext4\n");
    m_formatter->setDevicePath(card);
    TRY(m_helper->running().size() == 1);
    for (const auto error : {QProcess::FailedToStart, QProcess::Crashed, QProcess::Timedout,
                             QProcess::ReadError, QProcess::WriteError, QProcess::UnknownError}) {
        report(error);
    }
    m_helper->release();
    TRY_EVENTS("path /dev/testcard1, Probing, busy, type ext4, Idle, not busy");

    // A second report of a failed start comes while the next command runs.
    start("hung", Start::Named);
    m_formatter->mount();
    report(QProcess::FailedToStart);
    perform("reply Mount"_s);
    TRY_EVENTS(mounted);
}

void TestMemoryCardFormatter::retriesAgainAndAgain()
{
    installHelper("missing");
    int retries = 0;
    onStatus(Formatter::Error, [&] {
        if (++retries == 20) {
            installHelper("done", "ext4\n");
        }
        m_formatter->setDevicePath("/dev/testcard%1"_s.arg(retries));
    });
    m_formatter->setDevicePath("/dev/testcard0"_s);
    TRY(events().endsWith("Probing, busy, type ext4, Idle, not busy"));
    QCOMPARE(retries, 20);
    QCOMPARE(runs(), "probe|testcard20"_s);
    QCOMPARE(takeLog().count('\n'), 19);
}

void TestMemoryCardFormatter::supportedFormatTypes()
{
    const auto install = [](const QString &type, int mode) {
        const QString path = "/sbin/mkfs."_s + type;
        Files::remove(path);
        if (mode >= 0) {
            Files::write(path, "#!/bin/sh\n");
            QCOMPARE(chmod(QFile::encodeName(path).constData(), mode_t(mode)), 0);
        }
    };
    // A missing program, one that is not executable, and one that is. Each read checks them again.
    for (const int vfatMode : {-1, 0644, 0755}) {
        for (const int ext4Mode : {-1, 0644, 0755}) {
            install(vfat, vfatMode);
            install(ext4, ext4Mode);
            const QStringList types = (vfatMode == 0755 ? QStringList(vfat) : QStringList())
                + (ext4Mode == 0755 ? QStringList(ext4) : QStringList());
            QCOMPARE(m_formatter->supportedFormatTypes(), types);
            QCOMPARE(m_formatter->property("supportedFormatTypes").toStringList(), types);
        }
    }
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
        mountedCard.fill();
        {
            const UsedUpDescriptors none;
            forgetEvents()->removeAllFiles();
            // The removal does not start, because a thread without descriptors would end the
            // process.
            TRY_EVENTS("not busy, Mounting, busy, Error, not busy");
        }
        QCOMPARE(takeLog(), notEmptied("/dev/testcard1", "because too many files are open"));
        QVERIFY(mountedCard.isFull());
        forgetEvents()->removeAllFiles();
        TRY_EVENTS(emptied);
        QVERIFY(mountedCard.isEmpty());
    }
}

void TestMemoryCardFormatter::removeAllFilesNeedsAThread()
{
    const MountedCard mountedCard(card);
    start("done");
    threadsFail = true;
    m_formatter->removeAllFiles();
    TRY_EVENTS("not busy, Mounting, busy, Error, not busy");
    threadsFail = false;
    QCOMPARE(takeLog(), notEmptied("/dev/testcard1", "because no thread can be started"));
    QVERIFY(mountedCard.isFull());
    // The thread pool waits for nothing, so the process can end.
    QVERIFY(QThreadPool::globalInstance()->waitForDone(patience));
    forgetEvents()->removeAllFiles();
    TRY_EVENTS(emptied);
    QVERIFY(mountedCard.isEmpty());
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
    QVERIFY(mountedCard.isFull());
}

void TestMemoryCardFormatter::requestsOnTheWire()
{
    start("done");
    timeouts.clear();
    m_formatter->format(vfat);
    // The signal is emitted although the property has not changed yet.
    QCOMPARE(events(), QByteArray("not busy"));
    QCOMPARE(m_formatter->status(), Formatter::Idle);
    TRY_EVENTS(formatted);
    const auto calls = m_diskService->calls();
    QCOMPARE(calls.size(), 2);
    for (const auto &call : calls) {
        QCOMPARE(call.path, "/org/freedesktop/UDisks2/block_devices/testcard1"_s);
        QCOMPARE(call.interface, "org.freedesktop.UDisks2.Filesystem"_s);
        QCOMPARE(call.signature, "a{sv}"_s);
    }
    QCOMPARE(calls[0].member, "Unmount"_s);
    QCOMPARE(calls[0].arguments, (QVariantList{QVariantMap{{QString(), ""_s}}}));
    QCOMPARE(calls[1].member, "Mount"_s);
    QCOMPARE(calls[1].arguments, (QVariantList{QVariantMap{{"fstype"_s, ""_s}}}));
    // A slow card has five minutes.
    QCOMPARE(timeouts, (QList<int>{300000, 300000}));
}

void TestMemoryCardFormatter::namesThatMakeNoObjectPath_data()
{
    QTest::addColumn<QString>("name");
    for (const char *name : {"..", "dm-0", "a b", "mmcblk1p1/", "a//b", "k\xc3\xa4rte", "%1"}) {
        QTest::newRow(name) << QString::fromUtf8(name);
    }
    QTest::newRow("null character") << "a"_s + QChar();
    QTest::newRow("half a pair") << "a"_s + QChar(0xd800);
}

void TestMemoryCardFormatter::namesThatMakeNoObjectPath()
{
    QFETCH(QString, name);
    start("done", Start::Unset);
    m_formatter->setDeviceName(name);
    forgetEvents()->unmount();
    TRY_EVENTS("not busy, Error");
    // Qt logs a warning of its own first.
    const QByteArrayList log = takeLog().split('\n');
    QCOMPARE(log.size(), 2);
    QVERIFY2(log.first().startsWith("warning [default] "), log.first().constData());
    QCOMPARE(log.last(),
             warning("\"Unmount\" error: org.qtproject.QtDBus.Error.InvalidObjectPath"));
    QCOMPARE(calls(), QString());

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

void TestMemoryCardFormatter::asksForMoreWhenBusyChanges()
{
    start("done", Start::Named);
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
    start("done", Start::Named);
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
    m_formatter->setDeviceName(cardName);
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
    setCard("testcard2"_s, otherCard);
    QCOMPARE(takeLog(), QByteArray());
}

void TestMemoryCardFormatter::goesInAHandler_data()
{
    QTest::addColumn<QByteArray>("event");
    QTest::addColumn<QByteArray>("scenarios");
    QTest::addColumn<QByteArray>("helper");
    const auto row = [](const char *event, const char *scenarios = "done",
                        const char *helper = "done") {
        QTest::addRow("%s, %s, %s", event, scenarios, helper)
            << QByteArray(event) << QByteArray(scenarios) << QByteArray(helper);
    };
    for (const char *event :
         {"path /dev/testcard2", "name testcard2", "Probing", "type vfat", "Idle", "not busy",
          "Unmounting", "busy", "Formatting", "Mounting", "RemovingFiles"}) {
        row(event);
    }
    row("Error", "done", "exit=1");
    row("Error", "done", "missing");
    row("unmount ErrorNotMounted", "Unmount=NotMounted");
    row("unmount ErrorAlreadyUnmounting", "AlreadyUnmounting");
    row("mount ErrorDeviceBusy", "Mount=DeviceBusy Unmount=done");
    row("Error", "Mount=DeviceBusy Unmount=done");
}

void TestMemoryCardFormatter::goesInAHandler()
{
    QFETCH(QByteArray, event);
    QFETCH(QByteArray, scenarios);
    QFETCH(QByteArray, helper);
    const MountedCard mountedCard(otherCard);
    start(scenarios, Start::Unset);
    installHelper(helper, "vfat");
    // The requests run up to the event, in whose handler the formatter is deleted.
    const QStringList sequences = {"name testcard2"_s, "path /dev/testcard2"_s,
                                   "mount"_s,          "format vfat"_s,
                                   "empty"_s,          "format vfat, path /dev/testcard1"_s,
                                   "format"_s};
    int gone = 0;
    for (const QString &sequence : sequences) {
        makeFormatter();
        m_formatter->setDeviceName(cardName);
        if (&sequence > &sequences.at(1)) {
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
        const QStringList requests = sequence.split(", "_s);
        for (const QString &request : requests) {
            if (m_formatter) {
                perform(request);
            }
        }
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
    // Before the request has been sent.
    start("gone", Start::Named);
    m_formatter->mount();
    m_formatter.reset();
    QTest::qWait(100);

    // Right after a failure, when a handler has queued a request.
    makeFormatter();
    start("Failed", Start::Named);
    onStatus(Formatter::Error, [this] { m_formatter->mount(); });
    m_formatter->mount();
    while (m_formatter->status() != Formatter::Error) {
        QCoreApplication::processEvents(QEventLoop::WaitForMoreEvents);
    }
    m_formatter.reset();
    QTest::qWait(100);
    takeLog();
}

void TestMemoryCardFormatter::goesDuringAProbe()
{
    for (const QByteArray scenario : {"hung", "held", "missing", "crash"}) {
        installHelper(scenario, "vfat\n");
        // While it is being started, and while it runs.
        for (const bool waits : {false, true}) {
            makeFormatter();
            const int before = m_helper->runs().size();
            m_formatter->setDevicePath(card);
            const QPointer<QProcess> process = m_formatter->findChild<QProcess *>();
            TRY(!waits || scenario == "missing" || m_helper->runs().size() > before);
            m_formatter.reset();
            // A probe is stopped when its formatter is destroyed.
            TRY(process == nullptr);
            QCOMPARE(m_helper->running(), QList<qint64>());
        }
    }
    m_log->takeAll(); // the probe that crashes may have ended before its formatter
}

void TestMemoryCardFormatter::goesDuringAFormat()
{
    // While it is being started, and while it runs.
    for (const bool waits : {false, true}) {
        makeFormatter();
        start("done");
        installHelper("held", QByteArray(1000000, 'x'));
        const int before = m_helper->runs().size();
        QPointer<QProcess> process;
        onStatus(Formatter::Formatting,
                 [this, &process] { process = m_formatter->findChild<QProcess *>(); });
        m_formatter->format(ext4);
        TRY(process != nullptr && (!waits || m_helper->runs().size() > before));
        QCOMPARE(m_formatter->status(), Formatter::Formatting);
        m_formatter.reset();
        // The helper finishes formatting, but the destroyed formatter does not mount the card.
        TRY(m_helper->running().size() == 1);
        QTest::qWait(100);
        QCOMPARE(m_helper->running().size(), 1);
        // The helper has no pipe, so it can continue even after the application has ended.
        const QString descriptors = "/proc/%1/fd/"_s.arg(m_helper->running().first());
        QCOMPARE(QFile::symLinkTarget(descriptors + "1"_s), "/dev/null"_s);
        QVERIFY(QFile::symLinkTarget(descriptors + "2"_s).startsWith("/memfd:"_s));
        QVERIFY(process != nullptr);
        m_helper->release();
        TRY(process == nullptr);
        QCOMPARE(m_helper->running(), QList<qint64>());
        QCOMPARE(calls(), "Unmount testcard1"_s);
        installHelper("done");
    }
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
    TRY(mountedCard.isEmpty());
    TRY(QThreadPool::globalInstance()->activeThreadCount() == 0);
}

QTEST_GUILESS_MAIN(TestMemoryCardFormatter)

#include "tst_memorycardformatter.moc"
