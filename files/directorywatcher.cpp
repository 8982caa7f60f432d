// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "directorywatcher.h"

#include <QFile>
#include <QFileInfo>

#include <sys/stat.h>

namespace {

QString parentOf(const QString &path)
{
    return path.left(qMax(1, path.lastIndexOf(QLatin1Char('/'))));
}

QString nearestExisting(QString path)
{
    while (path.size() > 1 && !QFileInfo(path).isDir()) {
        path = parentOf(path);
    }
    return path;
}

} // namespace

DirectoryWatcher::DirectoryWatcher(QString directory, QObject *parent)
    : QObject(parent), m_directory(std::move(directory)), m_watcher(this)
{
    // Not at once: where there is no inotify, QFileSystemWatcher tells of a change in the midst of
    // going through its watches, and watchedChanged() takes them off.
    connect(&m_watcher, &QFileSystemWatcher::directoryChanged, this,
            &DirectoryWatcher::watchedChanged, Qt::QueuedConnection);
    watch();
}

void DirectoryWatcher::watch()
{
    // A watch belongs to the directory that had the name when it was made. One that was removed and
    // made again looks watched, and is not: take every watch off and put it on anew. Between
    // looking and watching, a directory may have come or gone.
    QString nearest;
    do {
        const QStringList watched = m_watcher.directories();
        if (!watched.isEmpty()) {
            m_watcher.removePaths(watched);
        }
        m_identity = identify();
        nearest = nearestExisting(m_directory);
        m_watcher.addPath(nearest);
        if (nearest == m_directory) {
            m_watcher.addPath(parentOf(m_directory));
        }
    } while (nearest != nearestExisting(m_directory) || m_identity != identify());
}

void DirectoryWatcher::watchedChanged(const QString &path)
{
    // What else happens in the parent is of no interest. The watches stay, too: taking them off
    // would lose what the directory itself has yet to report.
    if (path != m_directory && m_identity && m_identity == identify()) {
        return;
    }
    const Identity before = m_identity;
    watch();
    if (path == m_directory || m_identity != before) {
        Q_EMIT directoryChanged(m_directory);
    }
}

DirectoryWatcher::Identity DirectoryWatcher::identify() const
{
    struct stat entry = {};
    if (stat(QFile::encodeName(m_directory).constData(), &entry) != 0) {
        return {};
    }
    return std::make_pair(entry.st_dev, entry.st_ino);
}
