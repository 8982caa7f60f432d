// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "cardhelper.h"
#include "files.h"
#include "formatterevents.h"
#include "memorycard/memorycardformatter.h"
#include "messagelog.h"
#include "simulator/diskservicepeer.h"
#include "usedupdescriptors.h"

#include <QDBusConnection>
#include <QLoggingCategory>
#include <QPointer>
#include <QProcess>
#include <QQmlComponent>
#include <QQmlEngine>
#include <QTemporaryDir>
#include <QThreadPool>
#include <QtTest>

#include <cerrno>
#include <functional>
#include <initializer_list>
#include <memory>

#include <dlfcn.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

using Formatter = MemoryCardFormatter;

namespace {

constexpr int patience = 60000; // ms, of a machine that is very busy

const QString card = QStringLiteral("/dev/testcard1");
const QString otherCard = QStringLiteral("/dev/testcard2");
const QString cardName = QStringLiteral("testcard1");
const QString otherCardName = QStringLiteral("testcard2");
const QString vfat = QStringLiteral("vfat");
const QString ext4 = QStringLiteral("ext4");

const QString debugRule = QStringLiteral("org.tarnwickos.settings.memorycard.debug=true");
const QByteArray warning = QByteArrayLiteral("warning [org.tarnwickos.settings.memorycard] ");
const QByteArray critical = QByteArrayLiteral("critical [org.tarnwickos.settings.memorycard] ");
const QByteArray debug = QByteArrayLiteral("debug [org.tarnwickos.settings.memorycard] ");

// Of the last call that was sent and waits for its reply, in milliseconds.
int lastTimeout = 0;
bool signalledAllProcesses = false;

QString objectPath(const QString &name)
{
    return QStringLiteral("/org/freedesktop/UDisks2/block_devices/") + name;
}

QStringList words(const char *text)
{
    return QString::fromLatin1(text).split(QLatin1Char(' '), Qt::SkipEmptyParts);
}

// A file system in memory, mounted for as long as this lives in the name of a card.
class MountedCard
{
public:
    explicit MountedCard(const QString &device)
    {
        const QByteArray name = QFile::encodeName(device);
        if (mount(name.constData(), directory().constData(), "tmpfs", 0, "mode=700") != 0) {
            qFatal("cannot mount %s", name.constData());
        }
    }
    ~MountedCard() { umount2(directory().constData(), MNT_DETACH); }
    Q_DISABLE_COPY_MOVE(MountedCard)

    QString file(const char *name) const { return m_dir.filePath(QString::fromLatin1(name)); }
    QStringList files() const
    {
        return QDir(m_dir.path()).entryList(QDir::AllEntries | QDir::Hidden | QDir::NoDotAndDotDot);
    }

private:
    QByteArray directory() const { return QFile::encodeName(m_dir.path()); }

    QTemporaryDir m_dir;
};

} // namespace

// Takes the place of the D-Bus library's own, for the one thing that cannot be seen on the wire.
extern "C" Q_DECL_EXPORT unsigned dbus_connection_send_with_reply(void *connection, void *message,
                                                                  void **reply, int timeout)
{
    using Function = unsigned (*)(void *, void *, void **, int);
    static const auto original =
        reinterpret_cast<Function>(dlsym(RTLD_NEXT, "dbus_connection_send_with_reply"));
    lastTimeout = timeout;
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

class TestMemoryCardFormatter : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void startsIdle();
    void interface();
    void enumKeysInQml();
    void errorsInQml();

    void deviceName();
    void deviceNameWhileBusy();

    void newPathIsProbed();
    void samePathIsNotProbed();
    void pathIsKeptWhileBusy();
    void fileNameOfThePath_data();
    void fileNameOfThePath();
    void outputOfTheProbe_data();
    void outputOfTheProbe();
    void outputInPiecesOrWithMuchBesides();
    void failedProbe_data();
    void failedProbe();
    void crashedProbe();
    void helperThatCannotRun_data();
    void helperThatCannotRun();
    void helperWithFewDescriptors();
    void retriesWhenTheStatusIsError_data();
    void retriesWhenTheStatusIsError();
    void retriesWhenTheStatusIsErrorAgainAndAgain();

    void supportedFormatTypes_data();
    void supportedFormatTypes();

    void format_data();
    void format();
    void formatNeedsAPathAndAType();
    void formatOutputIsNotRead();
    void failedFormat_data();
    void failedFormat();
    void stepsOfTheSameSequenceKeepBusy();
    void removeAllFiles();
    void removeAllFilesNeedsAPath();
    void removeAllFilesFromACardThatIsNotMounted();
    void removeAllFilesNeedsADescriptor();
    void mountAndUnmount();
    void operationsWhileBusy();

    void requestsOnTheWire();
    void requestsHaveFiveMinutes();
    void errorsOfTheDiskService_data();
    void errorsOfTheDiskService();
    void errorEndsTheSequence();
    void alreadyDoneGoesOn_data();
    void alreadyDoneGoesOn();
    void otherErrors_data();
    void otherErrors();
    void namesThatMakeNoObjectPath_data();
    void namesThatMakeNoObjectPath();
    void slowDiskService();
    void withoutASystemBus();
    void fromErrorOn();

    void withoutADeviceName();
    void refusedCommandLeavesItsQueueBehind();
    void emptyTypeDuringARequest();

    void oneRequestAtATime();
    void formatsOneAfterTheOther();
    void probeWaitsForTheRequest();
    void probeSurvivesAFailedRequest_data();
    void probeSurvivesAFailedRequest();
    void errorsOfARunningHelper();
    void requestKeepsTheResultOfAProbe();
    void commandsKeepTheirPath();
    void nameIsReadWhenAStepStarts();
    void nameThatIsEmptyInTheMiddleOfASequence();
    void leftCommandsKeepTheirPath();
    void emptiesTheCardThatWasAskedFor();
    void retriesWhenToldOfAnError_data();
    void retriesWhenToldOfAnError();
    void asksForMoreWhenBusyChanges();

    void oneProcessForAll();
    void statusIsLogged();

    void goesDuringARequest();
    void goesDuringAProbe_data();
    void goesDuringAProbe();
    void goesDuringAFormat_data();
    void goesDuringAFormat();
    void goesWhileFilesAreRemoved();
    void goesAfterAFailure();

private:
    // The disk service that does what the words say.
    void startDiskService(const char *scenarios);
    // Gives the formatter a name and a path, and forgets the events up to the end of the probe.
    void setCard(const QString &name, const QString &path);
    // Both, with the usual card.
    void start(const char *scenarios);
    void startWithoutPath(const char *scenarios);
    void makeFormatter();
    Formatter *forgetEvents();
    // Mounts or unmounts.
    void request(bool mounts);
    // The scenario "missing" is a helper that is not there.
    void installHelper(const QString &scenario, const QByteArray &output = QByteArray());
    static void addScenarios(std::initializer_list<const char *> scenarios);
    std::unique_ptr<QObject> createFromQml(const QByteArray &source);
    // Answers each change of the status to the given one.
    void onStatus(Formatter::Status status, const std::function<void()> &answer);
    QByteArray takeLog() { return m_log->takeReport().toUtf8(); }

    QQmlEngine m_engine;
    std::unique_ptr<MessageLog> m_log;
    std::unique_ptr<CardHelper> m_helper;
    std::unique_ptr<DiskServicePeer> m_diskService;
    std::unique_ptr<Formatter> m_formatter;
    std::unique_ptr<FormatterEvents> m_events;
};

#define TRY_EVENTS(expected)                                                                       \
    QTRY_COMPARE_WITH_TIMEOUT(m_events->line(), QByteArray(expected), patience)
#define TRY(condition) QTRY_VERIFY_WITH_TIMEOUT(condition, patience)
#define TRY_COMPARE(actual, expected) QTRY_COMPARE_WITH_TIMEOUT(actual, expected, patience)

void TestMemoryCardFormatter::init()
{
    m_log = std::make_unique<MessageLog>();
    m_helper = std::make_unique<CardHelper>();
    m_helper->install(QStringLiteral("done"));
    makeFormatter();
}

void TestMemoryCardFormatter::cleanup()
{
    // Whatever else there is to come, comes now.
    const QByteArray events = m_events->line();
    QTest::qWait(0);
    const QByteArray eventsAfterwards = m_events->line();
    m_formatter.reset();
    m_diskService.reset();
    m_helper.reset();
    QLoggingCategory::setFilterRules(QString());
    const QString report = m_log->takeReport();
    m_log.reset();
    QCOMPARE(report, QString());
    QCOMPARE(eventsAfterwards, events);
}

void TestMemoryCardFormatter::startDiskService(const char *scenarios)
{
    m_diskService.reset();
    m_diskService = std::make_unique<DiskServicePeer>(words(scenarios));
}

void TestMemoryCardFormatter::makeFormatter()
{
    m_formatter = std::make_unique<Formatter>();
    m_events = std::make_unique<FormatterEvents>(m_formatter.get());
}

void TestMemoryCardFormatter::setCard(const QString &name, const QString &path)
{
    m_formatter->setDeviceName(name);
    m_formatter->setDevicePath(path);
    TRY(m_formatter->status() == Formatter::Idle);
    m_events->clear();
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
    m_events->clear();
}

Formatter *TestMemoryCardFormatter::forgetEvents()
{
    m_events->clear();
    return m_formatter.get();
}

void TestMemoryCardFormatter::request(bool mounts)
{
    (m_formatter.get()->*(mounts ? &Formatter::mount : &Formatter::unmount))();
}

void TestMemoryCardFormatter::installHelper(const QString &scenario, const QByteArray &output)
{
    if (scenario == QLatin1String("missing")) {
        m_helper->remove();
    } else {
        m_helper->install(scenario, output);
    }
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
    component.setData(source, QUrl(QStringLiteral("test.qml")));
    std::unique_ptr<QObject> object(component.create());
    if (object == nullptr) {
        qWarning("%s", qPrintable(component.errorString()));
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

    QByteArrayList properties;
    for (int i = meta.propertyOffset(); i < meta.propertyCount(); ++i) {
        const QMetaProperty property = meta.property(i);
        properties.append(
            QByteArray(property.typeName()) + ' ' + property.name()
            + (property.isWritable() ? " writable" : "")
            + (property.isConstant() ? " constant" : "")
            + (property.hasNotifySignal() ? ' ' + property.notifySignal().name() : QByteArray()));
    }
    QCOMPARE(properties,
             (QByteArrayList{
                 "Status status statusChanged", "QString deviceName writable deviceNameChanged",
                 "QString devicePath writable devicePathChanged",
                 "QString filesystemType filesystemTypeChanged",
                 "QStringList supportedFormatTypes constant", "bool busy busyChanged"}));

    QByteArrayList methods;
    for (int i = meta.methodOffset(); i < meta.methodCount(); ++i) {
        const QMetaMethod method = meta.method(i);
        static const char *const kinds[] = {"method ", "signal ", "slot "};
        const QByteArray access = method.access() == QMetaMethod::Private ? "private " : "";
        methods.append(access + kinds[method.methodType()] + method.methodSignature());
        QCOMPARE(method.typeName(), "void");
    }
    QCOMPARE(methods,
             (QByteArrayList{"signal statusChanged()", "signal deviceNameChanged()",
                             "signal devicePathChanged()", "signal filesystemTypeChanged()",
                             "signal busyChanged()", "signal mountError(MountError)",
                             "signal unmountError(MountError)",
                             "private slot commandError(QProcess::ProcessError)",
                             "private slot commandFinished(int,QProcess::ExitStatus)",
                             "private slot fileRemoverFinished()",
                             "private slot fileRemoverError()", "method format(QString)",
                             "method removeAllFiles()", "method mount()", "method unmount()"}));
}

void TestMemoryCardFormatter::enumKeysInQml()
{
    const auto object = createFromQml(R"(import QtQml 2.15
        import Test 1.0
        QtObject {
            property var status: ['Idle', 'Unmounting', 'Formatting', 'RemovingFiles', 'Mounting',
                'Probing', 'Error'].map(function(key) { return MemoryCardFormatter[key] })
            property var errors: ['Failed', 'Cancelled', 'AlreadyCancelled', 'NotAuthorized',
                'NotAuthorizedCanObtain', 'NotAuthorizedDismissed', 'AlreadyMounted', 'NotMounted',
                'OptionNotPermitted', 'MountedByOtherUser', 'AlreadyUnmounting', 'NotSupported',
                'Timedout', 'WouldWakeup', 'DeviceBusy']
                .map(function(key) { return MemoryCardFormatter['Error' + key] })
        })");
    QVERIFY(object != nullptr);
    QCOMPARE(object->property("status").toList(), (QVariantList{0, 1, 2, 3, 4, 5, 6}));
    QCOMPARE(object->property("errors").toList(),
             (QVariantList{0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14}));
}

void TestMemoryCardFormatter::errorsInQml()
{
    startDiskService("Mount=DeviceBusy Unmount=NotMounted");
    const auto object = createFromQml(R"(import Test 1.0
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
    QVERIFY(object != nullptr);
    QVERIFY(QMetaObject::invokeMethod(object.get(), "unmount"));
    TRY_COMPARE(object->property("seen").toString(), QStringLiteral("truetruetruetrue"));
    QCOMPARE(takeLog(),
             warning + "\"Unmount\" error: org.freedesktop.UDisks2.Error.NotMounted\n" + warning
                 + "\"Mount\" error: org.freedesktop.UDisks2.Error.DeviceBusy");
}

void TestMemoryCardFormatter::deviceName()
{
    m_formatter->setDeviceName(cardName);
    QCOMPARE(m_formatter->deviceName(), cardName);
    m_formatter->setDeviceName(cardName);
    QCOMPARE(m_events->line(), QByteArray("name testcard1"));

    QLoggingCategory::setFilterRules(debugRule);
    m_formatter->setDeviceName(cardName);
    QCOMPARE(takeLog(), QByteArray());
    m_formatter->setDeviceName(otherCardName);
    QCOMPARE(takeLog(), debug + "New device name \"testcard2\"");
    QCOMPARE(m_events->line(), QByteArray("name testcard1, name testcard2"));
    QVERIFY(m_helper->runs().isEmpty());
}

void TestMemoryCardFormatter::deviceNameWhileBusy()
{
    m_helper->install(QStringLiteral("held"));
    m_formatter->setDevicePath(card);
    TRY_EVENTS("path /dev/testcard1, Probing, busy");
    m_formatter->setDeviceName(cardName);
    QCOMPARE(m_formatter->deviceName(), cardName);
    TRY_EVENTS("path /dev/testcard1, Probing, busy, name testcard1");
    m_helper->release();
    TRY_EVENTS("path /dev/testcard1, Probing, busy, name testcard1, Idle, not busy");
}

void TestMemoryCardFormatter::newPathIsProbed()
{
    m_helper->install(QStringLiteral("done"), "vfat\n");
    m_formatter->setDevicePath(QStringLiteral("/dev/mmcblk1p1"));
    QCOMPARE(m_formatter->devicePath(), QStringLiteral("/dev/mmcblk1p1"));
    TRY_EVENTS("path /dev/mmcblk1p1, Probing, busy, type vfat, Idle, not busy");
    QCOMPARE(m_formatter->filesystemType(), vfat);
    QCOMPARE(m_helper->runs(), QList<QStringList>{words("probe mmcblk1p1")});

    // The same again is no change.
    forgetEvents()->setDevicePath(otherCard);
    TRY_EVENTS("path /dev/testcard2, Probing, busy, Idle, not busy");

    m_events->clear();
    m_helper->install(QStringLiteral("done"), "ext4\n");
    m_formatter->setDevicePath(QString());
    TRY_EVENTS("path , Probing, busy, type ext4, Idle, not busy");
    QCOMPARE(m_helper->runs().last(), (QStringList{QStringLiteral("probe"), QString()}));
}

void TestMemoryCardFormatter::samePathIsNotProbed()
{
    m_formatter->setDevicePath(QString());
    QCOMPARE(m_events->line(), QByteArray());
    setCard(cardName, card);
    m_formatter->setDevicePath(card);
    QCOMPARE(m_events->line(), QByteArray());
    QCOMPARE(m_helper->runs().size(), 1);
}

void TestMemoryCardFormatter::pathIsKeptWhileBusy()
{
    start("done");
    m_helper->install(QStringLiteral("held"));
    m_formatter->format(vfat);
    TRY_EVENTS("not busy, Unmounting, busy, Formatting");
    m_formatter->setDevicePath(card);
    QCOMPARE(takeLog(), QByteArray());
    m_formatter->setDevicePath(otherCard);
    QCOMPARE(takeLog(),
             warning
                 + "Cannot change device path when not idle. Status is "
                   "MemoryCardFormatter::Formatting");
    QCOMPARE(m_formatter->devicePath(), card);
    m_helper->release();
    TRY_EVENTS("not busy, Unmounting, busy, Formatting, Mounting, Idle, not busy");
    QCOMPARE(m_helper->runs().size(), 2);
}

void TestMemoryCardFormatter::fileNameOfThePath_data()
{
    QTest::addColumn<QString>("path");
    QTest::addColumn<QString>("name");
    const auto row = [](const char *path, const char *name) {
        QTest::newRow(path) << QString::fromUtf8(path) << QString::fromUtf8(name);
    };
    row("/dev/mmcblk1p1", "mmcblk1p1");
    row("mmcblk1p1", "mmcblk1p1");
    row("/dev/mapper/a b", "a b");
    row("/dev/mmcblk1p1/", "");
    row("/", "");
    row("/dev/..", "..");
    row("/dev/k\xc3\xa4rte", "k\xc3\xa4rte");
    row("/dev/; rm -r *", "; rm -r *");
    row("/dev/--help", "--help");
}

void TestMemoryCardFormatter::fileNameOfThePath()
{
    QFETCH(QString, path);
    QFETCH(QString, name);
    startDiskService("done");
    setCard(cardName, path);
    m_formatter->format(vfat);
    TRY_EVENTS("not busy, Unmounting, busy, Formatting, Mounting, Idle, not busy");
    QCOMPARE(m_helper->runs(),
             (QList<QStringList>{{QStringLiteral("probe"), name},
                                 {QStringLiteral("format_vfat"), name}}));
}

void TestMemoryCardFormatter::outputOfTheProbe_data()
{
    QTest::addColumn<QByteArray>("output");
    QTest::addColumn<QString>("type");
    QTest::newRow("line") << QByteArray("vfat\n") << vfat;
    QTest::newRow("bare") << QByteArray("vfat") << vfat;
    QTest::newRow("white space") << QByteArray(" \t\r\n\v\f ext4 \r\n\n") << ext4;
    QTest::newRow("white space within") << QByteArray(" a  b\nc ") << QStringLiteral("a  b\nc");
    QTest::newRow("letters outside ASCII") << QByteArray("\xe9t\xe9\n") << QStringLiteral(u"été");
    // As text, this would be white space, too.
    QTest::newRow("no white space as a byte")
        << QByteArray("\xa0vfat\x85\n") << QStringLiteral(u"\u00a0vfat\u0085");
    QTest::newRow("not UTF-8") << QByteArray("\xc3\xa9") << QStringLiteral(u"Ã©");
    QTest::newRow("null byte") << QByteArray("vfat\0ext4", 9) << vfat;
    const QByteArray large = QByteArray(3000000, 'x');
    QTest::newRow("large") << large + '\n' << QString::fromLatin1(large);
}

void TestMemoryCardFormatter::outputOfTheProbe()
{
    QFETCH(QByteArray, output);
    QFETCH(QString, type);
    m_helper->install(QStringLiteral("done"), output);
    m_formatter->setDevicePath(card);
    TRY_EVENTS("path /dev/testcard1, Probing, busy, type " + type.toUtf8() + ", Idle, not busy");
    QCOMPARE(m_formatter->filesystemType(), type);

    m_helper->install(QStringLiteral("done"), " \n");
    forgetEvents()->setDevicePath(otherCard);
    TRY_EVENTS("path /dev/testcard2, Probing, busy, type , Idle, not busy");
}

void TestMemoryCardFormatter::outputInPiecesOrWithMuchBesides()
{
    for (const char *scenario : {"slow", "noisy"}) {
        installHelper(QString::fromLatin1(scenario), "ext4\n");
        makeFormatter();
        m_formatter->setDevicePath(card);
        TRY_EVENTS("path /dev/testcard1, Probing, busy, type ext4, Idle, not busy");
    }
}

void TestMemoryCardFormatter::failedProbe_data()
{
    QTest::addColumn<QString>("scenario");
    QTest::addColumn<QByteArray>("output");
    QTest::addColumn<QByteArray>("events");
    QTest::newRow("no output") << QStringLiteral("exit=1") << QByteArray()
                               << QByteArray("path /dev/testcard2, Probing, busy, type , Error, "
                                             "not busy");
    QTest::newRow("output") << QStringLiteral("exit=255") << QByteArray("swap\n")
                            << QByteArray("path /dev/testcard2, Probing, busy, type swap, Error, "
                                          "not busy");
    QTest::newRow("the same output")
        << QStringLiteral("exit=2") << QByteArray("vfat")
        << QByteArray("path /dev/testcard2, Probing, busy, Error, not busy");
}

void TestMemoryCardFormatter::failedProbe()
{
    QFETCH(QString, scenario);
    QFETCH(QByteArray, output);
    QFETCH(QByteArray, events);
    m_helper->install(QStringLiteral("done"), "vfat\n");
    setCard(cardName, card);
    m_helper->install(scenario, output);
    m_formatter->setDevicePath(otherCard);
    TRY_EVENTS(events);
    QCOMPARE(m_formatter->busy(), false);
    // It is the new path that could not be probed.
    QCOMPARE(m_formatter->devicePath(), otherCard);
}

void TestMemoryCardFormatter::crashedProbe()
{
    m_helper->install(QStringLiteral("done"), "vfat\n");
    setCard(cardName, card);
    m_helper->install(QStringLiteral("crash"), "ext4\n");
    m_formatter->setDevicePath(otherCard);
    TRY_EVENTS("path /dev/testcard2, Probing, busy, Error, not busy");
    // Nothing may follow when the process has really ended.
    TRY_COMPARE(m_formatter->findChild<QProcess *>()->state(), QProcess::NotRunning);
    QTest::qWait(100);
    QCOMPARE(m_events->line(), QByteArray("path /dev/testcard2, Probing, busy, Error, not busy"));
    QCOMPARE(m_formatter->filesystemType(), vfat);

    m_helper->install(QStringLiteral("done"), "ext4\n");
    forgetEvents()->setDevicePath(card);
    TRY_EVENTS("path /dev/testcard1, Probing, busy, type ext4, Idle, not busy");
}

void TestMemoryCardFormatter::helperThatCannotRun_data()
{
    QTest::addColumn<bool>("isThere");
    QTest::newRow("missing") << false;
    QTest::newRow("not executable") << true;
}

void TestMemoryCardFormatter::helperThatCannotRun()
{
    QFETCH(bool, isThere);
    m_helper->install(QStringLiteral("done"), "vfat\n");
    setCard(cardName, card);
    if (isThere) {
        m_helper->installNotExecutable();
    } else {
        m_helper->remove();
    }
    m_formatter->setDevicePath(otherCard);
    // The failed start has not been reported yet.
    QCOMPARE(m_formatter->status(), Formatter::Probing);
    TRY_EVENTS("path /dev/testcard2, Probing, busy, Error, not busy");
    QCOMPARE(m_formatter->filesystemType(), vfat);

    m_helper->install(QStringLiteral("done"), "ext4\n");
    forgetEvents()->setDevicePath(card);
    TRY_EVENTS("path /dev/testcard1, Probing, busy, type ext4, Idle, not busy");
}

void TestMemoryCardFormatter::helperWithFewDescriptors()
{
    startDiskService("done");
    m_formatter->setDeviceName(cardName);
    m_formatter->unmount();
    TRY(m_events->line().endsWith("Unmounting, busy, Idle, not busy"));
    bool started = false;
    bool failed = false;
    for (int left = 0; left < 24; ++left) {
        const UsedUpDescriptors used(left);
        makeFormatter();
        m_formatter->setDeviceName(cardName);
        m_formatter->setDevicePath(card);
        TRY(m_events->line().contains("Error") || m_events->line().endsWith("Idle, not busy"));
        const bool probed = m_formatter->status() == Formatter::Idle;
        forgetEvents()->format(vfat);
        TRY(m_events->line().endsWith(probed ? "Mounting, Idle, not busy" : "Error, not busy"));
        started = started || probed;
        failed = failed || !probed;

        // Its destruction ends a probe, and nothing else.
        Formatter another;
        another.setDevicePath(card);
    }
    QVERIFY(started && failed);
    QVERIFY(!signalledAllProcesses);
}

void TestMemoryCardFormatter::retriesWhenTheStatusIsError_data()
{
    addScenarios({"missing", "crash", "exit=1"});
}

void TestMemoryCardFormatter::retriesWhenTheStatusIsError()
{
    QFETCH(QString, scenario);
    installHelper(scenario);
    onStatus(Formatter::Error, [this] {
        m_helper->install(QStringLiteral("done"), "ext4\n");
        m_formatter->setDevicePath(otherCard);
    });
    m_formatter->setDevicePath(card);
    TRY(m_formatter->status() == Formatter::Idle && m_formatter->filesystemType() == ext4);
    QVERIFY(!m_formatter->busy());
    QCOMPARE(m_helper->runs().last(), words("probe testcard2"));
    // busyChanged() is emitted at most once in between: the step may be over by then.
    QVERIFY2(m_events->line().endsWith("Probing, busy, type ext4, Idle, not busy")
                 || m_events->line().endsWith("not busy, Probing, busy, type ext4, Idle, not busy"),
             m_events->line().constData());
}

void TestMemoryCardFormatter::retriesWhenTheStatusIsErrorAgainAndAgain()
{
    m_helper->remove();
    int retries = 0;
    onStatus(Formatter::Error, [this, &retries] {
        if (++retries == 20) {
            m_helper->install(QStringLiteral("done"), "ext4\n");
        }
        m_formatter->setDevicePath(QStringLiteral("/dev/testcard%1").arg(retries));
    });
    m_formatter->setDevicePath(QStringLiteral("/dev/testcard0"));
    TRY(m_formatter->status() == Formatter::Idle && m_formatter->filesystemType() == ext4);
    QCOMPARE(retries, 20);
    QCOMPARE(m_helper->runs(), QList<QStringList>{words("probe testcard20")});
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
    const auto install = [](const QString &path, int mode) {
        Files::remove(path);
        if (mode >= 0) {
            Files::write(path, "#!/bin/sh\n");
            QCOMPARE(chmod(QFile::encodeName(path).constData(), mode_t(mode)), 0);
        }
    };
    install(QStringLiteral("/sbin/mkfs.vfat"), vfatMode);
    install(QStringLiteral("/sbin/mkfs.ext4"), ext4Mode);
    QCOMPARE(m_formatter->supportedFormatTypes(), types);
    QCOMPARE(m_formatter->property("supportedFormatTypes").toStringList(), types);
    // Nothing is kept from one read to the next.
    install(QStringLiteral("/sbin/mkfs.vfat"), 0755);
    install(QStringLiteral("/sbin/mkfs.ext4"), 0755);
    QCOMPARE(m_formatter->supportedFormatTypes(), (QStringList{vfat, ext4}));
}

void TestMemoryCardFormatter::format_data()
{
    QTest::addColumn<QString>("type");
    QTest::addColumn<QStringList>("arguments");
    QTest::newRow("vfat") << vfat << words("format_vfat testcard1");
    QTest::newRow("ext4") << ext4 << words("format_ext4 testcard1");
    // The helper decides on these.
    QTest::newRow("VFAT") << QStringLiteral("VFAT") << words("testcard1");
    QTest::newRow("Ext4") << QStringLiteral("Ext4") << words("testcard1");
    QTest::newRow("blank") << QStringLiteral(" vfat") << words("testcard1");
    QTest::newRow("ntfs") << QStringLiteral("ntfs") << words("testcard1");
}

void TestMemoryCardFormatter::format()
{
    QFETCH(QString, type);
    QFETCH(QStringList, arguments);
    start("done");
    m_formatter->format(type);
    // Told although it has not changed yet.
    QCOMPARE(m_events->line(), QByteArray("not busy"));
    QCOMPARE(m_formatter->status(), Formatter::Idle);
    TRY_EVENTS("not busy, Unmounting, busy, Formatting, Mounting, Idle, not busy");
    QCOMPARE(m_diskService->members(), words("Unmount Mount"));
    QCOMPARE(m_helper->runs(), (QList<QStringList>{words("probe testcard1"), arguments}));
}

void TestMemoryCardFormatter::formatNeedsAPathAndAType()
{
    m_formatter->format(vfat);
    QCOMPARE(takeLog(), warning + "devicePath is empty.");
    QCOMPARE(m_events->line(), QByteArray("Error"));
    // The path is checked first. The status stays Error, so no signal is emitted.
    m_formatter->format(QString());
    QCOMPARE(takeLog(), warning + "devicePath is empty.");
    QCOMPARE(m_events->line(), QByteArray("Error"));

    setCard(cardName, card);
    m_formatter->format(QString());
    QCOMPARE(takeLog(), warning + "type is empty.");
    QCOMPARE(m_events->line(), QByteArray("Error"));
    QCOMPARE(m_formatter->status(), Formatter::Error);
    QCOMPARE(m_formatter->busy(), false);
}

void TestMemoryCardFormatter::formatOutputIsNotRead()
{
    startDiskService("done");
    m_helper->install(QStringLiteral("done"), "vfat\n");
    setCard(cardName, card);
    m_helper->install(QStringLiteral("done"), QByteArray(1000000, 'x'));
    m_formatter->format(ext4);
    TRY_EVENTS("not busy, Unmounting, busy, Formatting, Mounting, Idle, not busy");
    QCOMPARE(m_formatter->filesystemType(), vfat);
    // And a probe is read again.
    m_helper->install(QStringLiteral("done"), "ext4\n");
    forgetEvents()->setDevicePath(otherCard);
    TRY_EVENTS("path /dev/testcard2, Probing, busy, type ext4, Idle, not busy");
}

void TestMemoryCardFormatter::failedFormat_data()
{
    addScenarios({"missing", "crash", "exit=1", "exit=255"});
}

void TestMemoryCardFormatter::failedFormat()
{
    QFETCH(QString, scenario);
    startDiskService("done");
    m_helper->install(QStringLiteral("done"), "vfat\n");
    setCard(cardName, card);
    installHelper(scenario, "ext4\n");
    m_formatter->format(vfat);
    TRY_EVENTS("not busy, Unmounting, busy, Formatting, Error, not busy");
    QTest::qWait(100);
    QCOMPARE(m_events->line(),
             QByteArray("not busy, Unmounting, busy, Formatting, Error, not busy"));
    QCOMPARE(m_diskService->members(), words("Unmount"));
    QCOMPARE(m_formatter->deviceName(), cardName);
    QCOMPARE(m_formatter->devicePath(), card);
    QCOMPARE(m_formatter->filesystemType(), vfat);
}

void TestMemoryCardFormatter::stepsOfTheSameSequenceKeepBusy()
{
    start("done");
    QList<bool> busy;
    connect(m_formatter.get(), &Formatter::statusChanged, this,
            [this, &busy] { busy.append(m_formatter->busy()); });
    m_formatter->format(vfat);
    TRY_COMPARE(busy, (QList<bool>{true, true, true, false}));
    TRY_EVENTS("not busy, Unmounting, busy, Formatting, Mounting, Idle, not busy");
}

void TestMemoryCardFormatter::removeAllFiles()
{
    startDiskService("done");
    const MountedCard mounted(card);
    Files::write(mounted.file("file"), "x");
    Files::write(mounted.file(".hidden"), "x");
    Files::write(mounted.file("directory/file"), "x");
    setCard(cardName, card);
    m_formatter->removeAllFiles();
    QCOMPARE(m_events->line(), QByteArray("not busy"));
    TRY_EVENTS("not busy, Mounting, busy, RemovingFiles, Idle, not busy");
    QCOMPARE(mounted.files(), QStringList());
    QCOMPARE(m_diskService->members(), words("Mount"));
}

void TestMemoryCardFormatter::removeAllFilesNeedsAPath()
{
    m_formatter->setDeviceName(cardName);
    forgetEvents()->removeAllFiles();
    QCOMPARE(takeLog(), warning + "devicePath is empty.");
    QCOMPARE(m_events->line(), QByteArray("Error"));
}

void TestMemoryCardFormatter::removeAllFilesFromACardThatIsNotMounted()
{
    start("done");
    m_formatter->removeAllFiles();
    TRY_EVENTS("not busy, Mounting, busy, RemovingFiles, Error, not busy");
    forgetEvents()->mount();
    TRY_EVENTS("not busy, Mounting, busy, Idle, not busy");
}

void TestMemoryCardFormatter::removeAllFilesNeedsADescriptor()
{
    startDiskService("done");
    const MountedCard mounted(card);
    Files::write(mounted.file("file"), "x");
    setCard(cardName, card);
    // A first connection to a bus cannot be had without descriptors: QtDBus ends the process.
    m_formatter->mount();
    TRY_EVENTS("not busy, Mounting, busy, Idle, not busy");
    m_events->clear();
    {
        const UsedUpDescriptors none;
        m_formatter->removeAllFiles();
        // It does not begin: a thread without descriptors would be the end of the process.
        TRY_EVENTS("not busy, Mounting, busy, Error, not busy");
    }
    QCOMPARE(mounted.files(), words("file"));
    forgetEvents()->removeAllFiles();
    TRY_EVENTS("not busy, Mounting, busy, RemovingFiles, Idle, not busy");
    QCOMPARE(mounted.files(), QStringList());
}

void TestMemoryCardFormatter::mountAndUnmount()
{
    // No path is needed.
    startWithoutPath("done");
    for (const bool mounts : {true, false}) {
        const QByteArray status = mounts ? "Mounting" : "Unmounting";
        m_events->clear();
        request(mounts);
        QCOMPARE(m_events->line(), QByteArray("not busy"));
        TRY_EVENTS("not busy, " + status + ", busy, Idle, not busy");
    }
    QCOMPARE(m_diskService->members(), words("Mount Unmount"));
}

void TestMemoryCardFormatter::operationsWhileBusy()
{
    startWithoutPath("done");
    m_helper->install(QStringLiteral("held"));
    m_formatter->setDevicePath(card);
    TRY_EVENTS("path /dev/testcard1, Probing, busy");

    const QByteArray tail = " called when not idle. Status is MemoryCardFormatter::Probing";
    m_formatter->format(vfat);
    QCOMPARE(takeLog(), warning + "format()" + tail);
    // Whether the formatter is busy is checked before the arguments.
    m_formatter->format(QString());
    QCOMPARE(takeLog(), warning + "format()" + tail);
    m_formatter->removeAllFiles();
    QCOMPARE(takeLog(), warning + "removeAllFiles()" + tail);
    m_formatter->mount();
    QCOMPARE(takeLog(), warning + "mount()" + tail);
    m_formatter->unmount();
    QCOMPARE(takeLog(), warning + "unmount()" + tail);

    m_helper->release();
    TRY_EVENTS("path /dev/testcard1, Probing, busy, Idle, not busy");
    QCOMPARE(m_diskService->members(), QStringList());
    QCOMPARE(m_helper->runs().size(), 1);
}

void TestMemoryCardFormatter::requestsOnTheWire()
{
    startDiskService("done");
    setCard(QStringLiteral("mmcblk1p1"), card);
    m_formatter->format(vfat);
    TRY_EVENTS("not busy, Unmounting, busy, Formatting, Mounting, Idle, not busy");
    const auto calls = m_diskService->calls();
    QCOMPARE(calls.size(), 2);
    for (const auto &call : calls) {
        QCOMPARE(call.path, QStringLiteral("/org/freedesktop/UDisks2/block_devices/mmcblk1p1"));
        QCOMPARE(call.interface, QStringLiteral("org.freedesktop.UDisks2.Filesystem"));
        QCOMPARE(call.signature, QStringLiteral("a{sv}"));
    }
    QCOMPARE(calls[0].member, QStringLiteral("Unmount"));
    QCOMPARE(calls[0].arguments, (QVariantList{QVariantMap{{QString(), QLatin1String("")}}}));
    QCOMPARE(calls[1].member, QStringLiteral("Mount"));
    QCOMPARE(calls[1].arguments,
             (QVariantList{QVariantMap{{QStringLiteral("fstype"), QLatin1String("")}}}));
}

void TestMemoryCardFormatter::requestsHaveFiveMinutes()
{
    startWithoutPath("done");
    for (const auto operation : {&Formatter::mount, &Formatter::unmount}) {
        lastTimeout = 0;
        (m_formatter.get()->*operation)();
        TRY(m_events->line().endsWith("Idle, not busy"));
        QCOMPARE(lastTimeout, 300000);
        m_events->clear();
    }
}

void TestMemoryCardFormatter::errorsOfTheDiskService_data()
{
    QTest::addColumn<bool>("mounts");
    QTest::addColumn<Formatter::MountError>("code");
    const QMetaEnum codes = QMetaEnum::fromType<Formatter::MountError>();
    QCOMPARE(codes.keyCount(), 15);
    for (int i = 0; i < codes.keyCount(); ++i) {
        for (const bool mounts : {true, false}) {
            QTest::addRow("%s %s", mounts ? "Mount" : "Unmount", codes.key(i))
                << mounts << Formatter::MountError(i);
        }
    }
}

void TestMemoryCardFormatter::errorsOfTheDiskService()
{
    QFETCH(bool, mounts);
    QFETCH(Formatter::MountError, code);
    const QByteArray key = FormatterEvents::key(code);
    const QByteArray error = key.mid(int(strlen("Error")));
    startWithoutPath(error.constData());
    request(mounts);
    const bool forgiven = error == "AlreadyMounted" || error == "AlreadyUnmounting";
    // The error before the status; a sequence that is over goes from Idle to Idle without a word.
    TRY_EVENTS(QByteArray("not busy, ") + (mounts ? "mount " : "unmount ") + key
               + (forgiven ? "" : ", Error"));
    QCOMPARE(m_formatter->status(), forgiven ? Formatter::Idle : Formatter::Error);
    QCOMPARE(takeLog(),
             warning + (mounts ? "\"Mount\"" : "\"Unmount\"")
                 + " error: org.freedesktop.UDisks2.Error." + error);
}

void TestMemoryCardFormatter::errorEndsTheSequence()
{
    start("Unmount=NotMounted Mount=DeviceBusy");
    m_formatter->format(vfat);
    TRY_EVENTS("not busy, unmount ErrorNotMounted, Error");
    QCOMPARE(takeLog(), warning + "\"Unmount\" error: org.freedesktop.UDisks2.Error.NotMounted");
    QCOMPARE(m_helper->runs().size(), 1);

    m_events->clear();
    startDiskService("Unmount=done Mount=DeviceBusy");
    m_formatter->format(vfat);
    TRY_EVENTS("not busy, Unmounting, busy, Formatting, mount ErrorDeviceBusy, Error, not busy");
    QCOMPARE(takeLog(), warning + "\"Mount\" error: org.freedesktop.UDisks2.Error.DeviceBusy");

    // Nothing is left of either.
    m_events->clear();
    startDiskService("done");
    m_formatter->unmount();
    TRY_EVENTS("not busy, Unmounting, busy, Idle, not busy");
    QCOMPARE(m_diskService->members(), words("Unmount"));
    QCOMPARE(m_helper->runs().size(), 2);
}

void TestMemoryCardFormatter::alreadyDoneGoesOn_data()
{
    QTest::addColumn<QByteArray>("error");
    QTest::newRow("AlreadyMounted") << QByteArray("AlreadyMounted");
    QTest::newRow("AlreadyUnmounting") << QByteArray("AlreadyUnmounting");
}

void TestMemoryCardFormatter::alreadyDoneGoesOn()
{
    QFETCH(QByteArray, error);
    start(error.constData());
    m_formatter->format(vfat);
    // The status passes over what was not done.
    TRY_EVENTS("not busy, unmount Error" + error + ", Formatting, busy, mount Error" + error
               + ", Idle, not busy");
    const QByteArray name = "org.freedesktop.UDisks2.Error." + error;
    QCOMPARE(takeLog(),
             warning + "\"Unmount\" error: " + name + '\n' + warning + "\"Mount\" error: " + name);
    QCOMPARE(m_helper->runs().last(), words("format_vfat testcard1"));

    m_events->clear();
    const MountedCard mounted(card);
    Files::write(mounted.file("file"), "x");
    m_formatter->removeAllFiles();
    TRY_EVENTS("not busy, mount Error" + error + ", RemovingFiles, busy, Idle, not busy");
    QCOMPARE(mounted.files(), QStringList());
    QCOMPARE(takeLog(), warning + "\"Mount\" error: " + name);
}

void TestMemoryCardFormatter::otherErrors_data()
{
    QTest::addColumn<QByteArray>("scenario");
    QTest::addColumn<QByteArray>("error");
    QTest::newRow("unknown") << QByteArray("UnknownError")
                             << QByteArray("org.freedesktop.UDisks2.Error.UnknownError");
    QTest::newRow("gone") << QByteArray("gone") << QByteArray("org.freedesktop.DBus.Error.NoReply");
    QTest::newRow("absent") << QByteArray("absent")
                            << QByteArray("org.freedesktop.DBus.Error.ServiceUnknown");
}

void TestMemoryCardFormatter::otherErrors()
{
    QFETCH(QByteArray, scenario);
    QFETCH(QByteArray, error);
    for (const bool mounts : {true, false}) {
        startDiskService(scenario.constData());
        makeFormatter();
        m_formatter->setDeviceName(cardName);
        m_events->clear();
        request(mounts);
        TRY_EVENTS("not busy, Error");
        QCOMPARE(takeLog(), warning + (mounts ? "\"Mount\"" : "\"Unmount\"") + " error: " + error);
    }
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
    // Behind what Qt itself has to say.
    const auto messages = m_log->takeAll();
    QCOMPARE(messages.size(), 2);
    QCOMPARE(messages[0].category, QStringLiteral("default"));
    QCOMPARE(messages[1].category, QStringLiteral("org.tarnwickos.settings.memorycard"));
    QCOMPARE(messages[1].text,
             QStringLiteral("\"Unmount\" error: org.qtproject.QtDBus.Error.InvalidObjectPath"));
    QCOMPARE(m_diskService->members(), QStringList());

    m_formatter->setDeviceName(cardName);
    forgetEvents()->unmount();
    TRY_EVENTS("not busy, Unmounting, busy, Idle, not busy");
}

void TestMemoryCardFormatter::slowDiskService()
{
    start("slow");
    m_formatter->format(vfat);
    TRY_EVENTS("not busy, Unmounting, busy, Formatting, Mounting, Idle, not busy");
}

void TestMemoryCardFormatter::withoutASystemBus()
{
    // The connection belongs to the process, so this takes one of its own.
    constexpr char marker[] = "TEST_WITHOUT_A_SYSTEM_BUS";
    if (!qEnvironmentVariableIsSet(marker)) {
        QProcess process;
        QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
        environment.insert(QLatin1String(marker), QStringLiteral("1"));
        environment.insert(QStringLiteral("DBUS_SYSTEM_BUS_ADDRESS"),
                           QStringLiteral("unix:path=/nonexistent"));
        process.setProcessEnvironment(environment);
        process.setProcessChannelMode(QProcess::MergedChannels);
        process.start(QCoreApplication::applicationFilePath(), words("withoutASystemBus"));
        QVERIFY(process.waitForFinished(patience));
        const QByteArray output = process.readAll();
        QVERIFY2(process.exitStatus() == QProcess::NormalExit && process.exitCode() == 0,
                 output.constData());
        QVERIFY2(output.contains("PASS   : TestMemoryCardFormatter::withoutASystemBus()"),
                 output.constData());
        return;
    }
    QVERIFY(!QDBusConnection::systemBus().isConnected());
    m_formatter->setDeviceName(cardName);
    forgetEvents()->mount();
    QCOMPARE(m_events->line(), QByteArray("not busy"));
    TRY_EVENTS("not busy, Error");
    QCOMPARE(takeLog(), warning + "\"Mount\" error: org.freedesktop.DBus.Error.Disconnected");
}

void TestMemoryCardFormatter::fromErrorOn()
{
    startDiskService("done");
    m_formatter->format(vfat);
    takeLog();
    m_formatter->setDeviceName(cardName);
    forgetEvents()->mount();
    QCOMPARE(m_formatter->status(), Formatter::Error);
    TRY_EVENTS("not busy, Mounting, busy, Idle, not busy");
}

void TestMemoryCardFormatter::withoutADeviceName()
{
    m_formatter->mount();
    QCOMPARE(m_events->line(), QByteArray("not busy"));
    // The words are crossed on purpose.
    QCOMPARE(takeLog(), critical + "Cannot unmount without device name");
    m_formatter->unmount();
    QCOMPARE(m_events->line(), QByteArray("not busy, not busy"));
    QCOMPARE(takeLog(), critical + "Cannot mount without device name");
    QCOMPARE(m_formatter->status(), Formatter::Idle);

    m_formatter->format(vfat);
    QCOMPARE(takeLog(), warning + "devicePath is empty.");
    m_formatter->mount();
    QCOMPARE(takeLog(), critical + "Cannot unmount without device name");
    QCOMPARE(m_events->line(), QByteArray("not busy, not busy, Error, not busy"));
    QCOMPARE(m_formatter->status(), Formatter::Error);
}

void TestMemoryCardFormatter::refusedCommandLeavesItsQueueBehind()
{
    startDiskService("done");
    setCard(QString(), card);
    m_formatter->format(vfat);
    QCOMPARE(takeLog(), critical + "Cannot mount without device name");
    QCOMPARE(m_events->line(), QByteArray("not busy"));
    QCOMPARE(m_formatter->status(), Formatter::Idle);

    // The rest of the queue runs first, with the name set since then.
    m_formatter->setDeviceName(cardName);
    forgetEvents()->unmount();
    TRY_EVENTS("not busy, Formatting, busy, Mounting, Unmounting, Idle, not busy");
    QCOMPARE(m_helper->runs().last(), words("format_vfat testcard1"));
    QCOMPARE(m_diskService->members(), words("Mount Unmount"));
    QCOMPARE(m_diskService->calls().first().path, objectPath(cardName));

    // In the middle of a sequence, the status stays at what was done before.
    setCard(QString(), card);
    m_formatter->removeAllFiles();
    QCOMPARE(takeLog(), critical + "Cannot unmount without device name");
    forgetEvents()->setDevicePath(otherCard);
    TRY_EVENTS("path /dev/testcard2, RemovingFiles, busy, Error, not busy");
}

void TestMemoryCardFormatter::emptyTypeDuringARequest()
{
    start("hung");
    m_formatter->unmount();
    TRY_COMPARE(m_diskService->members(), words("Unmount"));
    m_formatter->format(QString());
    QCOMPARE(takeLog(), warning + "type is empty.");
    QCOMPARE(m_events->line(), QByteArray("not busy, Error"));
    m_diskService->replyToKept();
    TRY_EVENTS("not busy, Error, Unmounting, busy, Idle, not busy");
}

void TestMemoryCardFormatter::oneRequestAtATime()
{
    startWithoutPath("hung");
    m_formatter->mount();
    m_formatter->unmount();
    m_formatter->mount();
    TRY_COMPARE(m_diskService->members(), words("Mount"));
    QTest::qWait(100);
    QCOMPARE(m_diskService->members(), words("Mount"));
    QCOMPARE(m_events->line(), QByteArray("not busy, not busy, not busy"));

    m_diskService->replyToKept();
    TRY_COMPARE(m_diskService->members(), words("Mount Unmount"));
    TRY_EVENTS("not busy, not busy, not busy, Mounting, busy");
    m_diskService->replyToKept();
    TRY_COMPARE(m_diskService->members(), words("Mount Unmount Mount"));
    m_diskService->replyToKept();
    TRY_EVENTS("not busy, not busy, not busy, Mounting, busy, Unmounting, Mounting, Idle, "
               "not busy");
    QCOMPARE(m_diskService->members(), words("Mount Unmount Mount"));
}

void TestMemoryCardFormatter::formatsOneAfterTheOther()
{
    start("hung");
    m_formatter->format(vfat);
    m_formatter->format(ext4);
    TRY_COMPARE(m_diskService->members(), words("Unmount"));
    QTest::qWait(100);
    // Nothing is made of a card that is still mounted.
    QCOMPARE(m_helper->runs().size(), 1);
    QCOMPARE(m_diskService->members(), words("Unmount"));

    m_diskService->replyToKept();
    TRY_COMPARE(m_diskService->members(), words("Unmount Mount"));
    QCOMPARE(m_helper->runs().last(), words("format_vfat testcard1"));
    m_diskService->replyToKept();
    TRY_COMPARE(m_diskService->members(), words("Unmount Mount Unmount"));
    QCOMPARE(m_helper->runs().size(), 2);
    m_diskService->replyToKept();
    TRY_COMPARE(m_diskService->members(), words("Unmount Mount Unmount Mount"));
    QCOMPARE(m_helper->runs().last(), words("format_ext4 testcard1"));
    m_diskService->replyToKept();
    TRY_EVENTS("not busy, not busy, Unmounting, busy, Formatting, Mounting, Unmounting, "
               "Formatting, Mounting, Idle, not busy");
}

void TestMemoryCardFormatter::probeWaitsForTheRequest()
{
    startDiskService("hung");
    m_helper->install(QStringLiteral("done"), "vfat\n");
    m_formatter->setDeviceName(cardName);
    forgetEvents()->mount();
    m_formatter->setDevicePath(card);
    TRY_COMPARE(m_diskService->members(), words("Mount"));
    QTest::qWait(100);
    QCOMPARE(m_helper->runs().size(), 0);
    QCOMPARE(m_events->line(), QByteArray("not busy, path /dev/testcard1"));
    m_diskService->replyToKept();
    TRY_EVENTS("not busy, path /dev/testcard1, Mounting, busy, Probing, type vfat, Idle, "
               "not busy");
}

void TestMemoryCardFormatter::probeSurvivesAFailedRequest_data()
{
    QTest::addColumn<bool>("mounts");
    QTest::newRow("mount") << true;
    QTest::newRow("unmount") << false;
}

void TestMemoryCardFormatter::probeSurvivesAFailedRequest()
{
    QFETCH(bool, mounts);
    start("DeviceBusy");
    m_helper->install(QStringLiteral("done"), "ext4\n");
    // The next card is set before the request for this one fails.
    request(mounts);
    m_formatter->format(vfat);
    m_formatter->setDevicePath(otherCard);
    const QByteArray error = mounts ? "mount ErrorDeviceBusy" : "unmount ErrorDeviceBusy";
    TRY_EVENTS("not busy, not busy, path /dev/testcard2, " + error
               + ", Error, Probing, busy, type ext4, Idle, not busy");
    // The format is dropped.
    QCOMPARE(m_helper->runs().mid(1), QList<QStringList>{words("probe testcard2")});
    QCOMPARE(m_diskService->members().size(), 1);
    takeLog();
}

void TestMemoryCardFormatter::errorsOfARunningHelper()
{
    // Only a failed start is handled here: the process reports every other end by finished().
    const auto report = [this](QProcess::ProcessError error) {
        return QMetaObject::invokeMethod(m_formatter.get(), "commandError",
                                         Q_ARG(QProcess::ProcessError, error));
    };
    m_helper->install(QStringLiteral("held"), "ext4\n");
    m_formatter->setDevicePath(card);
    TRY(m_helper->running().size() == 1);
    for (const auto error : {QProcess::FailedToStart, QProcess::Crashed, QProcess::Timedout,
                             QProcess::ReadError, QProcess::WriteError, QProcess::UnknownError}) {
        QVERIFY(report(error));
    }
    m_helper->release();
    TRY_EVENTS("path /dev/testcard1, Probing, busy, type ext4, Idle, not busy");

    // A second report of a failed start comes while the next command runs.
    startWithoutPath("hung");
    m_formatter->mount();
    QVERIFY(report(QProcess::FailedToStart));
    TRY_COMPARE(m_diskService->members(), words("Mount"));
    m_diskService->replyToKept();
    TRY_EVENTS("not busy, Mounting, busy, Idle, not busy");
}

void TestMemoryCardFormatter::requestKeepsTheResultOfAProbe()
{
    startDiskService("hung");
    m_helper->install(QStringLiteral("done"), "vfat\n");
    m_formatter->setDeviceName(cardName);
    forgetEvents()->mount();
    m_formatter->setDevicePath(card);
    m_formatter->unmount();
    TRY_COMPARE(m_diskService->members(), words("Mount"));
    startDiskService("AlreadyUnmounting");
    // The first request ends with the service. The probe behind it runs, the unmounting is dropped.
    TRY_EVENTS("not busy, path /dev/testcard1, not busy, Error, Probing, busy, type vfat, Idle, "
               "not busy");
    QCOMPARE(takeLog(), warning + "\"Mount\" error: org.freedesktop.DBus.Error.NoReply");

    // Here the probe is over when the request begins, and the status still says that it runs.
    setCard(cardName, otherCard);
    m_formatter->unmount();
    m_formatter->setDevicePath(card);
    m_formatter->unmount();
    TRY_EVENTS("not busy, path /dev/testcard1, not busy, unmount ErrorAlreadyUnmounting, Probing, "
               "busy, unmount ErrorAlreadyUnmounting, Idle, not busy");
    QCOMPARE(m_formatter->filesystemType(), vfat);
    takeLog();
}

void TestMemoryCardFormatter::commandsKeepTheirPath()
{
    start("hung");
    m_formatter->format(vfat);
    // QML moves on to another card before the first one is unmounted.
    m_formatter->setDevicePath(otherCard);
    QCOMPARE(m_formatter->devicePath(), otherCard);
    TRY_COMPARE(m_diskService->members(), words("Unmount"));
    m_diskService->replyToKept();
    TRY_COMPARE(m_diskService->members(), words("Unmount Mount"));
    m_diskService->replyToKept();
    TRY_EVENTS("not busy, path /dev/testcard2, Unmounting, busy, Formatting, Mounting, Probing, "
               "Idle, not busy");
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
    m_diskService->replyToKept();
    TRY_COMPARE(m_diskService->members(), words("Unmount Mount"));
    m_diskService->replyToKept();
    TRY_EVENTS("not busy, name testcard2, Unmounting, busy, Formatting, Mounting, Idle, not busy");
    QCOMPARE(m_diskService->calls().first().path, objectPath(cardName));
    QCOMPARE(m_diskService->calls().last().path, objectPath(otherCardName));

    // The same for a request that waits behind another one.
    m_formatter->unmount();
    m_formatter->mount();
    m_formatter->setDeviceName(cardName);
    TRY_COMPARE(m_diskService->members(), words("Unmount Mount Unmount"));
    m_diskService->replyToKept();
    TRY_COMPARE(m_diskService->members(), words("Unmount Mount Unmount Mount"));
    QCOMPARE(m_diskService->calls().at(2).path, objectPath(otherCardName));
    QCOMPARE(m_diskService->calls().at(3).path, objectPath(cardName));
    m_diskService->replyToKept();
    TRY(m_formatter->status() == Formatter::Idle);
}

void TestMemoryCardFormatter::nameThatIsEmptyInTheMiddleOfASequence()
{
    start("hung");
    m_formatter->format(vfat);
    TRY_COMPARE(m_diskService->members(), words("Unmount"));
    m_formatter->setDeviceName(QString());
    m_diskService->replyToKept();
    QByteArray log;
    TRY((log += takeLog()) == critical + "Cannot unmount without device name");
    const QByteArray events = "not busy, name , Unmounting, busy, Formatting";
    QCOMPARE(m_events->line(), events);

    // The formatter stays as it is, whatever is set or requested afterwards.
    m_formatter->setDeviceName(cardName);
    m_formatter->mount();
    QCOMPARE(takeLog(),
             warning + "mount() called when not idle. Status is MemoryCardFormatter::Formatting");
    QTest::qWait(100);
    QCOMPARE(m_events->line(), events + ", name testcard1");
    QCOMPARE(m_diskService->members(), words("Unmount"));

    // A new one works.
    makeFormatter();
    m_formatter->setDeviceName(cardName);
    m_formatter->mount();
    TRY_COMPARE(m_diskService->members(), words("Unmount Mount"));
    m_diskService->replyToKept();
    TRY_EVENTS("name testcard1, not busy, Mounting, busy, Idle, not busy");
}

void TestMemoryCardFormatter::leftCommandsKeepTheirPath()
{
    startDiskService("done");
    setCard(QString(), card);
    m_formatter->format(ext4);
    QCOMPARE(takeLog(), critical + "Cannot mount without device name");
    // The probe of the new path comes behind what is left of the sequence.
    m_formatter->setDeviceName(otherCardName);
    m_formatter->setDevicePath(otherCard);
    TRY_EVENTS("not busy, name testcard2, path /dev/testcard2, Formatting, busy, Mounting, "
               "Probing, Idle, not busy");
    QCOMPARE(m_helper->runs(),
             (QList<QStringList>{words("probe testcard1"), words("format_ext4 testcard1"),
                                 words("probe testcard2")}));
}

void TestMemoryCardFormatter::emptiesTheCardThatWasAskedFor()
{
    startDiskService("hung");
    const MountedCard mounted(card);
    const MountedCard other(otherCard);
    Files::write(mounted.file("file"), "x");
    Files::write(other.file("file"), "x");
    setCard(cardName, card);
    m_formatter->removeAllFiles();
    m_formatter->setDevicePath(otherCard);
    TRY_COMPARE(m_diskService->members(), words("Mount"));
    m_diskService->replyToKept();
    TRY_EVENTS("not busy, path /dev/testcard2, Mounting, busy, RemovingFiles, Probing, Idle, "
               "not busy");
    QCOMPARE(mounted.files(), QStringList());
    QCOMPARE(other.files(), words("file"));
}

void TestMemoryCardFormatter::retriesWhenToldOfAnError_data()
{
    QTest::addColumn<bool>("mounts");
    QTest::addColumn<bool>("byStatus");
    QTest::newRow("mount, by the error") << true << false;
    QTest::newRow("mount, by the status") << true << true;
    QTest::newRow("unmount, by the error") << false << false;
    QTest::newRow("unmount, by the status") << false << true;
}

void TestMemoryCardFormatter::retriesWhenToldOfAnError()
{
    QFETCH(bool, mounts);
    QFETCH(bool, byStatus);
    startWithoutPath("Mount=NotAuthorized Unmount=DeviceBusy");
    const auto operation = mounts ? &Formatter::mount : &Formatter::unmount;
    const auto retry = [this, operation] {
        startDiskService("done");
        (m_formatter.get()->*operation)();
    };
    if (byStatus) {
        onStatus(Formatter::Error, retry);
    } else {
        connect(m_formatter.get(), mounts ? &Formatter::mountError : &Formatter::unmountError, this,
                retry);
    }
    (m_formatter.get()->*operation)();
    const QByteArray error = mounts ? "mount ErrorNotAuthorized" : "unmount ErrorDeviceBusy";
    const QByteArray done = mounts ? "Mounting" : "Unmounting";
    // What was asked for in between is not lost with what had failed.
    TRY_EVENTS("not busy, " + error + (byStatus ? ", Error, not busy, " : ", not busy, Error, ")
               + done + ", busy, Idle, not busy");
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
    startDiskService("done");
    const auto processes = [this] { return m_formatter->findChildren<QProcess *>(); };
    m_formatter->setDeviceName(cardName);
    forgetEvents()->mount();
    TRY_EVENTS("not busy, Mounting, busy, Idle, not busy");
    QCOMPARE(processes().size(), 0);

    setCard(cardName, card);
    QCOMPARE(processes().size(), 1);
    QProcess *process = processes().constFirst();
    m_formatter->format(vfat);
    TRY_EVENTS("not busy, Unmounting, busy, Formatting, Mounting, Idle, not busy");
    setCard(cardName, otherCard);
    QCOMPARE(processes(), QList<QProcess *>{process});
    QCOMPARE(process->parent(), m_formatter.get());
    // The replies have gone.
    TRY_COMPARE(m_formatter->children().size(), 1);
}

void TestMemoryCardFormatter::statusIsLogged()
{
    QLoggingCategory::setFilterRules(debugRule);
    startDiskService("done");
    m_formatter->setDeviceName(cardName);
    m_formatter->setDevicePath(card);
    TRY_EVENTS("name testcard1, path /dev/testcard1, Probing, busy, Idle, not busy");
    forgetEvents()->format(vfat);
    TRY_EVENTS("not busy, Unmounting, busy, Formatting, Mounting, Idle, not busy");
    forgetEvents()->removeAllFiles();
    TRY_EVENTS("not busy, Mounting, busy, RemovingFiles, Error, not busy");
    const QByteArray status = debug + "New status MemoryCardFormatter::";
    QCOMPARE(takeLog(),
             debug + "New device name \"testcard1\"\n" + status + "Probing\n" + status + "Idle\n"
                 + status + "Unmounting\n" + status + "Formatting\n" + status + "Mounting\n"
                 + status + "Idle\n" + status + "Mounting\n" + status + "RemovingFiles\n" + status
                 + "Error");

    // Off unless switched on.
    QLoggingCategory::setFilterRules(QString());
    m_formatter->setDeviceName(otherCardName);
    m_formatter->setDevicePath(otherCard);
    TRY(m_formatter->status() == Formatter::Idle);
    QCOMPARE(takeLog(), QByteArray());
}

void TestMemoryCardFormatter::goesDuringARequest()
{
    startDiskService("hung");
    m_formatter->setDeviceName(cardName);
    m_formatter->mount();
    TRY_COMPARE(m_diskService->members(), words("Mount"));
    m_formatter.reset();
    m_diskService->replyToKept();
    QTest::qWait(100);

    startDiskService("gone");
    makeFormatter();
    m_formatter->setDeviceName(cardName);
    m_formatter->mount();
    m_formatter.reset();
    QTest::qWait(100);
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
    m_helper->install(QStringLiteral("held"), QByteArray(1000000, 'x'));
    if (runs) {
        m_formatter->format(ext4);
        TRY(m_helper->runs().size() == 2);
    } else {
        QPointer<QProcess> starting;
        onStatus(Formatter::Formatting,
                 [this, &starting] { starting = m_formatter->findChild<QProcess *>(); });
        m_formatter->format(ext4);
        TRY(starting != nullptr);
        QVERIFY(m_formatter->status() == Formatter::Formatting);
    }
    QPointer<QProcess> process = m_formatter->findChild<QProcess *>();
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
    startDiskService("done");
    const MountedCard mounted(card);
    Files::write(mounted.file("directory/file"), "x");
    setCard(cardName, card);
    bool removing = false;
    onStatus(Formatter::RemovingFiles, [&removing] { removing = true; });
    m_formatter->removeAllFiles();
    TRY(removing);
    m_formatter.reset();
    // It is not waited for, and does not stop.
    TRY_COMPARE(mounted.files(), QStringList());
    TRY(QThreadPool::globalInstance()->activeThreadCount() == 0);
}

void TestMemoryCardFormatter::goesAfterAFailure()
{
    startWithoutPath("Failed");
    // This request is still queued when the formatter is destroyed.
    onStatus(Formatter::Error, [this] { m_formatter->mount(); });
    m_formatter->mount();
    while (m_formatter->status() != Formatter::Error) {
        QCoreApplication::processEvents(QEventLoop::WaitForMoreEvents);
    }
    m_formatter.reset();
    QTest::qWait(100);
    takeLog();
}

QTEST_GUILESS_MAIN(TestMemoryCardFormatter)

#include "tst_memorycardformatter.moc"
