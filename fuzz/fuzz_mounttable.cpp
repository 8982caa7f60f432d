// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The input is the path of a card's device, on the first line, and a mount table.

#include "fuzzing.h"
#include "isolatedthread.h"
#include "memorycard/fileremover.h"

#include <QFile>

#include <string>
#include <vector>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace {

// The directories of the isolated file system, parents first; each contains a file.
const std::vector<std::string> directories = {
    "/etc",   "/dev",     "/card",   "/card/directory", "/card/directory/deep",
    "/card2", "/a b",     "/tab\tx", "/back\\slash",    "/new\nline",
    "/#",     "/outside", "/cwd",    "/cwd/card",       "/\xff",
};
const char *const fileName = "/file";
const char *const linkPath = "/link"; // to /card2
const char *const mountTable = "/etc/mtab";

bool exists(const std::string &path)
{
    struct stat info = {};
    return lstat(path.c_str(), &info) == 0;
}

void touch(const std::string &path)
{
    const int fd = open(path.c_str(), O_WRONLY | O_CREAT | O_CLOEXEC, 0600);
    Fuzzing::require(fd >= 0, "a file can be made");
    close(fd);
}

void makeWorld()
{
    for (const std::string &directory : directories) {
        mkdir(directory.c_str(), 0700);
        touch(directory + fileName);
    }
    Fuzzing::require(exists(linkPath) || symlink("/card2", linkPath) == 0, "a link can be made");
    Fuzzing::require(chdir("/cwd") == 0, "there is a current directory");
}

void writeMountTable(const QByteArray &table)
{
    const int fd = open(mountTable, O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0600);
    Fuzzing::require(fd >= 0 && write(fd, table.constData(), size_t(table.size())) == table.size(),
                     "the table can be written");
    close(fd);
}

// Returns the next word of a line, with its escapes decoded.
std::string takeWord(const std::string &line, size_t *at)
{
    *at = std::min(line.find_first_not_of(" \t", *at), line.size());
    const size_t end = std::min(line.find_first_of(" \t", *at), line.size());
    const std::string word = line.substr(*at, end - *at);
    *at = end;

    static const std::vector<std::pair<std::string, char>> codes = {
        {"\\040", ' '}, {"\\011", '\t'}, {"\\012", '\n'}, {"\\134", '\\'}, {"\\\\", '\\'}};
    std::string decoded;
    for (size_t i = 0; i < word.size();) {
        char character = word[i];
        size_t length = 1;
        for (const auto &[code, meaning] : codes) {
            if (word.compare(i, code.size(), code) == 0) {
                character = meaning;
                length = code.size();
                break;
            }
        }
        decoded += character;
        i += length;
    }
    return decoded;
}

ino_t numberOf(const std::string &path)
{
    struct stat info = {};
    lstat(path.c_str(), &info);
    return info.st_ino;
}

// Returns the inodes of the directories that the table names for the device, with the type of this
// file system. Returns none if one of them is the root directory: then the device is not a card.
std::vector<ino_t> namedDirectories(const std::string &device, const std::string &table)
{
    std::vector<ino_t> named;
    size_t start = 0;
    while (start < table.size()) {
        const size_t end =
            std::min(table.find_first_of(std::string("\n\0", 2), start), table.size());
        const std::string line = table.substr(start, end - start);
        start = end + 1;
        size_t at = 0;
        struct stat info = {};
        if (takeWord(line, &at) != device) {
            continue;
        }
        const std::string directory = takeWord(line, &at);
        if (directory.empty() || directory[0] != '/'
            || lstat((directory + "/").c_str(), &info) != 0) {
            continue;
        }
        const std::string type = takeWord(line, &at);
        // The C library skips the line after one with a NUL.
        if (info.st_ino == numberOf("/") && !type.empty()
            && table.find('\0') == std::string::npos) {
            return {};
        }
        if (type.compare(0, 5, "tmpfs") == 0) {
            named.push_back(info.st_ino);
        }
    }
    return named;
}

const char *empty(const QString &devicePath, const QByteArray &table)
{
    makeWorld();
    writeMountTable(table);
    const std::vector<ino_t> named =
        namedDirectories(QFile::encodeName(devicePath).toStdString(), table.toStdString());
    // Whether the files of each directory may be removed.
    std::vector<bool> mayLose;
    for (const std::string &directory : directories) {
        bool may = false;
        for (size_t end = directory.size(); end != 0; end = directory.rfind('/', end - 1)) {
            const ino_t number = numberOf(directory.substr(0, end));
            may = may || std::find(named.cbegin(), named.cend(), number) != named.cend();
        }
        mayLose.push_back(may);
    }

    int completed = 0;
    int failed = 0;
    FileRemover remover(devicePath);
    QObject::connect(&remover, &FileRemover::completed, [&completed] { ++completed; });
    QObject::connect(&remover, &FileRemover::error, [&failed] { ++failed; });
    remover.run();

    if (completed + failed != 1) {
        return "the remover reports its end exactly once";
    }
    if (!exists(linkPath)) {
        return "the link must stay";
    }
    bool lost = false;
    for (size_t i = 0; i < directories.size(); ++i) {
        if (!exists(directories[i] + fileName)) {
            lost = true;
            if (!mayLose[i]) {
                return "no directory loses anything that the table does not name for the device";
            }
        }
    }
    if (lost && !named.empty() && completed == 0 && named.size() == 1) {
        return "a card that could be emptied is reported as empty";
    }
    return nullptr;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size)
{
    static IsolatedThread thread;
    Bytes input(data, size);
    const QString devicePath = QString::fromUtf8(input.takeUntil('\n'));
    const char *const failure = thread.run([&] { return empty(devicePath, input.rest()); });
    Fuzzing::require(failure == nullptr, failure);
    return 0;
}
