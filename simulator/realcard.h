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

    The system outside is not affected. Mounts and device nodes are in a mount namespace of their
    own, the device manager communicates in a network namespace of its own, and the loop device
    belongs to whoever has it open. When the process ends, in whatever way, all of this disappears.
*/
class RealCard
{
public:
    // Why a card cannot be created here; empty if it can.
    static QString whyNot();
    // Leaves the namespaces that the process shares with others. Call this once, before there is a
    // second thread.
    static void becomePrivate();
    // Installs a program that really formats and probes memory cards. Processes outside the network
    // namespace of this process may run it, too. While the file /usr/libexec/sdcardhelper-waits
    // exists, the program waits.
    static void installHelper();

    // Ends the program if something that it requires is missing.
    RealCard();
    ~RealCard();
    Q_DISABLE_COPY_MOVE(RealCard)

    // Such as loop0 and /dev/loop0.
    QString name() const { return m_name; }
    QString path() const { return m_path; }

    // Turns it into an empty, unmounted ext4 card, and waits until the disk service has noticed.
    void reset();
    // Where the card is mounted.
    QStringList mountDirectories() const;
    QString file(const QString &name) const;
    QStringList files() const;
    // The value of a tag that blkid finds on the card.
    QString probe(const char *tag) const;

    // Makes changes to the files on the card wait until thaw().
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
