// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef RECORDINGSERVICE_H
#define RECORDINGSERVICE_H

#include <QDBusConnection>
#include <QDBusMessage>
#include <QDBusVirtualObject>

/*
    A D-Bus peer that owns a service name on a connection of its own and keeps every method call to
    any of its objects.
*/
class RecordingService : public QDBusVirtualObject
{
    Q_OBJECT

public:
    enum class Answer { Reply, Error, Nothing };

    // Ends the test program if the service name cannot be registered.
    RecordingService(QDBusConnection::BusType bus, const QString &service);
    ~RecordingService() override;
    Q_DISABLE_COPY_MOVE(RecordingService)

    // Sets the reply to calls; an error has the given name and text.
    void setAnswer(Answer answer, const QString &errorName = QString(),
                   const QString &errorText = QStringLiteral("as told"));
    QList<QDBusMessage> calls() const { return m_calls; }
    QDBusConnection connection() const { return m_connection; }

    QString introspect(const QString &path) const override;
    bool handleMessage(const QDBusMessage &message, const QDBusConnection &connection) override;

Q_SIGNALS:
    void called(const QDBusMessage &message);

private:
    QDBusConnection m_connection;
    QString m_service;
    Answer m_answer = Answer::Reply;
    QString m_errorName;
    QString m_errorText;
    QList<QDBusMessage> m_calls;
};

#endif
