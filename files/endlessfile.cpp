// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "endlessfile.h"

#include <QFileInfo>

bool isEndless(const QString &path)
{
    const QFileInfo entry(path);
    return entry.exists() && !entry.isFile() && !entry.isDir();
}
