// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "messagelog.h"
#include "texts.h"

#include <QMutex>
#include <QMutexLocker>
#include <QRegularExpression>
#include <QStringList>

#include <algorithm>

namespace {

// A message handler is a plain function and messages come from any thread.
QMutex mutex;
QList<MessageLog::Message> messages;
QtMessageHandler previousHandler = nullptr;

void record(QtMsgType type, const QMessageLogContext &context, const QString &text)
{
    if (type == QtFatalMsg) {
        previousHandler(type, context, text);
        return;
    }
    const QMutexLocker locker(&mutex);
    messages.append({type, QString::fromUtf8(context.category), text});
}

} // namespace

MessageLog::MessageLog()
{
    // Every test creates a log, and no test may run where its changes to files and keys persist.
    if (!qEnvironmentVariableIsSet("MARLO_THROW_AWAY_ROOT")) {
        qFatal("this test runs only in the throw-away root of simulator");
    }
    messages.clear();
    previousHandler = qInstallMessageHandler(record);
}

MessageLog::~MessageLog()
{
    qInstallMessageHandler(previousHandler);
}

QList<MessageLog::Message> MessageLog::takeAll()
{
    const QMutexLocker locker(&mutex);
    QList<Message> taken;
    taken.swap(messages);
    return taken;
}

QStringList MessageLog::takeTexts()
{
    QStringList texts;
    const auto taken = takeAll();
    for (const Message &message : taken) {
        texts.append(message.text);
    }
    return texts;
}

QString MessageLog::takeReport()
{
    static const char *const types[] = {"debug", "warning", "critical", "fatal", "info"};
    QStringList lines;
    const auto taken = takeAll();
    for (const Message &message : taken) {
        lines.append(
            "%1 [%2] %3"_s.arg(QLatin1String(types[message.type]), message.category, message.text));
    }
    return lines.join(QLatin1Char('\n'));
}

QStringList MessageLog::takeLinesWithout(const QRegularExpression &ignored)
{
    QStringList lines = takeReport().split(QLatin1Char('\n'), Qt::SkipEmptyParts);
    const auto isIgnored = [&ignored](const QString &line) { return line.contains(ignored); };
    lines.erase(std::remove_if(lines.begin(), lines.end(), isIgnored), lines.end());
    return lines;
}
