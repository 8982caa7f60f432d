// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "coverdaemon.h"

#include <QDBusError>

namespace {

const QString service = QStringLiteral("com.marlo.kivd");
const QString path = QStringLiteral("/com/marlo/kivd");
const QString propertiesInterface = QStringLiteral("org.freedesktop.DBus.Properties");

QString propertyOf(const QDBusMessage &call)
{
    return call.arguments().value(1).toString();
}

} // namespace

CoverDaemon::CoverDaemon()
    : m_connection(
        QDBusConnection::connectToBus(QDBusConnection::SystemBus, QStringLiteral("cover daemon")))
{
    if (!m_connection.registerVirtualObject(QStringLiteral("/"), this, QDBusConnection::SubPath)
        || !m_connection.registerService(service)) {
        qFatal("cannot own %s: %s", qPrintable(service),
               qPrintable(m_connection.lastError().message()));
    }
}

CoverDaemon::~CoverDaemon()
{
    m_connection.unregisterService(service);
    QDBusConnection::disconnectFromBus(m_connection.name());
}

void CoverDaemon::answer(const QString &property, const QVariantList &arguments)
{
    setAnswer(property, {false, arguments});
}

void CoverDaemon::answerWithError(const QString &property)
{
    setAnswer(property, {true, {}});
}

void CoverDaemon::sendPropertiesChanged(const QVariantList &arguments)
{
    QDBusMessage changed =
        QDBusMessage::createSignal(path, propertiesInterface, QStringLiteral("PropertiesChanged"));
    changed.setArguments(arguments);
    if (!m_connection.send(changed)) {
        qFatal("cannot send the signal");
    }
}

void CoverDaemon::sendChanges(const QVariantMap &changes, const QStringList &invalidated)
{
    sendPropertiesChanged({service, changes, invalidated});
}

QString CoverDaemon::introspect(const QString & /*path*/) const
{
    return {};
}

bool CoverDaemon::handleMessage(const QDBusMessage &message, const QDBusConnection &connection)
{
    Q_UNUSED(connection)
    m_calls.append(message);
    const auto answer = m_answers.constFind(propertyOf(message));
    if (answer != m_answers.constEnd()) {
        send(message, *answer);
    } else {
        m_waiting.append(message);
    }
    return true;
}

void CoverDaemon::setAnswer(const QString &property, const Answer &answer)
{
    m_answers.insert(property, answer);
    QList<QDBusMessage> stillWaiting;
    for (const QDBusMessage &call : qAsConst(m_waiting)) {
        if (propertyOf(call) == property) {
            send(call, answer);
        } else {
            stillWaiting.append(call);
        }
    }
    m_waiting = stillWaiting;
}

void CoverDaemon::send(const QDBusMessage &call, const Answer &answer)
{
    const QDBusMessage reply = answer.isError
        ? call.createErrorReply(QStringLiteral("com.marlo.kivd.Error"), QStringLiteral("as told"))
        : call.createReply(answer.arguments);
    if (!m_connection.send(reply)) {
        qFatal("cannot send the reply");
    }
}
