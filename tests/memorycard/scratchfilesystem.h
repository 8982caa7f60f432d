// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef SCRATCHFILESYSTEM_H
#define SCRATCHFILESYSTEM_H

#include <QByteArray>
#include <QTemporaryDir>

/*
    A file system of its own, in memory, on a temporary folder. Trees that are made to be removed
    lie in it, so that a remover that is broken and climbs out of its tree meets another device,
    where it would otherwise meet the developer's files.
*/
class ScratchFileSystem
{
public:
    // Ends the program when there is no right to mount, which the sandbox grants to everybody.
    ScratchFileSystem();
    ~ScratchFileSystem();
    Q_DISABLE_COPY_MOVE(ScratchFileSystem)

    // The path of a name in it.
    QByteArray path(const char *name) const;

private:
    QTemporaryDir m_dir;
    const QByteArray m_path;
};

#endif
