// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef THROWAWAYROOT_H
#define THROWAWAYROOT_H

#include "messagelog.h"
#include "simulator/recordingservice.h"

#include <QObject>
#include <QVariant>

#include <memory>

/*
    What a QML test makes its world with: files, dconf keys, catalogs, the language, and D-Bus
    peers.
*/
class ThrowAwayRoot : public QObject
{
    Q_OBJECT

public:
    explicit ThrowAwayRoot(QObject *parent = nullptr);
    ~ThrowAwayRoot() override;

    Q_INVOKABLE void writeFile(const QString &path, const QString &content) const;
    Q_INVOKABLE void removeFile(const QString &path) const;
    Q_INVOKABLE void installCatalog(const QString &name) const;
    Q_INVOKABLE void setLocale(const QString &name) const;

    Q_INVOKABLE void setKey(const QString &key, const QVariant &value) const;
    Q_INVOKABLE void setStringList(const QString &key, const QStringList &value) const;
    Q_INVOKABLE void unsetKey(const QString &key) const;
    Q_INVOKABLE QVariant key(const QString &key) const;

    // A peer on the session bus, one at a time, and what it was called with so far.
    Q_INVOKABLE void ownService(const QString &name);
    Q_INVOKABLE void disownService();
    Q_INVOKABLE QVariantList receivedCalls() const;

    // From here on messages are taken; whatever a test does not expect should fail it. Before, what
    // QML has to say of the test itself is to be seen.
    Q_INVOKABLE void recordMessages();
    // Returns the messages that were logged since the last call.
    Q_INVOKABLE QStringList takeMessages();

private:
    std::unique_ptr<MessageLog> m_log;
    std::unique_ptr<RecordingService> m_service;
};

#endif
