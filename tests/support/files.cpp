// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "files.h"
#include "texts.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QSaveFile>

#include <sys/stat.h>

namespace {

void require(bool done, const char *what, const QString &path)
{
    if (!done) {
        qFatal("cannot %s %s", what, qPrintable(path));
    }
}

QString catalogPath(const QString &name)
{
    return "/usr/share/translations/%1.qm"_s.arg(name);
}

// A test that is started by hand, even as root, must not change the machine's real files.
void requireThrowAwayRoot(const QString &path)
{
    require(qEnvironmentVariableIsSet("MARLO_THROW_AWAY_ROOT"),
            "run outside the throw-away root of simulator and touch", path);
}

} // namespace

void Files::write(const QString &path, const QByteArray &content)
{
    makeDirectory(QFileInfo(path).path());
    QSaveFile file(path);
    require(file.open(QIODevice::WriteOnly) && file.write(content) == content.size()
                && file.commit(),
            "write", path);
}

void Files::remove(const QString &path)
{
    requireThrowAwayRoot(path);
    const QFileInfo entry(path);
    if (entry.isDir() && !entry.isSymLink()) {
        require(QDir(path).removeRecursively(), "remove", path);
    } else if (entry.exists() || entry.isSymLink()) {
        require(QFile::remove(path), "remove", path);
    }
}

void Files::makeDirectory(const QString &path)
{
    requireThrowAwayRoot(path);
    require(QDir().mkpath(path), "make", path);
}

void Files::makePipe(const QString &path)
{
    requireThrowAwayRoot(path);
    require(mkfifo(QFile::encodeName(path).constData(), 0600) == 0, "make", path);
}

void Files::makeSparse(const QString &path, qint64 size)
{
    write(path, {});
    require(QFile::resize(path, size), "enlarge", path);
}

void Files::makeLink(const QString &target, const QString &path)
{
    requireThrowAwayRoot(path);
    require(QFile::link(target, path), "make", path);
}

void Files::installCatalog(const QString &name)
{
    QFile compiled(CATALOG_DIR "/%1.qm"_s.arg(name));
    require(compiled.open(QIODevice::ReadOnly), "read", compiled.fileName());
    write(catalogPath(name), compiled.readAll());
}

void Files::installCatalogs(const QStringList &names)
{
    for (const QString &name : names) {
        installCatalog(name);
    }
}

void Files::removeCatalog(const QString &name)
{
    remove(catalogPath(name));
}
