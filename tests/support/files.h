// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef FILES_H
#define FILES_H

#include <QByteArray>
#include <QString>
#include <QStringList>

/*
    Functions for files in the throw-away root. Each ends the test program if it fails.
*/
namespace Files {

// Creates missing parent directories. The file appears under its name only when it is complete.
void write(const QString &path, const QByteArray &content);
// Removes a file or a whole directory, if it exists.
void remove(const QString &path);
void makeDirectory(const QString &path);
void makePipe(const QString &path);
// Makes a file of the given size that takes no disk space.
void makeSparse(const QString &path, qint64 size);
void makeLink(const QString &target, const QString &path);

// Installs a compiled catalog of tests/catalogs in /usr/share/translations, or removes it.
void installCatalog(const QString &name);
void installCatalogs(const QStringList &names);
void removeCatalog(const QString &name);

} // namespace Files

#endif
