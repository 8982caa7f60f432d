// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "isolatedthread.h"

#include <QtGlobal>

#include <cerrno>
#include <cstdio>
#include <cstring>

#include <sched.h>
#include <sys/mount.h>
#include <sys/syscall.h>
#include <unistd.h>

// The sanitizers provide this function. It starts a symbolizer program, which the isolated thread
// cannot find.
extern "C" __attribute__((weak)) void __sanitizer_symbolize_pc(void *pc, const char *format,
                                                               char *buffer, std::size_t size);

namespace {

constexpr int skipped = 77; // the status of a test that is skipped

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

void isolateFileSystem()
{
    // For this thread only. /tmp is just the mount point of the new root; its files stay untouched.
    const bool unshared = unshare(CLONE_NEWNS | CLONE_FS) == 0;
    if (!unshared && errno == EPERM) {
        std::fputs("skipped: this system forbids mount namespaces\n", stderr);
        _exit(skipped);
    }
    require(unshared, "unshare the mount namespace");
    require(mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0, "make mounts private");
    require(mount("tmpfs", "/tmp", "tmpfs", 0, "mode=700") == 0, "mount");
    require(chdir("/tmp") == 0 && syscall(SYS_pivot_root, ".", ".") == 0, "change the root");
    // The old root now lies above the new one.
    require(umount2(".", MNT_DETACH) == 0 && chdir("/") == 0, "leave the old root");
    // Check that the old root is gone before anything is removed.
    require(access("/usr", F_OK) != 0 && access("/proc", F_OK) != 0,
            "leave the old root completely");
}

} // namespace

IsolatedThread::IsolatedThread()
{
    startSymbolizer();
    m_thread = std::thread(&IsolatedThread::serve, this);
}

IsolatedThread::~IsolatedThread()
{
    {
        const std::lock_guard<std::mutex> lock(m_mutex);
        m_ended = true;
    }
    m_changed.notify_all();
    m_thread.join();
}

const char *IsolatedThread::run(const std::function<const char *()> &task)
{
    std::unique_lock<std::mutex> lock(m_mutex);
    m_task = &task;
    m_changed.notify_all();
    m_changed.wait(lock, [this] { return m_task == nullptr; });
    return m_result;
}

void IsolatedThread::serve()
{
    isolateFileSystem();
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
