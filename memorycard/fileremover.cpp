// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "fileremover.h"

#include "directoryemptier.h"
#include "faultlog.h"
#include "files/filedescriptor.h"
#include "mounttable.h"
#include "processlimits.h"

#include <QByteArray>
#include <QFile>
#include <QThreadPool>

#include <algorithm>
#include <array>
#include <cerrno>
#include <utility>
#include <vector>

#include <fcntl.h>
#include <linux/magic.h>
#include <sys/stat.h>
#include <sys/vfs.h>

namespace {

constexpr const char *mountTablePath = "/etc/mtab";

// The file systems whose directories have a device number of their own instead of the number of
// the block device, with what statfs() returns for them.
struct Unnumbered {
    const char *type;
    unsigned magic;
};
constexpr std::array unnumbered = {
    Unnumbered{"btrfs", BTRFS_SUPER_MAGIC},
    Unnumbered{"fuse", FUSE_SUPER_MAGIC},
    Unnumbered{"overlay", OVERLAYFS_SUPER_MAGIC},
    Unnumbered{"tmpfs", TMPFS_MAGIC},
};

struct Mount {
    QByteArray directory; // its name has an unknown encoding
    QByteArray type; // without a subtype, such as ".exfat"
    bool isCovered = false; // by the mount of another device
};

FileDescriptor openDirectory(const char *path)
{
    return FileDescriptor(open(path, O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC));
}

// Whether the device has the root directory, which is the system and not a card.
bool carriesRoot(const QByteArray &device, const std::vector<Mount> &mounts)
{
    struct stat root = {};
    struct stat node = {};
    if (stat("/", &root) != 0
        || (stat(device.constData(), &node) == 0 && S_ISBLK(node.st_mode)
            && node.st_rdev == root.st_dev)) {
        return true;
    }
    return std::any_of(mounts.cbegin(), mounts.cend(), [&root](const Mount &mount) {
        struct stat info = {};
        return stat(mount.directory.constData(), &info) == 0 && info.st_dev == root.st_dev
            && info.st_ino == root.st_ino;
    });
}

// Whether a mount on a directory hides another directory, which is the same or below it.
bool hides(const QByteArray &directory, const QByteArray &other)
{
    return (other + '/').startsWith(directory.endsWith('/') ? directory : directory + '/');
}

// Whether the directory is on the device. If its file system has a device number of its own, this
// is unknown, and true if the table has no later mount there and the type is that in the table.
bool liesOn(const QByteArray &device, const Mount &mount, int directory)
{
    struct stat info = {};
    struct stat node = {};
    if (fstat(directory, &info) != 0) {
        return false;
    }
    if (stat(device.constData(), &node) == 0 && S_ISBLK(node.st_mode)
        && node.st_rdev == info.st_dev) {
        return true;
    }
    const auto entry =
        std::find_if(std::cbegin(unnumbered), std::cend(unnumbered),
                     [&mount](const auto &known) { return mount.type == known.type; });
    struct statfs system = {};
    return entry != std::cend(unnumbered) && !mount.isCovered && fstatfs(directory, &system) == 0
        && static_cast<unsigned>(system.f_type) == entry->magic;
}

// Empties the card that is mounted on the directory. Returns why it is not empty, or nothing.
QString emptyMount(const QByteArray &device, const Mount &mount)
{
    // Only an absolute path names a mount directory.
    if (!mount.directory.startsWith('/')) {
        return QStringLiteral("not an absolute path");
    }
    // The table has real paths, so a link is not the card. Neither is the directory that remains
    // after the card has been unmounted.
    FileDescriptor fd = openDirectory(mount.directory.constData());
    if (!fd.isOpen()) {
        switch (errno) {
        case ENOTDIR:
            return QStringLiteral("not a directory");
        case EMFILE:
        case ENFILE:
        case ENOMEM:
            return qt_error_string(errno);
        default: // A card that cannot be read counts as empty, as for removeAllEntries().
            return {};
        }
    }
    if (!liesOn(device, mount, fd.get())) {
        return QStringLiteral("not on the device");
    }
    const Leftovers left = emptyDirectory(std::move(fd));
    return left.count == 0 ? QString()
                           : QStringLiteral("%1: %2, and %3 more")
                                 .arg(QFile::decodeName(left.first.c_str()),
                                      qt_error_string(left.error), QString::number(left.count - 1));
}

} // namespace

FileRemover::FileRemover(QString devicePath) : m_devicePath(std::move(devicePath))
{
}

FileRemover::~FileRemover()
{
    if (m_obstacle) {
        qCWarning(lcCardFaults) << "Cannot empty" << m_devicePath << "because" << m_obstacle;
        Q_EMIT error();
    }
}

bool FileRemover::start(std::unique_ptr<FileRemover> remover)
{
    if (!ProcessLimits::hasDescriptorsLeft()) {
        remover->m_obstacle = "too many files are open";
        return false;
    }
    if (!ProcessLimits::canStartThread()) {
        remover->m_obstacle = "no thread can be started";
        return false;
    }
    QThreadPool::globalInstance()->start(remover.release());
    return true;
}

void FileRemover::run()
{
    m_obstacle = nullptr;
    if (emptyCard()) {
        Q_EMIT completed();
    } else {
        Q_EMIT error();
    }
}

bool FileRemover::removeAllEntries(const QString &path)
{
    FileDescriptor fd = openDirectory(QFile::encodeName(path).constData());
    return !fd.isOpen() || emptyDirectory(std::move(fd)).count == 0;
}

bool FileRemover::emptyCard() const
{
    const auto warn = [this](const char *reason) {
        qCWarning(lcCardFaults) << "Cannot empty" << m_devicePath << "because" << reason;
        return false;
    };
    const QByteArray device = QFile::encodeName(m_devicePath);
    // Sources such as "tmpfs" and "none" are not devices.
    if (!device.startsWith('/')) {
        return warn("it is not an absolute path");
    }
    MountTable table(mountTablePath);
    if (!table.isOpen()) {
        return warn("the mount table cannot be read");
    }
    std::vector<Mount> mounts;
    while (const mntent *entry = table.next()) {
        if (device == entry->mnt_fsname) {
            mounts.push_back({entry->mnt_dir, QByteArray(entry->mnt_type).split('.').first()});
            continue;
        }
        for (Mount &mount : mounts) {
            mount.isCovered = mount.isCovered || hides(entry->mnt_dir, mount.directory);
        }
    }
    if (mounts.empty()) {
        return warn("it is not mounted");
    }
    if (carriesRoot(device, mounts)) {
        return warn("it has the root directory");
    }
    // A card that is mounted twice gets a second attempt through its other mount directory.
    return std::any_of(mounts.cbegin(), mounts.cend(), [&](const Mount &mount) {
        const QString reason = emptyMount(device, mount);
        if (!reason.isEmpty()) {
            qCWarning(lcCardFaults) << "Cannot empty" << m_devicePath << "on"
                                    << QFile::decodeName(mount.directory) << "because" << reason;
        }
        return reason.isEmpty();
    });
}
