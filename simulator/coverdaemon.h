// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef COVERDAEMON_H
#define COVERDAEMON_H

#include <QDBusConnection>
#include <QDBusMessage>
#include <QDBusVirtualObject>
#include <QHash>

/*
    Simulates the smart back cover's daemon, com.marlo.kivd on the system bus, on a connection of
    its own. A test sets its replies, right or wrong. It keeps every call to any of its objects.
*/
class CoverDaemon : public QDBusVirtualObject
{
    Q_OBJECT

public:
    // Ends the test program if it cannot own the name. A new daemon replies to no call.
    CoverDaemon();
    ~CoverDaemon() override;
    Q_DISABLE_COPY_MOVE(CoverDaemon)

    // Sets the reply to reads of a property, including reads that already wait for a reply. The
    // arguments are sent unchanged: the real daemon sends a bare string for KIVID and a bare
    // 32 bit integer for Ready.
    void answer(const QString &property, const QVariantList &arguments);
    void answerWithError(const QString &property);

    // Sends PropertiesChanged with these arguments, unchanged.
    void sendPropertiesChanged(const QVariantList &arguments);
    // Sends PropertiesChanged as the real daemon does.
    void sendChanges(const QVariantMap &changes, const QStringList &invalidated = {});

    QList<QDBusMessage> calls() const { return m_calls; }
    QDBusConnection connection() const { return m_connection; }

    QString introspect(const QString &path) const override;
    bool handleMessage(const QDBusMessage &message, const QDBusConnection &connection) override;

private:
    struct Answer {
        bool isError = false;
        QVariantList arguments;
    };

    void setAnswer(const QString &property, const Answer &answer);
    void send(const QDBusMessage &call, const Answer &answer);

    QDBusConnection m_connection;
    QHash<QString, Answer> m_answers;
    QList<QDBusMessage> m_calls;
    QList<QDBusMessage> m_waiting;
};

#endif
