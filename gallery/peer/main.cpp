// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// A sample service, started by the session bus: answers every call and tells the gallery of it.
//
// usage: gallery-peer SERVICE

#include "recordingservice.h"

#include <QCoreApplication>

namespace {

// One text for each argument; those of a list are joined.
QStringList texts(const QVariantList &arguments)
{
    QStringList result;
    for (const QVariant &argument : arguments) {
        result.append(argument.toStringList().join(QLatin1String(", ")));
    }
    return result;
}

} // namespace

int main(int argc, char *argv[])
{
    const QCoreApplication application(argc, argv);
    const QStringList arguments = QCoreApplication::arguments();
    if (arguments.size() != 2) {
        qFatal("usage: gallery-peer SERVICE");
    }

    const QString &name = arguments.at(1);
    RecordingService service(QDBusConnection::SessionBus, name);
    QDBusConnection bus = service.connection();
    QObject::connect(&service, &RecordingService::called, [bus, name](const QDBusMessage &call) {
        QDBusMessage signal = QDBusMessage::createSignal(
            QStringLiteral("/"), QStringLiteral("com.marlo.settings.gallery.Peer"),
            QStringLiteral("CallReceived"));
        signal.setArguments({name, call.member(), texts(call.arguments())});
        bus.send(signal);
    });
    // Nobody else ends it: a service goes with its bus.
    bus.connect(QString(), QStringLiteral("/org/freedesktop/DBus/Local"),
                QStringLiteral("org.freedesktop.DBus.Local"), QStringLiteral("Disconnected"),
                QCoreApplication::instance(), SLOT(quit()));
    return QCoreApplication::exec();
}
