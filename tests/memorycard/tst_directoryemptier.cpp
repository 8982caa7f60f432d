// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "filetree.h"
#include "memorycard/directoryemptier.h"
#include "memorycard/filedescriptor.h"
#include "messagelog.h"
#include "scratchfilesystem.h"
#include "systemcalls.h"

#include <QFile>
#include <QHash>
#include <QTest>
#include <QVector>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <memory>

#include <dirent.h>
#include <fcntl.h>
#include <pthread.h>
#include <sys/mount.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

using namespace FileTree;

namespace {

constexpr int maxOpenDescriptors = 57;
constexpr std::size_t smallStackSize = 256 * 1024;

bool empty(const QByteArray &path)
{
    return emptyDirectory(
        FileDescriptor(open(path.constData(), O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC)));
}

// Counts what the walk asks of the kernel, by the name of the call.
class CallCounter
{
public:
    CallCounter()
    {
        SystemCalls &hooks = SystemCalls::hooks();
        const SystemCalls &real = SystemCalls::real();
        for (int fd = 0; fd < 256; ++fd) {
            if (fcntl(fd, F_GETFD) == -1) {
                m_free.append(fd);
            }
        }
        hooks.openat = [this, &real](int directory, const char *name, int flags) {
            ++counts["openat"];
            const int fd = real.openat(directory, name, flags);
            // The lowest free one is given out, so that all below are in use.
            openDescriptors = std::max(openDescriptors, m_free.indexOf(fd) + 1);
            return fd;
        };
        hooks.unlinkat = [this, &real](int directory, const char *name, int flags) {
            ++counts["unlinkat"];
            return real.unlinkat(directory, name, flags);
        };
        hooks.fstat = [this, &real](int fd, struct stat *info) {
            ++counts["fstat"];
            return real.fstat(fd, info);
        };
        hooks.fstatat = [this, &real](int directory, const char *name, struct stat *info,
                                      int flags) {
            ++counts["fstatat"];
            return real.fstatat(directory, name, info, flags);
        };
        hooks.readdir = [this, &real](DIR *directory) {
            ++counts["readdir"];
            return real.readdir(directory);
        };
    }
    ~CallCounter() { SystemCalls::hooks() = {}; }
    Q_DISABLE_COPY_MOVE(CallCounter)

    QHash<QByteArray, int> counts;
    int openDescriptors = 0;

private:
    QVector<int> m_free;
};

QByteArray nameOf(int directory)
{
    return QFile::symLinkTarget(QStringLiteral("/proc/self/fd/%1").arg(directory)).toLocal8Bit();
}

// Calls a function once, before the first removal of the name.
void beforeRemovalOf(const QByteArray &name, std::function<void()> function)
{
    auto called = std::make_shared<bool>(false);
    SystemCalls::hooks().unlinkat = [=](int directory, const char *entry, int flags) {
        if (!*called && name == entry) {
            *called = true;
            // What the test itself does is not counted.
            SystemCalls hooks;
            std::swap(hooks, SystemCalls::hooks());
            function();
            std::swap(hooks, SystemCalls::hooks());
        }
        return SystemCalls::real().unlinkat(directory, entry, flags);
    };
}

void rename(const QByteArray &from, const QByteArray &to)
{
    if (::rename(from.constData(), to.constData()) != 0) {
        qFatal("cannot rename %s: %s", from.constData(), std::strerror(errno));
    }
}

// Lists directories with other types or other names.
template<typename Change> void changeListings(Change change)
{
    SystemCalls::hooks().readdir = [=](DIR *directory) {
        dirent *const entry = SystemCalls::real().readdir(directory);
        if (entry) {
            change(entry);
        }
        return entry;
    };
}

// A file and a full directory on one side of a directory.
void makeNeighbours(const QByteArray &directory, const char *side)
{
    makeFile(directory + side + "File");
    makeDirectory(directory + side + "Directory");
    makeFile(directory + side + "Directory/file");
}

// A chain of directories. Each has files and full directories before and after the next one, in
// whichever order they are listed, so the walk has something left to do in all of them on its way
// back.
void makeDeepTree(const QByteArray &top, int depth)
{
    for (int level = 0; level <= depth; ++level) {
        const QByteArray directory = chainPath(top, level);
        for (const char *const side : {"/a", "/z"}) {
            makeNeighbours(directory, side);
            if (level < depth && !exists(chainPath(top, level + 1))) {
                makeDirectory(chainPath(top, level + 1));
            }
        }
    }
}

// Such a tree, and what happens before its deepest file is removed.
void makeDeepTree(const QByteArray &top, int depth, const std::function<void()> &happening)
{
    makeDeepTree(top, depth);
    makeFile(chainPath(top, depth) + "/trigger");
    beforeRemovalOf("trigger", happening);
}

// Enough for a walk to be met at every turn: a walk by paths lost files in most of 120.
constexpr int races = 200;

// Does something again and again in a process of its own, until it is ended, with this program at
// the latest.
template<typename Work> pid_t startRepeating(Work work)
{
    const pid_t pid = fork();
    if (pid == 0) {
        prctl(PR_SET_PDEATHSIG, SIGKILL);
        while (true) {
            work();
        }
    }
    return pid;
}

void makeVictims(const QByteArray &top)
{
    for (int i = 0; i < 10; ++i) {
        const QByteArray directory = top + "/directory" + QByteArray::number(i);
        makeDirectory(directory);
        makeDirectory(directory + "/victim");
        makeFiles(directory + "/victim", 20);
    }
}

pid_t startSwapping(const QByteArray &first, const QByteArray &second)
{
    return startRepeating([=] {
        renameat2(AT_FDCWD, first.constData(), AT_FDCWD, second.constData(), RENAME_EXCHANGE);
    });
}

// Moves a directory out of a tree and back.
pid_t startMoving(const QByteArray &inside, const QByteArray &outside)
{
    return startRepeating([=] {
        ::rename(inside.constData(), outside.constData());
        ::rename(outside.constData(), inside.constData());
    });
}

pid_t startMounting(const QByteArray &directory, const QByteArray &mountPoint)
{
    return startRepeating([=] {
        mount(directory.constData(), mountPoint.constData(), nullptr, MS_BIND, nullptr);
        umount2(mountPoint.constData(), MNT_DETACH);
    });
}

void stop(pid_t pid)
{
    kill(pid, SIGKILL);
    waitpid(pid, nullptr, 0);
}

} // namespace

class tst_DirectoryEmptier : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void directoryWithoutEntries();
    void everyKindOfEntry();
    void listsWholeThenRemovesInDirectoryOrder();
    void callsIntoTheKernel_data();
    void callsIntoTheKernel();
    void unknownTypes();
    void unknownTypeOfVanishedEntry();
    void namesThatLeadElsewhere();
    void wideDirectory();
    void wideDirectoriesInDeepTree();
    void veryDeep();
    void failureStopsNothing();
    void failureFarDown();
    void directoryThatDoesNotOpen();
    void listingThatBreaksOff();
    void directoryOfNoKnownDevice();
    void mountInside();
    void bindMountInside();
    void directoryBecomesLink_data();
    void directoryBecomesLink();
    void directoryBecomesLinkToParent();
    void fileBecomesDirectory();
    void directoryMovedOutNearby();
    void directoryMovedOutFarDown();
    void wayMovedOutFarDown();
    void wayMovedOutAndReplaced_data();
    void wayMovedOutAndReplaced();
    void descriptorsAfterDetour();
    void entryVanishes();
    void raceOfDirectoriesAndLinks();
    void raceOfMovedDirectories();
    void raceOfMounts();

private:
    void checkOutside();
    // What a walk would remove that took the outside for a directory of a deep tree.
    void makeBait();

    std::unique_ptr<MessageLog> m_log;
    std::unique_ptr<ScratchFileSystem> m_files;
    QByteArray m_top;
    QByteArray m_outside;
    QByteArrayList m_outsideBefore;
};

void tst_DirectoryEmptier::init()
{
    m_log = std::make_unique<MessageLog>();
    m_files = std::make_unique<ScratchFileSystem>();
    m_top = m_files->path("card");
    m_outside = m_files->path("outside");
    makeDirectory(m_top);
    makeDirectory(m_outside);
    makeDirectory(m_outside + "/directory");
    makeFile(m_outside + "/directory/file", "precious");
    makeFile(m_outside + "/file", "precious");
    m_outsideBefore = listAll(m_outside);
}

void tst_DirectoryEmptier::cleanup()
{
    SystemCalls::hooks() = {};
    checkOutside();
    m_files.reset();
    QCOMPARE(m_log->takeAll(), QList<MessageLog::Message>());
    m_log.reset();
}

void tst_DirectoryEmptier::checkOutside()
{
    QByteArrayList left = listAll(m_outside);
    for (const QByteArray &path : qAsConst(m_outsideBefore)) {
        QVERIFY2(left.contains(path), path.constData());
    }
    QCOMPARE(read(m_outside + "/file"), QByteArray("precious"));
    QCOMPARE(read(m_outside + "/directory/file"), QByteArray("precious"));
}

void tst_DirectoryEmptier::makeBait()
{
    makeDirectory(m_outside + "/d");
    makeNeighbours(m_outside, "/a");
    makeNeighbours(m_outside, "/z");
    m_outsideBefore = listAll(m_outside);
}

void tst_DirectoryEmptier::directoryWithoutEntries()
{
    QVERIFY(empty(m_top));
    QVERIFY(exists(m_top));
}

void tst_DirectoryEmptier::everyKindOfEntry()
{
    makeFile(m_top + "/file", "content");
    makeFile(m_top + "/.hidden");
    makeFile(m_top + "/...");
    makeFile(m_top + "/caf\xe9 \xff\xfe");
    makeFile(m_top + "/\xc3\x9cmlaut");
    makeFile(m_top + "/line\nbreak\\040");
    makeFile(m_top + '/' + QByteArray(255, 'n'));
    makeLink(m_top + "/toDirectory", m_outside);
    makeLink(m_top + "/toFile", m_outside + "/file");
    makeLink(m_top + "/toLink", m_top + "/toDirectory");
    makeLink(m_top + "/toParent", "..");
    makeLink(m_top + "/dangling", "/nowhere/at/all");
    makeLink(m_top + "/toItself", m_top + "/toItself");
    makePipe(m_top + "/pipe");
    makeSocket(m_top + "/socket");
    makeDirectory(m_top + "/.hiddenDirectory");
    makeFile(m_top + "/.hiddenDirectory/.hidden");
    makeDirectory(m_top + "/\xe9t\xe9");
    makeFile(m_top + "/\xe9t\xe9/\x80");
    makeLink(m_top + "/\xe9t\xe9/link", "../..");
    makeDirectory(m_top + "/\xe9t\xe9/directory");
    QVERIFY(empty(m_top));
    QCOMPARE(list(m_top), QByteArrayList());
    QVERIFY(exists(m_top));
}

void tst_DirectoryEmptier::listsWholeThenRemovesInDirectoryOrder()
{
    // Enough for a directory to be read in several pieces.
    makeDirectory(m_top + "/a");
    makeFiles(m_top + "/a", 3000);
    makeDirectory(m_top + "/b");
    makeFiles(m_top + "/b", 10);
    makeFiles(m_top, 3000);
    QHash<QByteArray, QByteArrayList> expected;
    for (const QByteArray &directory : {m_top, m_top + "/a", m_top + "/b"}) {
        expected[directory] = list(directory);
    }

    QHash<QByteArray, QByteArrayList> removed;
    QHash<QByteArray, bool> listed;
    SystemCalls::hooks().readdir = [&](DIR *directory) {
        dirent *const entry = SystemCalls::real().readdir(directory);
        listed[nameOf(dirfd(directory))] = !entry;
        return entry;
    };
    SystemCalls::hooks().unlinkat = [&](int directory, const char *name, int flags) {
        const QByteArray path = nameOf(directory);
        if (listed.value(path)) {
            removed[path].append(name);
        }
        return SystemCalls::real().unlinkat(directory, name, flags);
    };
    QVERIFY(empty(m_top));
    QCOMPARE(removed, expected);
}

void tst_DirectoryEmptier::callsIntoTheKernel_data()
{
    QTest::addColumn<int>("directories");
    QTest::addColumn<int>("files");

    QTest::newRow("flat") << 0 << 2000;
    QTest::newRow("nested") << 20 << 100;
}

void tst_DirectoryEmptier::callsIntoTheKernel()
{
    QFETCH(const int, directories);
    QFETCH(const int, files);
    for (int i = 0; i < directories; ++i) {
        makeDirectory(m_top + '/' + QByteArray::number(i));
        makeFiles(m_top + '/' + QByteArray::number(i), files);
    }
    if (directories == 0) {
        makeFiles(m_top, files);
    }

    CallCounter counter;
    QVERIFY(empty(m_top));
    // One removal per entry; a directory is also opened, looked at, and read to its end.
    const int entries = directories == 0 ? files : directories * (files + 1);
    QCOMPARE(counter.counts.value("unlinkat"), entries);
    QCOMPARE(counter.counts.value("fstatat"), 0);
    QCOMPARE(counter.counts.value("openat"), directories);
    QCOMPARE(counter.counts.value("fstat"), directories + 1);
    // With "." and "..", and once for the end.
    QCOMPARE(counter.counts.value("readdir"), entries + 3 * (directories + 1));
    QCOMPARE(list(m_top), QByteArrayList());
}

void tst_DirectoryEmptier::unknownTypes()
{
    makeFiles(m_top, 5);
    makeDirectory(m_top + "/directory");
    makeFiles(m_top + "/directory", 5);
    makeLink(m_top + "/directory/link", m_outside + "/directory");
    makeLink(m_top + "/link", m_outside);
    makePipe(m_top + "/pipe");

    CallCounter counter;
    changeListings([](dirent *entry) { entry->d_type = DT_UNKNOWN; });
    QVERIFY(empty(m_top));
    QCOMPARE(list(m_top), QByteArrayList());
    QCOMPARE(counter.counts.value("fstatat"), 14); // each entry once
    QCOMPARE(counter.counts.value("openat"), 1);
    QCOMPARE(counter.counts.value("unlinkat"), 14);
}

void tst_DirectoryEmptier::unknownTypeOfVanishedEntry()
{
    makeFiles(m_top, 5);
    changeListings([](dirent *entry) { entry->d_type = DT_UNKNOWN; });
    SystemCalls::hooks().fstatat = [&](int, const char *name, struct stat *, int) {
        if (qstrcmp(name, "file3") == 0) {
            unlink((m_top + "/file3").constData());
        }
        errno = ENOENT;
        return -1;
    };
    QVERIFY(!empty(m_top));
    QCOMPARE(list(m_top), QByteArrayList());
}

void tst_DirectoryEmptier::namesThatLeadElsewhere()
{
    makeDirectory(m_top + "/abcdefghij123456789");
    makeFile(m_top + "/klmnopqrst12");
    makeFile(m_top + "/other");
    changeListings([](dirent *entry) {
        if (qstrcmp(entry->d_name, "abcdefghij123456789") == 0) {
            std::strcpy(entry->d_name, "../outside/directory");
        } else if (qstrcmp(entry->d_name, "klmnopqrst12") == 0) {
            std::strcpy(entry->d_name, "../outside/file");
        }
    });
    // Shorter or as long as the names they replace: records have room for a few bytes more.
    QVERIFY(!empty(m_top));
    QVERIFY(!exists(m_top + "/other"));
}

void tst_DirectoryEmptier::wideDirectory()
{
    makeFiles(m_top, 20000);
    CallCounter counter;
    QVERIFY(empty(m_top));
    QCOMPARE(list(m_top), QByteArrayList());
    QCOMPARE(counter.counts.value("openat"), 0);
}

void tst_DirectoryEmptier::wideDirectoriesInDeepTree()
{
    // Deeper than the number of descriptors that are kept, with entries left at every level.
    constexpr int depth = 150;
    makeDeepTree(m_top, depth);
    CallCounter counter;
    QVERIFY(empty(m_top));
    QCOMPARE(list(m_top), QByteArrayList());
    QCOMPARE(counter.openDescriptors, maxOpenDescriptors);
    // A directory is opened once. Those that are not kept open are opened once more later.
    QVERIFY(counter.counts.value("openat") > depth + 2 * (depth + 1));
    QVERIFY(counter.counts.value("openat") < 2 * depth + 2 * (depth + 1));
}

void tst_DirectoryEmptier::veryDeep()
{
    makeChain(m_top, 50000);
    struct Run {
        QByteArray top;
        bool emptied = false;
        int openDescriptors = 0;
    } run;
    run.top = m_top;

    pthread_attr_t attributes = {};
    QCOMPARE(pthread_attr_init(&attributes), 0);
    QCOMPARE(pthread_attr_setstacksize(&attributes, smallStackSize), 0);
    pthread_t thread = {};
    const auto body = [](void *argument) -> void * {
        auto *const run = static_cast<Run *>(argument);
        CallCounter counter;
        run->emptied = empty(run->top);
        run->openDescriptors = counter.openDescriptors;
        return nullptr;
    };
    QCOMPARE(pthread_create(&thread, &attributes, body, &run), 0);
    pthread_join(thread, nullptr);
    pthread_attr_destroy(&attributes);

    QVERIFY(run.emptied);
    QCOMPARE(run.openDescriptors, maxOpenDescriptors);
    QCOMPARE(list(m_top), QByteArrayList());
}

void tst_DirectoryEmptier::failureStopsNothing()
{
    makeFiles(m_top, 50);
    makeDirectory(m_top + "/a");
    makeDirectory(m_top + "/a/b");
    makeFiles(m_top + "/a/b", 50);
    makeDirectory(m_top + "/a/c");
    makeFiles(m_top + "/a/c", 50);
    QByteArrayList attempted;
    SystemCalls::hooks().unlinkat = [&](int directory, const char *name, int flags) {
        if ((flags & AT_REMOVEDIR) != 0) {
            attempted.append(name);
        }
        if (qstrcmp(name, "file7") == 0 && nameOf(directory).endsWith("/b")) {
            errno = EPERM;
            return -1;
        }
        return SystemCalls::real().unlinkat(directory, name, flags);
    };
    QVERIFY(!empty(m_top));
    QCOMPARE(listAll(m_top), (QByteArrayList{"a", "a/b", "a/b/file7"}));
    // A directory that something is left in is not even tried.
    QCOMPARE(attempted, QByteArrayList{"c"});
}

void tst_DirectoryEmptier::failureFarDown()
{
    constexpr int depth = 150;
    makeDeepTree(m_top, depth);
    makeFile(chainPath(m_top, depth) + "/stuck");
    SystemCalls::hooks().unlinkat = [&](int directory, const char *name, int flags) {
        if (qstrcmp(name, "stuck") == 0) {
            errno = EROFS;
            return -1;
        }
        return SystemCalls::real().unlinkat(directory, name, flags);
    };
    QVERIFY(!empty(m_top));
    const QByteArrayList left = listAll(m_top);
    QCOMPARE(left.size(), depth + 1);
    QVERIFY(left.last().endsWith("/stuck"));
}

void tst_DirectoryEmptier::directoryThatDoesNotOpen()
{
    makeDirectory(m_top + "/empty");
    makeDirectory(m_top + "/full");
    makeFile(m_top + "/full/file");
    makeFiles(m_top, 5);
    QByteArrayList attempted;
    SystemCalls::hooks().openat = [&](int, const char *, int) {
        errno = EACCES;
        return -1;
    };
    SystemCalls::hooks().unlinkat = [&](int directory, const char *name, int flags) {
        if ((flags & AT_REMOVEDIR) != 0) {
            attempted.append(name);
        }
        return SystemCalls::real().unlinkat(directory, name, flags);
    };
    QVERIFY(!empty(m_top));
    QCOMPARE(listAll(m_top), (QByteArrayList{"full", "full/file"}));
    std::sort(attempted.begin(), attempted.end());
    QCOMPARE(attempted, (QByteArrayList{"empty", "full"}));

    unlink((m_top + "/full/file").constData());
    QVERIFY(empty(m_top));
    QCOMPARE(list(m_top), QByteArrayList());
}

void tst_DirectoryEmptier::listingThatBreaksOff()
{
    makeDirectory(m_top + "/unreadable");
    makeFile(m_top + "/unreadable/file");
    makeFiles(m_top, 5);
    SystemCalls::hooks().readdir = [&](DIR *directory) -> dirent * {
        if (nameOf(dirfd(directory)).endsWith("/unreadable")) {
            errno = EIO;
            return nullptr;
        }
        return SystemCalls::real().readdir(directory);
    };
    QVERIFY(!empty(m_top));
    SystemCalls::hooks() = {};
    QCOMPARE(listAll(m_top), (QByteArrayList{"unreadable", "unreadable/file"}));

    SystemCalls::hooks().readdir = [](DIR *) -> dirent * {
        errno = EIO;
        return nullptr;
    };
    QVERIFY(empty(m_top));
    SystemCalls::hooks() = {};
    QCOMPARE(listAll(m_top), (QByteArrayList{"unreadable", "unreadable/file"}));
}

void tst_DirectoryEmptier::directoryOfNoKnownDevice()
{
    // Without it the walk could not tell where the card ends.
    makeFiles(m_top, 5);
    SystemCalls::hooks().fstat = [](int, struct stat *) {
        errno = EIO;
        return -1;
    };
    QVERIFY(!empty(m_top));
    SystemCalls::hooks().fstat = nullptr;
    QCOMPARE(listAll(m_top).size(), 5);
}

void tst_DirectoryEmptier::mountInside()
{
    makeFiles(m_top, 5);
    makeDirectory(m_top + "/directory");
    const QByteArray mounted = m_top + "/directory/mounted";
    makeDirectory(mounted);
    QCOMPARE(mount("tmpfs", mounted.constData(), "tmpfs", 0, nullptr), 0);
    makeFile(mounted + "/file");
    makeDirectory(mounted + "/inner");
    makeFiles(m_top + "/directory", 5);
    const bool emptied = empty(m_top);
    const QByteArrayList left = listAll(m_top);
    QCOMPARE(umount(mounted.constData()), 0);
    QVERIFY(!emptied);
    QCOMPARE(left,
             (QByteArrayList{"directory", "directory/mounted", "directory/mounted/file",
                             "directory/mounted/inner"}));
}

void tst_DirectoryEmptier::bindMountInside()
{
    // Mounted, but of the same device: what is in it is on the card.
    const QByteArray mounted = m_top + "/mounted";
    makeDirectory(mounted);
    makeDirectory(m_top + "/other");
    QCOMPARE(mount((m_top + "/other").constData(), mounted.constData(), nullptr, MS_BIND, nullptr),
             0);
    makeFiles(mounted, 5);
    const bool emptied = empty(m_top);
    const QByteArrayList left = listAll(m_top);
    QCOMPARE(umount(mounted.constData()), 0);
    QVERIFY(!emptied);
    QVERIFY(left.contains("mounted"));
    QVERIFY(!left.contains("mounted/file0"));
    QVERIFY(!left.contains("other/file0"));
}

void tst_DirectoryEmptier::directoryBecomesLink_data()
{
    QTest::addColumn<QByteArray>("target");
    QTest::addColumn<bool>("unknownType");

    QTest::newRow("to a directory") << QByteArray("../outside/directory") << false;
    QTest::newRow("to a file") << QByteArray("../outside/file") << false;
    QTest::newRow("to nothing") << QByteArray("../outside/nothing") << false;
    QTest::newRow("after it was asked for") << QByteArray("../outside/directory") << true;
}

void tst_DirectoryEmptier::directoryBecomesLink()
{
    QFETCH(const QByteArray, target);
    QFETCH(const bool, unknownType);
    makeDirectory(m_top + "/victim");
    makeFiles(m_top + "/victim", 3);
    makeFiles(m_top, 5);
    if (unknownType) {
        changeListings([](dirent *entry) { entry->d_type = DT_UNKNOWN; });
    }
    SystemCalls::hooks().openat = [&](int directory, const char *name, int flags) {
        if (qstrcmp(name, "victim") == 0) {
            rename(m_top + "/victim", m_outside + "/moved");
            makeLink(m_top + "/victim", target);
        }
        return SystemCalls::real().openat(directory, name, flags);
    };
    QVERIFY(!empty(m_top));
    QCOMPARE(list(m_top), QByteArrayList{"victim"});
    QCOMPARE(list(m_outside + "/moved").size(), 3);
}

void tst_DirectoryEmptier::directoryBecomesLinkToParent()
{
    // The directory is replaced while the walk is already in it.
    makeDirectory(m_top + "/victim");
    makeFile(m_top + "/victim/trigger");
    makeFiles(m_top, 5);
    beforeRemovalOf("trigger", [&] {
        rename(m_top + "/victim", m_outside + "/moved");
        makeLink(m_top + "/victim", "..");
    });
    QVERIFY(!empty(m_top));
    QCOMPARE(list(m_top), QByteArrayList{"victim"});
}

void tst_DirectoryEmptier::fileBecomesDirectory()
{
    makeFile(m_top + "/file");
    makeFile(m_top + "/other");
    beforeRemovalOf("file", [&] {
        unlink((m_top + "/file").constData());
        makeDirectory(m_top + "/file");
    });
    QVERIFY(!empty(m_top));
    QCOMPARE(list(m_top), QByteArrayList{"file"});
}

void tst_DirectoryEmptier::directoryMovedOutNearby()
{
    // The directories above are still open: their entries go.
    makeDeepTree(m_top, 10);
    makeFile(chainPath(m_top, 8) + "/trigger");
    beforeRemovalOf("trigger", [&] { rename(chainPath(m_top, 5), m_outside + "/moved"); });
    QVERIFY(!empty(m_top));
    // d/d/d/d was left when its entry could not be removed.
    QCOMPARE(listAll(m_top), (QByteArrayList{"d", "d/d", "d/d/d", "d/d/d/d"}));
}

void tst_DirectoryEmptier::directoryMovedOutFarDown()
{
    // No directory above this one is open any more, and its ".." leads outside: the walk finds its
    // way back from the top.
    makeDeepTree(m_top, 150, [&] { rename(chainPath(m_top, 20), m_outside + "/moved"); });
    makeBait();
    QVERIFY(!empty(m_top));
    const QByteArrayList left = listAll(m_top);
    QCOMPARE(left.size(), 19);
    QCOMPARE(m_top + '/' + left.last(), chainPath(m_top, 19));
    QCOMPARE(list(m_outside + "/moved"), QByteArrayList());
}

void tst_DirectoryEmptier::wayMovedOutFarDown()
{
    // Two directories are moved: the walk returns to the directory above the higher one.
    makeDeepTree(m_top, 150, [&] {
        rename(chainPath(m_top, 40), m_outside + "/moved");
        rename(chainPath(m_top, 10), m_outside + "/movedToo");
    });
    makeBait();
    QVERIFY(!empty(m_top));
    const QByteArrayList left = listAll(m_top);
    QCOMPARE(left.size(), 9);
    QCOMPARE(m_top + '/' + left.last(), chainPath(m_top, 9));
    // The directories between the two are outside the card now and are not removed.
    QVERIFY(exists(chainPath(m_outside + "/movedToo", 29)));
}

void tst_DirectoryEmptier::wayMovedOutAndReplaced_data()
{
    QTest::addColumn<bool>("full");

    QTest::newRow("by a full directory") << true;
    QTest::newRow("by an empty directory") << false;
}

void tst_DirectoryEmptier::wayMovedOutAndReplaced()
{
    QFETCH(const bool, full);
    // Another directory has taken the name of a parent: it was not listed and is not entered.
    constexpr int depth = 150;
    makeDeepTree(m_top, depth);
    makeFile(chainPath(m_top, depth) + "/trigger");
    makeDirectory(m_outside + "/other");
    if (full) {
        makeDeepTree(m_outside + "/other", 30);
    }
    makeBait();
    // Except the directory that is moved into the card.
    m_outsideBefore.erase(
        std::remove_if(m_outsideBefore.begin(), m_outsideBefore.end(),
                       [](const QByteArray &path) { return path.startsWith("other"); }),
        m_outsideBefore.end());
    const int size = listAll(m_outside + "/other").size();
    beforeRemovalOf("trigger", [&] {
        rename(chainPath(m_top, 30), m_outside + "/moved");
        rename(chainPath(m_top, 20), m_outside + "/movedToo");
        rename(m_outside + "/other", chainPath(m_top, 20));
    });
    QVERIFY(!empty(m_top));
    QCOMPARE(listAll(chainPath(m_top, 20)).size(), size);
    QCOMPARE(listAll(m_top).size(), 20 + size);
}

void tst_DirectoryEmptier::descriptorsAfterDetour()
{
    // As many are kept open after a way back from the top as before, in either direction.
    makeDeepTree(m_top, 150, [&] {
        rename(chainPath(m_top, 90), m_outside + "/moved");
        // Puts new deep trees into the directories that the walk still has to remove there.
        for (const char *const side : {"/aDirectory", "/zDirectory"}) {
            const QByteArray directory = chainPath(m_top, 89) + side;
            if (exists(directory)) {
                makeChain(directory, 200);
            }
        }
    });
    const auto unlinkat = SystemCalls::hooks().unlinkat;
    CallCounter counter;
    SystemCalls::hooks().unlinkat = unlinkat;
    QVERIFY(!empty(m_top));
    QCOMPARE(listAll(m_top).size(), 89);
    QCOMPARE(counter.openDescriptors, maxOpenDescriptors);
}

void tst_DirectoryEmptier::entryVanishes()
{
    makeFiles(m_top, 5);
    makeDirectory(m_top + "/directory");
    makeFile(m_top + "/directory/trigger");
    beforeRemovalOf("trigger", [&] { unlink((m_top + "/directory/trigger").constData()); });
    // The call failed, whatever the reason: it is not this walk that removed the entry.
    QVERIFY(!empty(m_top));
    QCOMPARE(listAll(m_top), QByteArrayList{"directory"});
}

void tst_DirectoryEmptier::raceOfDirectoriesAndLinks()
{
    for (int run = 0; run < races; ++run) {
        makeVictims(m_top);
        makeLink(m_outside + "/link", m_outside);
        const pid_t swapper = startSwapping(m_top + "/directory5/victim", m_outside + "/link");
        const pid_t swapper2 = startSwapping(m_top + "/directory2", m_top + "/directory7/victim");
        QVERIFY(swapper > 0 && swapper2 > 0);
        empty(m_top);
        stop(swapper);
        stop(swapper2);
        checkOutside();
        QVERIFY(!QTest::currentTestFailed());
        // Whatever state it was left in, undisturbed it goes.
        QVERIFY(empty(m_top));
        unlink((m_outside + "/link").constData());
        if (exists(m_outside + "/link")) {
            QVERIFY(empty(m_outside + "/link"));
            rmdir((m_outside + "/link").constData());
        }
    }
}

void tst_DirectoryEmptier::raceOfMovedDirectories()
{
    for (int run = 0; run < races; ++run) {
        makeChain(m_top, 90);
        makeFiles(chainPath(m_top, 90), 200);
        const pid_t mover = startMoving(chainPath(m_top, 80), m_outside + "/moved");
        const pid_t mover2 = startMoving(chainPath(m_top, 10), m_outside + "/movedToo");
        QVERIFY(mover > 0 && mover2 > 0);
        empty(m_top);
        stop(mover);
        stop(mover2);
        checkOutside();
        QVERIFY(!QTest::currentTestFailed());
        QVERIFY(empty(m_top));
        for (const char *name : {"/moved", "/movedToo"}) {
            if (exists(m_outside + name)) {
                QVERIFY(empty(m_outside + name));
                rmdir((m_outside + name).constData());
            }
        }
    }
}

void tst_DirectoryEmptier::raceOfMounts()
{
    const ScratchFileSystem otherDevice;
    const QByteArray other = otherDevice.path("other");
    makeDirectory(other);
    makeDirectory(other + "/directory");
    makeFiles(other + "/directory", 20);
    makeFiles(other, 20);
    const QByteArrayList before = listAll(other);
    const QByteArrayList mountPoints{m_top + "/directory2", m_top + "/directory7/victim"};
    for (int run = 0; run < races; ++run) {
        makeVictims(m_top);
        const pid_t mounter = startMounting(other, mountPoints[0]);
        const pid_t mounter2 = startMounting(other, mountPoints[1]);
        QVERIFY(mounter > 0 && mounter2 > 0);
        empty(m_top);
        stop(mounter);
        stop(mounter2);
        for (const QByteArray &mountPoint : mountPoints) {
            while (umount2(mountPoint.constData(), MNT_DETACH) == 0) { }
        }
        QCOMPARE(listAll(other), before);
        QVERIFY(empty(m_top));
    }
}

QTEST_GUILESS_MAIN(tst_DirectoryEmptier)

#include "tst_directoryemptier.moc"
