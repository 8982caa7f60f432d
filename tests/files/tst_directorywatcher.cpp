// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "files.h"
#include "files/directorywatcher.h"
#include "loggedtest.h"
#include "ownprocess.h"

#include <QTemporaryDir>
#include <QtTest>

#include <atomic>
#include <functional>
#include <memory>
#include <random>
#include <thread>
#include <utility>
#include <vector>

#include <dlfcn.h>
#include <fcntl.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

namespace {

const QString filter = QStringLiteral("*.conf");

// Called once, before the watch of a path that ends like this.
std::function<void()> beforeWatch;
QByteArray beforeWatchOf;

// In place, as an editor or a script does it.
void rewrite(const QString &path)
{
    QFile file(path);
    QVERIFY(file.open(QIODevice::WriteOnly));
    file.write("new");
}

QString contentOf(const QString &path)
{
    QFile file(path);
    return file.open(QIODevice::ReadOnly) ? QString::fromLatin1(file.readAll()) : QString();
}

// The inotify instances of this process.
QStringList instances()
{
    QStringList found;
    const QDir descriptors(QStringLiteral("/proc/self/fd"));
    const QStringList names = descriptors.entryList(QDir::Files | QDir::System);
    for (const QString &name : names) {
        if (QFileInfo(descriptors.filePath(name))
                .symLinkTarget()
                .contains(QLatin1String("inotify"))) {
            found.append(name);
        }
    }
    return found;
}

int watches()
{
    int count = 0;
    const QStringList found = instances();
    for (const QString &name : found) {
        count +=
            contentOf(QStringLiteral("/proc/self/fdinfo/") + name).count(QStringLiteral("wd:"));
    }
    return count;
}

// What a model does: reads the matching files whenever the watcher says so.
class Reader
{
public:
    explicit Reader(const QString &directory) : m_directory(directory), m_watcher(directory, filter)
    {
        QObject::connect(&m_watcher, &DirectoryWatcher::changed, [this] { seen = read(); });
    }
    QMap<QString, QString> read() const
    {
        QMap<QString, QString> files;
        const QStringList names = m_directory.entryList({filter});
        for (const QString &name : names) {
            files.insert(name, contentOf(m_directory.filePath(name)));
        }
        return files;
    }
    QMap<QString, QString> seen;

private:
    QDir m_directory;
    DirectoryWatcher m_watcher;
};

} // namespace

// Takes the place of the C library's own, in which there is no time to do anything in between.
extern "C" Q_DECL_EXPORT int inotify_add_watch(int inotify, const char *path, uint32_t events)
{
    using Function = int (*)(int, const char *, uint32_t);
    static const auto original = reinterpret_cast<Function>(dlsym(RTLD_NEXT, "inotify_add_watch"));
    if (beforeWatch && QByteArray(path).endsWith(beforeWatchOf)) {
        std::exchange(beforeWatch, nullptr)();
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
    void reportsPermissions();
    void reportsWrittenFileOnceItIsClosed();
    void reportsOnceForManyFiles();
    void reportsAfterLostEvents();
    void ignoresOtherNames();
    void ignoresReading();
    void reportsDirectoryMadeLater();
    void reportsDirectoryMadeAndFilledAtOnce();
    void reportsDirectoryMadeMeanwhile_data();
    void reportsDirectoryMadeMeanwhile();
    void reportsDirectoryMadeAgain();
    void reportsDirectoryReplacedAtOnce();
    void reportsDirectoryRenamedAway();
    void reportsReplacedParent_data();
    void reportsReplacedParent();
    void reportsMovedTargetOfALink();
    void ignoresItsParents();
    void losesNothingToItsParent();
    void losesNothingToAnotherProcess();

    void watchersShareOneInstance();
    void watchersHaveFiltersOfTheirOwn();
    void aReceiverMayDestroyWatchers();
    void takesTheLowestDescriptor();
    void pollsWithoutAnInstance();

private:
    QString path(const char *name) const { return m_root->filePath(QString::fromLatin1(name)); }
    QString file(const char *name = "file.conf") const
    {
        return m_directory + QLatin1Char('/') + QLatin1String(name);
    }

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
    beforeWatch = nullptr;
    m_root.reset();
    LoggedTest::cleanup();
}

void TestDirectoryWatcher::reportsEntries()
{
    Files::makeDirectory(m_directory);
    const DirectoryWatcher watcher(m_directory, filter);
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    QFile made(file());
    QVERIFY(made.open(QIODevice::WriteOnly));
    QVERIFY(spy.wait());

    QVERIFY(QFile::rename(file(), file("other.conf")));
    QVERIFY(spy.wait());
    QVERIFY(QFile::rename(file("other.conf"), path("a/file")));
    QVERIFY(spy.wait());
    QVERIFY(QFile::rename(path("a/file"), file("FILE.CONF")));
    QVERIFY(spy.wait());
    Files::remove(file("FILE.CONF"));
    QVERIFY(spy.wait());
    Files::makeLink(path("a"), file());
    QVERIFY(spy.wait());
}

void TestDirectoryWatcher::reportsPermissions()
{
    Files::write(file(), "x");
    const DirectoryWatcher watcher(m_directory, filter);
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    QVERIFY(QFile::setPermissions(file(), QFile::ReadOwner));
    QVERIFY(spy.wait());
    QVERIFY(QFile::setPermissions(m_directory, QFile::ReadOwner | QFile::ExeOwner));
    QVERIFY(spy.wait());
    QVERIFY(
        QFile::setPermissions(m_directory, QFile::ReadOwner | QFile::WriteOwner | QFile::ExeOwner));
    QVERIFY(spy.wait());
}

void TestDirectoryWatcher::reportsWrittenFileOnceItIsClosed()
{
    Files::write(file(), "old");
    const DirectoryWatcher watcher(m_directory, filter);
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    QFile open(file());
    QVERIFY(open.open(QIODevice::WriteOnly));
    open.write("half");
    open.flush();
    QVERIFY(!spy.wait(100));
    open.close();
    QVERIFY(spy.wait());
    QCOMPARE(spy.size(), 1);
}

void TestDirectoryWatcher::reportsOnceForManyFiles()
{
    Files::makeDirectory(m_directory);
    const DirectoryWatcher watcher(m_directory, filter);
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    for (int i = 0; i < 500; ++i) {
        rewrite(m_directory + QStringLiteral("/%1.conf").arg(i));
    }
    QVERIFY(spy.wait());
    QVERIFY(!spy.wait(100));
    QCOMPARE(spy.size(), 1);
}

void TestDirectoryWatcher::reportsAfterLostEvents()
{
    QFile limit(QStringLiteral("/proc/sys/fs/inotify/max_queued_events"));
    QVERIFY(limit.open(QIODevice::ReadOnly));
    const int events = limit.readAll().trimmed().toInt();
    Files::makeDirectory(m_directory);
    const DirectoryWatcher watcher(m_directory, filter);
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    // The kernel keeps the first events and drops the last, those of the file and the directory. It
    // merges events that are the same as the one before.
    QFile one(file("one"));
    QFile other(file("other"));
    QVERIFY(one.open(QIODevice::WriteOnly) && other.open(QIODevice::WriteOnly));
    for (int i = 0; i < events; i += 2) {
        QVERIFY(fchmod(one.handle(), 0600) == 0 && fchmod(other.handle(), 0600) == 0);
    }
    Files::remove(path("a"));
    Files::write(file(), "x");
    QVERIFY(spy.wait());
    QVERIFY(!spy.wait(100));
    rewrite(file());
    QVERIFY(spy.wait());
}

void TestDirectoryWatcher::ignoresOtherNames()
{
    Files::write(file("other.txt"), "old");
    const DirectoryWatcher watcher(m_directory, filter);
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    rewrite(file("other.txt"));
    Files::write(file("another.txt"), "x");
    Files::write(file("file.conf.new"), "x");
    QVERIFY(QFile::setPermissions(file("other.txt"), QFile::ReadOwner));
    Files::remove(file("other.txt"));
    Files::makeDirectory(file("directory"));
    QVERIFY(!spy.wait(200));
    rewrite(file());
    QVERIFY(spy.wait());
}

void TestDirectoryWatcher::ignoresReading()
{
    Files::write(file(), "x");
    const DirectoryWatcher watcher(m_directory, filter);
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    QCOMPARE(contentOf(file()), QStringLiteral("x"));
    QCOMPARE(QDir(m_directory).entryList(QDir::Files).size(), 1);
    QVERIFY(!spy.wait(100));
}

void TestDirectoryWatcher::reportsDirectoryMadeLater()
{
    const DirectoryWatcher watcher(m_directory, filter);
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    // Creates one level at a time. The watcher has time to notice each one before the next is
    // created.
    Files::makeDirectory(path("a"));
    QVERIFY(!spy.wait(100));
    Files::makeDirectory(path("a/b"));
    QVERIFY(!spy.wait(100));
    Files::makeDirectory(m_directory);
    QVERIFY(spy.wait());

    rewrite(file());
    QVERIFY(spy.wait());
}

void TestDirectoryWatcher::reportsDirectoryMadeAndFilledAtOnce()
{
    const DirectoryWatcher watcher(m_directory, filter);
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    Files::write(file(), "x");
    QVERIFY(spy.wait());

    Files::write(file("another.conf"), "x");
    QVERIFY(spy.wait());
}

void TestDirectoryWatcher::reportsDirectoryMadeMeanwhile_data()
{
    QTest::addColumn<QString>("made");
    QTest::addColumn<QByteArray>("before");
    const QStringList paths = {QStringLiteral("a"), QStringLiteral("a/b"), QStringLiteral("a/b/c")};
    for (const QString &made : paths) {
        for (const char *before : {"/a/", "/a/b/", "/a/b/c/"}) {
            QTest::addRow("%s before the watch of %s", qPrintable(made), before)
                << made << QByteArray(before);
        }
    }
}

void TestDirectoryWatcher::reportsDirectoryMadeMeanwhile()
{
    QFETCH(QString, made);
    QFETCH(QByteArray, before);
    beforeWatch = [this, &made] { Files::makeDirectory(m_root->filePath(made)); };
    beforeWatchOf = before;
    const DirectoryWatcher watcher(m_directory, filter);
    QVERIFY(!beforeWatch);
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    Files::write(file(), "x");
    QVERIFY(spy.wait());
}

void TestDirectoryWatcher::reportsDirectoryMadeAgain()
{
    Files::makeDirectory(m_directory);
    const DirectoryWatcher watcher(m_directory, filter);
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    Files::remove(path("a"));
    QVERIFY(spy.wait());

    Files::makeDirectory(m_directory);
    QVERIFY(spy.wait());

    rewrite(file());
    QVERIFY(spy.wait());
}

void TestDirectoryWatcher::reportsDirectoryReplacedAtOnce()
{
    Files::makeDirectory(m_directory);
    const DirectoryWatcher watcher(m_directory, filter);
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    // Nobody sees the moment without the directory.
    Files::remove(m_directory);
    Files::makeDirectory(m_directory);
    QVERIFY(spy.wait());

    rewrite(file());
    QVERIFY(spy.wait());
}

void TestDirectoryWatcher::reportsDirectoryRenamedAway()
{
    Files::makeDirectory(m_directory);
    const DirectoryWatcher watcher(m_directory, filter);
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    QVERIFY(QDir().rename(m_directory, path("a/b/elsewhere")));
    QVERIFY(spy.wait());

    rewrite(path("a/b/elsewhere/file.conf"));
    QVERIFY(!spy.wait(100));
    Files::makeDirectory(m_directory);
    QVERIFY(spy.wait());
}

void TestDirectoryWatcher::reportsReplacedParent_data()
{
    QTest::addColumn<QString>("parent");
    QTest::newRow("parent") << QStringLiteral("a/b");
    QTest::newRow("grandparent") << QStringLiteral("a");
}

void TestDirectoryWatcher::reportsReplacedParent()
{
    QFETCH(QString, parent);
    Files::makeDirectory(m_directory);
    const QString replaced = m_root->filePath(parent);
    const QString rest = m_directory.mid(replaced.size());
    const QString old = path("old");
    const DirectoryWatcher watcher(m_directory, filter);
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    // With another that has the directory as well, in one go.
    Files::write(path("new") + rest + QStringLiteral("/file.conf"), "x");
    QVERIFY(QDir().rename(replaced, old));
    QVERIFY(QDir().rename(path("new"), replaced));
    QVERIFY(spy.wait());
    rewrite(old + rest + QStringLiteral("/file.conf"));
    QVERIFY(!spy.wait(100));
    rewrite(file());
    QVERIFY(spy.wait());

    // With one that does not have it, and back.
    Files::makeDirectory(path("new"));
    QVERIFY(QDir().rename(replaced, path("newer")));
    QVERIFY(QDir().rename(path("new"), replaced));
    QVERIFY(spy.wait());
    QVERIFY(QDir().rename(replaced, path("new")));
    QVERIFY(QDir().rename(path("newer"), replaced));
    QVERIFY(spy.wait());
    rewrite(file());
    QVERIFY(spy.wait());
}

void TestDirectoryWatcher::reportsMovedTargetOfALink()
{
    Files::makeDirectory(path("target/c"));
    Files::makeDirectory(path("a"));
    Files::makeLink(path("target"), path("a/b"));
    const DirectoryWatcher watcher(m_directory, filter);
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    rewrite(path("target/c/file.conf"));
    QVERIFY(spy.wait());
    // No name on the path of the directory changes.
    QVERIFY(QDir().rename(path("target"), path("elsewhere")));
    QVERIFY(spy.wait());
    Files::remove(path("a/b"));
    Files::makeLink(path("elsewhere"), path("a/b"));
    QVERIFY(spy.wait());
    rewrite(path("elsewhere/c/file.conf"));
    QVERIFY(spy.wait());
}

void TestDirectoryWatcher::ignoresItsParents()
{
    Files::makeDirectory(m_directory);
    const DirectoryWatcher present(m_directory, filter);
    const DirectoryWatcher missing(path("a/b/missing"), filter);
    QSignalSpy presentSpy(&present, &DirectoryWatcher::changed);
    QSignalSpy missingSpy(&missing, &DirectoryWatcher::changed);
    rewrite(path("a/b/file.conf"));
    QVERIFY(QFile::setPermissions(path("a/b"), QFile::ReadOwner | QFile::ExeOwner));
    QVERIFY(QDir().rename(path("a/b"), path("a/other")));
    QVERIFY(QDir().rename(path("a/other"), path("a/b")));
    QVERIFY(!missingSpy.wait(200));
    QCOMPARE(presentSpy.size(), 0);
}

void TestDirectoryWatcher::losesNothingToItsParent()
{
    Files::makeDirectory(m_directory);
    const DirectoryWatcher watcher(m_directory, filter);
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    Files::makeDirectory(path("a/b/sibling"));
    Files::write(file(), "x");
    QVERIFY(spy.wait());
    // While the watches are looked over because the parent has other permissions.
    for (const char *before : {"/a/", "/a/b/", "/a/b/c/"}) {
        beforeWatch = [this] { rewrite(file()); };
        beforeWatchOf = before;
        QVERIFY(QFile::setPermissions(path("a/b"), QFile::ReadOwner | QFile::ExeOwner));
        QVERIFY(spy.wait());
        QVERIFY(!beforeWatch);
    }
}

void TestDirectoryWatcher::losesNothingToAnotherProcess()
{
    Reader reader(m_directory);
    std::atomic<bool> done{false};
    std::thread writer([this, &done] {
        std::mt19937 random(20261121);
        const auto write = [this](int content) {
            QFile changed(file(content % 2 == 0 ? "even.conf" : "odd.conf"));
            if (changed.open(QIODevice::WriteOnly)) {
                changed.write(QByteArray::number(content));
            }
        };
        for (int step = 0; step < 1000; ++step) {
            switch (random() % 8) {
            case 0:
                QDir().rename(path("a"), path("x"));
                break;
            case 1:
                QDir().rename(path("x"), path("a"));
                break;
            case 2:
                QDir().rename(path("a/b/c"), path("y"));
                break;
            case 3:
                QDir(path("a")).removeRecursively();
                break;
            case 4:
                QFile::remove(file("even.conf"));
                break;
            case 5:
                QDir().mkpath(m_directory);
                break;
            default:
                write(step);
                break;
            }
        }
        QDir().mkpath(m_directory);
        write(1000);
        done = true;
    });
    while (!done) {
        QCoreApplication::processEvents();
    }
    writer.join();
    QCOMPARE(contentOf(file("even.conf")), QStringLiteral("1000"));
    QTRY_COMPARE(reader.seen, reader.read());
}

void TestDirectoryWatcher::watchersShareOneInstance()
{
    Files::makeDirectory(m_directory);
    std::vector<std::unique_ptr<DirectoryWatcher>> watchers;
    watchers.push_back(std::make_unique<DirectoryWatcher>(m_directory, filter));
    const QStringList used = instances();
    QCOMPARE(used.size(), 1);
    const int once = watches();
    for (int i = 0; i < 100; ++i) {
        watchers.push_back(std::make_unique<DirectoryWatcher>(m_directory, filter));
    }
    watchers.push_back(std::make_unique<DirectoryWatcher>(path("a/b"), filter));
    QCOMPARE(instances(), used);
    QCOMPARE(watches(), once);
    // A watch stays for as long as anybody needs it.
    watchers.erase(watchers.begin(), watchers.end() - 1);
    QCOMPARE(watches(), once - 1);
    QSignalSpy spy(watchers.front().get(), &DirectoryWatcher::changed);
    rewrite(path("a/b/file.conf"));
    QVERIFY(spy.wait());
    // A directory that is replaced leaves none behind.
    Files::remove(path("a/b"));
    Files::makeDirectory(path("a/b"));
    QVERIFY(spy.wait());
    QCOMPARE(watches(), once - 1);
    watchers.clear();
    QCOMPARE(watches(), 0);
    QCOMPARE(instances(), used);
}

void TestDirectoryWatcher::watchersHaveFiltersOfTheirOwn()
{
    Files::makeDirectory(m_directory);
    const DirectoryWatcher watcher(m_directory, filter);
    auto other = std::make_unique<DirectoryWatcher>(m_directory, QStringLiteral("*.json"));
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    QSignalSpy otherSpy(other.get(), &DirectoryWatcher::changed);
    rewrite(file("file.json"));
    QVERIFY(otherSpy.wait());
    QCOMPARE(spy.size(), 0);
    other.reset();
    rewrite(file());
    QVERIFY(spy.wait());
}

void TestDirectoryWatcher::aReceiverMayDestroyWatchers()
{
    Files::makeDirectory(m_directory);
    std::vector<std::unique_ptr<DirectoryWatcher>> watchers;
    int reports = 0;
    for (int i = 0; i < 3; ++i) {
        watchers.push_back(std::make_unique<DirectoryWatcher>(m_directory, filter));
        connect(watchers.back().get(), &DirectoryWatcher::changed, this, [&watchers, &reports] {
            ++reports;
            watchers.clear();
        });
    }
    rewrite(file());
    QTRY_COMPARE(reports, 1);
    QTest::qWait(50);
    QCOMPARE(reports, 1);
}

void TestDirectoryWatcher::takesTheLowestDescriptor()
{
    IN_A_PROCESS_OF_ITS_OWN()
    close(STDIN_FILENO);
    const DirectoryWatcher watcher(m_directory, filter);
    QCOMPARE(instances(), QStringList{QStringLiteral("0")});
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    Files::write(file(), "x");
    QVERIFY(spy.wait());
}

void TestDirectoryWatcher::pollsWithoutAnInstance()
{
#ifdef __SANITIZE_ADDRESS__
    QSKIP("the sanitizers need a descriptor to examine an object");
#endif
    IN_A_PROCESS_OF_ITS_OWN()
    rlimit limit = {};
    QCOMPARE(getrlimit(RLIMIT_NOFILE, &limit), 0);
    const rlimit none = {0, limit.rlim_max};
    QCOMPARE(setrlimit(RLIMIT_NOFILE, &none), 0);
    const DirectoryWatcher poller(m_directory, filter);
    QCOMPARE(setrlimit(RLIMIT_NOFILE, &limit), 0);
    QCOMPARE(instances(), QStringList());

    QSignalSpy spy(&poller, &DirectoryWatcher::changed);
    Files::makeDirectory(m_directory);
    QVERIFY(spy.wait());
    Files::write(file(), "x");
    QVERIFY(spy.wait());
    // Replaced, and followed all the same.
    Files::remove(m_directory);
    Files::makeDirectory(m_directory);
    QVERIFY(spy.wait());
    Files::write(file("another.conf"), "x");
    QVERIFY(spy.wait());

    // The next watcher gets an instance.
    const DirectoryWatcher watcher(m_directory, filter);
    QCOMPARE(instances().size(), 1);
    QSignalSpy watcherSpy(&watcher, &DirectoryWatcher::changed);
    rewrite(file());
    QVERIFY(watcherSpy.wait());
}

QTEST_GUILESS_MAIN(TestDirectoryWatcher)

#include "tst_directorywatcher.moc"
