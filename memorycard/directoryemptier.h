// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DIRECTORYEMPTIER_H
#define DIRECTORYEMPTIER_H

class FileDescriptor;

/*
    Removes everything below a directory that was just opened for reading. Returns whether all
    entries were removed: a failure never stops the walk.

    A directory that cannot be read counts as empty. Links are removed, never followed. A directory
    on another device stays, which is a failure. The walk never enters what other processes put in
    the place of a directory. The tree may have any depth; at most 57 descriptors are open
    at a time.
*/
bool emptyDirectory(FileDescriptor directory);

#endif
