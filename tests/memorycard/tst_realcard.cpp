// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The formatter with a real block device, the distribution's own disk service, and a helper that
// really makes file systems.

#include "files.h"
#include "formattertest.h"
#include "simulator/realcard.h"
#include "texts.h"

#include <QDir>
#include <QFile>
#include <QtTest>

#include <sys/prctl.h>

#include <csignal>

namespace {

const QString ext4 = "ext4"_s;
const QString vfat = "vfat"_s;

// Whether a thread of this process is in an uninterruptible wait.
bool someThreadIsStuck()
{
    const QDir tasks("/proc/self/task"_s);
    const QStringList ids = tasks.entryList(QDir::Dirs | QDir::NoDotAndDotDot);
    for (const QString &id : ids) {
        QFile file(tasks.filePath(id + "/stat"_s));
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

class TestRealCard : public FormatterTest
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
    void removeAllFiles();
    void busyCard();
    void deviceThatDisappears();

private:
    // Each starts an operation, waits for its end and returns its signals.
    QByteArray run(void (Formatter::*operation)());
    QByteArray format(const QString &type);
    QByteArray probe(const QString &path);
    QByteArray wait();
    // Creates files, directories and links on the card, which must be mounted.
    void fill();

    std::unique_ptr<RealCard> m_card;
};

void TestRealCard::initTestCase()
{
    const QString reason = RealCard::whyNot();
    if (!reason.isEmpty()) {
        if (!qEnvironmentVariableIsEmpty("CI")) {
            QFAIL(qPrintable("may not be skipped here, but "_s + reason));
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
    const QString loop = "/sys/block/%1/loop"_s.arg(m_card->name());
    QVERIFY(QFileInfo::exists(loop));
    m_card.reset();
    // Nothing keeps the device in use.
    TRY(!QFileInfo::exists(loop));
}

void TestRealCard::init()
{
    m_card->reset();
    FormatterTest::init();
    makeFormatter();
    setCard(m_card->name(), m_card->path());
    QCOMPARE(m_formatter->filesystemType(), ext4);
}

void TestRealCard::cleanup()
{
    m_card->thaw();
    m_formatter.reset();
    FormatterTest::cleanup();
}

QByteArray TestRealCard::run(void (Formatter::*operation)())
{
    (forgetEvents()->*operation)();
    return wait();
}

QByteArray TestRealCard::format(const QString &type)
{
    forgetEvents()->format(type);
    return wait();
}

QByteArray TestRealCard::probe(const QString &path)
{
    forgetEvents()->setDevicePath(path);
    return wait();
}

QByteArray TestRealCard::wait()
{
    // An operation emits "not busy" first. It ends with the status, with "not busy" again, or with
    // a forgiven error.
    const auto isOver = [this] { return !m_formatter->busy() && events() != "not busy"; };
    if (!becomesTrue(isOver)) {
        return events() + " and no end";
    }
    // The signals that are emitted together with the last one.
    QTest::qWait(0);
    return events();
}

void TestRealCard::fill()
{
    for (int i = 0; i < 20; ++i) {
        for (int j = 0; j < 20; ++j) {
            Files::write(m_card->file("directory %1/deep/.file%2"_s.arg(i).arg(j)), "content");
        }
    }
    Files::write(m_card->file("été"_s), QByteArray(1000000, 'x'));
    Files::makeLink("/etc"_s, m_card->file("link"_s));
    Files::makePipe(m_card->file(".pipe"_s));
    QVERIFY(m_card->files().size() > 20);
}

void TestRealCard::probe()
{
    QCOMPARE(probe("/dev/nonexistent"_s),
             QByteArray("path /dev/nonexistent, Probing, busy, type , Error, not busy"));
    QCOMPARE(takeLog(), helperEnded("probe", "nonexistent", "exited with 2 and the error \"\""));
    QCOMPARE(probe(m_card->path()),
             "path " + m_card->path().toUtf8() + ", Probing, busy, type ext4, Idle, not busy");
}

void TestRealCard::mountAndUnmount()
{
    QCOMPARE(run(&Formatter::mount), QByteArray(mounted));
    QCOMPARE(m_card->mountDirectories().size(), 1);
    QCOMPARE(m_card->files(), QStringList("lost+found"_s));
    QCOMPARE(run(&Formatter::mount), QByteArray("not busy, mount ErrorAlreadyMounted"));
    QCOMPARE(takeLog(), diskServiceError("Mount", "AlreadyMounted"));

    QCOMPARE(run(&Formatter::unmount), QByteArray(unmounted));
    QCOMPARE(m_card->mountDirectories(), QStringList());
    QCOMPARE(run(&Formatter::unmount), QByteArray("not busy, unmount ErrorNotMounted, Error"));
    QCOMPARE(takeLog(), diskServiceError("Unmount", "NotMounted"));
}

void TestRealCard::format()
{
    const QString before = m_card->probe("UUID");
    // A card that is not mounted is not formatted.
    QCOMPARE(format(ext4), QByteArray("not busy, unmount ErrorNotMounted, Error"));
    QCOMPARE(takeLog(), diskServiceError("Unmount", "NotMounted"));
    QCOMPARE(m_card->probe("UUID"), before);
    QCOMPARE(m_card->mountDirectories(), QStringList());

    QCOMPARE(run(&Formatter::mount), QByteArray(mounted));
    fill();
    QCOMPARE(format(ext4),
             QByteArray("not busy, Unmounting, busy, Formatting, Mounting, Idle, not busy"));
    QVERIFY(m_card->probe("UUID") != before);
    QCOMPARE(m_card->mountDirectories().size(), 1);
    QCOMPARE(m_card->files(), QStringList("lost+found"_s));
    QCOMPARE(run(&Formatter::unmount), QByteArray(unmounted));
}

void TestRealCard::formatAsVfat()
{
    QCOMPARE(run(&Formatter::mount), QByteArray(mounted));
    const QByteArray events = format(vfat);
    // Not every kernel can mount the new file system.
    QVERIFY2(events.startsWith("not busy, Unmounting, busy, Formatting, Mounting, Idle, ")
                 || events.startsWith("not busy, Unmounting, busy, Formatting, mount ErrorFailed, "
                                      "Error, "),
             events.constData());
    takeLog();
    QCOMPARE(m_card->probe("TYPE"), vfat);

    makeFormatter();
    setCard(m_card->name(), m_card->path());
    QCOMPARE(m_formatter->filesystemType(), vfat);
}

void TestRealCard::removeAllFiles()
{
    run(&Formatter::mount);
    fill();
    run(&Formatter::unmount);
    QCOMPARE(run(&Formatter::removeAllFiles),
             QByteArray("not busy, Mounting, busy, RemovingFiles, Idle, not busy"));
    QCOMPARE(m_card->files(), QStringList());
    QVERIFY(QFileInfo::exists("/etc/passwd"_s));

    // The card is still mounted.
    fill();
    QCOMPARE(
        run(&Formatter::removeAllFiles),
        QByteArray("not busy, mount ErrorAlreadyMounted, RemovingFiles, busy, Idle, not busy"));
    QCOMPARE(takeLog(), diskServiceError("Mount", "AlreadyMounted"));
    QCOMPARE(m_card->files(), QStringList());
}

void TestRealCard::busyCard()
{
    run(&Formatter::mount);
    const QString before = m_card->probe("UUID");
    const QString path = m_card->file("file"_s);
    Files::write(path, "content");
    QFile file(path);
    QVERIFY(file.open(QIODevice::ReadOnly));

    QCOMPARE(run(&Formatter::unmount), QByteArray("not busy, unmount ErrorDeviceBusy, Error"));
    QCOMPARE(takeLog(), diskServiceError("Unmount", "DeviceBusy"));
    QCOMPARE(format(ext4), QByteArray("not busy, unmount ErrorDeviceBusy"));
    QCOMPARE(takeLog(), diskServiceError("Unmount", "DeviceBusy"));
    QCOMPARE(m_formatter->status(), Formatter::Error);
    QCOMPARE(m_card->probe("UUID"), before);
    QCOMPARE(file.readAll(), QByteArray("content"));

    file.close();
    QCOMPARE(run(&Formatter::unmount), QByteArray(unmounted));
}

void TestRealCard::deviceThatDisappears()
{
    run(&Formatter::mount);
    fill();
    m_card->freeze();
    forgetEvents()->removeAllFiles();
    TRY_EVENTS("not busy, mount ErrorAlreadyMounted, RemovingFiles, busy");
    takeLog();
    // The remover has read the card, and waits for the removal of its first file.
    TRY(someThreadIsStuck());
    m_card->vanish();
    m_card->thaw();
    TRY_EVENTS("not busy, mount ErrorAlreadyMounted, RemovingFiles, busy, Error, not busy");

    // The disk service no longer knows the device, and the helper finds no file system on it.
    m_formatter->unmount();
    QByteArray log;
    TRY((log += takeLog()).endsWith("DBus.Error.UnknownMethod"));
    QCOMPARE(m_formatter->status(), Formatter::Error);
    probe(m_card->path() + QLatin1Char(' '));
    QCOMPARE(probe(m_card->path()),
             "path " + m_card->path().toUtf8() + ", Probing, busy, Error, not busy");
    QVERIFY(takeLog().endsWith("exited with 2 and the error \"\""));
    QCOMPARE(m_formatter->filesystemType(), QString());
}

int main(int argc, char *argv[])
{
    // The card and its daemons end with this process, even if the program that runs the test is
    // killed.
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    if (RealCard::whyNot().isEmpty()) {
        RealCard::becomePrivate();
    }
    const QCoreApplication application(argc, argv);
    TestRealCard test;
    return QTest::qExec(&test, argc, argv);
}

#include "tst_realcard.moc"
