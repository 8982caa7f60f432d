// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef SYSTEMCALLS_H
#define SYSTEMCALLS_H

#include <functional>

#include <dirent.h>
#include <sys/stat.h>

/*
    The calls of the walk over a card, which this program takes over: a test counts them, changes the
    tree between two of them, or makes one fail. A hook that is set replaces the call and may forward
    to the real one.
*/
struct SystemCalls {
    std::function<int(int, const char *, int)> openat;
    std::function<int(int, const char *, int)> unlinkat;
    std::function<int(int, struct stat *)> fstat;
    std::function<int(int, const char *, struct stat *, int)> fstatat;
    std::function<dirent *(DIR *)> readdir;

    // Those of the calling thread.
    static SystemCalls &hooks();
    // The C library's own.
    static const SystemCalls &real();
};

#endif
