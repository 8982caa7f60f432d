// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The input is a tree, and the changes to it while it is removed.

#include "files/filedescriptor.h"
#include "fuzzing.h"
#include "isolatedthread.h"
#include "memorycard/directoryemptier.h"
#include "systemcalls.h"

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <map>
#include <string>
#include <tuple>
#include <vector>

#include <dirent.h>
#include <fcntl.h>
#include <ftw.h>
#include <sys/mount.h>
#include <unistd.h>

namespace {

const std::string top = "/top"; // is emptied
const std::string outside = "/outside";
const std::string aside = outside + "/aside"; // takes what is moved out of the top
const std::string other = "/other"; // another file system
// These files must survive. No link in a tree leads to a directory with the names that are used in trees,
// because the events that change a tree must not change these files. A walk that continues in a
// wrong directory meets the last four.
const std::vector<std::string> keptFiles = {
    outside + "/x", outside + "/y/x", outside + "/y/z/x", other + "/x", other + "/y/x",
    aside + "/a",   aside + "/b",     aside + "/c",       aside + "/d",
};
const std::vector<std::string> keptDirectories = {outside, outside + "/y", outside + "/y/z",
                                                  aside,   other,          other + "/y"};

constexpr size_t maximumNodes = 400;
constexpr size_t maximumLength = 1000; // of a path
constexpr int maximumEvents = 8;
// A walk over so few nodes needs fewer calls.
constexpr int tooManyCalls = 100000;
// The maximum number of descriptors that the walk may hold open.
constexpr int maximumOpen = 12;

const char *const hostileNames[] = {"..", ".", "../outside/x", "/outside/x", "../outside",
                                    "",   "a/"};
const int errors[] = {EIO, ENOENT, EACCES, EINTR, ENOMEM, ENOTDIR, ELOOP, EMFILE};

void touch(const std::string &path)
{
    const int fd = open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0600);
    if (fd >= 0) {
        close(fd);
    }
}

void makeWorld()
{
    mkdir(other.c_str(), 0700);
    Fuzzing::require(mount("tmpfs", other.c_str(), "tmpfs", 0, "mode=700") == 0, "it can mount");
    for (const std::string &directory : keptDirectories) {
        mkdir(directory.c_str(), 0700);
    }
}

void touchAll()
{
    for (const std::string &file : keptFiles) {
        touch(file);
    }
}

void clear(const std::string &directory)
{
    const auto removeOne = [](const char *path, const struct stat *, int, struct FTW *place) {
        if (place->level > 0) {
            std::remove(path);
        }
        return 0;
    };
    nftw(directory.c_str(), removeOne, 20, FTW_DEPTH | FTW_PHYS | FTW_MOUNT);
}

// A number above all descriptors that the next count calls of open() return.
int beyond(int count)
{
    int fd = 0;
    while (count > 0) {
        count -= fcntl(fd++, F_GETFD) < 0 ? 1 : 0;
    }
    return fd;
}

bool isEmpty(const std::string &directory)
{
    DIR *const stream = opendir(directory.c_str());
    int count = 0;
    while (readdir(stream) != nullptr) {
        ++count;
    }
    closedir(stream);
    return count == 2;
}

class World
{
public:
    explicit World(Bytes input) : m_input(std::move(input)) { }

    const char *run()
    {
        makeTree();
        readEvents();
        const bool isQuiet = m_events.empty();
        const int lowest = dup(STDERR_FILENO);
        close(lowest);
        static const int limit = beyond(maximumOpen);
        m_limit = limit;
        const int directory = open(top.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
        takeCalls();
        const bool emptied = emptyDirectory(FileDescriptor(directory)).count == 0;
        SystemCalls::hooks() = {};
        takeMountsOff();

        const int lowestNow = dup(STDERR_FILENO);
        close(lowestNow);
        if (lowestNow != lowest) {
            m_failure = "every descriptor is closed";
        }
        const auto isThere = [](const std::string &path) {
            return access(path.c_str(), F_OK) == 0;
        };
        if (!std::all_of(keptFiles.cbegin(), keptFiles.cend(), isThere)) {
            m_failure = "nothing outside is lost";
        }
        if (isQuiet && (!emptied || !isEmpty(top))) {
            m_failure = "what nobody disturbs is emptied";
        }
        clear(top);
        clear(aside);
        return m_failure;
    }

private:
    enum Happening {
        MoveOut,
        Exchange,
        ReplaceByLink,
        Add,
        Remove,
        Mount,
        Fail,
        List,
        Untype,
        Count
    };
    struct Event {
        int happening;
        size_t node;
        size_t other;
        int argument;
    };

    void addNode(const std::string &path) { m_nodes.push_back(path); }

    void makeTree()
    {
        std::vector<std::string> way = {top};
        touchAll();
        mkdir(top.c_str(), 0700); // may have been moved away
        addNode(top);
        while (!m_input.atEnd() && m_nodes.size() < maximumNodes) {
            const int byte = m_input.takeByte();
            const std::string name(1, char('a' + byte / 16 % 4));
            const std::string path = way.back() + '/' + name;
            switch (byte % 8) {
            case 0:
                if (path.size() < maximumLength && mkdir(path.c_str(), 0700) == 0) {
                    addNode(path);
                    way.push_back(path);
                }
                break;
            case 1:
                if (way.size() > 1) {
                    way.pop_back();
                }
                break;
            case 2:
                touch(path);
                addNode(path);
                break;
            case 3:
                if (symlink((byte < 128 ? outside : outside + "/x").c_str(), path.c_str()) == 0) {
                    addNode(path);
                }
                break;
            case 4:
                makeChain(&way, name);
                break;
            case 5:
                if (link((outside + "/x").c_str(), path.c_str()) == 0) {
                    addNode(path);
                }
                break;
            case 6:
                if (mkfifo(path.c_str(), 0600) == 0) {
                    addNode(path);
                }
                break;
            default:
                return;
            }
        }
    }

    // Makes a chain of directories, which may be so deep that the walk closes and reopens some. Either
    // each directory has a file, or none has.
    void makeChain(std::vector<std::string> *way, const std::string &name)
    {
        const int byte = m_input.takeByte();
        std::string path = way->back();
        for (int i = byte % 80; i > 0 && path.size() < maximumLength; --i) {
            if (byte >= 128) {
                // The file is older than the directory, so it is listed after the directory.
                touch(path + "/d");
            }
            path += '/' + name;
            if (mkdir(path.c_str(), 0700) != 0) {
                break;
            }
            addNode(path);
            way->push_back(path);
        }
    }

    void readEvents()
    {
        for (int i = 0; i < maximumEvents && !m_input.atEnd(); ++i) {
            const int call = m_input.takeByte() + 256 * (m_input.takeByte() % 4);
            const int happening = m_input.takeByte() % Count;
            const size_t node = m_input.takeByte() % m_nodes.size();
            const size_t another = m_input.takeByte() % m_nodes.size();
            m_events.insert({call, {happening, node, another, m_input.takeByte()}});
        }
    }

    void takeCalls()
    {
        SystemCalls &hooks = SystemCalls::hooks();
        const SystemCalls &real = SystemCalls::real();
        hooks.openat = [this, &real](int directory, const char *name, int flags) {
            if (happens()) {
                return -1;
            }
            const int fd = real.openat(directory, name, flags);
            if (fd >= m_limit) {
                m_failure = "it holds no more open than it says";
            }
            return fd;
        };
        hooks.unlinkat = [this, &real](int directory, const char *name, int flags) {
            return happens() ? -1 : real.unlinkat(directory, name, flags);
        };
        hooks.fstat = [this, &real](int fd, struct stat *info) {
            return happens() ? -1 : real.fstat(fd, info);
        };
        hooks.fstatat = [this, &real](int directory, const char *name, struct stat *info,
                                      int flags) {
            return happens() ? -1 : real.fstatat(directory, name, info, flags);
        };
        hooks.readdir = [this, &real](DIR *directory) -> dirent * {
            if (happens()) {
                return nullptr;
            }
            return disguise(real.readdir(directory));
        };
    }

    // Makes the changes that are due before the next call. Returns whether that call fails.
    bool happens()
    {
        Fuzzing::require(++m_calls < tooManyCalls, "the walk comes to an end");
        bool fails = false;
        const auto due = m_events.equal_range(m_calls);
        for (auto event = due.first; event != due.second; ++event) {
            fails = happen(event->second) || fails;
        }
        return fails;
    }

    bool happen(const Event &event)
    {
        // The node may be gone, or another one may have its name.
        const std::string &node = m_nodes[event.node];
        const std::string &another = m_nodes[event.other];
        const std::string moved = aside + '/' + std::to_string(m_calls);
        switch (event.happening) {
        case MoveOut:
            rename(node.c_str(), moved.c_str());
            break;
        case Exchange:
            renameat2(AT_FDCWD, node.c_str(), AT_FDCWD, another.c_str(),
                      event.argument % 2 == 0 ? RENAME_EXCHANGE : 0);
            break;
        case ReplaceByLink:
            if (node != top && rename(node.c_str(), moved.c_str()) == 0) {
                std::ignore = symlink((outside + "/y").c_str(), node.c_str());
            }
            break;
        case Add:
            touch(node + "/new");
            mkdir((node + "/newer").c_str(), 0700);
            break;
        case Remove:
            std::remove(node.c_str());
            break;
        case Mount:
            // Rarely, because the kernel takes long to unmount.
            if (event.argument % 16 == 0) {
                putMount(node);
            }
            break;
        case Fail:
            errno = errors[size_t(event.argument) % std::size(errors)];
            return true;
        case List:
            m_listed = hostileNames[size_t(event.argument) % std::size(hostileNames)];
            break;
        default:
            m_untyped = !m_untyped;
        }
        return false;
    }

    // Mounts the other file system on a directory, unless it is already mounted.
    void putMount(const std::string &node)
    {
        if (m_mount < 0 && node != top
            && mount(other.c_str(), node.c_str(), nullptr, MS_BIND, nullptr) == 0) {
            m_mount = SystemCalls::real().openat(AT_FDCWD, node.c_str(),
                                                 O_PATH | O_DIRECTORY | O_CLOEXEC);
            // A high number, so that the count of open descriptors does not include it.
            const int away = fcntl(m_mount, F_DUPFD_CLOEXEC, 500);
            close(m_mount);
            m_mount = away;
        }
    }

    void takeMountsOff()
    {
        if (m_mount >= 0) {
            const bool done =
                fchdir(m_mount) == 0 && umount2(".", MNT_DETACH) == 0 && chdir("/") == 0;
            Fuzzing::require(done, "the mount can be taken off");
            close(m_mount);
        }
    }

    // File systems need not report the type of an entry, and broken ones may list any entry.
    dirent *disguise(dirent *entry)
    {
        if (entry && m_untyped) {
            entry->d_type = DT_UNKNOWN;
        }
        if (entry && m_listed != nullptr) {
            // Replaces the real entry, which is then not removed.
            entry->d_type = m_calls % 2 == 0 ? DT_DIR : m_calls % 3 == 0 ? DT_REG : DT_UNKNOWN;
            std::strcpy(entry->d_name, m_listed);
            m_listed = nullptr;
        }
        return entry;
    }

    Bytes m_input;
    std::vector<std::string> m_nodes;
    std::multimap<int, Event> m_events; // by the number of the call that they come before
    int m_calls = 0;
    int m_limit = 0;
    int m_mount = -1;
    bool m_untyped = false;
    const char *m_listed = nullptr;
    const char *m_failure = nullptr;
};

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size)
{
    static IsolatedThread thread;
    static bool made = false;
    const char *const failure = thread.run([&]() -> const char * {
        if (!made) {
            makeWorld();
            made = true;
        }
        return World(Bytes(data, size)).run();
    });
    Fuzzing::require(failure == nullptr, failure);
    return 0;
}
