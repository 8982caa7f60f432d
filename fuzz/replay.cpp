// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// usage: PROGRAM FILE|DIRECTORY...
//
// Passes each file once to the fuzz target that it is linked with: for compilers without a fuzzer, and
// as a regression test.

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
    const QDir directory(path);
    const QStringList names = directory.entryList(QDir::Files, QDir::Name);
    for (const QString &name : names) {
        files.append(directory.filePath(name));
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
            // The last path printed before a crash is the one that caused it.
            std::fprintf(stderr, "%s\n", qPrintable(path));
            QFile file(path);
            if (!file.open(QIODevice::ReadOnly)) {
                std::fprintf(stderr, "cannot be read\n");
                return 1;
            }
            // Exactly as large as the input, so that a sanitizer notices reads beyond the end.
            const QByteArray content = file.readAll();
            const std::vector<std::uint8_t> input(content.cbegin(), content.cend());
            LLVMFuzzerTestOneInput(input.data(), input.size());
            ++count;
        }
    }
    std::fprintf(stderr, "%d inputs\n", count);
    return count > 0 ? 0 : 1;
}
