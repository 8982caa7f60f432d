// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The formatter with a card and with a helper program that fail.

#include "failingcard.h"
#include "files.h"
#include "formattertest.h"
#include "simulator/serviceprocess.h"
#include "texts.h"

#include <QDir>
#include <QThreadPool>
#include <QtTest>

#include <cerrno>
#include <csignal>

#include <sys/mount.h>

using Fault = FailingCard::Fault;
Q_DECLARE_METATYPE(Fault)

class TestCardFaults : public FormatterTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void cardThatFails_data();
    void cardThatFails();
    void cardGoneWhileItIsEmptied();
    void cardDetachedWhileItIsEmptied();
    void cardThatHangs();
    void goesWhileTheCardHangs();
    void fullCard();

    void helperThatWritesAHundredMegabytes();
    void helperThatClosesItsOutputFirst();
    void helperThatReportsAtLength();
    void helperThatNeverEnds();

private:
    // Starts to empty a card, which blocks the removal of its first file.
    bool startEmptying(FailingCard *card);
    bool startProbing(const QString &path, const QByteArray &helper);

    std::unique_ptr<ServiceProcess> m_diskService;
};

namespace {

constexpr int files = 300;

// The signals of removeAllFiles() when it succeeds and when it fails.
constexpr char emptied[] = "not busy, Mounting, busy, RemovingFiles, Idle, not busy";
constexpr char failed[] = "not busy, Mounting, busy, RemovingFiles, Error, not busy";

const QString name = "testcard1"_s;
const QString device = "/dev/testcard1"_s;
const QString otherDevice = "/dev/testcard2"_s;
const QString vfat = "vfat"_s;

#define NEEDS_FUSE()                                                                               \
    if (!FailingCard::whyNot().isEmpty()) {                                                        \
        QSKIP(qPrintable(FailingCard::whyNot()));                                                  \
    }

void installHelper(const QByteArray &script)
{
    const QString path = "/usr/libexec/sdcardhelper"_s;
    Files::write(path, "#!/bin/sh\n" + script);
    if (!QFile::setPermissions(path, QFile::ReadOwner | QFile::ExeOwner)) {
        qFatal("cannot make the helper executable");
    }
}

} // namespace

void TestCardFaults::init()
{
    FormatterTest::init();
    installHelper("echo ext4\n");
    m_diskService =
        std::make_unique<ServiceProcess>("system", "org.freedesktop.UDisks2"_s, "replies");
    makeFormatter();
    setCard(name, device);
    QCOMPARE(m_formatter->filesystemType(), "ext4"_s);
}

void TestCardFaults::cleanup()
{
    m_formatter.reset();
    m_diskService.reset();
    QVERIFY(QThreadPool::globalInstance()->waitForDone(patience));
    FormatterTest::cleanup();
}

bool TestCardFaults::startEmptying(FailingCard *card)
{
    card->setFault(Fault::Waits);
    m_formatter->removeAllFiles();
    return becomesTrue([card] { return card->waiting() == 1; });
}

bool TestCardFaults::startProbing(const QString &path, const QByteArray &helper)
{
    installHelper(helper);
    forgetEvents()->setDevicePath(path);
    return m_formatter->status() == Formatter::Probing;
}

void TestCardFaults::cardThatFails_data()
{
    QTest::addColumn<Fault>("fault");
    QTest::addColumn<QByteArray>("expected");
    // Such a card counts as empty.
    QTest::newRow("cannot be listed") << Fault::Unreadable << QByteArray(emptied);
    QTest::newRow("removes nothing") << Fault::Stuck << QByteArray(failed);
}

void TestCardFaults::cardThatFails()
{
    NEEDS_FUSE()
    QFETCH(Fault, fault);
    QFETCH(QByteArray, expected);
    FailingCard card(device, files);
    card.setFault(fault);
    m_formatter->removeAllFiles();
    TRY_EVENTS(expected);
    QCOMPARE(card.filesLeft(), files);
    QCOMPARE(takeLog(),
             fault == Fault::Unreadable
                 ? QByteArray()
                 : notEmptied("/dev/testcard1",
                              "on \"" + card.directory().toUtf8()
                                  + "\" because \"file0: Input/output error, "
                                    "and 299 more\""));

    card.setFault(Fault::None);
    forgetEvents()->removeAllFiles();
    TRY_EVENTS(emptied);
    QCOMPARE(card.filesLeft(), 0);
}

void TestCardFaults::cardGoneWhileItIsEmptied()
{
    NEEDS_FUSE()
    {
        FailingCard card(device, files);
        QVERIFY(startEmptying(&card));
        card.setFault(Fault::Gone);
        TRY_EVENTS(failed);
        QCOMPARE(card.filesLeft(), files);
        QVERIFY(takeLog().endsWith("and 299 more\""));
    }
    const FailingCard another(device, files);
    forgetEvents()->removeAllFiles();
    TRY_EVENTS(emptied);
    QCOMPARE(another.filesLeft(), 0);
}

void TestCardFaults::cardDetachedWhileItIsEmptied()
{
    NEEDS_FUSE()
    FailingCard card(device, files);
    QVERIFY(startEmptying(&card));
    // The directory under the mount point is not part of the card.
    card.detach();
    const QString below = card.directory() + "/file0"_s;
    Files::write(below, "not of the card");
    card.setFault(Fault::None);
    TRY_EVENTS(emptied);
    QCOMPARE(card.filesLeft(), 0);
    QVERIFY(QFile::exists(below));

    // And no card is mounted any more.
    forgetEvents()->removeAllFiles();
    TRY_EVENTS(failed);
    QCOMPARE(takeLog(), notEmptied("/dev/testcard1", "because it is not mounted"));
    QVERIFY(QFile::exists(below));
}

void TestCardFaults::cardThatHangs()
{
    NEEDS_FUSE()
    FailingCard card(device, files);
    QVERIFY(startEmptying(&card));
    QTest::qWait(100);
    TRY_EVENTS("not busy, Mounting, busy, RemovingFiles");
    QVERIFY(m_formatter->busy());
    card.setFault(Fault::None);
    TRY_EVENTS(emptied);
    QCOMPARE(card.filesLeft(), 0);
}

void TestCardFaults::goesWhileTheCardHangs()
{
    NEEDS_FUSE()
    FailingCard card(device, files);
    QVERIFY(startEmptying(&card));
    m_formatter.reset();
    QTest::qWait(100);
    // The removal continues all the same.
    card.setFault(Fault::None);
    TRY_COMPARE(card.filesLeft(), 0);
}

void TestCardFaults::fullCard()
{
    const QTemporaryDir dir;
    const QByteArray path = QFile::encodeName(dir.path());
    if (mount(QFile::encodeName(device).constData(), path.constData(), "tmpfs", 0,
              "size=64k,nr_inodes=10")
        != 0) {
        QCOMPARE(errno, EPERM);
        QSKIP("this system forbids mounts");
    }
    int written = 0;
    for (int i = 0; i < 20; ++i) {
        QFile file(dir.filePath(QString::number(i)));
        if (file.open(QIODevice::WriteOnly | QIODevice::Unbuffered)
            && file.write(QByteArray(10000, 'x')) == 10000) {
            ++written;
        }
    }
    QVERIFY(written > 0 && written < 20);
    m_formatter->removeAllFiles();
    TRY_EVENTS(emptied);
    const QStringList left = QDir(dir.path()).entryList(QDir::AllEntries | QDir::NoDotAndDotDot);
    umount2(path.constData(), MNT_DETACH);
    QCOMPARE(left, QStringList());
}

void TestCardFaults::helperThatWritesAHundredMegabytes()
{
    QVERIFY(startProbing(otherDevice, "head -c 100000000 /dev/zero | tr '\\0' x\n"));
    TRY_COMPARE(m_formatter->status(), Formatter::Idle);
    // The whole output becomes the file system type.
    QCOMPARE(m_formatter->filesystemType().size(), 100000000);
    QVERIFY(startProbing(device, "echo vfat\n"));
    TRY_COMPARE(m_formatter->filesystemType(), vfat);
}

void TestCardFaults::helperThatClosesItsOutputFirst()
{
    // The probe ends when the helper exits, not when it closes its output.
    QVERIFY(startProbing(otherDevice, "echo vfat\nexec >&-\nsleep 0.5\nexit 0\n"));
    TRY_COMPARE(m_formatter->status(), Formatter::Idle);
    QCOMPARE(m_formatter->filesystemType(), vfat);
    QVERIFY(startProbing(device, "exec >&-\nsleep 0.5\nexit 1\n"));
    TRY_COMPARE(m_formatter->status(), Formatter::Error);
    QCOMPARE(m_formatter->filesystemType(), QString());
    QCOMPARE(takeLog(), helperEnded("probe", "testcard1", "exited with 1 and the error \"\""));
}

void TestCardFaults::helperThatReportsAtLength()
{
    // A warning has only the front of the first line.
    QVERIFY(startProbing(otherDevice, "head -c 10000000 /dev/zero | tr '\\0' x >&2\nexit 3\n"));
    TRY_COMPARE(m_formatter->status(), Formatter::Error);
    QCOMPARE(takeLog(),
             helperEnded("probe", "testcard2",
                         "exited with 3 and the error \"" + QByteArray(200, 'x') + '"'));
}

void TestCardFaults::helperThatNeverEnds()
{
    QVERIFY(startProbing(otherDevice, "echo $$ >/run/helper\nexec sleep 600\n"));
    QFile file("/run/helper"_s);
    TRY(file.size() > 0);
    QTest::qWait(100);
    QCOMPARE(m_formatter->status(), Formatter::Probing);
    // Another program kills the helper.
    QVERIFY(file.open(QIODevice::ReadOnly));
    const int pid = file.readAll().trimmed().toInt();
    QVERIFY(pid > 1);
    QCOMPARE(kill(pid, SIGKILL), 0);
    TRY_COMPARE(m_formatter->status(), Formatter::Error);
    QCOMPARE(takeLog(),
             helperEnded("probe", "testcard2", "was ended by signal 9 with the error \"\""));
    QVERIFY(startProbing(device, "echo vfat\n"));
    TRY_EVENTS("path /dev/testcard1, Probing, busy, type vfat, Idle, not busy");
}

QTEST_GUILESS_MAIN(TestCardFaults)

#include "tst_cardfaults.moc"
