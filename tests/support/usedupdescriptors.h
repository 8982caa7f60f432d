// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef USEDUPDESCRIPTORS_H
#define USEDUPDESCRIPTORS_H

#include <QtGlobal>

#include <vector>

#include <fcntl.h>
#include <sys/resource.h>
#include <unistd.h>

/*
    Uses up the file descriptors that this process may still open, except the given number.
*/
class UsedUpDescriptors
{
public:
    explicit UsedUpDescriptors(int left = 0)
    {
        // poll() refuses more descriptors than the limit. With 256, all open ones remain usable.
        const rlimit few = {256, m_limit.rlim_max};
        if (setrlimit(RLIMIT_NOFILE, &few) != 0) {
            qFatal("cannot limit the descriptors");
        }
        int descriptor = -1;
        while ((descriptor = open("/dev/null", O_RDONLY | O_CLOEXEC)) >= 0) {
            m_descriptors.push_back(descriptor);
        }
        for (; left > 0 && !m_descriptors.empty(); --left) {
            close(m_descriptors.back());
            m_descriptors.pop_back();
        }
    }
    ~UsedUpDescriptors()
    {
        for (const int descriptor : m_descriptors) {
            close(descriptor);
        }
        setrlimit(RLIMIT_NOFILE, &m_limit);
    }
    Q_DISABLE_COPY_MOVE(UsedUpDescriptors)

private:
    static rlimit limit()
    {
        rlimit limit = {};
        getrlimit(RLIMIT_NOFILE, &limit);
        return limit;
    }

    const rlimit m_limit = limit();
    std::vector<int> m_descriptors;
};

#endif
