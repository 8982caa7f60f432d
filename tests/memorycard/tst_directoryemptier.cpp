// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "files.h"
#include "files/filedescriptor.h"
#include "filetree.h"
#include "loggedtest.h"
#include "memorycard/directoryemptier.h"
#include "scratchfilesystem.h"
#include "systemcalls.h"
#include "texts.h"

#include <QFile>
#include <QHash>
#include <QTest>
#include <QThread>
#include <QVector>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <memory>
#include <vector>

#include <dirent.h>
#include <fcntl.h>
#include <sys/mount.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

using namespace FileTree;

namespace {

constexpr int maxOpenDescriptors = 12;
constexpr uint smallStackSize = 256 * 1024;
// The depth of a tree in which the walk cannot keep all directories open.
constexpr int deep = 150;

Leftovers emptyAndReport(const QByteArray &path)
{
    return emptyDirectory(
        FileDescriptor(open(path.constData(), O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC)));
}

bool empty(const QByteArray &path)
{
    return emptyAndReport(path).count == 0;
}

// Counts the system calls of the walk by their names.
class CallCounter
{
public:
    CallCounter()
    {
        for (int fd = 0; fd < 256; ++fd) {
            if (fcntl(fd, F_GETFD) == -1) {
                m_free.append(fd);
            }
        }
        count("unlinkat", &SystemCalls::unlinkat);
        count("fstat", &SystemCalls::fstat);
        count("fstatat", &SystemCalls::fstatat);
        count("readdir", &SystemCalls::readdir);
        SystemCalls::hooks().openat = [this](int directory, const char *name, int flags) {
            ++counts["openat"];
            const int fd = SystemCalls::real().openat(directory, name, flags);
            // The kernel returns the lowest free descriptor, so all lower ones are in use.
            openDescriptors = std::max(openDescriptors, m_free.indexOf(fd) + 1);
            return fd;
        };
    }
    ~CallCounter() { SystemCalls::hooks() = {}; }
    Q_DISABLE_COPY_MOVE(CallCounter)

    QHash<QByteArray, int> counts;
    int openDescriptors = 0;

private:
    // A hook that is already set is called instead of the real function.
    template<typename Result, typename... Arguments>
    void count(const char *name, std::function<Result(Arguments...)> SystemCalls::*call)
    {
        auto &hook = SystemCalls::hooks().*call;
        const auto next = hook ? hook : SystemCalls::real().*call;
        hook = [this, name, next](Arguments... arguments) {
            ++counts[name];
            return next(arguments...);
        };
    }

    QVector<int> m_free;
};

QByteArray nameOf(int directory)
{
    return QFile::symLinkTarget("/proc/self/fd/%1"_s.arg(directory)).toLocal8Bit();
}

// Makes each removal of the name fail.
void failRemovalOf(const QByteArray &name, int error)
{
    SystemCalls::hooks().unlinkat = [=](int directory, const char *entry, int flags) {
        if (name == entry) {
            errno = error;
            return -1;
        }
        return SystemCalls::real().unlinkat(directory, entry, flags);
    };
}

// Collects the names of directories whose removal is attempted, on top of the hook that is set.
void collectRemovedDirectories(QByteArrayList *names)
{
    const auto hook = SystemCalls::hooks().unlinkat;
    const auto next = hook ? hook : SystemCalls::real().unlinkat;
    SystemCalls::hooks().unlinkat = [=](int directory, const char *name, int flags) {
        if ((flags & AT_REMOVEDIR) != 0) {
            names->append(name);
        }
        return next(directory, name, flags);
    };
}

// Calls a function once, before the first removal of the name.
void beforeRemovalOf(const QByteArray &name, std::function<void()> function)
{
    auto called = std::make_shared<bool>(false);
    SystemCalls::hooks().unlinkat = [=](int directory, const char *entry, int flags) {
        if (!*called && name == entry) {
            *called = true;
            // The calls of the test itself are not counted.
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

void listWithoutTypes()
{
    changeListings([](dirent *entry) { entry->d_type = DT_UNKNOWN; });
}

// A chain of directories. In directory order, each has a file and a full directory both before and
// after the next one, so that the walk has work left in all of them on its return.
void makeDeepTree(const QByteArray &top, int depth)
{
    for (int level = 0; level <= depth; ++level) {
        const QByteArray directory = chainPath(top, level);
        makeTree(directory, {"aFile", "aDirectory/file"});
        if (level < depth) {
            makeTree(directory, {"d/"});
        }
        makeTree(directory, {"zFile", "zDirectory/file"});
    }
}

// Makes such a tree. The function is called before the walk removes its deepest file.
void makeDeepTree(const QByteArray &top, int depth, const std::function<void()> &happening)
{
    makeDeepTree(top, depth);
    makeFile(chainPath(top, depth) + "/trigger");
    beforeRemovalOf("trigger", happening);
}

// Changes happen at every point of the walk. A walk by paths lost files in most of 120 runs.
constexpr int races = 200;

// Repeats each of the functions in a process of its own while the directory is emptied.
void emptyDuring(const QByteArray &path, const std::vector<std::function<void()>> &disturbances)
{
    std::vector<pid_t> processes;
    for (const auto &disturb : disturbances) {
        processes.push_back(fork());
        if (processes.back() == 0) {
            prctl(PR_SET_PDEATHSIG, SIGKILL);
            while (true) {
                disturb();
            }
        }
        if (processes.back() < 0) {
            qFatal("cannot fork");
        }
    }
    empty(path);
    for (const pid_t process : processes) {
        kill(process, SIGKILL);
        waitpid(process, nullptr, 0);
    }
}

void removeDirectory(const QByteArray &path)
{
    if (exists(path) && (!empty(path) || rmdir(path.constData()) != 0)) {
        qFatal("cannot remove %s", path.constData());
    }
}

void makeVictims(const QByteArray &top)
{
    for (int i = 0; i < 10; ++i) {
        const QByteArray victim = "directory" + QByteArray::number(i) + "/victim";
        makeTree(top, {victim + '/'});
        makeFiles(top + '/' + victim, 20);
    }
}

} // namespace

class tst_DirectoryEmptier : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void everyKindOfEntry();
    void listsWholeThenRemovesInDirectoryOrder();
    void callsIntoTheKernel();
    void unknownTypes();
    void unknownTypeOfVanishedEntry();
    void namesThatLeadElsewhere();
    void wideDirectoriesInDeepTree();
    void veryDeep();
    void failureStopsNothing();
    void failureFarDown();
    void reportOfManyFailures();
    void directoryThatDoesNotOpen();
    void listingThatBreaksOff();
    void directoryOfNoKnownDevice();
    void mountInside();
    void bindMountInside();
    void directoryBecomesLink_data();
    void directoryBecomesLink();
    void entriesThatChange();
    void directoryMovedOutNearby();
    void directoriesMovedOutFarDown_data();
    void directoriesMovedOutFarDown();
    void pathMovedOutAndReplaced_data();
    void pathMovedOutAndReplaced();
    void descriptorsAfterDetour();
    void raceOfDirectoriesAndLinks();
    void raceOfMovedDirectories();
    void raceOfMounts();

private:
    void checkOutside();
    // Adds entries that a walk would remove if it mistook m_outside for a directory of a deep tree.
    void makeBait();

    std::unique_ptr<ScratchFileSystem> m_files;
    QByteArray m_top;
    QByteArray m_outside;
    QByteArrayList m_outsideBefore;
};

void tst_DirectoryEmptier::init()
{
    LoggedTest::init();
    m_files = std::make_unique<ScratchFileSystem>();
    m_top = m_files->path("card");
    m_outside = m_files->path("outside");
    makeDirectory(m_top);
    makeTree(m_outside, {"directory/"});
    makeFile(m_outside + "/directory/file", "precious");
    makeFile(m_outside + "/file", "precious");
    m_outsideBefore = listAll(m_outside);
}

void tst_DirectoryEmptier::cleanup()
{
    SystemCalls::hooks() = {};
    checkOutside();
    m_files.reset();
    LoggedTest::cleanup();
}

void tst_DirectoryEmptier::checkOutside()
{
    const QByteArrayList left = listAll(m_outside);
    for (const QByteArray &path : qAsConst(m_outsideBefore)) {
        QVERIFY2(left.contains(path), path.constData());
    }
    QCOMPARE(read(m_outside + "/file"), QByteArray("precious"));
    QCOMPARE(read(m_outside + "/directory/file"), QByteArray("precious"));
}

void tst_DirectoryEmptier::makeBait()
{
    makeTree(m_outside, {"d/", "aFile", "aDirectory/file", "zFile", "zDirectory/file"});
    m_outsideBefore = listAll(m_outside);
}

void tst_DirectoryEmptier::everyKindOfEntry()
{
    makeTree(m_top,
             {"file", ".hidden", "...", "caf\xe9 \xff\xfe", "\xc3\x9cmlaut", "line\nbreak\\040",
              QByteArray(255, 'n'), "toDirectory -> " + m_outside, "toFile -> ../outside/file",
              "toLink -> toDirectory", "toParent -> ..", "dangling -> /nowhere/at/all",
              "toItself -> toItself", ".hiddenDirectory/.hidden", "\xe9t\xe9/\x80",
              "\xe9t\xe9/link -> ../..", "\xe9t\xe9/directory/"});
    Files::makePipe(QFile::decodeName(m_top + "/pipe"));
    makeSocket(m_top + "/socket");
    // An empty directory is emptied, too.
    for (int i = 0; i < 2; ++i) {
        QVERIFY(empty(m_top));
        QVERIFY(exists(m_top));
        QCOMPARE(list(m_top), QByteArrayList());
    }
}

void tst_DirectoryEmptier::listsWholeThenRemovesInDirectoryOrder()
{
    // Enough for a directory to be read in several pieces.
    makeTree(m_top, {"a/", "b/"});
    makeFiles(m_top + "/a", 3000);
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

void tst_DirectoryEmptier::callsIntoTheKernel()
{
    constexpr int files = 20000;
    constexpr int directories = 20;
    constexpr int filesInEach = 100;
    makeFiles(m_top, files);
    for (int i = 0; i < directories; ++i) {
        const QByteArray directory = m_top + '/' + QByteArray::number(i);
        makeDirectory(directory);
        makeFiles(directory, filesInEach);
    }

    const CallCounter counter;
    QVERIFY(empty(m_top));
    // One removal per entry. The walk also opens a directory, calls fstat() and reads it to its
    // end.
    constexpr int entries = files + directories * (filesInEach + 1);
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
    makeTree(m_top, {"directory/link -> ../../outside/directory", "link -> ../outside"});
    makeFiles(m_top, 5);
    makeFiles(m_top + "/directory", 5);
    Files::makePipe(QFile::decodeName(m_top + "/pipe"));

    listWithoutTypes();
    const CallCounter counter;
    QVERIFY(empty(m_top));
    QCOMPARE(list(m_top), QByteArrayList());
    QCOMPARE(counter.counts.value("fstatat"), 14); // each entry once
    QCOMPARE(counter.counts.value("openat"), 1);
    QCOMPARE(counter.counts.value("unlinkat"), 14);
}

void tst_DirectoryEmptier::unknownTypeOfVanishedEntry()
{
    makeFiles(m_top, 5);
    listWithoutTypes();
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
    // Each name is at least as long as the one that replaces it: records have little room.
    const QHash<QByteArray, QByteArray> names = {{"abcdefghij1234567890", "../outside/directory"},
                                                 {"klmnopqrst123456", "../outside/file"}};
    makeTree(m_top, {"abcdefghij1234567890/", "klmnopqrst123456", "other"});
    changeListings([names](dirent *entry) {
        const QByteArray name = names.value(entry->d_name, entry->d_name);
        std::strcpy(entry->d_name, name.constData());
    });
    QVERIFY(!empty(m_top));
    QVERIFY(!exists(m_top + "/other"));
}

void tst_DirectoryEmptier::wideDirectoriesInDeepTree()
{
    makeDeepTree(m_top, deep);
    const CallCounter counter;
    QVERIFY(empty(m_top));
    QCOMPARE(list(m_top), QByteArrayList());
    QCOMPARE(counter.openDescriptors, maxOpenDescriptors);
    // Each directory is opened once. On the way back from it, its parent may be opened again.
    constexpr int directories = deep + 2 * (deep + 1);
    QVERIFY(counter.counts.value("openat") > directories);
    QVERIFY(counter.counts.value("openat") < 2 * directories);
}

void tst_DirectoryEmptier::veryDeep()
{
    makeChain(m_top, 50000);
    bool emptied = false;
    int openDescriptors = 0;
    const std::unique_ptr<QThread> thread(QThread::create([&] {
        const CallCounter counter;
        emptied = empty(m_top);
        openDescriptors = counter.openDescriptors;
    }));
    thread->setStackSize(smallStackSize);
    thread->start();
    QVERIFY(thread->wait());

    QVERIFY(emptied);
    QCOMPARE(openDescriptors, maxOpenDescriptors);
    QCOMPARE(list(m_top), QByteArrayList());
}

void tst_DirectoryEmptier::failureStopsNothing()
{
    makeTree(m_top, {"a/b/stuck", "a/c/"});
    for (const QByteArray &directory : {m_top, m_top + "/a/b", m_top + "/a/c"}) {
        makeFiles(directory, 50);
    }
    QByteArrayList attempted;
    failRemovalOf("stuck", EPERM);
    collectRemovedDirectories(&attempted);
    const Leftovers left = emptyAndReport(m_top);
    QCOMPARE(listAll(m_top), (QByteArrayList{"a", "a/b", "a/b/stuck"}));
    QCOMPARE(left.first.c_str(), "a/b/stuck");
    QCOMPARE(left.error, EPERM);
    QCOMPARE(left.count, size_t(1));
    // The walk does not try to remove a directory in which something is left.
    QCOMPARE(attempted, QByteArrayList{"c"});
}

void tst_DirectoryEmptier::failureFarDown()
{
    makeDeepTree(m_top, deep);
    makeFile(chainPath(m_top, deep) + "/stuck");
    failRemovalOf("stuck", EROFS);
    QVERIFY(!empty(m_top));
    const QByteArrayList left = listAll(m_top);
    QCOMPARE(left.size(), deep + 1);
    QVERIFY(left.last().endsWith("/stuck"));
}

void tst_DirectoryEmptier::reportOfManyFailures()
{
    // The report has the first of the entries that cannot be removed, and how many there are.
    makeTree(m_top, {"directory/"});
    makeFiles(m_top, 10);
    makeFiles(m_top + "/directory", 10);
    QByteArray first;
    SystemCalls::hooks().unlinkat = [&](int directory, const char *entry, int) {
        const bool isFirst = first.isEmpty();
        if (isFirst) {
            first = (nameOf(directory) + '/' + entry).mid(m_top.size() + 1);
        }
        errno = isFirst ? EIO : EBUSY;
        return -1;
    };
    const Leftovers left = emptyAndReport(m_top);
    QCOMPARE(QByteArray(left.first.c_str()), first);
    QCOMPARE(left.error, EIO);
    QCOMPARE(left.count, size_t(20));

    // A long path is cut.
    SystemCalls::hooks() = {};
    QVERIFY(empty(m_top));
    const QByteArray name(255, 'n');
    makeChain(m_top, 20, name);
    failRemovalOf(name, EIO);
    QCOMPARE(emptyAndReport(m_top).first.c_str(), (name + '/').repeated(16).constData());
}

void tst_DirectoryEmptier::directoryThatDoesNotOpen()
{
    makeTree(m_top, {"empty/", "full/file"});
    makeFiles(m_top, 5);
    QByteArrayList attempted;
    collectRemovedDirectories(&attempted);
    SystemCalls::hooks().openat = [](int, const char *, int) {
        errno = EACCES;
        return -1;
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
    makeTree(m_top, {"unreadable/file"});
    makeFiles(m_top, 5);
    // A read error in a directory of the card makes its removal fail. In the top directory, it
    // counts as the end of the listing.
    for (const bool inTop : {false, true}) {
        SystemCalls::hooks().readdir = [=](DIR *directory) -> dirent * {
            if (inTop || nameOf(dirfd(directory)).endsWith("/unreadable")) {
                errno = EIO;
                return nullptr;
            }
            return SystemCalls::real().readdir(directory);
        };
        QCOMPARE(empty(m_top), inTop);
        SystemCalls::hooks() = {};
        QCOMPARE(listAll(m_top), (QByteArrayList{"unreadable", "unreadable/file"}));
    }
}

void tst_DirectoryEmptier::directoryOfNoKnownDevice()
{
    // Without it the walk would not know where the card ends.
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
    NEEDS_MOUNTS(*m_files)
    const QByteArray mounted = m_top + "/directory/mounted";
    makeTree(m_top, {"directory/mounted/"});
    makeFiles(m_top, 5);
    makeFiles(m_top + "/directory", 5);
    QCOMPARE(mount("tmpfs", mounted.constData(), "tmpfs", 0, nullptr), 0);
    makeTree(mounted, {"file", "inner/"});
    const Leftovers leftovers = emptyAndReport(m_top);
    const QByteArrayList left = listAll(m_top);
    QCOMPARE(umount(mounted.constData()), 0);
    QCOMPARE(leftovers.first.c_str(), "directory/mounted");
    QCOMPARE(leftovers.error, EXDEV);
    QCOMPARE(left,
             (QByteArrayList{"directory", "directory/mounted", "directory/mounted/file",
                             "directory/mounted/inner"}));
}

void tst_DirectoryEmptier::bindMountInside()
{
    NEEDS_MOUNTS(*m_files)
    // The mounted directory is on the same device, so its content is on the card.
    const QByteArray mounted = m_top + "/mounted";
    const QByteArray other = m_top + "/other";
    makeTree(m_top, {"mounted/", "other/"});
    QCOMPARE(mount(other.constData(), mounted.constData(), nullptr, MS_BIND, nullptr), 0);
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
    QTest::newRow("after its type was read") << QByteArray("../outside/directory") << true;
}

void tst_DirectoryEmptier::directoryBecomesLink()
{
    QFETCH(const QByteArray, target);
    QFETCH(const bool, unknownType);
    makeTree(m_top, {"victim/a", "victim/b", "victim/c"});
    makeFiles(m_top, 5);
    if (unknownType) {
        listWithoutTypes();
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

void tst_DirectoryEmptier::entriesThatChange()
{
    const auto check = [this](const QByteArrayList &entries, const QByteArray &trigger,
                              const std::function<void()> &change, const QByteArrayList &left) {
        makeTree(m_top, entries);
        makeFiles(m_top, 5);
        beforeRemovalOf(trigger, change);
        QVERIFY(!empty(m_top));
        QCOMPARE(listAll(m_top), left);
        QVERIFY(empty(m_top));
    };
    // The walk is already in the directory that is replaced.
    check({"victim/trigger"}, "trigger",
          [this] {
              rename(m_top + "/victim", m_outside + "/moved");
              makeLink(m_top + "/victim", "..");
          },
          {"victim"});
    check({"file", "other"}, "file",
          [this] {
              unlink((m_top + "/file").constData());
              makeDirectory(m_top + "/file");
          },
          {"file"});
    // The call failed, whatever the reason: this walk has not removed the entry.
    check({"directory/trigger"}, "trigger",
          [this] { unlink((m_top + "/directory/trigger").constData()); }, {"directory"});
}

void tst_DirectoryEmptier::directoryMovedOutNearby()
{
    // The directories above are still open: their entries are removed.
    makeDeepTree(m_top, 10);
    makeFile(chainPath(m_top, 8) + "/trigger");
    beforeRemovalOf("trigger", [&] { rename(chainPath(m_top, 5), m_outside + "/moved"); });
    QVERIFY(!empty(m_top));
    // d/d/d/d was left when its entry could not be removed.
    QCOMPARE(listAll(m_top), (QByteArrayList{"d", "d/d", "d/d/d", "d/d/d/d"}));
}

void tst_DirectoryEmptier::directoriesMovedOutFarDown_data()
{
    QTest::addColumn<int>("lower");
    QTest::addColumn<int>("higher");

    // No directory above this one is open any more, and its ".." leads outside: the walk follows
    // its path again from the top.
    QTest::newRow("one") << 20 << 0;
    // The walk returns to the directory above the higher one.
    QTest::newRow("two") << 40 << 10;
}

void tst_DirectoryEmptier::directoriesMovedOutFarDown()
{
    QFETCH(const int, lower);
    QFETCH(const int, higher);
    makeDeepTree(m_top, deep, [&] {
        rename(chainPath(m_top, lower), m_outside + "/moved");
        if (higher > 0) {
            rename(chainPath(m_top, higher), m_outside + "/movedToo");
        }
    });
    makeBait();
    QCOMPARE(emptyAndReport(m_top).error, ENOENT);
    const int depth = (higher > 0 ? higher : lower) - 1;
    const QByteArrayList left = listAll(m_top);
    QCOMPARE(left.size(), depth);
    QCOMPARE(m_top + '/' + left.last(), chainPath(m_top, depth));
    QCOMPARE(list(m_outside + "/moved"), QByteArrayList());
    if (higher > 0) {
        // The directories between the two are outside the card now and are not removed.
        QVERIFY(exists(chainPath(m_outside + "/movedToo", lower - higher - 1)));
    }
}

void tst_DirectoryEmptier::pathMovedOutAndReplaced_data()
{
    QTest::addColumn<bool>("full");

    QTest::newRow("by a full directory") << true;
    QTest::newRow("by an empty directory") << false;
}

void tst_DirectoryEmptier::pathMovedOutAndReplaced()
{
    QFETCH(const bool, full);
    // Another directory has taken the name of a parent: it was not listed and is not entered.
    const QByteArray other = m_files->path("other");
    makeDirectory(other);
    if (full) {
        makeDeepTree(other, 30);
    }
    const int size = listAll(other).size();
    makeDeepTree(m_top, deep, [&] {
        rename(chainPath(m_top, 30), m_outside + "/moved");
        rename(chainPath(m_top, 20), m_outside + "/movedToo");
        rename(other, chainPath(m_top, 20));
    });
    makeBait();
    QVERIFY(!empty(m_top));
    QCOMPARE(listAll(chainPath(m_top, 20)).size(), size);
    QCOMPARE(listAll(m_top).size(), 20 + size);
}

void tst_DirectoryEmptier::descriptorsAfterDetour()
{
    // After the walk has followed its path from the top, it keeps as many open as before.
    makeDeepTree(m_top, deep, [&] {
        rename(chainPath(m_top, 90), m_outside + "/moved");
        // Puts new deep trees into the directories that the walk still has to remove there.
        for (const char *const side : {"/aDirectory", "/zDirectory"}) {
            const QByteArray directory = chainPath(m_top, 89) + side;
            if (exists(directory)) {
                makeChain(directory, 200);
            }
        }
    });
    const CallCounter counter;
    QVERIFY(!empty(m_top));
    QCOMPARE(listAll(m_top).size(), 89);
    QCOMPARE(counter.openDescriptors, maxOpenDescriptors);
}

void tst_DirectoryEmptier::raceOfDirectoriesAndLinks()
{
    const auto swap = [](const QByteArray &one, const QByteArray &other) {
        return [=] {
            renameat2(AT_FDCWD, one.constData(), AT_FDCWD, other.constData(), RENAME_EXCHANGE);
        };
    };
    const QByteArray link = m_outside + "/link";
    for (int run = 0; run < races; ++run) {
        makeVictims(m_top);
        makeLink(link, m_outside);
        emptyDuring(m_top,
                    {swap(m_top + "/directory5/victim", link),
                     swap(m_top + "/directory2", m_top + "/directory7/victim")});
        checkOutside();
        QVERIFY(!QTest::currentTestFailed());
        // Undisturbed, everything is removed.
        QVERIFY(empty(m_top));
        if (unlink(link.constData()) != 0) {
            removeDirectory(link);
        }
    }
}

void tst_DirectoryEmptier::raceOfMovedDirectories()
{
    const auto moveOutAndBack = [](const QByteArray &inside, const QByteArray &outside) {
        return [=] {
            ::rename(inside.constData(), outside.constData());
            ::rename(outside.constData(), inside.constData());
        };
    };
    for (int run = 0; run < races; ++run) {
        makeChain(m_top, 90);
        makeFiles(chainPath(m_top, 90), 200);
        emptyDuring(m_top,
                    {moveOutAndBack(chainPath(m_top, 80), m_outside + "/moved"),
                     moveOutAndBack(chainPath(m_top, 10), m_outside + "/movedToo")});
        checkOutside();
        QVERIFY(!QTest::currentTestFailed());
        QVERIFY(empty(m_top));
        removeDirectory(m_outside + "/moved");
        removeDirectory(m_outside + "/movedToo");
    }
}

void tst_DirectoryEmptier::raceOfMounts()
{
    NEEDS_MOUNTS(*m_files)
    const ScratchFileSystem otherDevice;
    const QByteArray other = otherDevice.path("other");
    makeTree(other, {"directory/"});
    makeFiles(other + "/directory", 20);
    makeFiles(other, 20);
    const QByteArrayList before = listAll(other);
    const auto mountAndUnmount = [&other](const QByteArray &mountPoint) {
        return [=] {
            mount(other.constData(), mountPoint.constData(), nullptr, MS_BIND, nullptr);
            umount2(mountPoint.constData(), MNT_DETACH);
        };
    };
    const QByteArrayList mountPoints{m_top + "/directory2", m_top + "/directory7/victim"};
    for (int run = 0; run < races; ++run) {
        makeVictims(m_top);
        emptyDuring(m_top, {mountAndUnmount(mountPoints[0]), mountAndUnmount(mountPoints[1])});
        for (const QByteArray &mountPoint : mountPoints) {
            while (umount2(mountPoint.constData(), MNT_DETACH) == 0) { }
        }
        QCOMPARE(listAll(other), before);
        QVERIFY(empty(m_top));
    }
}

QTEST_GUILESS_MAIN(tst_DirectoryEmptier)

#include "tst_directoryemptier.moc"
