// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef SYSTEMCALLS_H
#define SYSTEMCALLS_H

#include <functional>

#include <dirent.h>
#include <sys/stat.h>

/*
    The system calls of the walk over a card. This program replaces them, so that a test can count
    them, change the tree between two of them, or make one fail. A hook that is set replaces the
    call and may forward to the real one.
*/
struct SystemCalls {
    std::function<int(int, const char *, int)> openat;
    std::function<int(int, const char *, int)> unlinkat;
    std::function<int(int, struct stat *)> fstat;
    std::function<int(int, const char *, struct stat *, int)> fstatat;
    std::function<dirent *(DIR *)> readdir;

    // The hooks of the calling thread.
    static SystemCalls &hooks();
    // The functions of the C library.
    static const SystemCalls &real();
};

#endif
