// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef THROWAWAYROOT_H
#define THROWAWAYROOT_H

#include "dconftool.h"
#include "files.h"
#include "messagelog.h"
#include "mgconfitem.h"
#include "simulator/recordingservice.h"

#include <QLocale>
#include <QObject>
#include <QVariant>

#include <memory>

/*
    The environment of a QML test: files, dconf keys, catalogs, the language, and D-Bus peers.
*/
class ThrowAwayRoot : public QObject
{
    Q_OBJECT

public:
    using QObject::QObject;

    Q_INVOKABLE void writeFile(const QString &path, const QString &content) const
    {
        Files::write(path, content.toUtf8());
    }
    Q_INVOKABLE void removeFile(const QString &path) const { Files::remove(path); }
    Q_INVOKABLE void installCatalog(const QString &name) const { Files::installCatalog(name); }
    Q_INVOKABLE void setLocale(const QString &name) const { QLocale::setDefault(QLocale(name)); }

    Q_INVOKABLE void setKey(const QString &key, const QVariant &value) const
    {
        MGConfItem(key).set(value);
    }
    Q_INVOKABLE void setStringList(const QString &key, const QStringList &value) const
    {
        MGConfItem(key).set(value);
    }
    Q_INVOKABLE void unsetKey(const QString &key) const { MGConfItem(key).unset(); }
    Q_INVOKABLE QVariant key(const QString &key) const { return MGConfItem(key).value(); }
    // The module has its own dconf client. Its writes may overtake those of this program.
    Q_INVOKABLE void waitUntilStored() const { DconfTool::waitUntilStored(); }

    // A peer on the session bus, one at a time, and the calls that it has received so far.
    Q_INVOKABLE void ownService(const QString &name)
    {
        m_service = std::make_unique<RecordingService>(QDBusConnection::SessionBus, name);
    }
    Q_INVOKABLE void disownService() { m_service.reset(); }
    Q_INVOKABLE QVariantList receivedCalls() const
    {
        QVariantList calls;
        const QList<QDBusMessage> messages = m_service->calls();
        for (const QDBusMessage &message : messages) {
            calls.append(QVariantMap{{QStringLiteral("path"), message.path()},
                                     {QStringLiteral("interface"), message.interface()},
                                     {QStringLiteral("method"), message.member()},
                                     {QStringLiteral("arguments"), message.arguments()}});
        }
        return calls;
    }

    // Records messages from now on; a test should fail if there is one that it does not expect.
    // Earlier messages, such as QML's about the test itself, are printed.
    Q_INVOKABLE void recordMessages() { m_log = std::make_unique<MessageLog>(); }
    // Returns the messages that were logged since the last call.
    Q_INVOKABLE QStringList takeMessages() { return m_log->takeTexts(); }

private:
    std::unique_ptr<MessageLog> m_log;
    std::unique_ptr<RecordingService> m_service;
};

#endif
