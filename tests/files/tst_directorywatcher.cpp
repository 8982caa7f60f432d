// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "files.h"
#include "files/directorywatcher.h"
#include "loggedtest.h"
#include "ownprocess.h"
#include "patience.h"
#include "texts.h"
#include "usedupdescriptors.h"

#include <QProcess>
#include <QTemporaryDir>
#include <QtTest>

#include <atomic>
#include <cerrno>
#include <functional>
#include <memory>
#include <random>
#include <thread>
#include <utility>
#include <vector>

#include <dlfcn.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace {

const QString filter = "*.conf"_s;

// Why no watch can be added, if this is not 0.
int watchError = 0;

// Called once, before the watcher adds a watch for a path that ends with beforeWatchOf.
std::function<void()> beforeWatch;
QByteArray beforeWatchOf;

// In place, as an editor or a script does it.
void rewrite(const QString &path)
{
    QFile file(path);
    if (!file.open(QIODevice::WriteOnly) || file.write("new") < 0) {
        qFatal("cannot write %s", qPrintable(path));
    }
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
    const QDir descriptors("/proc/self/fd"_s);
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
        count += contentOf("/proc/self/fdinfo/"_s + name).count("wd:"_s);
    }
    return count;
}

// Like a model, reads the matching files whenever the watcher reports a change.
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

// Replaces the function of the C library, so that a test can act right before a watch is added, or
// make it fail.
extern "C" Q_DECL_EXPORT int inotify_add_watch(int inotify, const char *path, uint32_t events)
{
    using Function = int (*)(int, const char *, uint32_t);
    static const auto original = reinterpret_cast<Function>(dlsym(RTLD_NEXT, "inotify_add_watch"));
    if (beforeWatch && QByteArray(path).endsWith(beforeWatchOf)) {
        std::exchange(beforeWatch, nullptr)();
    }
    if (watchError != 0) {
        errno = watchError;
        return -1;
    }
    return original(inotify, path, events);
}

class TestDirectoryWatcher : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void reportsChanges_data();
    void reportsChanges();
    void reportsOnceForManyFiles();
    void reportsAfterLostEvents();
    void reportsDirectoryMadeMeanwhile();
    void losesNothingToItsParent();
    void losesNothingToAnotherProcess();

    void watchersShareOneInstance();
    void watchersHaveFiltersOfTheirOwn();
    void aReceiverMayDestroyWatchers();
    void takesTheLowestDescriptor();
    void pollsWithoutAnInstance();
    void pollsWithoutAWatch();

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

void TestDirectoryWatcher::reportsChanges_data()
{
    QTest::addColumn<QString>("directory");
    QTest::addColumn<QString>("before");
    QTest::addColumn<QStringList>("steps");
    // Shell commands: one that runs before the watch, and then steps. A step that begins with "+"
    // is reported once, one that begins with "-" is not.
    const auto row = [](const char *name, const char *directory, const char *before,
                        const QStringList &steps) {
        QTest::newRow(name) << directory << before << steps;
    };
    const QString rewrite = "+ echo new > a/b/c/file.conf"_s;
    row("entries", "a/b/c", "mkdir -p a/b/c",
        {"+ : > a/b/c/file.conf"_s, "+ mv a/b/c/file.conf a/b/c/other.conf"_s,
         "+ mv a/b/c/other.conf a/file"_s, "+ mv a/file a/b/c/FILE.CONF"_s,
         "+ rm a/b/c/FILE.CONF"_s, "+ ln -s a a/b/c/file.conf"_s});
    row("permissions", "a/b/c", "mkdir -p a/b/c; : > a/b/c/file.conf",
        {"+ chmod 400 a/b/c/file.conf"_s, "+ chmod 500 a/b/c"_s, "+ chmod 700 a/b/c"_s});
    row("other names", "a/b/c", "mkdir -p a/b/c; echo old > a/b/c/other.txt",
        {"- echo new > a/b/c/other.txt"_s, "+ chmod 400 a/b/c/other.txt"_s,
         "+ mv a/b/c/other.txt a/b/c/another.txt"_s, "+ rm a/b/c/another.txt"_s,
         "+ : > a/b/c/file.conf.new"_s, "- echo new > a/b/c/file.conf.new"_s,
         "+ mkdir a/b/c/below"_s, rewrite});
    row("reading", "a/b/c", "mkdir -p a/b/c; echo x > a/b/c/file.conf",
        {"- ls a/b/c; cat a/b/c/file.conf"_s});

    row("made one level at a time", "a/b/c", ":",
        {"- mkdir a"_s, "- mkdir a/b"_s, "+ mkdir a/b/c"_s, rewrite});
    row("made and filled at once", "a/b/c", ":",
        {"+ mkdir -p a/b/c; echo x > a/b/c/file.conf"_s, rewrite});
    row("made again", "a/b/c", "mkdir -p a/b/c", {"+ rm -r a"_s, "+ mkdir -p a/b/c"_s, rewrite});
    row("replaced at once", "a/b/c", "mkdir -p a/b/c", {"+ rm -r a/b/c; mkdir a/b/c"_s, rewrite});
    row("renamed away", "a/b/c", "mkdir -p a/b/c",
        {"+ mv a/b/c a/b/elsewhere"_s, "- echo new > a/b/elsewhere/file.conf"_s,
         "+ mkdir a/b/c"_s});
    row("renamed and back at once", "a/b/c", "mkdir -p a/b/c",
        {"- mv a/b/c a/b/elsewhere; mv a/b/elsewhere a/b/c"_s, rewrite});
    row("parent replaced", "a/b/c", "mkdir -p a/b/c new/c",
        {"+ mv a/b old; mv new a/b"_s, "- echo new > old/c/file.conf"_s, rewrite,
         // The parent is replaced by one without the directory, and then put back.
         "+ mkdir new; mv a/b newer; mv new a/b"_s, "+ mv a/b new; mv newer a/b"_s, rewrite});
    row("grandparent replaced", "a/b/c", "mkdir -p a/b/c new/b/c",
        {"+ mv a old; mv new a"_s, "- echo new > old/b/c/file.conf"_s, rewrite,
         "+ mkdir new; mv a newer; mv new a"_s, "+ mv a new; mv newer a"_s, rewrite});
    // No name on the path of the directory changes.
    row("target of a link moved", "a/b/c", "mkdir -p target/c a; ln -s ../target a/b",
        {"+ echo new > target/c/file.conf"_s, "+ mv target elsewhere"_s,
         "+ rm a/b; ln -s ../elsewhere a/b"_s, "+ echo new > elsewhere/c/file.conf"_s});

    row("target of a link made later", "a/b/c", "mkdir a; ln -s ../target a/b",
        {"+ mkdir -p target/c"_s, "+ echo new > target/c/file.conf"_s, "+ rm -r target"_s,
         "+ mkdir new target; mkdir target/c"_s, "+ echo new > target/c/file.conf"_s});
    row("target of a link replaced", "a/b/c",
        "mkdir -p a new/c other/target/c; ln -s $PWD/link a/b; ln -s other/target link",
        {"+ mv other/target old; mv new other/target"_s, "- echo new > old/c/file.conf"_s,
         "+ echo new > other/target/c/file.conf"_s, "+ mv other gone"_s, "+ mv gone other"_s,
         "+ echo new > other/target/c/file.conf"_s});
    row("directory is a link", "a/b/c", "mkdir -p a/b new; ln -s ../../target a/b/c",
        {"+ mkdir target"_s, rewrite, "+ mv target old; mv new target"_s, rewrite});
    row("link to itself", "a/b/c", "mkdir a; ln -s b a/b",
        {"- mkdir new; : > new/file.conf"_s, "+ rm a/b; mkdir -p a/b/c"_s, rewrite});

    const QStringList ofTheParents{
        "- echo x > a/b/file.conf; chmod 500 a/b; mv a/b a/other; mv a/other a/b"_s};
    row("parents", "a/b/c", "mkdir -p a/b/c", ofTheParents);
    row("parents of a missing directory", "a/b/missing", "mkdir -p a/b/c", ofTheParents);
}

void TestDirectoryWatcher::reportsChanges()
{
    QFETCH(QString, directory);
    QFETCH(QString, before);
    QFETCH(QStringList, steps);
    const auto run = [this](const QString &command) {
        return QProcess::execute("sh"_s, {"-c"_s, "cd %1; %2"_s.arg(m_root->path(), command)});
    };
    QCOMPARE(run(before), 0);
    const DirectoryWatcher watcher(m_root->filePath(directory), filter);
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    for (const QString &step : qAsConst(steps)) {
        QCOMPARE(run(step.mid(2)), 0);
        const bool isReported = step.startsWith(QLatin1Char('+'));
        QVERIFY2(spy.wait(isReported ? 5000 : 100) == isReported, qPrintable(step));
        QCoreApplication::processEvents();
        QVERIFY2(spy.size() == (isReported ? 1 : 0), qPrintable(step));
        spy.clear();
    }
}

void TestDirectoryWatcher::reportsOnceForManyFiles()
{
    Files::makeDirectory(m_directory);
    const DirectoryWatcher watcher(m_directory, filter);
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    for (int i = 0; i < 500; ++i) {
        rewrite(m_directory + "/%1.conf"_s.arg(i));
    }
    QVERIFY(spy.wait());
    QVERIFY(!spy.wait(100));
    QCOMPARE(spy.size(), 1);
}

void TestDirectoryWatcher::reportsAfterLostEvents()
{
    QFile limit("/proc/sys/fs/inotify/max_queued_events"_s);
    QVERIFY(limit.open(QIODevice::ReadOnly));
    const int events = limit.readAll().trimmed().toInt();
    for (const bool isReplaced : {false, true}) {
        Files::write(file("one"), {});
        Files::write(file("other"), {});
        const DirectoryWatcher watcher(m_directory, filter);
        QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
        // The kernel keeps the first events and drops the last, those of the file and the
        // directory. It merges repeated events. Rewriting these files is not a change.
        for (int i = 0; i < events; i += 2) {
            rewrite(file("one"));
            rewrite(file("other"));
        }
        if (isReplaced) {
            Files::remove(path("a"));
        }
        Files::write(file(), "x");
        QVERIFY(spy.wait());
        QVERIFY(!spy.wait(100));
        rewrite(file());
        QVERIFY(spy.wait());
    }
}

void TestDirectoryWatcher::reportsDirectoryMadeMeanwhile()
{
    for (const char *made : {"a", "a/b", "a/b/c"}) {
        for (const char *before : {"/a/", "/a/b/", "/a/b/c/"}) {
            beforeWatch = [this, made] { Files::makeDirectory(path(made)); };
            beforeWatchOf = before;
            const DirectoryWatcher watcher(m_directory, filter);
            QVERIFY(!beforeWatch);
            QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
            Files::write(file(), "x");
            QVERIFY2(spy.wait(),
                     qPrintable("%1 before the watch of %2"_s.arg(QLatin1String(made),
                                                                  QLatin1String(before))));
            Files::remove(path("a"));
        }
    }
}

void TestDirectoryWatcher::losesNothingToItsParent()
{
    Files::makeDirectory(m_directory);
    const DirectoryWatcher watcher(m_directory, filter);
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    Files::makeDirectory(path("a/b/sibling"));
    Files::write(file(), "x");
    QVERIFY(spy.wait());
    // The file changes while the watcher renews its watches after a change of permissions.
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
    QCOMPARE(contentOf(file("even.conf")), "1000"_s);
    TRY_COMPARE(reader.seen, reader.read());
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
    // A watch stays as long as a watcher needs it.
    watchers.erase(watchers.begin(), watchers.end() - 1);
    QCOMPARE(watches(), once - 1);
    QSignalSpy spy(watchers.front().get(), &DirectoryWatcher::changed);
    rewrite(path("a/b/file.conf"));
    QVERIFY(spy.wait());
    // Replacing a directory leaves no watch behind, whether it is removed or only moved away.
    Files::remove(path("a/b"));
    Files::makeDirectory(path("a/b"));
    QVERIFY(spy.wait());
    QCOMPARE(watches(), once - 1);
    QVERIFY(QDir().rename(path("a/b"), path("old")));
    Files::makeDirectory(path("a/b"));
    QVERIFY(spy.wait());
    QCOMPARE(watches(), once - 1);
    watchers.clear();
    QCOMPARE(watches(), 0);
    QCOMPARE(instances(), used);
}

void TestDirectoryWatcher::watchersHaveFiltersOfTheirOwn()
{
    Files::write(file("file.json"), "old");
    const DirectoryWatcher watcher(m_directory, filter);
    auto other = std::make_unique<DirectoryWatcher>(m_directory, "*.json"_s);
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
    TRY_COMPARE(reports, 1);
    QTest::qWait(50);
    QCOMPARE(reports, 1);
}

void TestDirectoryWatcher::takesTheLowestDescriptor()
{
    IN_A_PROCESS_OF_ITS_OWN()
    close(STDIN_FILENO);
    const DirectoryWatcher watcher(m_directory, filter);
    QCOMPARE(instances(), QStringList{"0"_s});
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
    std::unique_ptr<DirectoryWatcher> poller;
    {
        const UsedUpDescriptors none;
        poller = std::make_unique<DirectoryWatcher>(m_directory, filter);
    }
    QCOMPARE(instances(), QStringList());
    QCOMPARE(m_log->takeTexts().size(), 1);
    QSignalSpy spy(poller.get(), &DirectoryWatcher::changed);
    Files::makeDirectory(m_directory);
    TRY_COMPARE(spy.size(), 1);
    // The next watcher gets an instance.
    const DirectoryWatcher watcher(m_directory, filter);
    QCOMPARE(instances().size(), 1);
}

void TestDirectoryWatcher::pollsWithoutAWatch()
{
    IN_A_PROCESS_OF_ITS_OWN()
    watchError = ENOSPC;
    const DirectoryWatcher poller(m_directory, filter);
    QCOMPARE(m_log->takeTexts(),
             QStringList{"Directories cannot be watched and are checked once a second: No space "
                         "left on device"_s});
    QSignalSpy pollerSpy(&poller, &DirectoryWatcher::changed);
    const QList<std::function<void()>> steps = {
        [this] { Files::makeDirectory(m_directory); },
        [this] { Files::write(file("another.txt"), "x"); },
        [this] {
            Files::remove(m_directory);
            Files::makeDirectory(m_directory);
        },
        [this] { Files::remove(path("a")); },
    };
    for (int i = 0; i < steps.size(); ++i) {
        steps.at(i)();
        TRY_COMPARE(pollerSpy.size(), i + 1);
    }
    // One warning is enough for the process.
    const DirectoryWatcher another(m_directory, filter);
    watchError = 0;
    QCOMPARE(watches(), 0);

    // A watcher polls, too, if it cannot replace its watches.
    const DirectoryWatcher watcher(m_directory, filter);
    QVERIFY(watches() > 0);
    QSignalSpy spy(&watcher, &DirectoryWatcher::changed);
    watchError = ENOMEM;
    Files::makeDirectory(m_directory);
    TRY_COMPARE(spy.size(), 1);
    QCOMPARE(watches(), 0);
    QVERIFY(!spy.wait(1500)); // The directory has not changed since.
    Files::write(file("last.conf"), "x");
    TRY_COMPARE(spy.size(), 2);
    watchError = 0;
}

QTEST_GUILESS_MAIN(TestDirectoryWatcher)

#include "tst_directorywatcher.moc"
