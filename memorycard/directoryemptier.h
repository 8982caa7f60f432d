// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DIRECTORYEMPTIER_H
#define DIRECTORYEMPTIER_H

class FileDescriptor;

/*
    Removes everything below a folder that was just opened for reading; the folder itself stays.

    Nothing stops it: every entry is attempted, and the result tells whether all of them went. What
    cannot be read counts as empty. Links are removed, never followed; a folder on another device is
    left as it is, which is a failure. Other processes may change the tree meanwhile: what they put
    in the place of a folder is not entered. The depth of the tree and the size of the thread's
    stack do not matter, and at most 57 descriptors are open at a time.
*/
bool emptyDirectory(FileDescriptor directory);

#endif
