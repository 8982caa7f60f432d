// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

/*
    Removes all files from a card, and compares that with `rm -rf`, with std::filesystem and with only
    the unlinkat() calls on a tree that was listed beforehand, on tmpfs and (as root) on ext4.

    rm sorts directories of more than 10,000 entries by inode, which spares ext4 much work; the remover
    keeps directory order. On ext4, such a directory is therefore compared with busybox's rm, which also
    keeps that order.

    Each program removes a new tree of its own that is already written to the file system. The time
    that a program takes for an empty directory is subtracted from its times, so that its start does
    not count.

    All of this happens in a mount namespace of this process. However the process ends, nothing
    stays mounted and no loop device stays in use.
*/

#include "memorycard/fileremover.h"
#include "rounds.h"

#include <QByteArray>
#include <QString>
#include <QThreadPool>
#include <QVector>

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <functional>
#include <memory>

#include <dirent.h>
#include <fcntl.h>
#include <sched.h>
#include <spawn.h>
#include <sys/mount.h>
#include <sys/prctl.h>
#include <sys/ptrace.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

constexpr int rounds = 5;
constexpr int smallStackSize = 256 * 1024;

// How far a removal may be above its usual time.
constexpr double factor = 1.10;
constexpr double barOfCallsFlat = 1.01;
constexpr double barOfCallsNested = 1.10;
constexpr double barOfMemory = 8.0; // MiB
constexpr int barOfOpenFiles = 16;

constexpr char measureOption[] = "--measure";

[[noreturn]] void die(const char *what)
{
    std::fprintf(stderr, "bench_fileremover: %s: %s\n", what, std::strerror(errno));
    std::exit(2);
}

int require(int result, const char *what)
{
    if (result < 0) {
        die(what);
    }
    return result;
}

int makeDirectory(int parent, const QByteArray &name)
{
    require(mkdirat(parent, name.constData(), 0700), "mkdirat");
    return require(openat(parent, name.constData(), O_RDONLY | O_DIRECTORY | O_CLOEXEC), "openat");
}

QByteArray photoName(int index)
{
    return "IMG_20260712_" + QByteArray::number(index).rightJustified(6, '0') + ".jpg";
}

void makeFiles(int directory, int count)
{
    for (int i = 0; i < count; ++i) {
        const int fd = require(openat(directory, photoName(i).constData(),
                                      O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0600),
                               "openat");
        close(fd);
    }
}

void makeDirectories(int top, int directories, int files)
{
    for (int i = 0; i < directories; ++i) {
        const int directory = makeDirectory(top, QByteArray::number(100 + i) + "MEDIA");
        makeFiles(directory, files);
        close(directory);
    }
}

struct Tree {
    const char *name;
    int entries;
    double barOfCalls; // into the kernel, per entry
    std::function<void(int)> make;
    bool isLarge = false; // for rm: more than 10,000 entries in one directory
};

const QVector<Tree> &trees()
{
    static const QVector<Tree> all = {
        {"100,000 files in one directory", 100000, barOfCallsFlat,
         [](int top) { makeFiles(top, 100000); }, true},
        {"900 directories of 110 files", 99900, barOfCallsNested,
         [](int top) { makeDirectories(top, 900, 110); }},
    };
    return all;
}

QByteArray treePath(const QByteArray &parent)
{
    return parent + "/tree";
}

// Makes a new tree and writes it out, so that its removal does not include work from its creation.
QByteArray makeTree(const QByteArray &parent, const Tree &tree)
{
    const int directory =
        require(open(parent.constData(), O_RDONLY | O_DIRECTORY | O_CLOEXEC), "open");
    const int top = makeDirectory(directory, "tree");
    tree.make(top);
    syncfs(top);
    close(top);
    close(directory);
    return treePath(parent);
}

void removeWithRemover(const QByteArray &path)
{
    if (!FileRemover::removeAllEntries(QString::fromUtf8(path)) || rmdir(path.constData()) != 0) {
        die("the remover left something");
    }
}

void removeWith(QVector<QByteArray> command, const QByteArray &path)
{
    command.append(path);
    std::vector<char *> arguments;
    for (QByteArray &argument : command) {
        arguments.push_back(argument.data());
    }
    arguments.push_back(nullptr);
    pid_t pid = 0;
    int status = 0;
    if (posix_spawnp(&pid, arguments[0], nullptr, nullptr, arguments.data(), environ) != 0
        || waitpid(pid, &status, 0) != pid || status != 0) {
        die(arguments[0]);
    }
}

void removeWithStandardLibrary(const QByteArray &path)
{
    std::filesystem::remove_all(path.constData());
}

// A tree that was listed, so that its removal consists only of calls into the kernel.
class BareCalls
{
public:
    explicit BareCalls(const QByteArray &path) : m_path(path)
    {
        m_directories.append(require(open(path.constData(), O_RDONLY | O_DIRECTORY), "open"));
        list(m_directories.first());
    }
    ~BareCalls()
    {
        for (const int directory : qAsConst(m_directories)) {
            close(directory);
        }
    }
    Q_DISABLE_COPY_MOVE(BareCalls)

    void remove() const
    {
        for (const Removal &removal : m_removals) {
            require(unlinkat(removal.directory, removal.name.constData(), removal.flags),
                    "unlinkat");
        }
        require(rmdir(m_path.constData()), "rmdir");
    }

private:
    struct Removal {
        int directory;
        QByteArray name;
        int flags;
    };

    void list(int directory)
    {
        DIR *const entries = fdopendir(require(dup(directory), "dup"));
        while (const dirent *entry = readdir(entries)) {
            const QByteArray name(entry->d_name);
            if (name == "." || name == "..") {
                continue;
            }
            if (entry->d_type != DT_DIR) {
                m_removals.append({directory, name, 0});
                continue;
            }
            const int below =
                require(openat(directory, name.constData(), O_RDONLY | O_DIRECTORY), "openat");
            m_directories.append(below);
            list(below);
            m_removals.append({directory, name, AT_REMOVEDIR});
        }
        closedir(entries);
    }

    QByteArray m_path;
    QVector<Removal> m_removals;
    QVector<int> m_directories;
};

// Subtracts the time that a program takes for an empty directory.
void subtract(const Rounds::Times &start, Rounds::Times *times)
{
    const auto median = [&start](double Rounds::Time::*clock) {
        std::vector<double> values;
        for (const Rounds::Time &time : start) {
            values.push_back(time.*clock);
        }
        std::nth_element(values.begin(), values.begin() + rounds / 2, values.end());
        return values[rounds / 2];
    };
    for (Rounds::Time &time : *times) {
        time.wall -= median(&Rounds::Time::wall);
        time.processor -= median(&Rounds::Time::processor);
    }
}

bool compareTimes(const QByteArray &parent, const char *fileSystem, const Tree &tree,
                  bool sortingHelps)
{
    const bool sorted = sortingHelps && tree.isLarge;
    const QByteArray path = treePath(parent);
    const auto make = [&] { makeTree(parent, tree); };
    const auto makeNothing = [&] { makeTree(parent, {"nothing", 0, 0, [](int) {}}); };
    const QVector<QByteArray> command =
        sorted ? QVector<QByteArray>{"busybox", "rm", "-rf"} : QVector<QByteArray>{"rm", "-rf"};
    const auto removeWithCommand = [&] { removeWith(command, path); };
    std::unique_ptr<BareCalls> bareCalls;
    std::vector<Rounds::Work> works = {
        {[&] { removeWithRemover(path); }, make},
        {removeWithCommand, make},
        {removeWithCommand, makeNothing},
        {[&] { bareCalls->remove(); },
         [&] {
             bareCalls.reset();
             make();
             bareCalls = std::make_unique<BareCalls>(path);
         }},
        {[&] { removeWithStandardLibrary(path); }, make},
    };
    // Each round makes new trees, which takes longer than anything else and warms up enough.
    auto times = Rounds::times(works, rounds, Rounds::WarmUp::No);
    subtract(times[2], &times[1]);

    const QByteArray work = QByteArray("remove ") + tree.name + ", " + fileSystem;
    const auto report = [&](const char *beside, std::size_t index) {
        return Rounds::report(work, beside, times[0], times[index], factor, &Rounds::Time::wall);
    };
    bool kept = report(sorted ? "busybox rm -rf" : "rm -rf", 1);
    kept &= report("bare calls", 3);
    kept &= report("std::filesystem::remove_all", 4);
    return kept;
}

// Traces a child while it removes a tree. Counts its system calls, as strace -c does, and its open
// files.
void countCalls(const QByteArray &path, long &calls, long &openFiles)
{
    const pid_t child = require(fork(), "fork");
    if (child == 0) {
        ptrace(PTRACE_TRACEME, 0, nullptr, nullptr);
        raise(SIGSTOP);
        _exit(FileRemover::removeAllEntries(QString::fromUtf8(path)) ? 0 : 1);
    }
    int status = 0;
    waitpid(child, &status, 0);
    require(static_cast<int>(ptrace(PTRACE_SETOPTIONS, child, nullptr,
                                    PTRACE_O_TRACESYSGOOD | PTRACE_O_EXITKILL)),
            "ptrace");
    calls = -1; // the exit
    openFiles = 0;
    long number = -1;
    while (true) {
        ptrace(PTRACE_SYSCALL, child, nullptr, nullptr);
        waitpid(child, &status, 0);
        if (!WIFSTOPPED(status)) {
            break;
        }
        if (WSTOPSIG(status) != (SIGTRAP | 0x80)) {
            continue;
        }
        __ptrace_syscall_info info = {};
        ptrace(PTRACE_GET_SYSCALL_INFO, child, sizeof(info), &info);
        if (info.op == PTRACE_SYSCALL_INFO_ENTRY) {
            ++calls;
            number = static_cast<long>(info.entry.nr);
        } else if (number == SYS_openat && info.exit.rval >= 0) {
            // The kernel returns the lowest free descriptor, and this program closes what it opens.
            openFiles = std::max(openFiles, static_cast<long>(info.exit.rval) + 1);
        }
    }
    if (!WIFEXITED(status) || WEXITSTATUS(status) != 0) {
        die("the traced remover failed");
    }
}

long statusValue(const char *key)
{
    long value = -1;
    char line[256];
    FILE *const file = std::fopen("/proc/self/status", "re");
    while (file && std::fgets(line, sizeof(line), file)) {
        if (std::strncmp(line, key, std::strlen(key)) == 0) {
            value = std::strtol(line + std::strlen(key), nullptr, 10);
        }
    }
    if (file) {
        std::fclose(file);
    }
    return value;
}

// Removes a tree on a pool thread with a small stack, in a process of its own. Prints the largest growth
// of the memory in use, in KiB.
int measure(const QByteArray &path)
{
    QThreadPool pool;
    pool.setStackSize(smallStackSize);
    pool.start([] {});
    pool.waitForDone();
    const int resetPeak =
        require(open("/proc/self/clear_refs", O_WRONLY | O_CLOEXEC), "clear_refs");
    require(static_cast<int>(write(resetPeak, "5", 1)), "clear_refs");
    close(resetPeak);
    const long idle = statusValue("VmRSS:");
    bool removed = false;
    pool.start([&] { removed = FileRemover::removeAllEntries(QString::fromUtf8(path)); });
    pool.waitForDone();
    std::printf("%ld\n", statusValue("VmHWM:") - idle);
    return removed ? 0 : 1;
}

double peakMemory(const QByteArray &path)
{
    const QByteArray command =
        "/proc/" + QByteArray::number(getpid()) + "/exe " + measureOption + ' ' + path;
    FILE *const output = popen(command.constData(), "re");
    long growth = -1;
    if (!output || std::fscanf(output, "%ld", &growth) != 1 || pclose(output) != 0) {
        die("the measured remover failed");
    }
    return static_cast<double>(growth) / 1024;
}

bool countAndMeasure(const QByteArray &parent, const Tree &tree)
{
    long calls = 0;
    long openFiles = 0;
    const QByteArray path = makeTree(parent, tree);
    countCalls(path, calls, openFiles);
    require(rmdir(path.constData()), "rmdir");
    const double memory = peakMemory(makeTree(parent, tree));
    require(rmdir(path.constData()), "rmdir");

    const QByteArray work = QByteArray("remove ") + tree.name;
    bool kept = Rounds::reportFigure(work, "calls into the kernel, per entry",
                                     static_cast<double>(calls) / tree.entries, tree.barOfCalls);
    kept &= Rounds::reportFigure(work, "MiB above the idle process", memory, barOfMemory);
    kept &=
        Rounds::reportFigure(work, "open files", static_cast<double>(openFiles), barOfOpenFiles);
    return kept;
}

void write(const char *path, const QByteArray &text)
{
    const int fd = require(open(path, O_WRONLY | O_CLOEXEC), path);
    require(static_cast<int>(::write(fd, text.constData(), static_cast<size_t>(text.size()))),
            path);
    close(fd);
}

// Enters a new mount namespace. Users other than root become root in a new user namespace.
void enterNamespace()
{
    const uid_t uid = getuid();
    const gid_t gid = getgid();
    require(unshare(CLONE_NEWNS | (uid == 0 ? 0 : CLONE_NEWUSER)), "unshare");
    if (uid != 0) {
        write("/proc/self/setgroups", "deny");
        write("/proc/self/uid_map", "0 " + QByteArray::number(uid) + " 1");
        write("/proc/self/gid_map", "0 " + QByteArray::number(gid) + " 1");
    }
    require(mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr), "mount");
}

void run(const char *command)
{
    if (std::system(command) != 0) {
        die(command);
    }
}

} // namespace

int main(int argc, char **argv)
{
    if (argc == 3 && std::strcmp(argv[1], measureOption) == 0) {
        return measure(argv[2]);
    }
    const bool root = getuid() == 0;
    rlimit files = {};
    getrlimit(RLIMIT_NOFILE, &files);
    files.rlim_cur = files.rlim_max;
    setrlimit(RLIMIT_NOFILE, &files);

    enterNamespace();
    const QByteArray base = "/mnt";
    require(mount("tmpfs", base.constData(), "tmpfs", 0, "mode=700,size=80%,nr_inodes=0"), "tmpfs");
    require(chdir(base.constData()), "chdir");
    const QByteArray tmpfs = base + "/tmpfs";
    require(mkdir(tmpfs.constData(), 0700), "mkdir");

    bool kept = true;
    for (const Tree &tree : trees()) {
        kept &= compareTimes(tmpfs, "tmpfs", tree, false);
    }
    if (root) {
        const QByteArray ext4 = base + "/ext4";
        require(mkdir(ext4.constData(), 0700), "mkdir");
        run("truncate -s 2G image && mkfs.ext4 -q -N 400000 image && mount -o loop image ext4");
        for (const Tree &tree : trees()) {
            kept &= compareTimes(ext4, "ext4", tree, true);
        }
        run("umount ext4");
    } else {
        std::fprintf(stderr, "ext4: not measured, only root may mount an image\n");
    }
    for (const Tree &tree : trees()) {
        kept &= countAndMeasure(tmpfs, tree);
    }
    return kept ? 0 : 1;
}
