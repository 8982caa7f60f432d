// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DIRECTORYWATCHER_H
#define DIRECTORYWATCHER_H

#include <QByteArray>
#include <QObject>
#include <QPointer>
#include <QRegularExpression>
#include <QString>

#include <vector>

class Inotify;
class QFileSystemWatcher;
struct inotify_event;

/*
    Watches the files with matching names in a directory that need not exist yet.

    changed() reports three events:
    - an entry is added, removed, renamed or given other permissions;
    - a file that was open for writing is closed, which means that it is complete;
    - the directory appears, disappears or is replaced, alone or together with a directory above it.
    Writes to the target of a link that leads out of the directory are not noticed.

    No event is lost while the watches are set up: they are set from the root downwards, each before
    the next name is looked up, and changed() is emitted last.

    All watchers share one inotify instance until the application ends: a user may have only 128
    instances, and closing one blocks for more than 10 ms. If no instance is left, the watcher uses
    QFileSystemWatcher, which checks once a second. It then ignores the filter, and does not notice
    a file that is rewritten in place.

    For the main thread only.
*/
class DirectoryWatcher : public QObject
{
    Q_OBJECT

public:
    // Takes an absolute path and a filter such as "*.conf", which works as for QDir.
    DirectoryWatcher(const QString &directory, const QString &nameFilter,
                     QObject *parent = nullptr);
    ~DirectoryWatcher() override;
    Q_DISABLE_COPY_MOVE(DirectoryWatcher)

Q_SIGNALS:
    void changed();

private:
    friend class Inotify;

    // The directory or one of its parents, with its watch if it exists.
    struct Level {
        QString path;
        QByteArray name;
        int watch;
    };

    void watch();
    // Returns whether this is the first relevant event since the last call of report().
    bool take(const inotify_event &event);
    void report();

    const QRegularExpression m_nameFilter;
    std::vector<Level> m_levels; // from the root downwards
    QPointer<Inotify> m_inotify;
    QFileSystemWatcher *m_poller = nullptr;
    bool m_pathChanged = false;
    bool m_entriesChanged = false;
};

#endif
