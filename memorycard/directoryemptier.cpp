// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "directoryemptier.h"

#include "files/filedescriptor.h"

#include <algorithm>
#include <cstring>
#include <deque>
#include <memory>
#include <string>
#include <vector>

#include <dirent.h>
#include <fcntl.h>
#include <sys/stat.h>

namespace {

// Besides the directory to empty and the one being opened. Few trees on a card are deeper.
constexpr std::size_t maxOpenDirectories = 55;

// In bytes. Larger blocks gain nothing.
constexpr std::size_t blockSize = 32768;

struct CloseDirectory {
    void operator()(DIR *directory) const { closedir(directory); }
};
using OpenDirectory = std::unique_ptr<DIR, CloseDirectory>;

// Null if the descriptor is not open or does not refer to a directory.
OpenDirectory openStream(FileDescriptor fd)
{
    OpenDirectory directory(fd.isOpen() ? fdopendir(fd.get()) : nullptr);
    if (directory) {
        fd.release();
    }
    return directory;
}

struct Entry {
    const char *name;
    unsigned char type; // a DT_ constant
};

// The entries of a directory in directory order, each as a type byte and a terminated name.
class Listing
{
public:
    void read(DIR *directory, std::string *buffer)
    {
        buffer->clear();
        // An error ends the listing, too: what is left in the directory makes its removal fail.
        while (const dirent *entry = readdir(directory)) {
            if (std::strcmp(entry->d_name, ".") == 0 || std::strcmp(entry->d_name, "..") == 0) {
                continue;
            }
            buffer->push_back(static_cast<char>(entry->d_type));
            buffer->append(entry->d_name, std::strlen(entry->d_name) + 1);
            if (buffer->size() >= blockSize) {
                m_blocks.push_back(*buffer);
                buffer->clear();
            }
        }
        if (!buffer->empty()) {
            m_blocks.push_back(*buffer);
        }
    }

    bool atEnd() const { return m_block == m_blocks.size(); }

    // Valid until next().
    Entry current() const
    {
        const char *entry = m_blocks[m_block].data() + m_offset;
        return {entry + 1, static_cast<unsigned char>(*entry)};
    }

    void next()
    {
        std::string &block = m_blocks[m_block];
        m_offset += 1 + std::strlen(current().name) + 1;
        if (m_offset == block.size()) {
            std::string().swap(block);
            m_offset = 0;
            ++m_block;
        }
    }

private:
    std::vector<std::string> m_blocks;
    std::size_t m_block = 0;
    std::size_t m_offset = 0;
};

struct Directory {
    int fd() const { return dirfd(stream.get()); }

    OpenDirectory stream; // null while closed
    ino_t inode = 0;
    Listing entries; // the current one is the next directory of the path
    bool emptied = true;
};

class Walk
{
public:
    bool run(FileDescriptor top)
    {
        OpenDirectory stream = openStream(std::move(top));
        struct stat info = {};
        if (!stream || fstat(dirfd(stream.get()), &info) != 0) {
            return false;
        }
        m_device = info.st_dev;
        enter(std::move(stream), info.st_ino);
        while (true) {
            if (!m_path.back().entries.atEnd()) {
                handleEntry();
            } else if (m_path.size() > 1) {
                leave();
            } else {
                return m_path.back().emptied;
            }
        }
    }

private:
    static OpenDirectory openIn(const Directory &parent, const char *name)
    {
        return openStream(FileDescriptor(
            openat(parent.fd(), name, O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC)));
    }

    static bool isDirectory(const Directory &parent, const Entry &entry)
    {
        if (entry.type != DT_UNKNOWN) {
            return entry.type == DT_DIR;
        }
        struct stat info = {};
        return fstatat(parent.fd(), entry.name, &info, AT_SYMLINK_NOFOLLOW) == 0
            && S_ISDIR(info.st_mode);
    }

    void handleEntry()
    {
        const Directory &directory = m_path.back();
        const Entry entry = directory.entries.current();
        // Such a name leads out of the directory. Not every kernel refuses to list it.
        if (std::strchr(entry.name, '/')) {
            finishEntry(false);
            return;
        }
        if (!isDirectory(directory, entry)) {
            finishEntry(unlinkat(directory.fd(), entry.name, 0) == 0);
            return;
        }
        OpenDirectory stream = openIn(directory, entry.name);
        if (!stream) {
            finishEntry(unlinkat(directory.fd(), entry.name, AT_REMOVEDIR) == 0);
            return;
        }
        struct stat info = {};
        if (fstat(dirfd(stream.get()), &info) != 0 || info.st_dev != m_device) {
            finishEntry(false);
            return;
        }
        enter(std::move(stream), info.st_ino);
    }

    void finishEntry(bool removed)
    {
        Directory &directory = m_path.back();
        directory.emptied = directory.emptied && removed;
        directory.entries.next();
    }

    void enter(OpenDirectory stream, ino_t inode)
    {
        m_path.push_back({std::move(stream), inode, {}, true});
        Directory &directory = m_path.back();
        directory.entries.read(directory.stream.get(), &m_buffer);
        if (m_path.size() - m_firstOpen > maxOpenDirectories) {
            m_path[m_firstOpen++].stream.reset();
        }
    }

    // Goes back to the parent, or to a directory above if the parent was moved away.
    void leave()
    {
        const Directory child = std::move(m_path.back());
        m_path.pop_back();
        const std::size_t length = m_path.size();
        if (!m_path.back().stream && !openParentOf(child)) {
            openFromTop();
        }
        const Directory &parent = m_path.back();
        finishEntry(child.emptied && m_path.size() == length
                    && unlinkat(parent.fd(), parent.entries.current().name, AT_REMOVEDIR) == 0);
    }

    // Opens the last directory of the path through its child. Fails if the child was moved.
    bool openParentOf(const Directory &child)
    {
        OpenDirectory stream = openIn(child, "..");
        if (!isSame(stream, m_path.back())) {
            return false;
        }
        m_path.back().stream = std::move(stream);
        m_firstOpen = m_path.size() - 1;
        return true;
    }

    // Follows the path from the top and shortens it to the last directory that is still there.
    void openFromTop()
    {
        std::size_t reached = 0;
        while (reached + 1 < m_path.size()) {
            Directory &directory = m_path[reached];
            OpenDirectory next = openIn(directory, directory.entries.current().name);
            if (!isSame(next, m_path[reached + 1])) {
                break;
            }
            if (reached > 0) {
                directory.stream.reset();
            }
            ++reached;
            m_path[reached].stream = std::move(next);
        }
        m_path.resize(reached + 1);
        m_firstOpen = std::max<std::size_t>(reached, 1);
    }

    // Device and inode identify a directory, unless the inode was freed and used again.
    bool isSame(const OpenDirectory &stream, const Directory &directory) const
    {
        struct stat info = {};
        return stream && fstat(dirfd(stream.get()), &info) == 0 && info.st_dev == m_device
            && info.st_ino == directory.inode;
    }

    dev_t m_device = 0;
    // The first directory is the one to empty, the last is the current one. The first one and those
    // from m_firstOpen on are open.
    std::deque<Directory> m_path;
    std::size_t m_firstOpen = 1;
    std::string m_buffer;
};

} // namespace

bool emptyDirectory(FileDescriptor directory)
{
    return Walk().run(std::move(directory));
}
