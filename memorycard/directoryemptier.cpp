// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "directoryemptier.h"

#include "files/filedescriptor.h"

#include <cerrno>
#include <cstring>
#include <deque>
#include <memory>
#include <utility>

#include <dirent.h>
#include <fcntl.h>
#include <sys/stat.h>

namespace {

// So many directories stay open, from the top down, besides the current one and the one being opened.
// Few trees on a card are deeper.
constexpr std::size_t maxKeptOpen = 10;

// The path of an entry that is left is cut there.
constexpr std::size_t maxPathLength = 4096;

struct CloseDirectory {
    void operator()(DIR *directory) const { closedir(directory); }
};
using OpenDirectory = std::unique_ptr<DIR, CloseDirectory>;

// Null, with errno set, if the descriptor is not open or does not refer to a directory.
OpenDirectory openStream(FileDescriptor fd)
{
    OpenDirectory directory(fd.isOpen() ? fdopendir(fd.get()) : nullptr);
    if (directory) {
        [[maybe_unused]] const int owned = fd.release();
    }
    return directory;
}

struct Directory {
    int fd() const { return dirfd(stream.get()); }

    void list()
    {
        // An error ends the listing, too: what is left in the directory makes its removal fail.
        while (const dirent *entry = readdir(stream.get())) {
            if (std::strcmp(entry->d_name, ".") != 0 && std::strcmp(entry->d_name, "..") != 0) {
                entries += static_cast<char>(entry->d_type);
                entries.append(entry->d_name, std::strlen(entry->d_name) + 1);
            }
        }
    }

    bool atEnd() const { return current == entries.size(); }
    unsigned char type() const { return static_cast<unsigned char>(entries[current]); }
    const char *name() const { return entries.data() + current + 1; }
    void next() { current += 1 + std::strlen(name()) + 1; }

    OpenDirectory stream; // null while closed
    ino_t inode = 0;
    // In directory order, each as a DT_ constant in a byte and a terminated name: as strings they
    // would take three times the memory.
    std::string entries;
    std::size_t current = 0; // in a parent directory: the next directory of the path
    bool emptied = true;
};

class Walk
{
public:
    Leftovers run(FileDescriptor top)
    {
        OpenDirectory stream = openStream(std::move(top));
        struct stat info = {};
        if (!stream || fstat(dirfd(stream.get()), &info) != 0) {
            return {1, {}, errno};
        }
        m_device = info.st_dev;
        enter(std::move(stream), info.st_ino);
        while (true) {
            if (!m_path.back().atEnd()) {
                handleEntry();
            } else if (m_path.size() > 1) {
                leave();
            } else {
                return std::move(m_leftovers);
            }
        }
    }

private:
    static OpenDirectory openIn(const Directory &parent, const char *name)
    {
        return openStream(FileDescriptor(
            openat(parent.fd(), name, O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC)));
    }

    static bool isDirectory(const Directory &parent)
    {
        if (parent.type() != DT_UNKNOWN) {
            return parent.type() == DT_DIR;
        }
        struct stat info = {};
        return fstatat(parent.fd(), parent.name(), &info, AT_SYMLINK_NOFOLLOW) == 0
            && S_ISDIR(info.st_mode);
    }

    void handleEntry()
    {
        const Directory &directory = m_path.back();
        // Such a name leads out of the directory. Not every kernel refuses to list it.
        if (std::strchr(directory.name(), '/')) {
            errno = EINVAL;
            finishEntry(false);
            return;
        }
        if (!isDirectory(directory)) {
            finishEntry(unlinkat(directory.fd(), directory.name(), 0) == 0);
            return;
        }
        OpenDirectory stream = openIn(directory, directory.name());
        if (!stream) {
            finishEntry(unlinkat(directory.fd(), directory.name(), AT_REMOVEDIR) == 0);
            return;
        }
        struct stat info = {};
        if (fstat(dirfd(stream.get()), &info) != 0 || info.st_dev != m_device) {
            errno = EXDEV;
            finishEntry(false);
            return;
        }
        enter(std::move(stream), info.st_ino);
    }

    // A failure has set errno.
    void finishEntry(bool removed)
    {
        Directory &directory = m_path.back();
        if (!removed) {
            noteLeftover(errno);
        }
        directory.emptied = directory.emptied && removed;
        directory.next();
    }

    void noteLeftover(int error)
    {
        if (m_leftovers.count++ > 0) {
            return;
        }
        m_leftovers.error = error;
        for (const Directory &directory : m_path) {
            m_leftovers.first += m_leftovers.first.empty() ? "" : "/";
            m_leftovers.first += directory.name();
            if (m_leftovers.first.size() > maxPathLength) {
                m_leftovers.first.resize(maxPathLength);
                return;
            }
        }
    }

    void enter(OpenDirectory stream, ino_t inode)
    {
        if (m_path.size() > maxKeptOpen) {
            m_path.back().stream.reset();
        }
        m_path.emplace_back();
        m_path.back().stream = std::move(stream);
        m_path.back().inode = inode;
        m_path.back().list();
    }

    // Goes back to the parent, or to a directory above if the parent was moved away.
    void leave()
    {
        Directory child = std::move(m_path.back());
        m_path.pop_back();
        const std::size_t length = m_path.size();
        if (!m_path.back().stream && !openParentOf(child)) {
            child.stream.reset();
            openFromAbove();
        }
        const Directory &parent = m_path.back();
        if (m_path.size() != length) {
            errno = ENOENT;
            finishEntry(false);
        } else if (child.emptied) {
            finishEntry(unlinkat(parent.fd(), parent.name(), AT_REMOVEDIR) == 0);
        } else {
            m_path.back().emptied = false;
            m_path.back().next();
        }
    }

    // Opens the last directory of the path through its child. Fails if the child was moved.
    bool openParentOf(const Directory &child)
    {
        OpenDirectory stream = openIn(child, "..");
        if (!isSame(stream, m_path.back())) {
            return false;
        }
        m_path.back().stream = std::move(stream);
        return true;
    }

    // Follows the path from the last directory that is open, and shortens it to the last one that
    // is still there.
    void openFromAbove()
    {
        std::size_t reached = maxKeptOpen - 1;
        while (reached + 1 < m_path.size()) {
            Directory &directory = m_path[reached];
            OpenDirectory next = openIn(directory, directory.name());
            if (!isSame(next, m_path[reached + 1])) {
                break;
            }
            if (reached >= maxKeptOpen) {
                directory.stream.reset();
            }
            m_path[++reached].stream = std::move(next);
        }
        m_path.resize(reached + 1);
    }

    // Device and inode identify a directory, unless the inode was freed and used again.
    bool isSame(const OpenDirectory &stream, const Directory &directory) const
    {
        struct stat info = {};
        return stream && fstat(dirfd(stream.get()), &info) == 0 && info.st_dev == m_device
            && info.st_ino == directory.inode;
    }

    dev_t m_device = 0;
    // The first directory is the one to empty, the last is the current one.
    std::deque<Directory> m_path;
    Leftovers m_leftovers;
};

} // namespace

Leftovers emptyDirectory(FileDescriptor directory)
{
    return Walk().run(std::move(directory));
}
