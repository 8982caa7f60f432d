// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef FILEREMOVER_H
#define FILEREMOVER_H

#include <QObject>
#include <QRunnable>
#include <QString>

#include <memory>

/*
    Removes all files and directories from a mounted memory card and leaves its mount directory in
    place.

    A remover runs once, on a thread pool, which deletes it afterwards. run() ends by emitting one
    of the two signals, once, on the pool's thread. A remover that is deleted before it has run
    emits error(). A warning in the category of faultlog.h says why a removal failed.
*/
class FileRemover : public QObject, public QRunnable
{
    Q_OBJECT

public:
    // run() finds the card in the mount table by this device node, for example /dev/mmcblk1p1.
    explicit FileRemover(QString devicePath);
    ~FileRemover() override;

    // Hands the remover to the global thread pool. If the process cannot start a thread, deletes
    // it and returns false.
    [[nodiscard]] static bool start(std::unique_ptr<FileRemover> remover);

    void run() override;

    // Removes everything below the directory. Returns whether all of it was removed; also true for
    // a directory that cannot be read.
    static bool removeAllEntries(const QString &path);

Q_SIGNALS:
    // The card is empty.
    void completed();
    // No card is mounted from the device, or something is left on it.
    void error();

private:
    bool emptyCard() const;

    const QString m_devicePath;
    // Why the remover has not run, while it has not.
    const char *m_obstacle = "it was taken from the thread pool";
};

#endif
