// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "simulateddiskservice.h"

#include "mounttable.h"

#include <QDBusConnectionInterface>
#include <QDBusError>
#include <QDebug>
#include <QDir>
#include <QFile>
#include <QFileInfo>

#include <algorithm>

namespace {

const QString service = QStringLiteral("org.freedesktop.UDisks2");
const QLatin1String errorPrefix("org.freedesktop.UDisks2.Error.");

QDBusMessage errorReply(const QDBusMessage &call, const char *name)
{
    return call.createErrorReply(errorPrefix + QLatin1String(name), QStringLiteral("simulated"));
}

// Whether this process has a file in the directory open.
bool isInUse(const QString &directory)
{
    const QFileInfoList descriptors =
        QDir(QStringLiteral("/proc/self/fd")).entryInfoList(QDir::Files | QDir::System);
    return std::any_of(descriptors.cbegin(), descriptors.cend(), [&](const QFileInfo &descriptor) {
        return descriptor.symLinkTarget().startsWith(directory + QLatin1Char('/'));
    });
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

QDBusMessage SimulatedDiskService::mountCard(const QDBusMessage &call)
{
    if (!MountTable::directoryOf(m_devicePath).isEmpty()) {
        return errorReply(call, "AlreadyMounted");
    }
    const QString directory = qEnvironmentVariable("XDG_RUNTIME_DIR") + QStringLiteral("/card");
    if (!QDir().mkpath(directory)
        || !MountTable::setDirectoryOf(m_devicePath, QFile::encodeName(directory))) {
        return errorReply(call, "Failed");
    }
    Q_EMIT mountsChanged();
    return call.createReply(directory);
}

QDBusMessage SimulatedDiskService::unmountCard(const QDBusMessage &call)
{
    const QString directory = MountTable::directoryOf(m_devicePath);
    if (directory.isEmpty()) {
        return errorReply(call, "NotMounted");
    }
    if (isInUse(directory)) {
        return errorReply(call, "DeviceBusy");
    }
    if (!MountTable::setDirectoryOf(m_devicePath, {}) || !QDir(directory).removeRecursively()) {
        return errorReply(call, "Failed");
    }
    Q_EMIT mountsChanged();
    return call.createReply();
}
