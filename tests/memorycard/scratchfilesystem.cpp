// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "scratchfilesystem.h"

#include <QFile>

#include <cerrno>
#include <cstring>

#include <sys/mount.h>

ScratchFileSystem::ScratchFileSystem() : m_path(QFile::encodeName(m_dir.path()))
{
    if (mount("tmpfs", m_path.constData(), "tmpfs", 0, "mode=700") != 0) {
        qFatal("cannot mount on %s: %s", m_path.constData(), std::strerror(errno));
    }
}

ScratchFileSystem::~ScratchFileSystem()
{
    // Also unmounts whatever a failed test left mounted in it.
    umount2(m_path.constData(), MNT_DETACH);
}

QByteArray ScratchFileSystem::path(const char *name) const
{
    return m_path + '/' + name;
}
