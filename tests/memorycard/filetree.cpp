// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "filetree.h"

#include <QtGlobal>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <filesystem>

#include <fcntl.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

namespace {

int require(int result, const QByteArray &path)
{
    if (result < 0) {
        qFatal("cannot make %s: %s", path.constData(), std::strerror(errno));
    }
    return result;
}

} // namespace

void FileTree::makeTree(const QByteArray &top, const QByteArrayList &entries)
{
    const QByteArray arrow = " -> ";
    for (const QByteArray &entry : entries) {
        const int nameEnd = entry.indexOf(arrow);
        const QByteArray path = top + '/' + entry.mid(0, nameEnd);
        for (int i = top.size(); i >= 0; i = path.indexOf('/', i + 1)) {
            if (!exists(path.left(i))) {
                makeDirectory(path.left(i));
            }
        }
        if (nameEnd >= 0) {
            makeLink(path, entry.mid(nameEnd + arrow.size()));
        } else if (!path.endsWith('/')) {
            makeFile(path);
        }
    }
}

void FileTree::makeDirectory(const QByteArray &path)
{
    require(mkdir(path.constData(), 0700), path);
}

void FileTree::makeFile(const QByteArray &path, const QByteArray &content)
{
    const int fd =
        require(open(path.constData(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0600), path);
    require(static_cast<int>(write(fd, content.constData(), static_cast<size_t>(content.size()))),
            path);
    close(fd);
}

void FileTree::makeFiles(const QByteArray &directory, int count)
{
    for (int i = 0; i < count; ++i) {
        makeFile(directory + "/file" + QByteArray::number(i));
    }
}

void FileTree::makeLink(const QByteArray &path, const QByteArray &target)
{
    require(symlink(target.constData(), path.constData()), path);
}

void FileTree::makeSocket(const QByteArray &path)
{
    sockaddr_un address = {};
    address.sun_family = AF_UNIX;
    Q_ASSERT(path.size() < int(sizeof(address.sun_path)));
    std::copy(path.begin(), path.end(), address.sun_path);
    const int fd = require(socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0), path);
    require(bind(fd, reinterpret_cast<const sockaddr *>(&address), sizeof(address)), path);
    close(fd);
}

void FileTree::makeChain(const QByteArray &path, int depth, const QByteArray &name)
{
    int fd = require(open(path.constData(), O_RDONLY | O_DIRECTORY | O_CLOEXEC), path);
    for (int level = 0; level < depth; ++level) {
        require(mkdirat(fd, name.constData(), 0700), name);
        const int below =
            require(openat(fd, name.constData(), O_RDONLY | O_DIRECTORY | O_CLOEXEC), name);
        close(fd);
        fd = below;
    }
    close(fd);
}

QByteArray FileTree::chainPath(const QByteArray &path, int depth, const QByteArray &name)
{
    return path + ('/' + name).repeated(depth);
}

bool FileTree::exists(const QByteArray &path)
{
    struct stat info = {};
    return lstat(path.constData(), &info) == 0;
}

QByteArray FileTree::read(const QByteArray &path)
{
    const int fd = open(path.constData(), O_RDONLY | O_CLOEXEC);
    char buffer[4096];
    const ssize_t size = ::read(fd, buffer, sizeof(buffer));
    close(fd);
    return size < 0 ? QByteArray() : QByteArray(buffer, int(size));
}

QByteArrayList FileTree::list(const QByteArray &path)
{
    QByteArrayList names;
    std::error_code error;
    for (const auto &entry : std::filesystem::directory_iterator(path.constData(), error)) {
        names.append(entry.path().filename().c_str());
    }
    return names;
}

QByteArrayList FileTree::listAll(const QByteArray &path)
{
    QByteArrayList paths;
    std::error_code error;
    for (const auto &entry :
         std::filesystem::recursive_directory_iterator(path.constData(), error)) {
        paths.append(entry.path().c_str() + path.size() + 1);
    }
    std::sort(paths.begin(), paths.end());
    return paths;
}
