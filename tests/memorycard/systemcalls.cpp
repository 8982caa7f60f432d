// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "systemcalls.h"

#include <cstdarg>

#include <dirent.h>
#include <dlfcn.h>
#include <fcntl.h>
#include <unistd.h>

namespace {

template<typename Function> Function *find(const char *name)
{
    return reinterpret_cast<Function *>(dlsym(RTLD_NEXT, name));
}

} // namespace

SystemCalls &SystemCalls::hooks()
{
    thread_local SystemCalls calls;
    return calls;
}

const SystemCalls &SystemCalls::real()
{
    static const SystemCalls calls = {
        find<int(int, const char *, int, ...)>("openat64"),
        find<int(int, const char *, int)>("unlinkat"),
        find<int(int, struct stat *)>("fstat64"),
        find<int(int, const char *, struct stat *, int)>("fstatat64"),
        find<dirent *(DIR *)>("readdir64"),
    };
    return calls;
}

// With 64-bit inode numbers the following names mean openat64 and so on. Definitions in the program
// come before those of the C library.
extern "C" {

int openat(int directory, const char *path, int flags, ...)
{
    if (SystemCalls::hooks().openat) {
        return SystemCalls::hooks().openat(directory, path, flags);
    }
    va_list arguments;
    va_start(arguments, flags);
    const mode_t mode = (flags & (O_CREAT | O_TMPFILE)) != 0 ? va_arg(arguments, mode_t) : 0;
    va_end(arguments);
    static auto *const real = find<int(int, const char *, int, ...)>("openat64");
    return real(directory, path, flags, mode);
}

int unlinkat(int directory, const char *path, int flags) noexcept
{
    const auto &hook = SystemCalls::hooks().unlinkat;
    return hook ? hook(directory, path, flags)
                : SystemCalls::real().unlinkat(directory, path, flags);
}

int fstat(int fd, struct stat *info) noexcept
{
    const auto &hook = SystemCalls::hooks().fstat;
    return hook ? hook(fd, info) : SystemCalls::real().fstat(fd, info);
}

int fstatat(int directory, const char *path, struct stat *info, int flags) noexcept
{
    const auto &hook = SystemCalls::hooks().fstatat;
    return hook ? hook(directory, path, info, flags)
                : SystemCalls::real().fstatat(directory, path, info, flags);
}

dirent *readdir(DIR *directory)
{
    const auto &hook = SystemCalls::hooks().readdir;
    return hook ? hook(directory) : SystemCalls::real().readdir(directory);
}
}
