// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// A sample service that the session bus starts. It answers every call and reports it to the gallery.
// While the file /usr/libexec/gallery-services-fail exists, it answers with an error.
//
// usage: gallery-peer SERVICE

#include "simulator/recordingservice.h"

#include <QCoreApplication>
#include <QDBusError>
#include <QFile>

namespace {

// One text for each argument. The texts of a list are joined.
QStringList texts(const QVariantList &arguments)
{
    QStringList result;
    for (const QVariant &argument : arguments) {
        result.append(argument.toStringList().join(QLatin1String(", ")));
    }
    return result;
}

class SampleService : public RecordingService
{
public:
    explicit SampleService(const QString &name)
        : RecordingService(QDBusConnection::SessionBus, name)
    {
    }

    bool handleMessage(const QDBusMessage &message, const QDBusConnection &connection) override
    {
        const bool fail = QFile::exists(QStringLiteral("/usr/libexec/gallery-services-fail"));
        setAnswer(fail ? Answer::Error : Answer::Reply,
                  QDBusError::errorString(QDBusError::Failed));
        return RecordingService::handleMessage(message, connection);
    }
};

} // namespace

int main(int argc, char *argv[])
{
    const QCoreApplication application(argc, argv);
    const QStringList arguments = QCoreApplication::arguments();
    if (arguments.size() != 2) {
        qFatal("usage: gallery-peer SERVICE");
    }

    const QString &name = arguments.at(1);
    SampleService service(name);
    QDBusConnection bus = service.connection();
    QObject::connect(&service, &RecordingService::called, [bus, name](const QDBusMessage &call) {
        QDBusMessage signal = QDBusMessage::createSignal(
            QStringLiteral("/"), QStringLiteral("com.marlo.settings.gallery.Peer"),
            QStringLiteral("CallReceived"));
        signal.setArguments({name, call.member(), texts(call.arguments())});
        bus.send(signal);
    });
    // The service ends with its bus. Nothing else ends it.
    bus.connect(QString(), QStringLiteral("/org/freedesktop/DBus/Local"),
                QStringLiteral("org.freedesktop.DBus.Local"), QStringLiteral("Disconnected"),
                QCoreApplication::instance(), SLOT(quit()));
    return QCoreApplication::exec();
}
