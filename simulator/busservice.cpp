// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

/*
    usage: bus-service-peer system|session SERVICE SCENARIO

    Owns the name SERVICE on a bus and simulates any service, in a process that may be stopped
    and killed. Prints "ready" on its standard output, and then a line with the member of each call.
    SCENARIO is how it handles calls:

      replies       replies; to reads of the properties KIVID and Ready with "cover-0" and 1
      other-types   replies to every call with a structure, a dictionary and an array
      error         replies with an unknown error
      gone          ends without a reply

    For a line with a number on its standard input, it sends that many signals: PropertiesChanged
    with KIVID "cover-1" and so on, and with Ready 1 in the last. An unknown scenario is an error.
    It exits when its standard input is closed.
*/

#include <QCoreApplication>
#include <QDBusArgument>
#include <QDBusConnection>
#include <QDBusError>
#include <QDBusMessage>
#include <QDBusVirtualObject>
#include <QSocketNotifier>

#include <cstdio>
#include <iostream>
#include <string>

#include <unistd.h>

namespace {

const QStringList buses = {QStringLiteral("system"), QStringLiteral("session")};
const QStringList scenarios = {QStringLiteral("replies"), QStringLiteral("other-types"),
                               QStringLiteral("error"), QStringLiteral("gone")};

void say(const QByteArray &line)
{
    std::fputs((line + '\n').constData(), stdout);
    std::fflush(stdout);
}

class Service : public QDBusVirtualObject
{
public:
    explicit Service(const QString &scenario) : m_scenario(scenario) { }

    QString introspect(const QString &path) const override
    {
        Q_UNUSED(path)
        // Clients must not introspect: it would take time on the main thread of an application.
        say("Introspect");
        return {};
    }

    bool handleMessage(const QDBusMessage &message, const QDBusConnection &bus) override
    {
        say(message.member().toUtf8());
        if (m_scenario == QLatin1String("gone")) {
            _exit(0);
        }
        if (m_scenario == QLatin1String("error")) {
            bus.send(message.createErrorReply(QStringLiteral("org.example.Error"),
                                              QStringLiteral("as told")));
        } else {
            bus.send(message.createReply(
                m_scenario == QLatin1String("replies") ? usualReply(message) : otherTypes()));
        }
        return true;
    }

private:
    static QVariantList usualReply(const QDBusMessage &message)
    {
        const QString property = message.arguments().value(1).toString();
        if (property == QLatin1String("KIVID")) {
            return {QStringLiteral("cover-0")};
        }
        return property == QLatin1String("Ready") ? QVariantList{1} : QVariantList();
    }

    static QVariantList otherTypes()
    {
        QDBusArgument structure;
        structure.beginStructure();
        structure << QStringLiteral("a") << 1;
        structure.endStructure();
        return {QVariant::fromValue(structure), QVariantMap{{QStringLiteral("a"), 1}},
                QVariantList{1, QStringLiteral("a")}};
    }

    const QString m_scenario;
};

void sendSignals(const QDBusConnection &bus, const QString &service, int count)
{
    const QString path =
        QLatin1Char('/') + QString(service).replace(QLatin1Char('.'), QLatin1Char('/'));
    for (int i = 1; i <= count; ++i) {
        QDBusMessage changed =
            QDBusMessage::createSignal(path, QStringLiteral("org.freedesktop.DBus.Properties"),
                                       QStringLiteral("PropertiesChanged"));
        changed.setArguments(
            {service,
             QVariantMap{{QStringLiteral("KIVID"), QStringLiteral("cover-%1").arg(i)},
                         {QStringLiteral("Ready"), i == count ? 1 : 0}},
             QStringList()});
        bus.send(changed);
    }
}

} // namespace

int main(int argc, char *argv[])
{
    const QCoreApplication application(argc, argv);
    const QStringList words = QCoreApplication::arguments().mid(1);
    if (words.size() != 3 || !buses.contains(words.at(0)) || !scenarios.contains(words.at(2))) {
        std::fputs("bus-service-peer: a bus, a name and a scenario are needed\n", stderr);
        return 2;
    }
    QDBusConnection bus = words.at(0) == QLatin1String("system") ? QDBusConnection::systemBus()
                                                                 : QDBusConnection::sessionBus();
    Service service(words.at(2));
    if (!bus.registerVirtualObject(QStringLiteral("/"), &service, QDBusConnection::SubPath)
        || !bus.registerService(words.at(1))) {
        std::fprintf(stderr, "bus-service-peer: %s\n", qPrintable(bus.lastError().message()));
        return 1;
    }

    const QSocketNotifier input(STDIN_FILENO, QSocketNotifier::Read);
    QObject::connect(&input, &QSocketNotifier::activated, &service, [bus, words] {
        std::string line;
        if (std::getline(std::cin, line)) {
            sendSignals(bus, words.at(1), QByteArray::fromStdString(line).toInt());
        } else {
            QCoreApplication::quit();
        }
    });
    say("ready");
    return QCoreApplication::exec();
}
