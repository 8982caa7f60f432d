// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The formatter with a card and with a helper program that fail.

#include "failingcard.h"
#include "files.h"
#include "memorycard/memorycardformatter.h"
#include "messagelog.h"
#include "ownprocess.h"
#include "simulator/serviceprocess.h"
#include "usedupdescriptors.h"

#include <QDir>
#include <QThreadPool>
#include <QtTest>

#include <csignal>
#include <memory>

#include <sys/mount.h>

using Formatter = MemoryCardFormatter;
using Statuses = QList<Formatter::Status>;

class TestCardFaults : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void cardThatCannotBeListed();
    void cardWithErrors();
    void cardGoneWhileItIsEmptied();
    void cardDetachedWhileItIsEmptied();
    void cardThatHangs();
    void goesWhileTheCardHangs();
    void fullCard();
    void cardWithoutDescriptors();

    void helperThatWritesAHundredMegabytes();
    void helperThatClosesItsOutputFirst();
    void helperThatNeverEnds();

private:
    void makeFormatter();
    void startEmptying();

    std::unique_ptr<MessageLog> m_log;
    std::unique_ptr<ServiceProcess> m_diskService;
    std::unique_ptr<Formatter> m_formatter;
    // Since the last start.
    Statuses m_statuses;
};

namespace {

constexpr int patience = 60000; // ms, of a machine that is very busy
constexpr int files = 300;

const Statuses emptied = {Formatter::Mounting, Formatter::RemovingFiles, Formatter::Idle};
const Statuses notEmptied = {Formatter::Mounting, Formatter::RemovingFiles, Formatter::Error};

const QString device = QStringLiteral("/dev/testcard1");

#define TRY(condition) QTRY_VERIFY_WITH_TIMEOUT(condition, patience)
#define TRY_COMPARE(actual, expected) QTRY_COMPARE_WITH_TIMEOUT(actual, expected, patience)
#define NEEDS_FUSE()                                                                               \
    if (!FailingCard::whyNot().isEmpty()) {                                                        \
        QSKIP(qPrintable(FailingCard::whyNot()));                                                  \
    }

void installHelper(const QByteArray &script)
{
    const QString path = QStringLiteral("/usr/libexec/sdcardhelper");
    Files::write(path, "#!/bin/sh\n" + script);
    QVERIFY(QFile::setPermissions(path, QFile::ReadOwner | QFile::ExeOwner));
}

// Runs the event loop for a while. Only other threads are blocked.
void letEverythingArrive()
{
    QTest::qWait(100);
}

} // namespace

void TestCardFaults::init()
{
    installHelper("echo ext4\n");
    m_log = std::make_unique<MessageLog>();
    m_diskService = std::make_unique<ServiceProcess>(
        "system", QStringLiteral("org.freedesktop.UDisks2"), "replies");
    makeFormatter();
}

void TestCardFaults::cleanup()
{
    m_formatter.reset();
    m_diskService.reset();
    QVERIFY(QThreadPool::globalInstance()->waitForDone(patience));
    const QString report = m_log->takeReport();
    m_log.reset();
    QCOMPARE(report, QString());
}

void TestCardFaults::makeFormatter()
{
    m_formatter = std::make_unique<Formatter>();
    connect(m_formatter.get(), &Formatter::statusChanged, this,
            [this] { m_statuses.append(m_formatter->status()); });
    m_formatter->setDeviceName(QStringLiteral("testcard1"));
    m_formatter->setDevicePath(device);
    TRY_COMPARE(m_formatter->filesystemType(), QStringLiteral("ext4"));
    TRY_COMPARE(m_formatter->status(), Formatter::Idle);
}

void TestCardFaults::startEmptying()
{
    m_statuses.clear();
    m_formatter->removeAllFiles();
}

void TestCardFaults::cardThatCannotBeListed()
{
    NEEDS_FUSE()
    FailingCard card(device, files);
    card.setFault(FailingCard::Fault::Unreadable);
    startEmptying();
    // What cannot be read counts as empty.
    TRY_COMPARE(m_statuses, emptied);
    QCOMPARE(card.filesLeft(), files);
    card.setFault(FailingCard::Fault::None);
    startEmptying();
    TRY_COMPARE(m_statuses, emptied);
    QCOMPARE(card.filesLeft(), 0);
}

void TestCardFaults::cardWithErrors()
{
    NEEDS_FUSE()
    FailingCard card(device, files);
    card.setFault(FailingCard::Fault::Stuck);
    startEmptying();
    TRY_COMPARE(m_statuses, notEmptied);
    QCOMPARE(card.filesLeft(), files);
    card.setFault(FailingCard::Fault::None);
    startEmptying();
    TRY_COMPARE(m_statuses, emptied);
    QCOMPARE(card.filesLeft(), 0);
}

void TestCardFaults::cardGoneWhileItIsEmptied()
{
    NEEDS_FUSE()
    {
        FailingCard card(device, files);
        card.setFault(FailingCard::Fault::Waits);
        startEmptying();
        TRY_COMPARE(card.waiting(), 1);
        card.setFault(FailingCard::Fault::Gone);
        TRY_COMPARE(m_statuses, notEmptied);
        QCOMPARE(card.filesLeft(), files);
    }
    FailingCard another(device, files);
    startEmptying();
    TRY_COMPARE(m_statuses, emptied);
    QCOMPARE(another.filesLeft(), 0);
}

void TestCardFaults::cardDetachedWhileItIsEmptied()
{
    NEEDS_FUSE()
    FailingCard card(device, files);
    card.setFault(FailingCard::Fault::Waits);
    startEmptying();
    TRY_COMPARE(card.waiting(), 1);
    // Beneath the card lies a directory of somebody else's.
    card.detach();
    const QString below = card.directory() + QStringLiteral("/file0");
    Files::write(below, "not of the card");
    card.setFault(FailingCard::Fault::None);
    TRY_COMPARE(m_statuses, emptied);
    QCOMPARE(card.filesLeft(), 0);
    QVERIFY(QFile::exists(below));

    // And no card is mounted any more.
    startEmptying();
    TRY_COMPARE(m_statuses, notEmptied);
    QVERIFY(QFile::exists(below));
}

void TestCardFaults::cardThatHangs()
{
    NEEDS_FUSE()
    FailingCard card(device, files);
    card.setFault(FailingCard::Fault::Waits);
    startEmptying();
    TRY_COMPARE(card.waiting(), 1);
    letEverythingArrive();
    QCOMPARE(m_formatter->status(), Formatter::RemovingFiles);
    QVERIFY(m_formatter->busy());
    card.setFault(FailingCard::Fault::None);
    TRY_COMPARE(m_statuses, emptied);
    QCOMPARE(card.filesLeft(), 0);
}

void TestCardFaults::goesWhileTheCardHangs()
{
    NEEDS_FUSE()
    FailingCard card(device, files);
    card.setFault(FailingCard::Fault::Waits);
    startEmptying();
    TRY_COMPARE(card.waiting(), 1);
    m_formatter.reset();
    letEverythingArrive();
    // What was asked for is done all the same.
    card.setFault(FailingCard::Fault::None);
    TRY_COMPARE(card.filesLeft(), 0);
}

void TestCardFaults::fullCard()
{
    QTemporaryDir dir;
    QCOMPARE(mount(QFile::encodeName(device).constData(), QFile::encodeName(dir.path()).constData(),
                   "tmpfs", 0, "size=64k,nr_inodes=10"),
             0);
    int written = 0;
    for (int i = 0; i < 20; ++i) {
        QFile file(dir.filePath(QString::number(i)));
        if (file.open(QIODevice::WriteOnly | QIODevice::Unbuffered)
            && file.write(QByteArray(10000, 'x')) == 10000) {
            ++written;
        }
    }
    QVERIFY(written > 0 && written < 20);
    startEmptying();
    TRY_COMPARE(m_statuses, emptied);
    const QStringList left = QDir(dir.path()).entryList(QDir::AllEntries | QDir::NoDotAndDotDot);
    umount2(QFile::encodeName(dir.path()).constData(), MNT_DETACH);
    QCOMPARE(left, QStringList());
}

void TestCardFaults::cardWithoutDescriptors()
{
    NEEDS_FUSE()
    if (!OwnProcess::isThis()) {
        // The other one has its own.
        m_diskService.reset();
    }
    IN_A_PROCESS_OF_ITS_OWN()
    // A first connection to a bus cannot be had without descriptors: QtDBus ends the process.
    m_formatter->mount();
    TRY_COMPARE(m_statuses.size(), 4); // with those of the probe
    FailingCard card(device, files);
    {
        const UsedUpDescriptors none;
        startEmptying();
        TRY_COMPARE(m_statuses, (Statuses{Formatter::Mounting, Formatter::Error}));
        QCOMPARE(card.filesLeft(), files);
    }
    startEmptying();
    TRY_COMPARE(m_statuses, emptied);
    QCOMPARE(card.filesLeft(), 0);
    {
        // Now there is a thread that is waiting for work.
        const UsedUpDescriptors none;
        startEmptying();
        TRY_COMPARE(m_formatter->status(), Formatter::Error);
    }
}

void TestCardFaults::helperThatWritesAHundredMegabytes()
{
    constexpr int size = 100000000;
    installHelper("head -c 100000000 /dev/zero | tr '\\0' x\n");
    m_formatter->setDevicePath(QStringLiteral("/dev/testcard2"));
    TRY_COMPARE(m_formatter->status(), Formatter::Probing);
    TRY_COMPARE(m_formatter->status(), Formatter::Idle);
    // Whatever it writes is the type.
    QCOMPARE(m_formatter->filesystemType().size(), size);
    // The output of a helper that formats is not read at all.
    m_statuses.clear();
    m_formatter->format(QStringLiteral("vfat"));
    TRY_COMPARE(m_statuses,
                (Statuses{Formatter::Unmounting, Formatter::Formatting, Formatter::Mounting,
                          Formatter::Idle}));
    QCOMPARE(m_formatter->filesystemType().size(), size);

    installHelper("echo vfat\n");
    m_formatter->setDevicePath(device);
    TRY_COMPARE(m_formatter->filesystemType(), QStringLiteral("vfat"));
}

void TestCardFaults::helperThatClosesItsOutputFirst()
{
    // The probe ends when the helper exits, not when it closes its output.
    installHelper("echo vfat\nexec >&-\nsleep 0.5\nexit 0\n");
    m_formatter->setDevicePath(QStringLiteral("/dev/testcard2"));
    TRY_COMPARE(m_formatter->status(), Formatter::Probing);
    TRY_COMPARE(m_formatter->status(), Formatter::Idle);
    QCOMPARE(m_formatter->filesystemType(), QStringLiteral("vfat"));
    installHelper("exec >&-\nsleep 0.5\nexit 1\n");
    m_formatter->setDevicePath(device);
    TRY_COMPARE(m_formatter->status(), Formatter::Error);
    QCOMPARE(m_formatter->filesystemType(), QString());
}

void TestCardFaults::helperThatNeverEnds()
{
    installHelper("echo $$ >/run/helper\nexec sleep 600\n");
    m_formatter->setDevicePath(QStringLiteral("/dev/testcard2"));
    QFile file(QStringLiteral("/run/helper"));
    TRY(file.size() > 0);
    letEverythingArrive();
    QCOMPARE(m_formatter->status(), Formatter::Probing);
    // Somebody ends it.
    QVERIFY(file.open(QIODevice::ReadOnly));
    const int pid = file.readAll().trimmed().toInt();
    QVERIFY(pid > 1);
    QCOMPARE(kill(pid, SIGKILL), 0);
    TRY_COMPARE(m_formatter->status(), Formatter::Error);
    installHelper("echo vfat\n");
    m_formatter->setDevicePath(device);
    TRY_COMPARE(m_formatter->filesystemType(), QStringLiteral("vfat"));
    TRY_COMPARE(m_formatter->status(), Formatter::Idle);
}

QTEST_GUILESS_MAIN(TestCardFaults)

#include "tst_cardfaults.moc"
