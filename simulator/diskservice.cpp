// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

/*
    usage: disk-service-peer [METHOD=]SCENARIO...

    Simulates the disk service on the system bus. Prints "ready" on its standard output, and then a
    line of JSON for each call. SCENARIO is how it handles calls. With a METHOD, the scenario
    applies only to calls of that method:

      done            replies
      ERROR           answers with the disk service's error of that name, such as DeviceBusy
      UnknownError    answers with an error that no version of the disk service knows
      failed          answers with another service's error Failed
      slow            replies after a second
      hung            does not reply until there is a line on its standard input
      gone            ends without a reply
      absent          does not own the service's name at all; only without a METHOD

    An unknown scenario is an error. The program exits when its standard input is closed.
*/

#include "simulator/diskserviceerrors.h"

#include <QCoreApplication>
#include <QDBusArgument>
#include <QDBusConnection>
#include <QDBusError>
#include <QDBusMessage>
#include <QDBusVirtualObject>
#include <QHash>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QSocketNotifier>
#include <QTimer>

#include <array>
#include <cstdio>

#include <unistd.h>

namespace {

const QLatin1String service("org.freedesktop.UDisks2");
const QLatin1String rootPath("/org/freedesktop/UDisks2");
const QLatin1String errorPrefix("org.freedesktop.UDisks2.Error.");
// Differs from an error of the disk service in one character.
const QLatin1String otherError("org.freedesktop.UDisks3.Error.Failed");
const QLatin1String mountPoint("/media/card");
constexpr int slowness = 1000; // ms

const QStringList methods = {QStringLiteral("Mount"), QStringLiteral("Unmount")};
const QStringList errors = diskServiceErrors() + QStringList(QStringLiteral("UnknownError"));
const QStringList otherScenarios = {QStringLiteral("done"), QStringLiteral("failed"),
                                    QStringLiteral("slow"), QStringLiteral("hung"),
                                    QStringLiteral("gone")};
const QString absent = QStringLiteral("absent");

void say(const QByteArray &line)
{
    std::fputs((line + '\n').constData(), stdout);
    std::fflush(stdout);
}

QJsonValue toJson(const QVariant &argument)
{
    if (argument.userType() == qMetaTypeId<QDBusArgument>()) {
        const auto dbusArgument = argument.value<QDBusArgument>();
        if (dbusArgument.currentSignature() == QLatin1String("a{sv}")) {
            return QJsonObject::fromVariantMap(qdbus_cast<QVariantMap>(dbusArgument));
        }
    }
    return QJsonValue::fromVariant(argument);
}

class DiskService : public QDBusVirtualObject
{
public:
    explicit DiskService(const QHash<QString, QString> &scenarios) : m_scenarios(scenarios) { }

    QString introspect(const QString &path) const override
    {
        // Clients must not introspect: it would take time on the main thread of an application.
        QJsonObject line;
        line.insert(QStringLiteral("introspected"), path);
        say(QJsonDocument(line).toJson(QJsonDocument::Compact));
        return {};
    }

    bool handleMessage(const QDBusMessage &message, const QDBusConnection &bus) override
    {
        record(message);
        const QString scenario = m_scenarios.value(message.member());
        if (errors.contains(scenario)) {
            bus.send(message.createErrorReply(errorPrefix + scenario, QStringLiteral("as told")));
        } else if (scenario == QLatin1String("failed")) {
            bus.send(message.createErrorReply(otherError, QStringLiteral("as told")));
        } else if (scenario == QLatin1String("slow")) {
            QTimer::singleShot(slowness, this, [message, bus] { reply(message, bus); });
        } else if (scenario == QLatin1String("hung")) {
            m_kept.append(message);
        } else if (scenario == QLatin1String("gone")) {
            _exit(0);
        } else if (scenario == QLatin1String("done")) {
            reply(message, bus);
        } else {
            bus.send(message.createErrorReply(QDBusError::UnknownMethod, message.member()));
        }
        return true;
    }

    void replyToKept(const QDBusConnection &bus)
    {
        for (const QDBusMessage &message : qAsConst(m_kept)) {
            reply(message, bus);
        }
        m_kept.clear();
    }

private:
    static void reply(const QDBusMessage &message, const QDBusConnection &bus)
    {
        bus.send(message.member() == QLatin1String("Mount")
                     ? message.createReply(QString(mountPoint))
                     : message.createReply());
    }

    static void record(const QDBusMessage &message)
    {
        QJsonArray arguments;
        const QVariantList given = message.arguments();
        for (const QVariant &argument : given) {
            arguments.append(toJson(argument));
        }
        const QJsonObject line = {
            {QStringLiteral("path"), message.path()},
            {QStringLiteral("interface"), message.interface()},
            {QStringLiteral("member"), message.member()},
            {QStringLiteral("signature"), message.signature()},
            {QStringLiteral("arguments"), arguments},
        };
        say(QJsonDocument(line).toJson(QJsonDocument::Compact));
    }

    const QHash<QString, QString> m_scenarios;
    QList<QDBusMessage> m_kept;
};

} // namespace

int main(int argc, char *argv[])
{
    const QCoreApplication application(argc, argv);

    QStringList words = QCoreApplication::arguments().mid(1);
    const bool isAbsent = words == QStringList(absent);
    QHash<QString, QString> scenarios;
    for (const QString &word : isAbsent ? QStringList() : words) {
        const QString method = word.section(QLatin1Char('='), 0, -2);
        const QString scenario = word.section(QLatin1Char('='), -1);
        if ((!errors.contains(scenario) && !otherScenarios.contains(scenario))
            || (!method.isEmpty() && !methods.contains(method))) {
            std::fprintf(stderr, "disk-service-peer: unknown scenario %s\n", qPrintable(word));
            return 2;
        }
        for (const QString &each : method.isEmpty() ? methods : QStringList(method)) {
            scenarios.insert(each, scenario);
        }
    }
    if (words.isEmpty()) {
        std::fputs("disk-service-peer: a scenario is needed\n", stderr);
        return 2;
    }

    DiskService diskService(scenarios);
    QDBusConnection bus = QDBusConnection::systemBus();
    if (!isAbsent
        && (!bus.registerVirtualObject(rootPath, &diskService, QDBusConnection::SubPath)
            || !bus.registerService(service))) {
        std::fprintf(stderr, "disk-service-peer: %s\n", qPrintable(bus.lastError().message()));
        return 1;
    }

    const QSocketNotifier input(STDIN_FILENO, QSocketNotifier::Read);
    QObject::connect(&input, &QSocketNotifier::activated, &diskService, [&diskService, bus] {
        std::array<char, 64> buffer = {};
        if (read(STDIN_FILENO, buffer.data(), buffer.size()) > 0) {
            diskService.replyToKept(bus);
        } else {
            QCoreApplication::quit();
        }
    });
    say("ready");
    return QCoreApplication::exec();
}
