// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef REALCARD_H
#define REALCARD_H

#include <QByteArray>
#include <QFile>
#include <QProcess>
#include <QString>
#include <QStringList>

/*
    A block device to format and mount, with the distribution's own disk service, device manager and
    tools: a loop device over a file in memory.

    The system outside takes no notice. Mounts and device nodes are made in a mount namespace of
    their own, the device manager speaks in a network namespace of its own, and the loop device
    belongs to whoever has it open. All of it goes with the process, however that ends.
*/
class RealCard
{
public:
    // Why a card cannot be created here; empty if it can.
    static QString whyNot();
    // Leaves the namespaces that the process shares with others: to be called once, before there is
    // a second thread.
    static void becomePrivate();
    // Installs a program that formats and probes memory cards for real; it may be run from outside
    // the network namespace of this process. While the file /usr/libexec/sdcardhelper-waits
    // exists, the program waits.
    static void installHelper();

    // Ends the program if something that it requires is missing.
    RealCard();
    ~RealCard();
    Q_DISABLE_COPY_MOVE(RealCard)

    // Such as loop0 and /dev/loop0.
    QString name() const { return m_name; }
    QString path() const { return m_path; }

    // Makes it an empty, unmounted ext4 card, and waits until the disk service has noticed that.
    void reset();
    // Where it is mounted.
    QStringList mountDirectories() const;
    QString file(const QString &name) const;
    QStringList files() const;
    // The value of a tag that blkid finds on it.
    QString probe(const char *tag) const;

    // Changes to its files wait from here until thaw().
    void freeze();
    void thaw();
    // Removes the device while its file system is mounted; reset() restores it.
    void vanish();

private:
    void startDaemon(QProcess *process, const QString &program);
    void setSize(qint64 size);
    bool isKnownToDiskService() const;

    QProcess m_deviceManager;
    QProcess m_diskService;
    QFile m_image;
    QFile m_device;
    QString m_name;
    QString m_path;
    int m_frozen = -1;
};

#endif
