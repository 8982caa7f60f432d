// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef SCRATCHFILESYSTEM_H
#define SCRATCHFILESYSTEM_H

#include <QByteArray>
#include <QTemporaryDir>

/*
    A file system in memory, mounted on a temporary directory. Trees that are to be removed are created
    in it: a broken remover that leaves its tree reaches another device there, and not the developer's
    files. Where mounts are forbidden, it is a directory of the throw-away root's own file system in
    memory.
*/
class ScratchFileSystem
{
public:
    ScratchFileSystem();
    ~ScratchFileSystem();
    Q_DISABLE_COPY_MOVE(ScratchFileSystem)

    // Whether tests may mount something in it.
    bool isMounted() const { return m_mounted; }
    QByteArray path() const { return m_path; }
    // The path of a name in it.
    QByteArray path(const char *name) const;

private:
    QTemporaryDir m_dir;
    const QByteArray m_path;
    const bool m_mounted;
};

// For tests of what happens at a mount point.
#define NEEDS_MOUNTS(files)                                                                        \
    if (!(files).isMounted()) {                                                                    \
        QSKIP("this system forbids mounts");                                                       \
    }

#endif
