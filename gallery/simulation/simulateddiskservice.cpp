// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "simulateddiskservice.h"

#include "mounttable.h"

#include <QDBusConnectionInterface>
#include <QDBusError>
#include <QDebug>
#include <QDir>
#include <QFile>

#include <cerrno>

#include <sys/mount.h>

namespace {

const QString service = QStringLiteral("org.freedesktop.UDisks2");
const QLatin1String errorPrefix("org.freedesktop.UDisks2.Error.");

QDBusMessage errorReply(const QDBusMessage &call, const char *name)
{
    return call.createErrorReply(errorPrefix + QLatin1String(name), QStringLiteral("simulated"));
}

} // namespace

SimulatedDiskService::SimulatedDiskService(Manner manner, const QString &devicePath)
    : m_manner(manner), m_devicePath(QFile::encodeName(devicePath)),
      m_connection(QDBusConnection::connectToBus(QDBusConnection::SystemBus,
                                                 QStringLiteral("simulated disk service")))
{
    // A real disk service allows other programs to replace it, and exits then.
    if (!m_connection.registerVirtualObject(QStringLiteral("/"), this, QDBusConnection::SubPath)
        || !m_connection.interface()->registerService(
            service, QDBusConnectionInterface::ReplaceExistingService)) {
        qWarning() << "cannot simulate the disk service:" << m_connection.lastError().message();
    }
}

SimulatedDiskService::~SimulatedDiskService()
{
    m_connection.unregisterObject(QStringLiteral("/"), QDBusConnection::UnregisterTree);
    // A real disk service that starts before the name is free would end.
    m_connection.interface()->unregisterService(service);
    QDBusConnection::disconnectFromBus(m_connection.name());
}

QString SimulatedDiskService::introspect(const QString &path) const
{
    Q_UNUSED(path)
    return {};
}

bool SimulatedDiskService::handleMessage(const QDBusMessage &message,
                                         const QDBusConnection &connection)
{
    switch (m_manner) {
    case Manner::Working:
        connection.send(message.member() == QLatin1String("Mount") ? mountCard(message)
                                                                   : unmountCard(message));
        break;
    case Manner::Forbidding:
        connection.send(errorReply(message, "NotAuthorized"));
        break;
    case Manner::Silent:
        break;
    }
    return true;
}

QDBusMessage SimulatedDiskService::mountCard(const QDBusMessage &call) const
{
    if (!MountTable::directoryOf(m_devicePath).isEmpty()) {
        return errorReply(call, "AlreadyMounted");
    }
    const QString directory = qEnvironmentVariable("XDG_RUNTIME_DIR") + QStringLiteral("/card");
    QDir().mkpath(directory);
    if (mount(m_devicePath.constData(), QFile::encodeName(directory).constData(), "tmpfs",
              MS_NOSUID | MS_NODEV, "mode=755,size=16m")
        != 0) {
        return errorReply(call, "Failed");
    }
    return call.createReply(directory);
}

QDBusMessage SimulatedDiskService::unmountCard(const QDBusMessage &call) const
{
    const QString directory = MountTable::directoryOf(m_devicePath);
    if (directory.isEmpty()) {
        return errorReply(call, "NotMounted");
    }
    if (umount2(QFile::encodeName(directory).constData(), 0) != 0) {
        return errorReply(call, errno == EBUSY ? "DeviceBusy" : "Failed");
    }
    return call.createReply();
}
