// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef SIMULATEDDISKSERVICE_H
#define SIMULATEDDISKSERVICE_H

#include <QByteArray>
#include <QDBusConnection>
#include <QDBusMessage>
#include <QDBusVirtualObject>
#include <QString>

/*
    Simulates the disk service while the object exists, and replaces a real one. It has a bus connection
    of its own. The card that it mounts is a directory in memory: unmounting removes it. Real mounts are
    forbidden in some containers.
*/
class SimulatedDiskService : public QDBusVirtualObject
{
    Q_OBJECT

public:
    enum class Manner { Working, Forbidding, Silent };

    SimulatedDiskService(Manner manner, const QString &devicePath);
    // The callers of unanswered calls get an error.
    ~SimulatedDiskService() override;
    Q_DISABLE_COPY_MOVE(SimulatedDiskService)

    QString introspect(const QString &path) const override;
    bool handleMessage(const QDBusMessage &message, const QDBusConnection &connection) override;

Q_SIGNALS:
    void mountsChanged();

private:
    QDBusMessage mountCard(const QDBusMessage &call);
    QDBusMessage unmountCard(const QDBusMessage &call);

    Manner m_manner;
    QByteArray m_devicePath;
    QDBusConnection m_connection;
};

#endif
