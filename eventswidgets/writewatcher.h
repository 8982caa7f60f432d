// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef WRITEWATCHER_H
#define WRITEWATCHER_H

#include <QObject>

/*
    Tells when somebody who wrote to a file of a directory has closed it: then the file is complete.

    QFileSystemWatcher tells of no write to a file that is not watched itself, and of every single
    one to a file that is. Writes to what a link in the directory leads to are not seen.
*/
class WriteWatcher : public QObject
{
    Q_OBJECT

public:
    explicit WriteWatcher(QObject *parent = nullptr);
    ~WriteWatcher() override;
    Q_DISABLE_COPY_MOVE(WriteWatcher)

    // Watches the directory that has the name now, in place of any before, and forgets what was
    // written until now: who looks at the files after this sees it.
    void watch(const QString &directory);

Q_SIGNALS:
    void written();

private:
    bool takeEvents();

    // Negative if the user's watches are used up: files that are rewritten in place go unnoticed.
    int m_inotify;
    int m_watch = -1;
};

#endif
