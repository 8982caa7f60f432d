// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// A sample service. The session bus starts those that the quick actions call. They answer every call
// and report it to the gallery; while the file /usr/libexec/gallery-services-fail exists, they answer
// with an error. The disk service, on the system bus, mounts and unmounts cards that are directories in
// memory.

#include "gallery/simulation/simulateddiskservice.h"
#include "simulator/diskserviceerrors.h"
#include "simulator/recordingservice.h"

#include <QCommandLineParser>
#include <QCoreApplication>
#include <QDBusError>
#include <QFile>
#include <QTimer>

#include <chrono>
#include <cstdio>
#include <memory>
#include <utility>

namespace {

using namespace std::chrono_literals;

const QString diskService = QStringLiteral("org.freedesktop.UDisks2");
constexpr std::chrono::milliseconds slowness = 3s;

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
    SampleService(const QString &name, QString error, std::chrono::milliseconds delay)
        : RecordingService(QDBusConnection::SessionBus, name), m_error(std::move(error)),
          m_delay(delay)
    {
        connect(this, &RecordingService::called, [this, name](const QDBusMessage &call) {
            QDBusMessage signal = QDBusMessage::createSignal(
                QStringLiteral("/"), QStringLiteral("com.marlo.settings.gallery.Peer"),
                QStringLiteral("CallReceived"));
            signal.setArguments({name, call.member(), texts(call.arguments())});
            this->connection().send(signal);
        });
    }

    bool handleMessage(const QDBusMessage &message, const QDBusConnection &connection) override
    {
        QTimer::singleShot(m_delay, this, [this, message, connection] {
            const bool fail = QFile::exists(QStringLiteral("/usr/libexec/gallery-services-fail"));
            const QString error =
                m_error.isEmpty() && fail ? QDBusError::errorString(QDBusError::Failed) : m_error;
            setAnswer(error.isEmpty() ? Answer::Reply : Answer::Error, error);
            RecordingService::handleMessage(message, connection);
        });
        return true;
    }

private:
    const QString m_error;
    const std::chrono::milliseconds m_delay;
};

[[noreturn]] void refuse(const QString &why)
{
    std::fprintf(stderr, "gallery-peer: %s\n", qPrintable(why));
    std::exit(2);
}

} // namespace

int main(int argc, char *argv[])
{
    const QCoreApplication application(argc, argv);
    QCommandLineParser parser;
    parser.setApplicationDescription(QStringLiteral(
        "Simulates a D-Bus service, which answers every call, until the bus ends.\n"
        "The disk service, org.freedesktop.UDisks2, is on the system bus. A card that it mounts is "
        "a "
        "directory in\nmemory, and unmounting removes the files. All other services are on the "
        "session bus."));
    parser.addHelpOption();
    const QCommandLineOption errorOption(
        QStringLiteral("error"),
        QStringLiteral("Answer every call with this error. Errors of the disk service: %1.")
            .arg(diskServiceErrors().join(QLatin1String(", "))),
        QStringLiteral("NAME"));
    const QCommandLineOption slowOption(QStringLiteral("slow"),
                                        QStringLiteral("Answer each call after three seconds."));
    parser.addOptions({errorOption, slowOption});
    parser.addPositionalArgument(QStringLiteral("SERVICE"),
                                 QStringLiteral("The name, such as com.marlo.torch."));
    parser.process(application);
    if (parser.positionalArguments().size() != 1) {
        refuse(QStringLiteral("exactly one service is needed; see --help"));
    }

    const QString name = parser.positionalArguments().constFirst();
    const QString error = parser.value(errorOption);
    const std::chrono::milliseconds delay = parser.isSet(slowOption) ? slowness : 0ms;
    std::unique_ptr<QObject> service;
    QDBusConnection bus = QDBusConnection::sessionBus();
    if (name == diskService) {
        if (parser.isSet(errorOption) && !diskServiceErrors().contains(error)) {
            refuse(QStringLiteral("the disk service has no error %1; see --help").arg(error));
        }
        bus = QDBusConnection::systemBus();
        service = std::make_unique<SimulatedDiskService>(
            parser.isSet(errorOption) ? SimulatedDiskService::Manner::Failing
                                      : SimulatedDiskService::Manner::Working,
            error, delay);
    } else {
        if (parser.isSet(errorOption) && !error.contains(QLatin1Char('.'))) {
            refuse(QStringLiteral("%1 is not the name of an error, such as %2")
                       .arg(error, QDBusError::errorString(QDBusError::Failed)));
        }
        service = std::make_unique<SampleService>(name, error, delay);
    }
    // The service ends with its bus. Nothing else ends it.
    bus.connect(QString(), QStringLiteral("/org/freedesktop/DBus/Local"),
                QStringLiteral("org.freedesktop.DBus.Local"), QStringLiteral("Disconnected"),
                QCoreApplication::instance(), SLOT(quit()));
    return QCoreApplication::exec();
}
