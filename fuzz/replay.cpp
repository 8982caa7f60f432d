// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// usage: PROGRAM FILE|FOLDER...
//
// Gives each of the files to the fuzz target that it is linked with, once: for compilers without a
// fuzzer, and so that what was wrong once stays right.

#include "fuzzing.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QStringList>

#include <cstdio>
#include <vector>

extern "C" int LLVMFuzzerInitialize(int *argc, char ***argv);

namespace {

QStringList filesOf(const QString &path)
{
    if (!QFileInfo(path).isDir()) {
        return {path};
    }
    QStringList files;
    const QDir folder(path);
    const QStringList names = folder.entryList(QDir::Files, QDir::Name);
    for (const QString &name : names) {
        files.append(folder.filePath(name));
    }
    return files;
}

} // namespace

int main(int argc, char *argv[])
{
    LLVMFuzzerInitialize(&argc, &argv);
    int count = 0;
    for (int i = 1; i < argc; ++i) {
        const QStringList paths = filesOf(QFile::decodeName(argv[i]));
        for (const QString &path : paths) {
            // The last one that is named before a crash is the one.
            std::fprintf(stderr, "%s\n", qPrintable(path));
            QFile file(path);
            if (!file.open(QIODevice::ReadOnly)) {
                std::fprintf(stderr, "cannot be read\n");
                return 1;
            }
            // Of just its size: what is read beyond it, a sanitizer sees.
            const QByteArray content = file.readAll();
            const std::vector<std::uint8_t> input(content.cbegin(), content.cend());
            LLVMFuzzerTestOneInput(input.data(), input.size());
            ++count;
        }
    }
    std::fprintf(stderr, "%d inputs\n", count);
    return count > 0 ? 0 : 1;
}
