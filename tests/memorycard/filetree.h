// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef FILETREE_H
#define FILETREE_H

#include <QByteArray>
#include <QByteArrayList>

/*
    Makes and reads trees of files whose names are any bytes, which QFile and QDir would pass
    through the locale's encoding. What cannot be made ends the program: no test goes on with a tree
    other than the one it asked for.
*/
namespace FileTree {

void makeFolder(const QByteArray &path);
void makeFile(const QByteArray &path, const QByteArray &content = QByteArray());
void makeFiles(const QByteArray &folder, int count);
void makeLink(const QByteArray &path, const QByteArray &target);
void makePipe(const QByteArray &path);
void makeSocket(const QByteArray &path);
// A chain of folders with one name each below the folder at path.
void makeChain(const QByteArray &path, int depth, const QByteArray &name = "d");
// The path of a folder of such a chain.
QByteArray chainPath(const QByteArray &path, int depth, const QByteArray &name = "d");

bool exists(const QByteArray &path);
QByteArray read(const QByteArray &path);
// The names in a folder, in directory order.
QByteArrayList list(const QByteArray &path);
// The paths of everything below a folder, relative to it, sorted.
QByteArrayList listAll(const QByteArray &path);

} // namespace FileTree

#endif
