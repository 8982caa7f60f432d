// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef SIMULATEDDISKSERVICE_H
#define SIMULATEDDISKSERVICE_H

#include <QDBusConnection>
#include <QDBusMessage>
#include <QDBusVirtualObject>
#include <QString>

#include <chrono>

/*
    Simulates the disk service while the object exists, and replaces a real one. It has a bus connection
    of its own. The card that it mounts is a directory in memory: unmounting removes it. Real mounts are
    forbidden in some containers.
*/
class SimulatedDiskService : public QDBusVirtualObject
{
    Q_OBJECT

public:
    enum class Manner { Working, Failing, Silent };

    // Replies after the delay. The error is one of the disk service's own, for the manner Failing.
    explicit SimulatedDiskService(Manner manner, QString error = QString(),
                                  std::chrono::milliseconds delay = {});
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
    QString m_error;
    std::chrono::milliseconds m_delay;
    QDBusConnection m_connection;
};

#endif
