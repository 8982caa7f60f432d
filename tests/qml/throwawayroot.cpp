// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "throwawayroot.h"

#include "files.h"
#include "mgconfitem.h"

#include <QLocale>

ThrowAwayRoot::ThrowAwayRoot(QObject *parent) : QObject(parent)
{
}

ThrowAwayRoot::~ThrowAwayRoot() = default;

void ThrowAwayRoot::writeFile(const QString &path, const QString &content) const
{
    Files::write(path, content.toUtf8());
}

void ThrowAwayRoot::removeFile(const QString &path) const
{
    Files::remove(path);
}

void ThrowAwayRoot::installCatalog(const QString &name) const
{
    Files::installCatalog(name);
}

void ThrowAwayRoot::setLocale(const QString &name) const
{
    QLocale::setDefault(QLocale(name));
}

void ThrowAwayRoot::setKey(const QString &key, const QVariant &value) const
{
    MGConfItem(key).set(value);
}

void ThrowAwayRoot::setStringList(const QString &key, const QStringList &value) const
{
    MGConfItem(key).set(value);
}

void ThrowAwayRoot::unsetKey(const QString &key) const
{
    MGConfItem(key).unset();
}

QVariant ThrowAwayRoot::key(const QString &key) const
{
    return MGConfItem(key).value();
}

void ThrowAwayRoot::ownService(const QString &name)
{
    m_service = std::make_unique<RecordingService>(QDBusConnection::SessionBus, name);
}

void ThrowAwayRoot::disownService()
{
    m_service.reset();
}

QVariantList ThrowAwayRoot::receivedCalls() const
{
    QVariantList calls;
    if (m_service != nullptr) {
        const QList<QDBusMessage> messages = m_service->calls();
        for (const QDBusMessage &message : messages) {
            calls.append(QVariantMap{{QStringLiteral("path"), message.path()},
                                     {QStringLiteral("interface"), message.interface()},
                                     {QStringLiteral("method"), message.member()},
                                     {QStringLiteral("arguments"), message.arguments()}});
        }
    }
    return calls;
}

void ThrowAwayRoot::recordMessages()
{
    m_log = std::make_unique<MessageLog>();
}

QStringList ThrowAwayRoot::takeMessages()
{
    return m_log->takeTexts();
}
