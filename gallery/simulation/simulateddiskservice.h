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
    The disk service for as long as this lives, in place of a real one, on a connection of its own.
    What it mounts as the card is a file system in memory, whose files go when it is unmounted.
*/
class SimulatedDiskService : public QDBusVirtualObject
{
    Q_OBJECT

public:
    enum class Manner { Working, Forbidding, Silent };

    SimulatedDiskService(Manner manner, const QString &devicePath);
    // With calls left unanswered, their callers learn that it has gone.
    ~SimulatedDiskService() override;
    Q_DISABLE_COPY_MOVE(SimulatedDiskService)

    QString introspect(const QString &path) const override;
    bool handleMessage(const QDBusMessage &message, const QDBusConnection &connection) override;

private:
    QDBusMessage mountCard(const QDBusMessage &call) const;
    QDBusMessage unmountCard(const QDBusMessage &call) const;

    Manner m_manner;
    QByteArray m_devicePath;
    QDBusConnection m_connection;
};

#endif
