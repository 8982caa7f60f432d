// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "mounttable.h"

#include <cerrno>

// glibc decodes the escapes in a field. musl, at least up to 1.2.3, returns them unchanged.
#ifndef LIBRARY_DECODES_ESCAPES
#ifdef __GLIBC__
#define LIBRARY_DECODES_ESCAPES true
#else
#define LIBRARY_DECODES_ESCAPES false
#endif
#endif

namespace {

[[maybe_unused]] void decodeEscapes(char *field)
{
    const auto isOctal = [](char c) { return c >= '0' && c <= '7'; };
    char *out = field;
    for (const char *in = field; *in != '\0'; ++out) {
        if (in[0] == '\\' && isOctal(in[1]) && isOctal(in[2]) && isOctal(in[3])) {
            *out = static_cast<char>((in[1] - '0') * 64 + (in[2] - '0') * 8 + in[3] - '0');
            in += 4;
        } else {
            *out = *in++;
        }
    }
    *out = '\0';
}

} // namespace

const mntent *MountTable::next()
{
    while (true) {
        errno = 0;
        if (!getmntent_r(m_file.get(), &m_entry, m_buffer.data(),
                         static_cast<int>(m_buffer.size()))) {
            // musl skips a line that is longer than the buffer, with this error.
            if (errno == ERANGE) {
                continue;
            }
            return nullptr;
        }
        // NOLINTNEXTLINE(readability-simplify-boolean-expr): a macro
        if constexpr (!LIBRARY_DECODES_ESCAPES) {
            decodeEscapes(m_entry.mnt_fsname);
            decodeEscapes(m_entry.mnt_dir);
        }
        // glibc cuts such a line instead. A line that is cut within the directory has no type.
        if (m_entry.mnt_type[0] != '\0') {
            return &m_entry;
        }
    }
}
