// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef SIMULATEDCARD_H
#define SIMULATEDCARD_H

#include "simulateddiskservice.h"

#include <QFile>
#include <QFileSystemWatcher>
#include <QObject>
#include <QProcess>
#include <QSocketNotifier>
#include <QString>

#include <memory>

/*
    The memory card of the gallery and its disk service. Both are real if gallery-with-card has made a
    card. Otherwise the card is only a name, and the service is simulated.
*/
class SimulatedCard : public QObject
{
    Q_OBJECT
    // Such as "loop0".
    Q_PROPERTY(QString name READ name CONSTANT)
    Q_PROPERTY(bool real READ isReal CONSTANT)
    Q_PROPERTY(bool inserted MEMBER m_inserted NOTIFY insertedChanged)
    Q_PROPERTY(bool mounted READ isMounted NOTIFY contentChanged)
    // The number of entries in the top directory of the mounted card.
    Q_PROPERTY(int fileCount READ fileCount NOTIFY contentChanged)
    // Whether a program has a file on the card open. The card cannot be unmounted then.
    Q_PROPERTY(bool inUse READ isInUse WRITE setInUse NOTIFY inUseChanged)
    Q_PROPERTY(
        DiskService diskService READ diskService WRITE setDiskService NOTIFY diskServiceChanged)
    // Whether a working disk service is on the bus.
    Q_PROPERTY(bool ready READ isReady NOTIFY readyChanged)

public:
    enum DiskService { Working, Forbidding, Silent, Absent };
    Q_ENUM(DiskService)

    explicit SimulatedCard(QObject *parent = nullptr);
    ~SimulatedCard() override;
    Q_DISABLE_COPY_MOVE(SimulatedCard)

    QString name() const { return m_name; }
    bool isReal() const { return m_real; }
    bool isMounted() const { return !m_directory.isEmpty(); }
    int fileCount() const;
    bool isInUse() const { return m_used.isOpen(); }
    void setInUse(bool inUse);
    DiskService diskService() const { return m_diskService; }
    void setDiskService(DiskService diskService);
    bool isReady() const;
    // Creates some directories and files.
    Q_INVOKABLE void fill();

Q_SIGNALS:
    void insertedChanged();
    void contentChanged();
    void inUseChanged();
    void diskServiceChanged();
    void readyChanged();

private:
    QString devicePath() const;
    void startDiskService();
    void followMounts();

    QString m_name;
    bool m_real = false;
    bool m_inserted = true;
    QString m_directory;
    QFile m_mounts;
    std::unique_ptr<QSocketNotifier> m_mountsNotifier;
    QFileSystemWatcher m_watcher;
    QFile m_used;
    DiskService m_diskService = Working;
    std::unique_ptr<SimulatedDiskService> m_simulated;
    std::unique_ptr<QProcess> m_daemon;
};

#endif
