// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "jail.h"

#include <QtGlobal>

#include <cerrno>
#include <cstring>

#include <sched.h>
#include <sys/mount.h>
#include <sys/syscall.h>
#include <unistd.h>

// The sanitizers' own, which starts a program that names functions: there is none inside.
extern "C" __attribute__((weak)) void __sanitizer_symbolize_pc(void *pc, const char *format,
                                                               char *buffer, std::size_t size);

namespace {

void require(bool done, const char *what)
{
    if (!done) {
        qFatal("cannot %s: %s", what, std::strerror(errno));
    }
}

void startSymbolizer()
{
    if (__sanitizer_symbolize_pc != nullptr) {
        char buffer[64];
        __sanitizer_symbolize_pc(reinterpret_cast<void *>(startSymbolizer), "%f", buffer,
                                 sizeof buffer);
    }
}

void leaveTheWorld()
{
    // Of this thread alone. /tmp is only where the new root is put; nothing in it is touched.
    require(unshare(CLONE_NEWNS | CLONE_FS) == 0, "have mounts of one's own");
    require(mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0, "keep mounts private");
    require(mount("tmpfs", "/tmp", "tmpfs", 0, "mode=700") == 0, "mount");
    require(chdir("/tmp") == 0 && syscall(SYS_pivot_root, ".", ".") == 0, "change the root");
    // The old one lies above the new one now.
    require(umount2(".", MNT_DETACH) == 0 && chdir("/") == 0, "leave the old root");
    // A root in which there is anything is none that may be worked in.
    require(access("/usr", F_OK) != 0 && access("/proc", F_OK) != 0, "be alone");
}

} // namespace

Jail::Jail()
{
    startSymbolizer();
    m_thread = std::thread(&Jail::serve, this);
}

Jail::~Jail()
{
    {
        const std::lock_guard<std::mutex> lock(m_mutex);
        m_ended = true;
    }
    m_changed.notify_all();
    m_thread.join();
}

const char *Jail::run(const std::function<const char *()> &task)
{
    std::unique_lock<std::mutex> lock(m_mutex);
    m_task = &task;
    m_changed.notify_all();
    m_changed.wait(lock, [this] { return m_task == nullptr; });
    return m_result;
}

void Jail::serve()
{
    leaveTheWorld();
    std::unique_lock<std::mutex> lock(m_mutex);
    while (true) {
        m_changed.wait(lock, [this] { return m_ended || m_task != nullptr; });
        if (m_ended) {
            return;
        }
        m_result = (*m_task)();
        m_task = nullptr;
        m_changed.notify_all();
    }
}
