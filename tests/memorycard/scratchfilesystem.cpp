// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "scratchfilesystem.h"

#include "texts.h"

#include <QFile>

#include <cerrno>
#include <cstring>
#include <filesystem>

#include <sys/mount.h>

ScratchFileSystem::ScratchFileSystem()
    : m_dir(qEnvironmentVariable("XDG_RUNTIME_DIR") + "/XXXXXX"_s),
      m_path(QFile::encodeName(m_dir.path())),
      m_mounted(mount("tmpfs", m_path.constData(), "tmpfs", 0, "mode=700") == 0)
{
    if (!m_mounted && errno != EPERM && errno != EACCES) {
        qFatal("cannot mount on %s: %s", m_path.constData(), std::strerror(errno));
    }
}

ScratchFileSystem::~ScratchFileSystem()
{
    // Also unmounts whatever a failed test left mounted in it.
    if (m_mounted) {
        umount2(m_path.constData(), MNT_DETACH);
    } else {
        // QTemporaryDir cannot remove names that are not UTF-8.
        std::error_code error;
        std::filesystem::remove_all(m_path.constData(), error);
    }
}

QByteArray ScratchFileSystem::path(const char *name) const
{
    return m_path + '/' + name;
}
