// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef SYSTEMCALLS_H
#define SYSTEMCALLS_H

#include <functional>

#include <sys/stat.h>
#include <sys/types.h>

/*
    The calls into the kernel that the walk over a card makes, taken over by this program: a test
    counts them, changes the tree between two of them, or makes one fail. A hook that is set stands
    in for the call and may pass it on to the real one.
*/
struct SystemCalls {
    std::function<int(int, const char *, int)> openat;
    std::function<int(int, const char *, int)> unlinkat;
    std::function<int(int, struct stat *)> fstat;
    std::function<int(int, const char *, struct stat *, int)> fstatat;
    std::function<ssize_t(int, void *, size_t)> getdents64;

    // Those of the calling thread.
    static SystemCalls &hooks();
    // The C library's own.
    static const SystemCalls &real();
};

#endif
