// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef OPENINGS_H
#define OPENINGS_H

#include <QFile>

#include <array>

#include <sys/inotify.h>
#include <unistd.h>

/*
    Records whether any process opens a file.
*/
class Openings
{
public:
    explicit Openings(const QString &path)
    {
        if (inotify_add_watch(m_descriptor, QFile::encodeName(path), IN_OPEN) < 0) {
            qFatal("cannot watch %s", qPrintable(path));
        }
    }
    ~Openings() { close(m_descriptor); }
    Q_DISABLE_COPY_MOVE(Openings)

    // Whether the file has been opened since the last call.
    bool take() const
    {
        std::array<char, 4096> events = {};
        return read(m_descriptor, events.data(), events.size()) > 0;
    }

private:
    const int m_descriptor = inotify_init1(IN_NONBLOCK | IN_CLOEXEC);
};

#endif
