// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "failingcard.h"
#include "texts.h"

#include <QFile>

#include <array>
#include <cerrno>
#include <chrono>
#include <cstdlib>
#include <cstring>
#include <string>
#include <utility>

#include <dirent.h>
#include <fcntl.h>
#include <linux/fuse.h>
#include <poll.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <sys/uio.h>
#include <unistd.h>

namespace {

constexpr const char *fuseDevice = "/dev/fuse";
constexpr size_t requestSize = 1024 * 1024;
constexpr uint64_t firstFile = FUSE_ROOT_ID + 1;
constexpr auto shortWhile = std::chrono::milliseconds(5);

std::string nameOf(int file)
{
    return "file" + std::to_string(file);
}

fuse_attr attributes(uint64_t node)
{
    fuse_attr attr = {};
    attr.ino = node;
    attr.mode = node == FUSE_ROOT_ID ? S_IFDIR | 0755 : S_IFREG | 0644;
    attr.nlink = 1;
    return attr;
}

} // namespace

QString FailingCard::whyNot()
{
    return access(fuseDevice, R_OK | W_OK) == 0 ? QString() : "/dev/fuse cannot be opened"_s;
}

FailingCard::FailingCard(const QString &device, int files)
    : m_count(files), m_left(files), m_removed(size_t(files))
{
    m_fuse = open(fuseDevice, O_RDWR | O_CLOEXEC | O_NONBLOCK);
    const QByteArray options =
        "fd=" + QByteArray::number(m_fuse) + ",rootmode=40000,user_id=0,group_id=0";
    if (m_fuse < 0
        || mount(QFile::encodeName(device).constData(), QFile::encodeName(directory()).constData(),
                 "fuse", MS_NOSUID | MS_NODEV, options.constData())
            != 0) {
        qFatal("cannot mount a card: %s", std::strerror(errno));
    }
    m_thread = std::thread([this] { serve(); });
}

FailingCard::~FailingCard()
{
    m_fault = Fault::None;
    detach();
    m_ends = true;
    m_thread.join();
    if (m_fuse >= 0) {
        close(m_fuse);
    }
}

void FailingCard::detach()
{
    umount2(QFile::encodeName(directory()).constData(), MNT_DETACH);
}

void FailingCard::serve()
{
    std::vector<char> request(requestSize);
    while (!m_ends) {
        pollfd ready = {m_fuse, POLLIN, 0};
        poll(&ready, 1, int(shortWhile.count()));
        const ssize_t size = read(m_fuse, request.data(), request.size());
        if (size < 0 && errno == ENODEV) {
            return; // unmounted
        }
        if (size > 0 && !answer(request.data())) {
            close(std::exchange(m_fuse, -1));
            return;
        }
    }
}

// Returns false when the card must disappear.
bool FailingCard::answer(const char *request)
{
    fuse_in_header in = {};
    std::memcpy(&in, request, sizeof(in));
    const char *argument = request + sizeof(in);
    std::vector<char> data;
    const auto append = [&data](const auto &part) {
        const auto *bytes = reinterpret_cast<const char *>(&part);
        data.insert(data.end(), bytes, bytes + sizeof(part));
    };
    int error = 0;
    const auto find = [this](const char *name) {
        const int file = std::strncmp(name, "file", 4) == 0 ? std::atoi(name + 4) : -1;
        return file >= 0 && file < m_count && !m_removed[size_t(file)] ? file : -1;
    };

    switch (in.opcode) {
    case FUSE_INIT: {
        fuse_init_out out = {};
        out.major = FUSE_KERNEL_VERSION;
        out.minor = 31;
        out.max_write = 4096;
        append(out);
        break;
    }
    case FUSE_GETATTR: {
        fuse_attr_out out = {};
        out.attr = attributes(in.nodeid);
        append(out);
        break;
    }
    case FUSE_LOOKUP: {
        const int file = find(argument);
        fuse_entry_out out = {};
        if (file >= 0) {
            out.nodeid = firstFile + uint64_t(file);
            out.attr = attributes(out.nodeid);
            append(out);
        } else {
            error = ENOENT;
        }
        break;
    }
    case FUSE_STATFS:
        append(fuse_statfs_out());
        break;
    case FUSE_OPENDIR:
        append(fuse_open_out());
        break;
    case FUSE_READDIR: {
        fuse_read_in read = {};
        std::memcpy(&read, argument, sizeof(read));
        if (m_fault == Fault::Unreadable) {
            error = EIO;
            break;
        }
        for (auto file = int(read.offset); file < m_count; ++file) {
            const std::string name = nameOf(file);
            const size_t length = FUSE_DIRENT_ALIGN(FUSE_NAME_OFFSET + name.size());
            if (data.size() + length > read.size) {
                break;
            }
            if (!m_removed[size_t(file)]) {
                fuse_dirent entry = {};
                entry.ino = firstFile + uint64_t(file);
                entry.off = uint64_t(file) + 1;
                entry.namelen = uint32_t(name.size());
                entry.type = DT_REG;
                const size_t begin = data.size();
                const auto *bytes = reinterpret_cast<const char *>(&entry);
                data.insert(data.end(), bytes, bytes + FUSE_NAME_OFFSET);
                data.insert(data.end(), name.begin(), name.end());
                data.resize(begin + length);
            }
        }
        break;
    }
    case FUSE_UNLINK: {
        ++m_waiting;
        while (m_fault == Fault::Waits && !m_ends) {
            std::this_thread::sleep_for(shortWhile);
        }
        --m_waiting;
        if (m_fault == Fault::Gone) {
            return false;
        }
        const int file = find(argument);
        if (m_fault == Fault::Stuck) {
            error = EIO;
        } else if (file < 0) {
            error = ENOENT;
        } else {
            m_removed[size_t(file)] = true;
            --m_left;
        }
        break;
    }
    case FUSE_RELEASEDIR:
        break;
    case FUSE_FORGET:
    case FUSE_BATCH_FORGET:
    case FUSE_INTERRUPT:
        return true; // without a reply
    default:
        error = ENOSYS;
    }

    fuse_out_header out = {};
    out.unique = in.unique;
    out.error = -error;
    if (error != 0) {
        data.clear();
    }
    out.len = uint32_t(sizeof(out) + data.size());
    const std::array<iovec, 2> parts = {{{&out, sizeof(out)}, {data.data(), data.size()}}};
    // Fails if the process that sent the request has ended, which is harmless.
    const ssize_t written = writev(m_fuse, parts.data(), int(parts.size()));
    Q_UNUSED(written)
    return true;
}
