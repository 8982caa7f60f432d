// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The formatter with a real block device, the distribution's own disk service, and a helper that
// really makes file systems.

#include "files.h"
#include "formatterevents.h"
#include "memorycard/memorycardformatter.h"
#include "messagelog.h"
#include "simulator/realcard.h"

#include <QDir>
#include <QFile>
#include <QtTest>

#include <memory>

#include <sys/prctl.h>

#include <csignal>

using Formatter = MemoryCardFormatter;

namespace {

constexpr int patience = 60000; // ms, of a machine that is very busy

const QString ext4 = QStringLiteral("ext4");
const QString vfat = QStringLiteral("vfat");

const QByteArray warning = QByteArrayLiteral("warning [org.tarnwickos.settings.memorycard] ");
const QByteArray diskServiceError = QByteArrayLiteral(" error: org.freedesktop.UDisks2.Error.");

// Whether a thread of this process waits where it cannot be interrupted.
bool someThreadIsStuck()
{
    const QDir tasks(QStringLiteral("/proc/self/task"));
    const QStringList ids = tasks.entryList(QDir::Dirs | QDir::NoDotAndDotDot);
    for (const QString &id : ids) {
        QFile file(tasks.filePath(id + QStringLiteral("/stat")));
        if (file.open(QIODevice::ReadOnly)) {
            const QByteArray stat = file.readAll();
            if (stat.mid(stat.lastIndexOf(')') + 2, 1) == "D") {
                return true;
            }
        }
    }
    return false;
}

} // namespace

class TestRealCard : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void cleanupTestCase();
    void init();
    void cleanup();

    void probe();
    void mountAndUnmount();
    void format();
    void formatAsVfat();
    void formatOfACardThatIsNotMounted();
    void removeAllFiles();
    void removeAllFilesFromACardThatIsMounted();
    void busyCard();
    void deviceThatDisappears();

private:
    // Runs an operation and waits for its end.
    QByteArray run(void (Formatter::*operation)());
    QByteArray format(const QString &type);
    QByteArray wait();
    // Files, directories and links in the card, which has to be mounted.
    void fill();
    QByteArray takeLog() { return m_log->takeReport().toUtf8(); }

    std::unique_ptr<MessageLog> m_log;
    std::unique_ptr<RealCard> m_card;
    std::unique_ptr<Formatter> m_formatter;
    std::unique_ptr<FormatterEvents> m_events;
};

void TestRealCard::initTestCase()
{
    const QString reason = RealCard::whyNot();
    if (!reason.isEmpty()) {
        if (!qEnvironmentVariableIsEmpty("CI")) {
            QFAIL(qPrintable(QStringLiteral("may not be skipped here, but ") + reason));
        }
        QSKIP(qPrintable(reason));
    }
    m_card = std::make_unique<RealCard>();
    RealCard::installHelper();
}

void TestRealCard::cleanupTestCase()
{
    if (m_card == nullptr) {
        return;
    }
    const QString loop = QStringLiteral("/sys/block/%1/loop").arg(m_card->name());
    QVERIFY(QFileInfo::exists(loop));
    m_card.reset();
    // Nothing holds on to the device.
    QTRY_VERIFY_WITH_TIMEOUT(!QFileInfo::exists(loop), patience);
}

void TestRealCard::init()
{
    m_card->reset();
    m_log = std::make_unique<MessageLog>();
    m_formatter = std::make_unique<Formatter>();
    m_formatter->setDeviceName(m_card->name());
    m_formatter->setDevicePath(m_card->path());
    QTRY_COMPARE_WITH_TIMEOUT(m_formatter->filesystemType(), ext4, patience);
    QTRY_COMPARE_WITH_TIMEOUT(m_formatter->status(), Formatter::Idle, patience);
    m_events = std::make_unique<FormatterEvents>(m_formatter.get());
}

void TestRealCard::cleanup()
{
    m_card->thaw();
    m_formatter.reset();
    const QString report = m_log->takeReport();
    m_log.reset();
    QCOMPARE(report, QString());
}

QByteArray TestRealCard::run(void (Formatter::*operation)())
{
    m_events->clear();
    (m_formatter.get()->*operation)();
    return wait();
}

QByteArray TestRealCard::format(const QString &type)
{
    m_events->clear();
    m_formatter->format(type);
    return wait();
}

QByteArray TestRealCard::wait()
{
    // An operation begins by saying "not busy", and ends with the status, with that again, or with
    // an error that is no obstacle.
    const auto isOver = [this] { return !m_formatter->busy() && m_events->line() != "not busy"; };
    if (!QTest::qWaitFor(isOver, patience)) {
        return m_events->line() + " and no end";
    }
    // Whatever is emitted together with that.
    QTest::qWait(0);
    return m_events->line();
}

void TestRealCard::fill()
{
    for (int i = 0; i < 20; ++i) {
        for (int j = 0; j < 20; ++j) {
            Files::write(m_card->file(QStringLiteral("directory %1/deep/.file%2").arg(i).arg(j)),
                         "content");
        }
    }
    Files::write(m_card->file(QStringLiteral(u"été")), QByteArray(1000000, 'x'));
    Files::makeLink(QStringLiteral("/etc"), m_card->file(QStringLiteral("link")));
    Files::makePipe(m_card->file(QStringLiteral(".pipe")));
    QVERIFY(m_card->files().size() > 20);
}

void TestRealCard::probe()
{
    m_formatter->setDevicePath(QStringLiteral("/dev/nonexistent"));
    QCOMPARE(wait(), QByteArray("path /dev/nonexistent, Probing, busy, type , Error, not busy"));
    m_events->clear();
    m_formatter->setDevicePath(m_card->path());
    QCOMPARE(wait(),
             "path " + m_card->path().toUtf8() + ", Probing, busy, type ext4, Idle, not busy");
}

void TestRealCard::mountAndUnmount()
{
    QCOMPARE(run(&Formatter::mount), QByteArray("not busy, Mounting, busy, Idle, not busy"));
    QCOMPARE(m_card->mountDirectories().size(), 1);
    QCOMPARE(m_card->files(), QStringList(QStringLiteral("lost+found")));
    QCOMPARE(run(&Formatter::mount), QByteArray("not busy, mount ErrorAlreadyMounted"));
    QCOMPARE(takeLog(), warning + "\"Mount\"" + diskServiceError + "AlreadyMounted");

    QCOMPARE(run(&Formatter::unmount), QByteArray("not busy, Unmounting, busy, Idle, not busy"));
    QCOMPARE(m_card->mountDirectories(), QStringList());
    QCOMPARE(run(&Formatter::unmount), QByteArray("not busy, unmount ErrorNotMounted, Error"));
    QCOMPARE(takeLog(), warning + "\"Unmount\"" + diskServiceError + "NotMounted");
}

void TestRealCard::format()
{
    QCOMPARE(run(&Formatter::mount), QByteArray("not busy, Mounting, busy, Idle, not busy"));
    fill();
    const QString before = m_card->probe("UUID");
    QCOMPARE(format(ext4),
             QByteArray("not busy, Unmounting, busy, Formatting, Mounting, Idle, not busy"));
    QVERIFY(m_card->probe("UUID") != before);
    QCOMPARE(m_card->mountDirectories().size(), 1);
    QCOMPARE(m_card->files(), QStringList(QStringLiteral("lost+found")));
    QCOMPARE(run(&Formatter::unmount), QByteArray("not busy, Unmounting, busy, Idle, not busy"));
}

void TestRealCard::formatAsVfat()
{
    QCOMPARE(run(&Formatter::mount), QByteArray("not busy, Mounting, busy, Idle, not busy"));
    const QByteArray events = format(vfat);
    // Not every kernel can mount what has been made.
    QVERIFY2(events.startsWith("not busy, Unmounting, busy, Formatting, Mounting, Idle, ")
                 || events.startsWith("not busy, Unmounting, busy, Formatting, mount ErrorFailed, "
                                      "Error, "),
             events.constData());
    takeLog();
    QCOMPARE(m_card->probe("TYPE"), vfat);

    Formatter another;
    another.setDevicePath(m_card->path());
    QTRY_COMPARE_WITH_TIMEOUT(another.filesystemType(), vfat, patience);
}

void TestRealCard::formatOfACardThatIsNotMounted()
{
    const QString before = m_card->probe("UUID");
    QCOMPARE(format(ext4), QByteArray("not busy, unmount ErrorNotMounted, Error"));
    QCOMPARE(takeLog(), warning + "\"Unmount\"" + diskServiceError + "NotMounted");
    QCOMPARE(m_card->probe("UUID"), before);
    QCOMPARE(m_card->mountDirectories(), QStringList());
}

void TestRealCard::removeAllFiles()
{
    run(&Formatter::mount);
    fill();
    run(&Formatter::unmount);
    QCOMPARE(run(&Formatter::removeAllFiles),
             QByteArray("not busy, Mounting, busy, RemovingFiles, Idle, not busy"));
    QCOMPARE(m_card->files(), QStringList());
    QVERIFY(QFileInfo::exists(QStringLiteral("/etc/passwd")));
}

void TestRealCard::removeAllFilesFromACardThatIsMounted()
{
    run(&Formatter::mount);
    fill();
    QCOMPARE(
        run(&Formatter::removeAllFiles),
        QByteArray("not busy, mount ErrorAlreadyMounted, RemovingFiles, busy, Idle, not busy"));
    QCOMPARE(takeLog(), warning + "\"Mount\"" + diskServiceError + "AlreadyMounted");
    QCOMPARE(m_card->files(), QStringList());
}

void TestRealCard::busyCard()
{
    run(&Formatter::mount);
    const QString before = m_card->probe("UUID");
    const QString path = m_card->file(QStringLiteral("file"));
    Files::write(path, "content");
    QFile file(path);
    QVERIFY(file.open(QIODevice::ReadOnly));

    QCOMPARE(run(&Formatter::unmount), QByteArray("not busy, unmount ErrorDeviceBusy, Error"));
    QCOMPARE(takeLog(), warning + "\"Unmount\"" + diskServiceError + "DeviceBusy");
    QCOMPARE(format(ext4), QByteArray("not busy, unmount ErrorDeviceBusy"));
    QCOMPARE(takeLog(), warning + "\"Unmount\"" + diskServiceError + "DeviceBusy");
    QCOMPARE(m_formatter->status(), Formatter::Error);
    QCOMPARE(m_card->probe("UUID"), before);
    QCOMPARE(file.readAll(), QByteArray("content"));

    file.close();
    QCOMPARE(run(&Formatter::unmount), QByteArray("not busy, Unmounting, busy, Idle, not busy"));
}

void TestRealCard::deviceThatDisappears()
{
    run(&Formatter::mount);
    fill();
    m_card->freeze();
    m_events->clear();
    m_formatter->removeAllFiles();
    QTRY_COMPARE_WITH_TIMEOUT(
        m_events->line(), QByteArray("not busy, mount ErrorAlreadyMounted, RemovingFiles, busy"),
        patience);
    takeLog();
    // The remover has read the card, and waits for its first file to go.
    QTRY_VERIFY_WITH_TIMEOUT(someThreadIsStuck(), patience);
    m_card->vanish();
    m_card->thaw();
    QTRY_COMPARE_WITH_TIMEOUT(m_events->line(),
                              QByteArray("not busy, mount ErrorAlreadyMounted, RemovingFiles, "
                                         "busy, Error, not busy"),
                              patience);

    // And with what is left of it: nothing to unmount, so far as the disk service knows, and
    // nothing to find a file system on.
    m_formatter->unmount();
    QByteArray log;
    QTRY_VERIFY_WITH_TIMEOUT((log += takeLog()).endsWith("DBus.Error.UnknownMethod"), patience);
    QCOMPARE(m_formatter->status(), Formatter::Error);
    m_events->clear();
    m_formatter->setDevicePath(m_card->path() + QLatin1Char(' '));
    wait();
    m_events->clear();
    m_formatter->setDevicePath(m_card->path());
    QCOMPARE(wait(), "path " + m_card->path().toUtf8() + ", Probing, busy, Error, not busy");
    QCOMPARE(m_formatter->filesystemType(), QString());
}

int main(int argc, char *argv[])
{
    // Whoever runs the test may be killed, and everything here hangs on this process.
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    if (RealCard::whyNot().isEmpty()) {
        RealCard::becomePrivate();
    }
    const QCoreApplication application(argc, argv);
    TestRealCard test;
    return QTest::qExec(&test, argc, argv);
}

#include "tst_realcard.moc"
