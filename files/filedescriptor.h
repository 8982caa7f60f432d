// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef FILEDESCRIPTOR_H
#define FILEDESCRIPTOR_H

#include <utility>

#include <unistd.h>

// Owns an open file descriptor, or none.
class FileDescriptor
{
public:
    FileDescriptor() = default;
    explicit FileDescriptor(int fd) : m_fd(fd) { }
    FileDescriptor(FileDescriptor &&other) noexcept : m_fd(std::exchange(other.m_fd, -1)) { }
    FileDescriptor &operator=(FileDescriptor &&other) noexcept
    {
        std::swap(m_fd, other.m_fd);
        other.close();
        return *this;
    }
    ~FileDescriptor() { close(); }

    bool isOpen() const { return m_fd >= 0; }
    int get() const { return m_fd; }

    // Leaves closing to the caller.
    [[nodiscard]] int release() { return std::exchange(m_fd, -1); }

    void close()
    {
        if (m_fd >= 0) {
            ::close(release());
        }
    }

private:
    int m_fd = -1;
};

#endif
