// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef MESSAGELOG_H
#define MESSAGELOG_H

#include <QList>
#include <QString>
#include <QStringList>
#include <QtGlobal>

class QRegularExpression;

/*
    Captures every message that is logged during its lifetime. A test takes the messages that it
    expects, in their order. Any message that is left is unexpected and should fail the test:

        void init() { m_log = std::make_unique<MessageLog>(); }
        void cleanup() { QCOMPARE(m_log->takeReport(), QString()); m_log.reset(); }

    Debug messages below the threshold of their category never reach it, as with any message
    handler.
*/
class MessageLog
{
public:
    struct Message {
        QtMsgType type;
        QString category;
        QString text;
        bool operator==(const Message &other) const
        {
            return type == other.type && category == other.category && text == other.text;
        }
    };

    MessageLog();
    ~MessageLog();
    Q_DISABLE_COPY_MOVE(MessageLog)

    // Returns and clears all messages so far, the oldest first.
    QList<Message> takeAll();
    // The texts of takeAll(), for tests that ignore type and category.
    QStringList takeTexts();
    // takeAll() as a text with one line for each message.
    QString takeReport();
    // The lines of takeReport() except those that match. This leaves out messages of other
    // libraries.
    QStringList takeLinesWithout(const QRegularExpression &ignored);
};

#endif
