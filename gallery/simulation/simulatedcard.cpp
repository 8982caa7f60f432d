// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "simulatedcard.h"

#include "mounttable.h"

#include <QDBusConnection>
#include <QDBusConnectionInterface>
#include <QDBusServiceWatcher>
#include <QDir>
#include <QProcessEnvironment>
#include <QQmlInfo>

namespace {

const QString service = QStringLiteral("org.freedesktop.UDisks2");
const QString daemon = QStringLiteral("/usr/libexec/udisks2/udisksd");

} // namespace

SimulatedCard::SimulatedCard(QObject *parent)
    : QObject(parent), m_name(qEnvironmentVariable("GALLERY_CARD")), m_real(!m_name.isEmpty())
{
    if (m_real) {
        m_directory = MountTable::directoryOf(QFile::encodeName(devicePath()));
    } else {
        m_name = QStringLiteral("gallerycard1");
        // A gallery that was killed may have left it mounted.
        MountTable::setDirectoryOf(QFile::encodeName(devicePath()), {});
        startDiskService();
    }
    auto *owner = new QDBusServiceWatcher(service, QDBusConnection::systemBus(),
                                          QDBusServiceWatcher::WatchForOwnerChange, this);
    connect(owner, &QDBusServiceWatcher::serviceOwnerChanged, this, &SimulatedCard::readyChanged);

    connect(&m_watcher, &QFileSystemWatcher::directoryChanged, this,
            &SimulatedCard::contentChanged);
    m_mounts.setFileName(QStringLiteral("/proc/self/mounts"));
    if (m_mounts.open(QIODevice::ReadOnly | QIODevice::Unbuffered)) {
        // The table is always readable. The kernel reports its changes as exceptional conditions.
        m_mountsNotifier =
            std::make_unique<QSocketNotifier>(m_mounts.handle(), QSocketNotifier::Exception);
        connect(m_mountsNotifier.get(), &QSocketNotifier::activated, this,
                &SimulatedCard::followMounts);
    }
}

SimulatedCard::~SimulatedCard()
{
    if (m_daemon != nullptr) {
        m_daemon->kill();
        m_daemon->waitForFinished();
    }
}

int SimulatedCard::fileCount() const
{
    return isMounted()
        ? int(QDir(m_directory)
                  .entryList(QDir::AllEntries | QDir::Hidden | QDir::System | QDir::NoDotAndDotDot)
                  .size())
        : 0;
}

void SimulatedCard::setInUse(bool inUse)
{
    if (inUse == isInUse()) {
        return;
    }
    m_used.close();
    m_used.setFileName(m_directory + QStringLiteral("/in-use.txt"));
    if (inUse && (!isMounted() || !m_used.open(QIODevice::WriteOnly))) {
        qmlWarning(this) << "no file can be opened on the card";
    }
    Q_EMIT inUseChanged();
}

void SimulatedCard::setDiskService(DiskService diskService)
{
    if (diskService == m_diskService) {
        return;
    }
    // A real disk service ends only when another one takes its name.
    const bool replaces = m_real && m_diskService == Working;
    m_diskService = diskService;
    m_simulated.reset();
    if (diskService == Working) {
        startDiskService();
    } else if (diskService != Absent || replaces) {
        m_simulated = std::make_unique<SimulatedDiskService>(
            diskService == Forbidding ? SimulatedDiskService::Manner::Failing
                                      : SimulatedDiskService::Manner::Silent,
            QStringLiteral("NotAuthorized"));
    }
    if (diskService == Absent) {
        m_simulated.reset();
    }
    Q_EMIT diskServiceChanged();
    Q_EMIT readyChanged();
}

bool SimulatedCard::isReady() const
{
    return m_diskService == Working
        && QDBusConnection::systemBus().interface()->isServiceRegistered(service);
}

void SimulatedCard::fill()
{
    for (const char *directory : {"Music", "Pictures", "Pictures/Summer"}) {
        QDir(m_directory).mkpath(QLatin1String(directory));
        for (int i = 1; i <= 5; ++i) {
            QFile file(
                QStringLiteral("%1/%2/%3.txt").arg(m_directory, QLatin1String(directory)).arg(i));
            if (!isMounted() || !file.open(QIODevice::WriteOnly)) {
                qmlWarning(this) << file.fileName() << ": " << file.errorString();
                return;
            }
            file.write("A sample file\n");
        }
    }
}

QString SimulatedCard::devicePath() const
{
    return QStringLiteral("/dev/") + m_name;
}

void SimulatedCard::startDiskService()
{
    if (!m_real) {
        m_simulated = std::make_unique<SimulatedDiskService>(SimulatedDiskService::Manner::Working);
        connect(m_simulated.get(), &SimulatedDiskService::mountsChanged, this,
                &SimulatedCard::followMounts);
        return;
    }
    if (m_daemon != nullptr) {
        m_daemon->waitForFinished();
    }
    m_daemon = std::make_unique<QProcess>();
    m_daemon->setStandardOutputFile(QProcess::nullDevice());
    m_daemon->setStandardErrorFile(QProcess::nullDevice());
    // The daemon must not load the sanitizer of this process.
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.remove(QStringLiteral("LD_PRELOAD"));
    m_daemon->setProcessEnvironment(environment);
    // It runs in the network namespace of the device manager, which reports devices to it, and ends with
    // this process.
    m_daemon->start(QStringLiteral("nsenter"),
                    {QStringLiteral("--net=") + qEnvironmentVariable("GALLERY_CARD_NETWORK"),
                     QStringLiteral("setpriv"), QStringLiteral("--pdeathsig"),
                     QStringLiteral("KILL"), daemon});
}

void SimulatedCard::followMounts()
{
    const QString directory = MountTable::directoryOf(QFile::encodeName(devicePath()));
    if (directory == m_directory) {
        return;
    }
    if (!m_directory.isEmpty()) {
        m_watcher.removePath(m_directory);
    }
    m_directory = directory;
    if (!m_directory.isEmpty()) {
        m_watcher.addPath(m_directory);
    }
    Q_EMIT contentChanged();
}
