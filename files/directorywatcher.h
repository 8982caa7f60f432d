// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DIRECTORYWATCHER_H
#define DIRECTORYWATCHER_H

#include <QFileSystemWatcher>

#include <optional>
#include <utility>

#include <sys/types.h>

/*
    Watches one directory, whether or not it exists yet: a package that brings the first definition
    brings its directory as well, and the last one to go takes it along.

    QFileSystemWatcher sees neither, nor a directory that is renamed: this watches the parent too,
    or the nearest one that exists.
*/
class DirectoryWatcher : public QObject
{
    Q_OBJECT

public:
    explicit DirectoryWatcher(QString directory, QObject *parent = nullptr);

Q_SIGNALS:
    // An entry was added, removed or renamed, or the directory itself came, went or was replaced.
    void directoryChanged(const QString &directory);

private:
    // What has the name at a moment: nothing, or an inode of a device.
    using Identity = std::optional<std::pair<dev_t, ino_t>>;

    void watch();
    void watchedChanged(const QString &path);
    Identity identify() const;

    QString m_directory;
    Identity m_identity;
    QFileSystemWatcher m_watcher;
};

#endif
