// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "eventswidgets/writewatcher.h"
#include "files.h"
#include "messagelog.h"

#include <QTemporaryDir>
#include <QtTest>

#include <memory>

#include <fcntl.h>
#include <sys/resource.h>
#include <unistd.h>

class TestWriteWatcher : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void tellsOfAFileThatWasWritten();
    void waitsUntilTheFileIsClosed();
    void tellsOnceOfManyFiles();
    void looksAreTold();
    void readingIsNoWrite();
    void followsTheNameNotTheDirectory();
    void missingDirectory();
    void withoutWatches();
    void withoutAStandardInput();

private:
    QString file(int number = 0) const
    {
        return m_directory + QStringLiteral("/file-%1").arg(number);
    }

    std::unique_ptr<MessageLog> m_log;
    std::unique_ptr<QTemporaryDir> m_root;
    QString m_directory;
};

namespace {

// In place, as an editor or a script does it.
void rewrite(const QString &path)
{
    QFile file(path);
    QVERIFY(file.open(QIODevice::WriteOnly));
    file.write("new");
}

} // namespace

void TestWriteWatcher::init()
{
    m_log = std::make_unique<MessageLog>();
    m_root = std::make_unique<QTemporaryDir>();
    m_directory = m_root->filePath(QStringLiteral("watched"));
    Files::write(file(), "old");
}

void TestWriteWatcher::cleanup()
{
    m_root.reset();
    QCOMPARE(m_log->takeReport(), QString());
    m_log.reset();
}

void TestWriteWatcher::tellsOfAFileThatWasWritten()
{
    WriteWatcher watcher;
    QSignalSpy spy(&watcher, &WriteWatcher::written);
    watcher.watch(m_directory);
    rewrite(file());
    QVERIFY(spy.wait());
    spy.clear();
    watcher.watch(m_directory);
    rewrite(file());
    QVERIFY(spy.wait());
    QCOMPARE(spy.size(), 1);
}

void TestWriteWatcher::waitsUntilTheFileIsClosed()
{
    WriteWatcher watcher;
    QSignalSpy spy(&watcher, &WriteWatcher::written);
    watcher.watch(m_directory);
    QFile open(file());
    QVERIFY(open.open(QIODevice::WriteOnly));
    open.write("half");
    open.flush();
    QVERIFY(!spy.wait(100));
    open.close();
    QVERIFY(spy.wait());
}

void TestWriteWatcher::tellsOnceOfManyFiles()
{
    WriteWatcher watcher;
    QSignalSpy spy(&watcher, &WriteWatcher::written);
    watcher.watch(m_directory);
    // More events than are read at once.
    for (int i = 0; i < 500; ++i) {
        rewrite(file(i));
    }
    QVERIFY(spy.wait());
    QVERIFY(!spy.wait(100));
    QCOMPARE(spy.size(), 1);
}

void TestWriteWatcher::looksAreTold()
{
    WriteWatcher watcher;
    QSignalSpy spy(&watcher, &WriteWatcher::written);
    watcher.watch(m_directory);
    rewrite(file());
    // Whoever looks now sees the file as it is.
    watcher.watch(m_directory);
    QVERIFY(!spy.wait(100));
}

void TestWriteWatcher::readingIsNoWrite()
{
    WriteWatcher watcher;
    QSignalSpy spy(&watcher, &WriteWatcher::written);
    watcher.watch(m_directory);
    QFile read(file());
    QVERIFY(read.open(QIODevice::ReadOnly));
    read.close();
    QVERIFY(!spy.wait(100));
}

void TestWriteWatcher::followsTheNameNotTheDirectory()
{
    WriteWatcher watcher;
    QSignalSpy spy(&watcher, &WriteWatcher::written);
    watcher.watch(m_directory);
    const QString elsewhere = m_root->filePath(QStringLiteral("elsewhere"));
    QVERIFY(QDir().rename(m_directory, elsewhere));
    Files::write(file(), "old");
    watcher.watch(m_directory);
    rewrite(elsewhere + QStringLiteral("/file-0"));
    QVERIFY(!spy.wait(100));
    rewrite(file());
    QVERIFY(spy.wait());
}

void TestWriteWatcher::missingDirectory()
{
    WriteWatcher watcher;
    QSignalSpy spy(&watcher, &WriteWatcher::written);
    Files::remove(m_directory);
    watcher.watch(m_directory);
    watcher.watch(m_directory);
    Files::write(file(), "old");
    QVERIFY(!spy.wait(100));
    watcher.watch(m_directory);
    rewrite(file());
    QVERIFY(spy.wait());
}

void TestWriteWatcher::withoutWatches()
{
    // As when the user's are used up: no more descriptors.
    rlimit limit = {};
    QCOMPARE(getrlimit(RLIMIT_NOFILE, &limit), 0);
    const rlimit none = {0, limit.rlim_max};
    QCOMPARE(setrlimit(RLIMIT_NOFILE, &none), 0);
    WriteWatcher watcher;
    QCOMPARE(setrlimit(RLIMIT_NOFILE, &limit), 0);
    QSignalSpy spy(&watcher, &WriteWatcher::written);
    watcher.watch(m_directory);
    rewrite(file());
    QVERIFY(!spy.wait(100));
}

void TestWriteWatcher::withoutAStandardInput()
{
    // The lowest descriptor is as good as any other.
    const int input = dup(STDIN_FILENO);
    close(STDIN_FILENO);
    auto watcher = std::make_unique<WriteWatcher>();
    QVERIFY(fcntl(STDIN_FILENO, F_GETFD) != -1);
    QSignalSpy spy(watcher.get(), &WriteWatcher::written);
    watcher->watch(m_directory);
    rewrite(file());
    QVERIFY(spy.wait());
    watcher.reset();
    QCOMPARE(fcntl(STDIN_FILENO, F_GETFD), -1);
    dup2(input, STDIN_FILENO);
    close(input);
}

QTEST_GUILESS_MAIN(TestWriteWatcher)

#include "tst_writewatcher.moc"
