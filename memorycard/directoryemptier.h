// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DIRECTORYEMPTIER_H
#define DIRECTORYEMPTIER_H

#include <cstddef>
#include <string>

class FileDescriptor;

// The entries that could not be removed. Directories that are left only because of them do not
// count.
struct Leftovers {
    std::size_t count = 0;
    std::string first; // the path below the directory, cut if it is very long
    int error = 0; // the errno of the first
};

/*
    Removes everything below a directory that was just opened for reading. A failure never stops the
    walk.

    A directory that cannot be read counts as empty. Links are removed, never followed. A directory
    on another device stays, which is a failure. The walk never enters what other processes put in
    the place of a directory. The tree may have any depth; at most 12 descriptors are open
    at a time.
*/
[[nodiscard]] Leftovers emptyDirectory(FileDescriptor directory);

#endif
