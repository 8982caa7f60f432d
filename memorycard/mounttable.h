// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef MOUNTTABLE_H
#define MOUNTTABLE_H

#include <array>
#include <cstdio>
#include <memory>

#include <mntent.h>

// Reads the entries of a mount table, such as /etc/mtab. Lines without a type are skipped.
class MountTable
{
public:
    explicit MountTable(const char *path) : m_file(setmntent(path, "r")) { }

    [[nodiscard]] bool isOpen() const { return m_file != nullptr; }

    // Null at the end. The entry is valid until the next call.
    [[nodiscard]] const mntent *next();

private:
    struct Close {
        void operator()(FILE *file) const { endmntent(file); }
    };

    std::unique_ptr<FILE, Close> m_file;
    mntent m_entry = {};
    std::array<char, 12288> m_buffer = {};
};

#endif
