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
    Watches the files of one kind in a directory, whether or not the directory exists yet: a package
    that installs the first definition file creates its directory as well, and the last package that
    goes removes it.

    changed() reports three events:
    - an entry of a matching name is added, removed, renamed or given other permissions;
    - a file of a matching name that was open for writing is closed, which means that it is complete;
    - the directory appears, disappears or is replaced, alone or together with a directory above it.
    Writes to a file outside the directory that a link in it leads to are not noticed.

    No event is lost while the watches are set up. They are set from the root downwards, each before
    the next name is looked up, so that a watch is already in place for whatever gets that name
    later. A directory that is watched already keeps its watch, and changed() is emitted last: a
    receiver that reads the directory sees everything that the watches do not report any more.

    All watchers of a process share one inotify instance, which is kept until the application ends.
    A user may have only 128 of them, and closing one blocks for more than 10 ms. If no instance is
    left, QFileSystemWatcher is used instead: it checks once a second, whatever the names are, and does
    not notice a file that is rewritten in place.

    To be used on the main thread.
*/
class DirectoryWatcher : public QObject
{
    Q_OBJECT

public:
    // The path is absolute. Names match a filter such as "*.conf" as they do for QDir.
    DirectoryWatcher(const QString &directory, const QString &nameFilter,
                     QObject *parent = nullptr);
    ~DirectoryWatcher() override;
    Q_DISABLE_COPY_MOVE(DirectoryWatcher)

Q_SIGNALS:
    void changed();

private:
    friend class Inotify;

    // The directory or one of its parents: its path, its name in its own parent, and its watch if
    // it exists.
    struct Level {
        QString path;
        QByteArray name;
        int watch;
    };

    void watch();
    // Returns whether this is the first event since the last call of report() that matters.
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
