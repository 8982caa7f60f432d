// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "recordingservice.h"

#include <QDBusError>

RecordingService::RecordingService(QDBusConnection::BusType bus, const QString &service)
    : m_connection(QDBusConnection::connectToBus(bus, QStringLiteral("peer ") + service)),
      m_service(service)
{
    if (!m_connection.registerVirtualObject(QStringLiteral("/"), this, QDBusConnection::SubPath)
        || !m_connection.registerService(service)) {
        qFatal("cannot own %s: %s", qPrintable(service),
               qPrintable(m_connection.lastError().message()));
    }
}

RecordingService::~RecordingService()
{
    m_connection.unregisterService(m_service);
    // QtDBus ends the connection in a thread of its own, where it would also release the registered
    // objects.
    m_connection.unregisterObject(QStringLiteral("/"), QDBusConnection::UnregisterTree);
    QDBusConnection::disconnectFromBus(m_connection.name());
}

void RecordingService::setAnswer(Answer answer, const QString &errorName, const QString &errorText)
{
    m_answer = answer;
    m_errorName = errorName;
    m_errorText = errorText;
}

QString RecordingService::introspect(const QString &path) const
{
    Q_UNUSED(path)
    return {};
}

bool RecordingService::handleMessage(const QDBusMessage &message, const QDBusConnection &connection)
{
    m_calls.append(message);
    switch (m_answer) {
    case Answer::Reply:
        connection.send(message.createReply());
        break;
    case Answer::Error:
        connection.send(message.createErrorReply(m_errorName, m_errorText));
        break;
    case Answer::Nothing:
        break;
    }
    Q_EMIT called(message);
    return true;
}
