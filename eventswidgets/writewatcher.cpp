// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "writewatcher.h"

#include <QFile>
#include <QSocketNotifier>

#include <array>

#include <sys/inotify.h>
#include <unistd.h>

WriteWatcher::WriteWatcher(QObject *parent)
    : QObject(parent), m_inotify(inotify_init1(IN_NONBLOCK | IN_CLOEXEC))
{
    if (m_inotify >= 0) {
        auto *notifier = new QSocketNotifier(m_inotify, QSocketNotifier::Read, this);
        // Behind what the watcher of the directory has to tell, which waits in the event loop too:
        // whoever reads the directory upon that has called watch(), and need not read it again.
        const auto tell = [this] {
            if (takeEvents()) {
                Q_EMIT written();
            }
        };
        connect(notifier, &QSocketNotifier::activated, this,
                [this, tell] { QMetaObject::invokeMethod(this, tell, Qt::QueuedConnection); });
    }
}

WriteWatcher::~WriteWatcher()
{
    // Closed only once nobody waits for it.
    delete findChild<QSocketNotifier *>();
    if (m_inotify >= 0) {
        close(m_inotify);
    }
}

void WriteWatcher::watch(const QString &directory)
{
    // The directory that is watched keeps its number.
    const int watch = inotify_add_watch(m_inotify, QFile::encodeName(directory).constData(),
                                        IN_CLOSE_WRITE | IN_ONLYDIR);
    if (watch != m_watch) {
        // One that was removed has lost its watch already.
        inotify_rm_watch(m_inotify, m_watch);
        m_watch = watch;
    }
    takeEvents();
}

bool WriteWatcher::takeEvents()
{
    bool wrote = false;
    alignas(inotify_event) std::array<char, 4096> buffer;
    ssize_t size = 0;
    while ((size = read(m_inotify, buffer.data(), buffer.size())) > 0) {
        for (const char *at = buffer.data(); at < buffer.data() + size;) {
            const auto *event = reinterpret_cast<const inotify_event *>(at);
            // After an overflow nobody knows what was written.
            wrote = wrote || (event->mask & (IN_CLOSE_WRITE | IN_Q_OVERFLOW)) != 0;
            at += sizeof(inotify_event) + event->len;
        }
    }
    return wrote;
}
