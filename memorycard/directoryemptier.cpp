// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "directoryemptier.h"

#include "filedescriptor.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <deque>
#include <memory>
#include <string>
#include <vector>

#include <dirent.h>
#include <fcntl.h>
#include <sys/stat.h>

namespace {

// Besides the folder to empty and the one being opened. A process has 1024 descriptors at least,
// and few trees on a card are half as deep.
constexpr std::size_t maxOpenFolders = 55;

// The size that the C library reads folders with; larger ones make nothing faster.
struct ReadBuffer {
    alignas(dirent64) std::array<char, 32768> bytes;
};

struct Entry {
    const char *name;
    unsigned char type; // a DT_ constant
};

// The entries of a folder in directory order, as packed as they come: a folder of 100,000 files is
// held in a few MiB. Names are bytes and never pass through an encoding.
class Listing
{
public:
    void read(int directory, ReadBuffer &buffer)
    {
        // An error ends the listing like the end of the folder does: the removal of the folder
        // tells whether anything was left in it.
        while (true) {
            const auto size = getdents64(directory, buffer.bytes.data(), buffer.bytes.size());
            if (size <= 0) {
                return;
            }
            const std::size_t packed = pack(buffer, static_cast<std::size_t>(size));
            if (packed > 0) {
                m_blocks.emplace_back(buffer.bytes.data(), packed);
            }
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
    // Turns the kernel's records at the front of the buffer into a type byte and a terminated name
    // each, without "." and "..". An entry only shrinks, so that this can be done in place.
    static std::size_t pack(ReadBuffer &buffer, std::size_t size)
    {
        char *out = buffer.bytes.data();
        for (std::size_t offset = 0; offset < size;) {
            const auto *record = reinterpret_cast<const dirent64 *>(buffer.bytes.data() + offset);
            offset += record->d_reclen;
            const char *name = record->d_name;
            if (std::strcmp(name, ".") == 0 || std::strcmp(name, "..") == 0) {
                continue;
            }
            const std::size_t length = std::strlen(name) + 1;
            *out++ = static_cast<char>(record->d_type);
            std::memmove(out, name, length);
            out += length;
        }
        return static_cast<std::size_t>(out - buffer.bytes.data());
    }

    std::vector<std::string> m_blocks;
    std::size_t m_block = 0;
    std::size_t m_offset = 0;
};

// A folder on the way from the one to empty down to the one that is worked on.
struct Folder {
    FileDescriptor fd; // closed while the way below is long
    ino_t inode = 0;
    Listing entries; // the current one is the next folder on the way
    bool emptied = true;
};

class Walk
{
public:
    bool run(FileDescriptor top)
    {
        struct stat info = {};
        if (fstat(top.get(), &info) != 0) {
            return false;
        }
        m_device = info.st_dev;
        enter(std::move(top), info.st_ino);
        while (true) {
            if (!m_way.back().entries.atEnd()) {
                handleEntry();
            } else if (m_way.size() > 1) {
                leave();
            } else {
                return m_way.back().emptied;
            }
        }
    }

private:
    static FileDescriptor openFolder(const Folder &parent, const char *name)
    {
        return FileDescriptor(
            openat(parent.fd.get(), name, O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC));
    }

    static bool isFolder(const Folder &parent, const Entry &entry)
    {
        if (entry.type != DT_UNKNOWN) {
            return entry.type == DT_DIR;
        }
        struct stat info = {};
        return fstatat(parent.fd.get(), entry.name, &info, AT_SYMLINK_NOFOLLOW) == 0
            && S_ISDIR(info.st_mode);
    }

    void handleEntry()
    {
        const Folder &folder = m_way.back();
        const Entry entry = folder.entries.current();
        // A name is one step, or it leads out of the folder: not every kernel refuses to list such
        // an entry of a card that was made with intent.
        if (std::strchr(entry.name, '/')) {
            finishEntry(false);
            return;
        }
        if (!isFolder(folder, entry)) {
            finishEntry(unlinkat(folder.fd.get(), entry.name, 0) == 0);
            return;
        }
        FileDescriptor fd = openFolder(folder, entry.name);
        if (!fd.isOpen()) {
            finishEntry(unlinkat(folder.fd.get(), entry.name, AT_REMOVEDIR) == 0);
            return;
        }
        struct stat info = {};
        if (fstat(fd.get(), &info) != 0 || info.st_dev != m_device) {
            finishEntry(false);
            return;
        }
        enter(std::move(fd), info.st_ino);
    }

    void finishEntry(bool removed)
    {
        Folder &folder = m_way.back();
        folder.emptied = folder.emptied && removed;
        folder.entries.next();
    }

    void enter(FileDescriptor fd, ino_t inode)
    {
        m_way.push_back({std::move(fd), inode, {}, true});
        Folder &folder = m_way.back();
        folder.entries.read(folder.fd.get(), *m_buffer);
        if (m_way.size() - m_firstOpen > maxOpenFolders) {
            m_way[m_firstOpen++].fd.close();
        }
    }

    // Back in the parent, or above it when that is no longer there.
    void leave()
    {
        const Folder child = std::move(m_way.back());
        m_way.pop_back();
        const std::size_t length = m_way.size();
        if (!m_way.back().fd.isOpen()) {
            reopen(child);
        }
        const Folder &parent = m_way.back();
        finishEntry(child.emptied && m_way.size() == length
                    && unlinkat(parent.fd.get(), parent.entries.current().name, AT_REMOVEDIR) == 0);
    }

    // Opens the last folder again. Whatever was moved meanwhile, no folder is taken for another: a
    // recycled inode aside, device and inode tell. When ".." leads elsewhere, the child was moved;
    // the way is then gone anew from the top, and shortened to where it now ends.
    void reopen(const Folder &child)
    {
        FileDescriptor fd = openFolder(child, "..");
        if (isSame(fd, m_way.back())) {
            m_firstOpen = m_way.size() - 1;
            m_way.back().fd = std::move(fd);
            return;
        }
        std::size_t reached = 0;
        while (reached + 1 < m_way.size()) {
            Folder &folder = m_way[reached];
            fd = openFolder(folder, folder.entries.current().name);
            if (!isSame(fd, m_way[reached + 1])) {
                break;
            }
            if (reached > 0) {
                folder.fd.close();
            }
            ++reached;
            m_way[reached].fd = std::move(fd);
        }
        m_way.resize(reached + 1);
        m_firstOpen = std::max<std::size_t>(reached, 1);
    }

    bool isSame(const FileDescriptor &fd, const Folder &folder) const
    {
        struct stat info = {};
        return fd.isOpen() && fstat(fd.get(), &info) == 0 && info.st_dev == m_device
            && info.st_ino == folder.inode;
    }

    dev_t m_device = 0;
    // The first is the folder to empty, which stays open.
    std::deque<Folder> m_way;
    // The open ones are the first, and from this index on all.
    std::size_t m_firstOpen = 1;
    const std::unique_ptr<ReadBuffer> m_buffer = std::make_unique<ReadBuffer>();
};

} // namespace

bool emptyDirectory(FileDescriptor directory)
{
    return Walk().run(std::move(directory));
}
