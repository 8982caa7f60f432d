// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DIRECTORYWATCHER_H
#define DIRECTORYWATCHER_H

#include <QByteArray>
#include <QObject>
#include <QPointer>
#include <QString>
#include <QTimer>

#include <array>
#include <vector>

struct inotify_event;

/*
    Watches a directory that need not exist yet, and the files in it.

    changed() reports three events:
    - an entry of any name is added, removed, renamed or given other permissions;
    - a file with a matching name that was open for writing is closed, which means that it is
      complete;
    - the directory appears, disappears or is replaced, alone or together with a directory above it
      or the target of a symbolic link in its path.
    Writes to the target of a link in the directory are not noticed.

    No event is lost while the watches are set up: they are set from the root downwards, each before
    the next name is looked up, and changed() is emitted last.

    All watchers share one inotify instance until the application ends: a user may have only 128
    instances, and closing one blocks for more than 10 ms. If no instance or no watch is left, the
    watcher warns and checks the directory once a second. It then does not notice a file that is
    rewritten in place or given other permissions.

    For the main thread only.
*/
class DirectoryWatcher : public QObject
{
    Q_OBJECT

public:
    // Takes an absolute path and a filter such as "*.conf", which works as for QDir.
    DirectoryWatcher(const QString &directory, QString nameFilter, QObject *parent = nullptr);
    ~DirectoryWatcher() override;
    Q_DISABLE_COPY_MOVE(DirectoryWatcher)

Q_SIGNALS:
    void changed();

private:
    class Inotify;

    // A directory on the path, with its watch if it exists, and the name that is looked up in it.
    struct Level {
        int watch;
        QByteArray name;
    };
    // What stat() returns for the directory: if nothing differs, it is still the same directory with
    // the same entries. Zeros if there is none.
    using Status = std::array<quint64, 6>;

    void watch();
    // Returns whether this is the first relevant event since the last call of report().
    bool take(const inotify_event &event);
    void report();

    void startPolling(int error);
    void poll();
    Status status() const;

    const QByteArray m_directory;
    const QString m_nameFilter;
    std::vector<Level> m_levels; // from the root downwards; the last one is the directory
    QPointer<Inotify> m_inotify;
    bool m_pathChanged = false;
    bool m_entriesChanged = false;
    QTimer m_pollTimer; // does not run unless the watcher polls
    Status m_status = {};
};

#endif
