// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef FILETREE_H
#define FILETREE_H

#include <QByteArray>
#include <QByteArrayList>

/*
    Creates and reads trees of files whose names are any bytes, which QFile and QDir would convert by
    the locale's encoding. The program ends if an entry cannot be created, so that no test runs with an
    incomplete tree.
*/
namespace FileTree {

// Creates entries below the directory top, with any missing parent directories. An entry is
// "directory/", "link -> target", or the name of an empty file.
void makeTree(const QByteArray &top, const QByteArrayList &entries);
void makeDirectory(const QByteArray &path);
void makeFile(const QByteArray &path, const QByteArray &content = QByteArray());
void makeFiles(const QByteArray &directory, int count);
void makeLink(const QByteArray &path, const QByteArray &target);
void makeSocket(const QByteArray &path);
// A chain of directories below the one at path, all of the same name.
void makeChain(const QByteArray &path, int depth, const QByteArray &name = "d");
// The path of a directory of such a chain.
QByteArray chainPath(const QByteArray &path, int depth, const QByteArray &name = "d");

bool exists(const QByteArray &path);
QByteArray read(const QByteArray &path);
// The names in a directory, in directory order.
QByteArrayList list(const QByteArray &path);
// The paths of everything below a directory, relative to it, sorted.
QByteArrayList listAll(const QByteArray &path);

} // namespace FileTree

#endif
