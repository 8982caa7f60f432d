// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DIRECTORYEMPTIER_H
#define DIRECTORYEMPTIER_H

class FileDescriptor;

/*
    Removes everything below a directory that was just opened for reading; the directory itself stays.

    A failure never stops the walk: it attempts every entry, and returns whether all of them were
    removed. A directory that cannot be read counts as empty. Links are removed, never followed; a
    directory on another device stays, which is a failure. Other processes may change the tree
    meanwhile: the walk never enters what they put in the place of a directory. The depth of the tree
    and the size of the thread's stack do not matter, and at most 57 descriptors are open at a time.
*/
bool emptyDirectory(FileDescriptor directory);

#endif
