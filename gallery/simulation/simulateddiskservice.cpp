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
#include <QTimer>

#include <algorithm>
#include <utility>

namespace {

const QString service = QStringLiteral("org.freedesktop.UDisks2");
const QLatin1String errorPrefix("org.freedesktop.UDisks2.Error.");

QDBusMessage errorReply(const QDBusMessage &call, const QString &name)
{
    return call.createErrorReply(errorPrefix + name, QStringLiteral("simulated"));
}

// The name of the card that a call is for, such as "mmcblk1p1".
QString cardOf(const QDBusMessage &call)
{
    return call.path().section(QLatin1Char('/'), -1);
}

QByteArray deviceOf(const QDBusMessage &call)
{
    return QFile::encodeName(QStringLiteral("/dev/") + cardOf(call));
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

SimulatedDiskService::SimulatedDiskService(Manner manner, QString error,
                                           std::chrono::milliseconds delay)
    : m_manner(manner), m_error(std::move(error)), m_delay(delay),
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
    if (m_manner != Manner::Silent) {
        QTimer::singleShot(m_delay, this, [this, message, connection] {
            connection.send(m_manner == Manner::Failing ? errorReply(message, m_error)
                                : message.member() == QLatin1String("Mount")
                                ? mountCard(message)
                                : unmountCard(message));
        });
    }
    return true;
}

QDBusMessage SimulatedDiskService::mountCard(const QDBusMessage &call)
{
    if (!MountTable::directoryOf(deviceOf(call)).isEmpty()) {
        return errorReply(call, QStringLiteral("AlreadyMounted"));
    }
    const QString directory =
        qEnvironmentVariable("XDG_RUNTIME_DIR") + QStringLiteral("/card-") + cardOf(call);
    if (!QDir().mkpath(directory)
        || !MountTable::setDirectoryOf(deviceOf(call), QFile::encodeName(directory))) {
        return errorReply(call, QStringLiteral("Failed"));
    }
    Q_EMIT mountsChanged();
    return call.createReply(directory);
}

QDBusMessage SimulatedDiskService::unmountCard(const QDBusMessage &call)
{
    const QString directory = MountTable::directoryOf(deviceOf(call));
    if (directory.isEmpty()) {
        return errorReply(call, QStringLiteral("NotMounted"));
    }
    if (isInUse(directory)) {
        return errorReply(call, QStringLiteral("DeviceBusy"));
    }
    if (!MountTable::setDirectoryOf(deviceOf(call), {}) || !QDir(directory).removeRecursively()) {
        return errorReply(call, QStringLiteral("Failed"));
    }
    Q_EMIT mountsChanged();
    return call.createReply();
}
