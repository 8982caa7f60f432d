// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef SCRATCHFILESYSTEM_H
#define SCRATCHFILESYSTEM_H

#include <QByteArray>
#include <QTemporaryDir>

/*
    A file system in memory, mounted on a temporary directory. Trees that are to be removed are created
    in it: a broken remover that leaves its tree reaches another device there, and not the developer's
    files.
*/
class ScratchFileSystem
{
public:
    // Ends the program if it is not allowed to mount. In the sandbox, every user is.
    ScratchFileSystem();
    ~ScratchFileSystem();
    Q_DISABLE_COPY_MOVE(ScratchFileSystem)

    QByteArray path() const { return m_path; }
    // The path of a name in it.
    QByteArray path(const char *name) const;

private:
    QTemporaryDir m_dir;
    const QByteArray m_path;
};

#endif
