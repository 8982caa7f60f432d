// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "catalogcheck.h"

#include <QByteArray>
#include <QString>
#include <QtEndian>

#include <array>
#include <utility>
#include <vector>

namespace {

// A literal would end with a NUL.
constexpr std::array<char, 16> magic = {'\x3c', '\xb8', '\x64', '\x18', '\xca', '\xef',
                                        '\x9c', '\x95', '\xcd', '\x21', '\x1c', '\xbf',
                                        '\x60', '\xa1', '\xbd', '\xdd'};

enum SectionTag : uchar {
    ContextsTag = 0x2f,
    HashesTag = 0x42,
    MessagesTag = 0x69,
    PluralRulesTag = 0x88,
    DependenciesTag = 0x96,
};

enum MessageTag : uchar {
    EndTag = 1,
    TranslationTag = 3,
    ObsoleteTag = 5,
    SourceTextTag = 6,
    ContextTag = 7,
    CommentTag = 8,
};

// lrelease writes this length for an empty plural form. QTranslator then stops reading the message.
constexpr quint32 nullTextSize = 0xffffffff;

// A part of the content. At its end, reading returns zeros.
class Section
{
public:
    Section() = default;
    Section(const uchar *data, quint32 size) : m_start(data), m_next(data), m_end(data + size) { }

    bool atEnd() const { return m_next == m_end; }
    quint32 size() const { return quint32(m_end - m_start); }
    quint32 position() const { return quint32(m_next - m_start); }

    template<typename Number> Number takeNumber()
    {
        const Section number = take(sizeof(Number));
        return number.size() > 0 ? qFromBigEndian<Number>(number.m_start) : 0;
    }

    // Empty, and nothing is left, if fewer bytes than that are left.
    Section take(quint32 size)
    {
        const uchar *const start = m_next;
        if (size > quint32(m_end - m_next)) {
            m_next = m_end;
            return {};
        }
        m_next += size;
        return {start, size};
    }

private:
    const uchar *m_start = nullptr;
    const uchar *m_next = nullptr;
    const uchar *m_end = nullptr;
};

// Reads the messages in their order and marks the start of each one. Returns false if one of them
// is damaged.
bool markMessages(Section messages, std::vector<bool> *starts)
{
    starts->resize(messages.size());
    while (!messages.atEnd()) {
        (*starts)[messages.position()] = true;
        // A message that is too short ends with the tag 0.
        for (auto tag = messages.takeNumber<uchar>(); tag != EndTag;
             tag = messages.takeNumber<uchar>()) {
            switch (tag) {
            case TranslationTag: {
                const auto size = messages.takeNumber<quint32>();
                if (size != nullTextSize && size % sizeof(QChar) != 0) {
                    return false;
                }
                messages.take(size == nullTextSize ? 0 : size);
                break;
            }
            case SourceTextTag:
            case ContextTag:
            case CommentTag:
                messages.take(messages.takeNumber<quint32>());
                break;
            case ObsoleteTag:
                messages.take(sizeof(quint32));
                break;
            default:
                return false;
            }
        }
    }
    return true;
}

// Each hash has the position of a message of its own. If hashes shared messages, a look-up could
// read the same long message a million times.
bool areHashesSound(Section hashes, std::vector<bool> messageStarts)
{
    while (!hashes.atEnd()) {
        hashes.take(sizeof(quint32)); // the hash
        const auto position = hashes.takeNumber<quint32>();
        if (position >= messageStarts.size() || !messageStarts[position]) {
            return false;
        }
        messageStarts[position] = false;
    }
    return hashes.size() % (2 * sizeof(quint32)) == 0;
}

// A hash table with the positions of the names of contexts, counted in pairs of bytes after it.
bool areContextsSound(Section contexts)
{
    if (contexts.size() == 0) {
        return true;
    }
    const auto count = contexts.takeNumber<quint16>();
    Section table = contexts.take(count * quint32(sizeof(quint16)));
    const quint32 namesSize = contexts.size() - contexts.position();
    while (!table.atEnd()) {
        if (table.takeNumber<quint16>() * quint32(sizeof(quint16)) >= namesSize) {
            return false;
        }
    }
    // QTranslator divides by the number.
    return table.size() > 0;
}

} // namespace

QString whyUnusableCatalog(const QByteArray &content)
{
    Section file(reinterpret_cast<const uchar *>(content.constData()), quint32(content.size()));
    if (!content.startsWith(QByteArray::fromRawData(magic.data(), int(magic.size())))) {
        return QStringLiteral("it does not begin like a catalog");
    }
    file.take(magic.size());

    Section contexts;
    Section hashes;
    Section messages;
    while (!file.atEnd()) {
        const auto tag = file.takeNumber<uchar>();
        const Section section = file.take(file.takeNumber<quint32>());
        if (section.size() == 0) {
            return QStringLiteral("it is cut short or damaged");
        }
        if (tag == 0) {
            break; // QTranslator reads no further.
        }
        switch (tag) {
        case ContextsTag:
            contexts = section;
            break;
        case HashesTag:
            hashes = section;
            break;
        case MessagesTag:
            messages = section;
            break;
        case DependenciesTag:
            return QStringLiteral("it depends on other catalogs");
        default:
            break;
        }
    }
    std::vector<bool> messageStarts;
    if (!markMessages(messages, &messageStarts)) {
        return QStringLiteral("a message is damaged");
    }
    if (!areHashesSound(hashes, std::move(messageStarts))) {
        return QStringLiteral("its index is damaged");
    }
    if (!areContextsSound(contexts)) {
        return QStringLiteral("its list of contexts is damaged");
    }
    return {};
}
