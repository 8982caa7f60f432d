// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

/*
    The removal of all files from a card, side by side with `rm -rf` and with nothing but the
    unlinkat() calls on a tree that was listed beforehand, on tmpfs and (as root) on ext4.

    In every round each of the three removes a tree of its own, fresh and written out, in shuffled
    order; a figure is the median of the rounds' ratios, with the lowest and the highest, and the
    same of the processor's time, which a busy machine disturbs less. The time that `rm` takes for
    an empty folder is taken off its times, so that its start does not count.

    The exit status is 1 when a bar is clearly missed: a count or a size is above it, or a ratio is,
    in the median and in all rounds but one at most.

    All of it happens in a mount namespace of this process: nothing stays mounted and no loop device
    in use when it ends, however it ends.
*/

#include "fileremover.h"

#include <QByteArray>
#include <QElapsedTimer>
#include <QString>
#include <QThreadPool>
#include <QVector>

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <functional>
#include <random>

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

constexpr int rounds = 7;
constexpr int depth = 50000;
constexpr int smallStackSize = 256 * 1024;
constexpr int photoSize = 16 * 1024;

constexpr double barOfRmOnTmpfs = 1.05;
constexpr double barOfRmOnExt4 = 1.20;
constexpr double barOfBareCalls = 1.20;
constexpr double barOfCallsFlat = 1.01;
constexpr double barOfCallsNested = 1.10;
constexpr double barOfMemory = 8.0; // MiB
constexpr int barOfOpenFiles = 72;

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

int makeFolder(int parent, const QByteArray &name)
{
    require(mkdirat(parent, name.constData(), 0700), "mkdirat");
    return require(openat(parent, name.constData(), O_RDONLY | O_DIRECTORY | O_CLOEXEC), "openat");
}

QByteArray photoName(int index)
{
    return "IMG_20260712_" + QByteArray::number(index).rightJustified(6, '0') + ".jpg";
}

void makeFiles(int folder, int count, int size = 0)
{
    const QByteArray content(size, 'p');
    for (int i = 0; i < count; ++i) {
        const int fd = require(
            openat(folder, photoName(i).constData(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0600),
            "openat");
        require(static_cast<int>(write(fd, content.constData(), static_cast<size_t>(size))),
                "write");
        close(fd);
    }
}

void makeFolders(int top, int folders, int files, int size = 0)
{
    for (int i = 0; i < folders; ++i) {
        const int folder = makeFolder(top, QByteArray::number(100 + i) + "MEDIA");
        makeFiles(folder, files, size);
        close(folder);
    }
}

void makeLinks(int folder, int count)
{
    for (int i = 0; i < count; ++i) {
        require(symlinkat("../elsewhere/photo.jpg", folder, photoName(i).constData()), "symlinkat");
    }
}

void makeChain(int top, int levels)
{
    int folder = dup(top);
    for (int i = 0; i < levels; ++i) {
        const int below = makeFolder(folder, "d");
        close(folder);
        folder = below;
    }
    close(folder);
}

struct Work {
    const char *name;
    int entries;
    double barOfCalls; // into the kernel, per entry; 0 for none
    std::function<void(int)> make;
};

const QVector<Work> &works()
{
    static const QVector<Work> all = {
        {"100,000 files in one folder", 100000, barOfCallsFlat,
         [](int top) { makeFiles(top, 100000); }},
        {"1,000 folders of 100 files", 101000, barOfCallsNested,
         [](int top) { makeFolders(top, 1000, 100); }},
        {"5,000 photos in 20 folders", 5020, barOfCallsNested,
         [](int top) { makeFolders(top, 20, 250, photoSize); }},
        {"200,000 links in one folder", 200000, barOfCallsFlat,
         [](int top) { makeLinks(top, 200000); }},
        {"50,000 folders in each other", depth, 0, [](int top) { makeChain(top, depth); }},
    };
    return all;
}

// A fresh tree, written out, so that nothing of its making is left to do while it is removed.
QByteArray makeTree(const QByteArray &parent, const Work &work)
{
    const QByteArray path = parent + "/tree";
    const int folder =
        require(open(parent.constData(), O_RDONLY | O_DIRECTORY | O_CLOEXEC), "open");
    const int top = makeFolder(folder, "tree");
    work.make(top);
    syncfs(top);
    close(top);
    close(folder);
    return path;
}

// What a removal takes, in milliseconds.
struct Time {
    double wall = 0;
    double processor = 0;
};

double processorTime(const rusage &usage)
{
    const auto milliseconds = [](const timeval &time) {
        return static_cast<double>(time.tv_sec) * 1e3 + static_cast<double>(time.tv_usec) / 1e3;
    };
    return milliseconds(usage.ru_utime) + milliseconds(usage.ru_stime);
}

// Times a function, and what it waits for if that is a child process.
template<typename Function> Time timeOf(int who, Function function)
{
    rusage before = {};
    rusage after = {};
    getrusage(who, &before);
    QElapsedTimer timer;
    timer.start();
    function();
    const double wall = static_cast<double>(timer.nsecsElapsed()) / 1e6;
    getrusage(who, &after);
    return {wall, processorTime(after) - processorTime(before)};
}

Time timeOfRemover(const QByteArray &path)
{
    bool removed = false;
    const Time time = timeOf(
        RUSAGE_SELF, [&] { removed = FileRemover::removeAllEntries(QString::fromUtf8(path)); });
    if (!removed || rmdir(path.constData()) != 0) {
        die("the remover left something");
    }
    return time;
}

Time timeOfRm(const QByteArray &path)
{
    QByteArray program("rm");
    QByteArray option("-rf");
    QByteArray argument(path);
    char *const arguments[] = {program.data(), option.data(), argument.data(), nullptr};
    return timeOf(RUSAGE_CHILDREN, [&] {
        pid_t pid = 0;
        int status = 0;
        if (posix_spawnp(&pid, "rm", nullptr, nullptr, arguments, environ) != 0
            || waitpid(pid, &status, 0) != pid || status != 0) {
            die("rm");
        }
    });
}

struct Removal {
    int folder;
    QByteArray name;
    int flags;
};

void list(int folder, QVector<Removal> &removals, QVector<int> &folders)
{
    DIR *const entries = fdopendir(require(dup(folder), "dup"));
    while (const dirent *entry = readdir(entries)) {
        const QByteArray name(entry->d_name);
        if (name == "." || name == "..") {
            continue;
        }
        if (entry->d_type != DT_DIR) {
            removals.append({folder, name, 0});
            continue;
        }
        const int below =
            require(openat(folder, name.constData(), O_RDONLY | O_DIRECTORY), "openat");
        folders.append(below);
        list(below, removals, folders);
        removals.append({folder, name, AT_REMOVEDIR});
    }
    closedir(entries);
}

Time timeOfBareCalls(const QByteArray &path)
{
    QVector<Removal> removals;
    QVector<int> folders;
    folders.append(require(open(path.constData(), O_RDONLY | O_DIRECTORY), "open"));
    list(folders.first(), removals, folders);
    const Time time = timeOf(RUSAGE_SELF, [&] {
        for (const Removal &removal : qAsConst(removals)) {
            require(unlinkat(removal.folder, removal.name.constData(), removal.flags), "unlinkat");
        }
    });
    for (const int folder : qAsConst(folders)) {
        close(folder);
    }
    require(rmdir(path.constData()), "rmdir");
    return time;
}

double median(QVector<double> values)
{
    std::sort(values.begin(), values.end());
    const int middle = values.size() / 2;
    return values.size() % 2 != 0 ? values[middle] : (values[middle - 1] + values[middle]) / 2;
}

bool everythingHeld = true;

struct Ratios {
    QVector<double> wall;
    QVector<double> processor;

    void append(const Time &time, const Time &reference)
    {
        wall.append(time.wall / reference.wall);
        processor.append(time.processor / reference.processor);
    }
};

// A figure, and what it says about its bar.
void printRatios(const char *than, const Ratios &ratios, double bar)
{
    const auto [lowest, highest] = std::minmax_element(ratios.wall.begin(), ratios.wall.end());
    const auto held =
        std::count_if(ratios.wall.begin(), ratios.wall.end(), [=](double r) { return r <= bar; });
    const double middle = median(ratios.wall);
    const char *verdict = "";
    if (middle > bar && held <= 1) {
        verdict = " MISSED";
        everythingHeld = false;
    } else if (middle > bar) {
        verdict = " over, not clearly";
    }
    std::printf("  %.2f x %s (%.2f-%.2f, bar %.2f%s; processor %.2f)", middle, than, *lowest,
                *highest, bar, verdict, median(ratios.processor));
}

void printCount(const char *format, double value, double bar)
{
    std::printf(format, value, bar, value > bar ? " MISSED" : "");
    everythingHeld = everythingHeld && value <= bar;
}

void compareTimes(const QByteArray &parent, const char *fileSystem, const Work &work,
                  double barOfRm)
{
    // A chain this long cannot be held open, which the bare calls need.
    const bool deep = work.entries == depth;
    const Work nothing = {"nothing", 0, 0, [](int) {}};
    QVector<double> wallOfStart;
    QVector<double> processorOfStart;
    for (int i = 0; i < 2 * rounds; ++i) {
        const Time time = timeOfRm(makeTree(parent, nothing));
        wallOfStart.append(time.wall);
        processorOfStart.append(time.processor);
    }

    std::mt19937 random(std::random_device{}());
    QVector<double> times;
    Ratios overRm;
    Ratios overBareCalls;
    for (int round = 0; round < rounds; ++round) {
        Time remover;
        Time rm;
        Time bareCalls;
        QVector<std::function<void()>> contenders = {
            [&] { remover = timeOfRemover(makeTree(parent, work)); },
            [&] { rm = timeOfRm(makeTree(parent, work)); },
        };
        if (!deep) {
            contenders.append([&] { bareCalls = timeOfBareCalls(makeTree(parent, work)); });
        }
        std::shuffle(contenders.begin(), contenders.end(), random);
        for (const auto &contender : qAsConst(contenders)) {
            contender();
        }
        rm.wall -= median(wallOfStart);
        rm.processor -= median(processorOfStart);
        times.append(remover.wall);
        overRm.append(remover, rm);
        overBareCalls.append(remover, bareCalls);
    }
    std::printf("%-29s %-6s %8.1f ms", work.name, fileSystem, median(times));
    printRatios("rm -rf", overRm, barOfRm);
    if (!deep) {
        printRatios("bare calls", overBareCalls, barOfBareCalls);
    }
    std::printf("\n");
    std::fflush(stdout);
}

// Traces a child while it removes a tree: counts what strace -c counts, and the open files.
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
            // The lowest free descriptor is given out, and this program closes what it opens.
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

// In a process of its own: removes a tree on a pool thread with a small stack, and says by how many
// KiB the memory in use grew at most.
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

void countAndMeasure(const QByteArray &parent, const Work &work)
{
    long calls = 0;
    long openFiles = 0;
    const QByteArray tree = makeTree(parent, work);
    countCalls(tree, calls, openFiles);
    require(rmdir(tree.constData()), "rmdir");
    const double memory = peakMemory(makeTree(parent, work));
    require(rmdir(tree.constData()), "rmdir");

    const double callsPerEntry = static_cast<double>(calls) / work.entries;
    std::printf("%-29s", work.name);
    if (work.barOfCalls > 0) {
        printCount("  %.4f calls an entry (bar %.2f%s)", callsPerEntry, work.barOfCalls);
    } else {
        std::printf("  %.4f calls an entry", callsPerEntry);
    }
    printCount("  %.1f MiB above idle (bar %.0f%s)", memory, barOfMemory);
    printCount("  %.0f open files (bar %.0f%s)\n", static_cast<double>(openFiles), barOfOpenFiles);
    std::fflush(stdout);
}

void write(const char *path, const QByteArray &text)
{
    const int fd = require(open(path, O_WRONLY | O_CLOEXEC), path);
    require(static_cast<int>(::write(fd, text.constData(), static_cast<size_t>(text.size()))),
            path);
    close(fd);
}

// Root in a mount namespace of its own; anybody else is made root in a user namespace first.
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

    for (const Work &work : works()) {
        compareTimes(tmpfs, "tmpfs", work, barOfRmOnTmpfs);
    }
    if (root) {
        const QByteArray ext4 = base + "/ext4";
        require(mkdir(ext4.constData(), 0700), "mkdir");
        run("truncate -s 2G image && mkfs.ext4 -q -N 400000 image && mount -o loop image ext4");
        for (const Work &work : works()) {
            compareTimes(ext4, "ext4", work, barOfRmOnExt4);
        }
        run("umount ext4");
    } else {
        std::printf("ext4: not measured, only root may mount an image\n");
    }
    for (const Work &work : works()) {
        countAndMeasure(tmpfs, work);
    }
    std::printf(everythingHeld ? "no bar was clearly missed\n" : "a bar was missed\n");
    return everythingHeld ? 0 : 1;
}
