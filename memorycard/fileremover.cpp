// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "fileremover.h"

#include "directoryemptier.h"
#include "files/filedescriptor.h"

#include <QByteArray>
#include <QFile>

#include <array>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <memory>
#include <utility>

#include <fcntl.h>
#include <mntent.h>
#include <sys/stat.h>
#include <sys/sysmacros.h>

namespace {

constexpr const char *mountTablePath = "/etc/mtab";
constexpr std::size_t mountEntrySize = 12288;

struct CloseMountTable {
    void operator()(FILE *table) const { endmntent(table); }
};
using MountTable = std::unique_ptr<FILE, CloseMountTable>;

// glibc decodes the escapes in a field. musl, at least up to 1.2.3, returns them unchanged.
bool libraryDecodesEscapes()
{
    QByteArray line("device /\\040 type options 0 0\n");
    const MountTable table(fmemopen(line.data(), size_t(line.size()), "r"));
    mntent entry = {};
    std::array<char, 64> buffer = {};
    return !table || !getmntent_r(table.get(), &entry, buffer.data(), int(buffer.size()))
        || std::strcmp(entry.mnt_dir, "/ ") == 0;
}

void decodeEscapes(char *field)
{
    const auto isOctal = [](char c) { return c >= '0' && c <= '7'; };
    char *out = field;
    for (const char *in = field; *in != '\0'; ++out) {
        if (in[0] == '\\' && isOctal(in[1]) && isOctal(in[2]) && isOctal(in[3])) {
            *out = static_cast<char>((in[1] - '0') * 64 + (in[2] - '0') * 8 + in[3] - '0');
            in += 4;
        } else {
            *out = *in++;
        }
    }
    *out = '\0';
}

FileDescriptor openDirectory(const char *path)
{
    return FileDescriptor(open(path, O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC));
}

bool isRootDirectory(const struct stat &directory)
{
    struct stat root = {};
    return stat("/", &root) != 0
        || (root.st_dev == directory.st_dev && root.st_ino == directory.st_ino);
}

// Whether the directory may be on the device. This is unknown, and therefore true, if the file
// system has its own number (major number 0) instead of a block device's, or if the path of the
// device is not a block device here.
bool mayLieOn(const QByteArray &device, const struct stat &directory)
{
    struct stat node = {};
    return stat(device.constData(), &node) != 0 || !S_ISBLK(node.st_mode)
        || major(directory.st_dev) == 0 || directory.st_dev == node.st_rdev;
}

// Empties the card that is mounted on the directory, whose name has an unknown encoding.
bool emptyMount(const QByteArray &device, const char *directory)
{
    // Only an absolute path names a mount directory.
    if (directory[0] != '/') {
        return false;
    }
    // The table has real paths, so a link is not the card. Neither is the directory that remains
    // after the card has been unmounted.
    FileDescriptor fd = openDirectory(directory);
    if (!fd.isOpen()) {
        // A card that cannot be read counts as empty, as for removeAllEntries().
        return errno != ENOTDIR;
    }
    struct stat info = {};
    if (fstat(fd.get(), &info) != 0 || isRootDirectory(info) || !mayLieOn(device, info)) {
        return false;
    }
    return emptyDirectory(std::move(fd));
}

} // namespace

FileRemover::FileRemover(QString devicePath) : m_devicePath(std::move(devicePath))
{
}

void FileRemover::run()
{
    if (emptyCard()) {
        Q_EMIT completed();
    } else {
        Q_EMIT error();
    }
}

bool FileRemover::removeAllEntries(const QString &path)
{
    FileDescriptor fd = openDirectory(QFile::encodeName(path).constData());
    return !fd.isOpen() || emptyDirectory(std::move(fd));
}

bool FileRemover::emptyCard() const
{
    const QByteArray device = QFile::encodeName(m_devicePath);
    // Sources such as "tmpfs" and "none" are not devices.
    if (!device.startsWith('/')) {
        return false;
    }
    const MountTable table(setmntent(mountTablePath, "r"));
    if (!table) {
        return false;
    }
    const bool decoded = libraryDecodesEscapes();
    mntent entry = {};
    std::array<char, mountEntrySize> buffer = {};
    while (true) {
        errno = 0;
        if (!getmntent_r(table.get(), &entry, buffer.data(), static_cast<int>(buffer.size()))) {
            // musl skips a line that is longer than the buffer, with this error.
            if (errno == ERANGE) {
                continue;
            }
            return false;
        }
        if (!decoded) {
            decodeEscapes(entry.mnt_fsname);
            decodeEscapes(entry.mnt_dir);
        }
        // glibc cuts such a line instead. A line that is cut within the directory has no type.
        const bool cut = entry.mnt_type[0] == '\0';
        // A card that is mounted twice gets a second attempt through its other mount directory.
        if (!cut && device == entry.mnt_fsname && emptyMount(device, entry.mnt_dir)) {
            return true;
        }
    }
}
