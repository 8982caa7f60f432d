// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "files.h"
#include "files/directorywatcher.h"
#include "loggedtest.h"

#include <QTemporaryDir>
#include <QtTest>

#include <functional>
#include <utility>

#include <dlfcn.h>

namespace {

// Called once, before the next watch is made.
std::function<void()> beforeNextWatch;

} // namespace

// Takes the place of the C library's own, in which there is no time to do anything in between.
extern "C" Q_DECL_EXPORT int inotify_add_watch(int inotify, const char *path, uint32_t events)
{
    using Function = int (*)(int, const char *, uint32_t);
    static const auto original = reinterpret_cast<Function>(dlsym(RTLD_NEXT, "inotify_add_watch"));
    if (const auto function = std::exchange(beforeNextWatch, nullptr)) {
        function();
    }
    return original(inotify, path, events);
}

class TestDirectoryWatcher : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void reportsEntries();
    void reportsDirectoryMadeLater();
    void reportsDirectoryMadeAndFilledAtOnce();
    void reportsDirectoryWhosePathIsMadeMeanwhile_data();
    void reportsDirectoryWhosePathIsMadeMeanwhile();
    void reportsDirectoryMadeAgain();
    void reportsDirectoryReplacedAtOnce();
    void reportsDirectoryRenamedAway();
    void ignoresItsParents();
    void losesNothingToItsParent();

private:
    QString path(const char *name) const { return m_root->filePath(QString::fromLatin1(name)); }

    std::unique_ptr<QTemporaryDir> m_root;
    QString m_directory;
};

void TestDirectoryWatcher::init()
{
    LoggedTest::init();
    m_root = std::make_unique<QTemporaryDir>();
    m_directory = path("a/b/c");
}

void TestDirectoryWatcher::cleanup()
{
    m_root.reset();
    LoggedTest::cleanup();
}

void TestDirectoryWatcher::reportsEntries()
{
    Files::makeFolder(m_directory);
    const DirectoryWatcher watcher(m_directory);
    QSignalSpy spy(&watcher, &DirectoryWatcher::directoryChanged);
    Files::write(m_directory + QStringLiteral("/file"), "x");
    QVERIFY(spy.wait());
    QCOMPARE(spy.first(), QVariantList{m_directory});

    spy.clear();
    Files::remove(m_directory + QStringLiteral("/file"));
    QVERIFY(spy.wait());
}

void TestDirectoryWatcher::reportsDirectoryMadeLater()
{
    const DirectoryWatcher watcher(m_directory);
    QSignalSpy spy(&watcher, &DirectoryWatcher::directoryChanged);
    // One level at a time, each seen before the next is made, and all at once below.
    Files::makeFolder(path("a"));
    QVERIFY(!spy.wait(100));
    Files::makeFolder(path("a/b"));
    QVERIFY(!spy.wait(100));
    Files::makeFolder(m_directory);
    QVERIFY(spy.wait());

    spy.clear();
    Files::write(m_directory + QStringLiteral("/file"), "x");
    QVERIFY(spy.wait());
}

void TestDirectoryWatcher::reportsDirectoryMadeAndFilledAtOnce()
{
    const DirectoryWatcher watcher(m_directory);
    QSignalSpy spy(&watcher, &DirectoryWatcher::directoryChanged);
    Files::write(m_directory + QStringLiteral("/file"), "x");
    QVERIFY(spy.wait());

    spy.clear();
    Files::write(m_directory + QStringLiteral("/another"), "x");
    QVERIFY(spy.wait());
}

void TestDirectoryWatcher::reportsDirectoryWhosePathIsMadeMeanwhile_data()
{
    QTest::addColumn<QString>("made");
    QTest::newRow("first folder") << QStringLiteral("a");
    QTest::newRow("parent") << QStringLiteral("a/b");
    QTest::newRow("directory") << QStringLiteral("a/b/c");
}

void TestDirectoryWatcher::reportsDirectoryWhosePathIsMadeMeanwhile()
{
    QFETCH(QString, made);
    // Between looking for the nearest folder that there is, and watching that.
    beforeNextWatch = [this, &made] { Files::makeFolder(m_root->filePath(made)); };
    const DirectoryWatcher watcher(m_directory);
    QVERIFY(!beforeNextWatch);
    QSignalSpy spy(&watcher, &DirectoryWatcher::directoryChanged);
    Files::write(m_directory + QStringLiteral("/file"), "x");
    QVERIFY(spy.wait());
}

void TestDirectoryWatcher::reportsDirectoryMadeAgain()
{
    Files::makeFolder(m_directory);
    const DirectoryWatcher watcher(m_directory);
    QSignalSpy spy(&watcher, &DirectoryWatcher::directoryChanged);
    Files::remove(path("a"));
    QVERIFY(spy.wait());

    spy.clear();
    Files::makeFolder(m_directory);
    QVERIFY(spy.wait());

    spy.clear();
    Files::write(m_directory + QStringLiteral("/file"), "x");
    QVERIFY(spy.wait());
}

void TestDirectoryWatcher::reportsDirectoryReplacedAtOnce()
{
    Files::makeFolder(m_directory);
    const DirectoryWatcher watcher(m_directory);
    QSignalSpy spy(&watcher, &DirectoryWatcher::directoryChanged);
    // Nobody sees the moment without the directory.
    Files::remove(m_directory);
    Files::makeFolder(m_directory);
    QVERIFY(spy.wait());

    spy.clear();
    Files::write(m_directory + QStringLiteral("/file"), "x");
    QVERIFY(spy.wait());
}

void TestDirectoryWatcher::reportsDirectoryRenamedAway()
{
    Files::makeFolder(m_directory);
    const DirectoryWatcher watcher(m_directory);
    QSignalSpy spy(&watcher, &DirectoryWatcher::directoryChanged);
    QVERIFY(QDir().rename(m_directory, path("a/b/elsewhere")));
    QVERIFY(spy.wait());

    spy.clear();
    Files::write(path("a/b/elsewhere/file"), "x");
    QVERIFY(!spy.wait(100));
    Files::makeFolder(m_directory);
    QVERIFY(spy.wait());
}

void TestDirectoryWatcher::ignoresItsParents()
{
    Files::makeFolder(m_directory);
    const DirectoryWatcher present(m_directory);
    const DirectoryWatcher missing(path("a/b/missing"));
    QSignalSpy presentSpy(&present, &DirectoryWatcher::directoryChanged);
    QSignalSpy missingSpy(&missing, &DirectoryWatcher::directoryChanged);
    Files::write(path("a/b/file"), "x");
    QVERIFY(!missingSpy.wait(200));
    QCOMPARE(presentSpy.size(), 0);
}

void TestDirectoryWatcher::losesNothingToItsParent()
{
    // Both are reported in one turn of the event loop, in any order: several times, several orders.
    for (int i = 0; i < 20; ++i) {
        const QString directory = path("a/") + QString::number(i);
        Files::makeFolder(directory);
        const DirectoryWatcher watcher(directory);
        QSignalSpy spy(&watcher, &DirectoryWatcher::directoryChanged);
        Files::makeFolder(directory + QStringLiteral(" sibling"));
        Files::write(directory + QStringLiteral("/file"), "x");
        QVERIFY(spy.wait());
    }
}

QTEST_GUILESS_MAIN(TestDirectoryWatcher)

#include "tst_directorywatcher.moc"
