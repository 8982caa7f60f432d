// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The input is a translation catalog. If the check accepts it, QTranslator reads it in memory that ends
// at a page without access, and looks up every message.

#include "fuzzing.h"
#include "translations/catalogcheck.h"

#include <QTranslator>
#include <QtEndian>

#include <cstring>
#include <initializer_list>

#include <sys/mman.h>
#include <unistd.h>

namespace {

constexpr int maximumSize = 1024 * 1024;

// Holds the content and its padding between two pages without access.
const uchar *guarded(const QByteArray &content)
{
    static const auto page = int(sysconf(_SC_PAGESIZE));
    static char *const start = [] {
        constexpr int anonymous = MAP_PRIVATE | MAP_ANONYMOUS;
        void *const memory =
            mmap(nullptr, size_t(maximumSize + 2 * page), PROT_NONE, anonymous, -1, 0);
        auto *const readable = static_cast<char *>(memory) + page;
        Fuzzing::require(memory != MAP_FAILED
                             && mprotect(readable, maximumSize, PROT_READ | PROT_WRITE) == 0,
                         "the memory can be allocated");
        return readable;
    }();
    char *const end = start + maximumSize;
    std::memset(end - catalogPadding, 0, catalogPadding);
    char *const data = end - catalogPadding - content.size();
    std::memcpy(data, content.constData(), size_t(content.size()));
    return reinterpret_cast<const uchar *>(data);
}

// Returns a text with this hash. QTranslator's hash shifts by four bits and adds the next character, so
// the characters are the digits of the number, from 1 to 16.
QByteArray textWithHash(quint32 hash)
{
    QByteArray text;
    for (; hash > 0; hash = (hash - 1) / 16) {
        text.prepend(char((hash - 1) % 16 + 1));
    }
    return text;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size)
{
    const QByteArray content(reinterpret_cast<const char *>(data), int(size));
    if (content.size() > maximumSize - catalogPadding || !whyUnusableCatalog(content).isEmpty()) {
        return 0;
    }
    QTranslator translator;
    if (!translator.load(guarded(content), content.size())) {
        return 0; // plural rules
    }
    const auto lookUp = [&translator](const char *context, const char *text) {
        for (const int number : {-1, 0, 1, 5, 1002}) {
            translator.translate(context, text, "", number);
            translator.translate(context, text, "c1", number);
        }
    };
    // The identifiers, contexts and texts in the seeds.
    for (const char *text :
         {"t-one", "t-empty", "t-n", "t-n0", "t-var", "Plain", "Same", "%n", ""}) {
        for (const char *context : {"", "Ctx", "Another", "a"}) {
            lookUp(context, text);
        }
    }
    // Every number may be a hash.
    for (int at = 0; at + 4 <= content.size(); ++at) {
        const auto hash = qFromBigEndian<quint32>(content.constData() + at);
        if (hash < 0x10000000) {
            translator.translate("", textWithHash(hash).constData(), nullptr, 1);
        }
    }
    return 0;
}
