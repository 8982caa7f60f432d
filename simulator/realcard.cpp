// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "realcard.h"

#include <QDBusConnection>
#include <QDBusMessage>
#include <QDBusVariant>
#include <QDir>
#include <QElapsedTimer>
#include <QFileInfo>
#include <QThread>

#include <cerrno>
#include <cstring>

#include <fcntl.h>
#include <linux/fs.h>
#include <linux/loop.h>
#include <mntent.h>
#include <sched.h>
#include <sys/ioctl.h>
#include <sys/mount.h>
#include <unistd.h>

namespace {

const QString udevd = QStringLiteral("/lib/systemd/systemd-udevd");
const QString udisksd = QStringLiteral("/usr/libexec/udisks2/udisksd");
const QString loopControl = QStringLiteral("/dev/loop-control");
const QString helper = QStringLiteral("/usr/libexec/sdcardhelper");
// A helper that waits exits when the program that runs it has ended.
// The disk service has to know of the new file system before a client asks it to mount the card.
constexpr char helperScript[] = R"(#!/bin/sh
set -eu
while [ -e /usr/libexec/sdcardhelper-waits ]; do
    kill -0 "$PPID" 2>/dev/null || exit 1
    sleep 0.1
done
case $1 in
format_vfat) mkfs.vfat -I "/dev/$2" ;;
format_ext4) mkfs.ext4 -q "/dev/$2" ;;
probe) exec blkid -p -o value -s TYPE "/dev/$2" ;;
*) exit 2 ;;
esac
exec nsenter --net=/proc/%1/ns/net udevadm trigger --settle --action=change "/sys/class/block/$2"
)";
constexpr qint64 cardSize = qint64(64) * 1024 * 1024;
constexpr int patience = 60000; // ms, enough for a machine that is very busy

// The shutdown request, as <linux/fs.h> of later kernels defines it, and its flag not to write
// anything out.
constexpr unsigned long shutdownRequest = _IOR('X', 125, __u32);
constexpr __u32 withoutFlushing = 2;

void require(bool done, const char *what)
{
    if (!done) {
        qFatal("cannot %s: %s", what, std::strerror(errno));
    }
}

template<typename Condition> void waitFor(const char *what, Condition condition)
{
    QElapsedTimer timer;
    timer.start();
    while (!condition()) {
        if (timer.hasExpired(patience)) {
            qFatal("no %s", what);
        }
        QThread::msleep(20);
    }
}

void run(const QStringList &command)
{
    if (QProcess::execute(command.first(), command.mid(1)) != 0) {
        qFatal("failed: %s", qPrintable(command.join(QLatin1Char(' '))));
    }
}

QVariant diskServiceProperty(const QString &name, const QString &interface, const QString &property)
{
    QDBusMessage call = QDBusMessage::createMethodCall(
        QStringLiteral("org.freedesktop.UDisks2"),
        QStringLiteral("/org/freedesktop/UDisks2/block_devices/") + name,
        QStringLiteral("org.freedesktop.DBus.Properties"), QStringLiteral("Get"));
    call.setArguments({QStringLiteral("org.freedesktop.UDisks2.") + interface, property});
    const QDBusMessage reply = QDBusConnection::systemBus().call(call);
    return reply.type() == QDBusMessage::ReplyMessage
        ? reply.arguments().constFirst().value<QDBusVariant>().variant()
        : QVariant();
}

} // namespace

QString RealCard::whyNot()
{
    QFile ids(QStringLiteral("/proc/self/uid_map"));
    const bool isRoot = geteuid() == 0 && ids.open(QIODevice::ReadOnly)
        && ids.readAll().simplified() == "0 0 4294967295";
    if (!isRoot) {
        return QStringLiteral("only root may attach and mount a loop device");
    }
    for (const QString &needed : {loopControl, udevd, udisksd}) {
        if (!QFileInfo::exists(needed)) {
            return QStringLiteral("there is no ") + needed;
        }
    }
    return {};
}

void RealCard::becomePrivate()
{
    require(unshare(CLONE_NEWNS | CLONE_NEWNET) == 0, "make namespaces");
    require(mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0, "make / private");
    // Contains the mount directories of the disk service, and the image.
    require(mount("tmpfs", "/media", "tmpfs", 0, "mode=755") == 0, "mount /media");
    // The device manager adds links and changes nodes.
    require(QDir().mkpath(QStringLiteral("/media/upper"))
                && QDir().mkpath(QStringLiteral("/media/work")),
            "make the layers of /dev");
    require(mount("overlay", "/dev", "overlay", 0,
                  "lowerdir=/dev,upperdir=/media/upper,workdir=/media/work")
                == 0,
            "lay a layer over /dev");
}

void RealCard::installHelper()
{
    QFile file(helper);
    const QByteArray script = QString::fromLatin1(helperScript).arg(getpid()).toLatin1();
    require(file.open(QIODevice::WriteOnly) && file.write(script) == script.size()
                && file.setPermissions(QFile::ReadOwner | QFile::ExeOwner),
            "install the helper program");
}

RealCard::RealCard() : m_image(QStringLiteral("/media/card.img"))
{
    startDaemon(&m_deviceManager, udevd);
    waitFor("device manager", [] {
        return QFileInfo::exists(QStringLiteral("/run/udev/control"))
            && QProcess::execute(QStringLiteral("udevadm"),
                                 {QStringLiteral("control"), QStringLiteral("--ping")})
            == 0;
    });

    require(m_image.open(QIODevice::ReadWrite) && m_image.resize(cardSize), "make the image");
    QFile control(loopControl);
    require(control.open(QIODevice::ReadWrite), "open the loop control");
    // Another process may get the same number and attach its image first.
    do {
        m_device.close();
        const int number = ioctl(control.handle(), LOOP_CTL_GET_FREE);
        require(number >= 0, "find a loop device");
        m_name = QStringLiteral("loop%1").arg(number);
        m_path = QStringLiteral("/dev/") + m_name;
        m_device.setFileName(m_path);
        require(m_device.open(QIODevice::ReadWrite | QIODevice::Unbuffered), "open a loop device");
        loop_config config = {};
        config.fd = __u32(m_image.handle());
        // The kernel detaches the image when the last user of the device closes it.
        config.info.lo_flags = LO_FLAGS_AUTOCLEAR;
        if (ioctl(m_device.handle(), LOOP_CONFIGURE, &config) == 0) {
            break;
        }
        require(errno == EBUSY, "attach the image");
    } while (true);

    startDaemon(&m_diskService, udisksd);
    reset();
}

RealCard::~RealCard()
{
    thaw();
    const auto directories = mountDirectories();
    for (const QString &directory : directories) {
        umount2(QFile::encodeName(directory).constData(), MNT_DETACH);
    }
    for (QProcess *process : {&m_diskService, &m_deviceManager}) {
        process->terminate();
        process->waitForFinished(patience);
    }
}

void RealCard::reset()
{
    thaw();
    setSize(cardSize);
    const auto directories = mountDirectories();
    for (const QString &directory : directories) {
        require(umount2(QFile::encodeName(directory).constData(), 0) == 0, "unmount the card");
    }
    run({QStringLiteral("mkfs.ext4"), QStringLiteral("-q"), QStringLiteral("-F"), m_path});
    run({QStringLiteral("udevadm"), QStringLiteral("trigger"), QStringLiteral("--settle"),
         QStringLiteral("--action=add"), QStringLiteral("/sys/block/") + m_name});
    waitFor("card that the disk service knows", [this] { return isKnownToDiskService(); });
}

QStringList RealCard::mountDirectories() const
{
    QStringList directories;
    FILE *table = setmntent("/proc/self/mounts", "r");
    require(table != nullptr, "read the mount table");
    while (const mntent *entry = getmntent(table)) {
        if (m_path == QFile::decodeName(entry->mnt_fsname)) {
            directories.append(QFile::decodeName(entry->mnt_dir));
        }
    }
    endmntent(table);
    return directories;
}

QString RealCard::file(const QString &name) const
{
    const QStringList directories = mountDirectories();
    if (directories.size() != 1) {
        qFatal("the card is mounted %d times", directories.size());
    }
    return directories.first() + QLatin1Char('/') + name;
}

QStringList RealCard::files() const
{
    return QDir(file(QString()))
        .entryList(QDir::AllEntries | QDir::Hidden | QDir::System | QDir::NoDotAndDotDot);
}

QString RealCard::probe(const char *tag) const
{
    QProcess process;
    process.start(QStringLiteral("blkid"),
                  {QStringLiteral("-p"), QStringLiteral("-o"), QStringLiteral("value"),
                   QStringLiteral("-s"), QLatin1String(tag), m_path});
    process.waitForFinished(patience);
    return QString::fromLatin1(process.readAllStandardOutput().trimmed());
}

void RealCard::freeze()
{
    m_frozen =
        open(QFile::encodeName(file(QString())).constData(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    require(m_frozen >= 0 && ioctl(m_frozen, FIFREEZE, 0) == 0, "freeze the card");
}

void RealCard::thaw()
{
    if (m_frozen >= 0) {
        require(ioctl(m_frozen, FITHAW, 0) == 0, "thaw the card");
        close(m_frozen);
        m_frozen = -1;
    }
}

void RealCard::vanish()
{
    const int directory =
        open(QFile::encodeName(file(QString())).constData(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    __u32 how = withoutFlushing;
    require(directory >= 0 && ioctl(directory, shutdownRequest, &how) == 0, "shut the card down");
    close(directory);
    setSize(0);
    waitFor("disk service that has noticed", [this] {
        return !diskServiceProperty(m_name, QStringLiteral("Filesystem"),
                                    QStringLiteral("MountPoints"))
                    .isValid();
    });
}

void RealCard::startDaemon(QProcess *process, const QString &program)
{
    process->setStandardOutputFile(QProcess::nullDevice());
    process->setStandardErrorFile(QProcess::nullDevice());
    process->start(QStringLiteral("setpriv"),
                   {QStringLiteral("--pdeathsig"), QStringLiteral("KILL"), program});
    require(process->waitForStarted(patience), qPrintable(program));
}

void RealCard::setSize(qint64 size)
{
    require(m_image.resize(size) && ioctl(m_device.handle(), LOOP_SET_CAPACITY, 0) == 0,
            "change the size of the card");
}

bool RealCard::isKnownToDiskService() const
{
    const QString uuid = probe("UUID");
    return !uuid.isEmpty()
        && diskServiceProperty(m_name, QStringLiteral("Block"), QStringLiteral("IdUUID")) == uuid
        && diskServiceProperty(m_name, QStringLiteral("Filesystem"), QStringLiteral("MountPoints"))
               .isValid();
}
