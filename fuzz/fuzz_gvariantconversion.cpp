// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The input is a type, up to the first NUL, and data of that type as a settings database may hold
// it, damaged or not. If the type is empty, the rest is a value from QML, to be stored.

#include "fuzzing.h"
#include "gvariantconversion.h"

#include <glib.h>

namespace {

// A stored value remains the same however often it is read and stored.
void store(const QVariant &value)
{
    QString reason;
    const GVariantPtr stored = toGVariant(value, &reason);
    Fuzzing::require((stored == nullptr) != reason.isEmpty(), "a refusal has a reason");
    if (stored) {
        Fuzzing::require(g_variant_is_normal_form(stored.get()), "what is stored is normal");
        const GVariantPtr again = toGVariant(toQVariant(stored.get()), &reason);
        Fuzzing::require(again && g_variant_equal(stored.get(), again.get()),
                         "what is stored is read as it was");
    }
}

QVariant takeValue(Bytes *input, int nesting)
{
    const int type = input->takeByte() % 10;
    const int count = nesting < 2 ? input->takeByte() % 8 : 0;
    switch (type) {
    case 0:
        return true;
    case 1:
        return int(input->takeByte()) - 128;
    case 2:
        return uint(input->takeByte());
    case 3:
        return qlonglong(input->takeByte()) << 40U;
    case 4:
        return qulonglong(input->takeByte()) << 56U;
    case 5:
        return QString::fromUtf8(input->takeUntil(';'));
    case 6: {
        // May contain half a surrogate pair, as texts from QML may.
        const QByteArray text = input->takeUntil(';');
        return QString(reinterpret_cast<const QChar *>(text.constData()), text.size() / 2);
    }
    case 7: {
        QStringList list;
        for (int i = 0; i < count; ++i) {
            list.append(QString::fromLatin1(input->takeUntil(';')));
        }
        return list;
    }
    case 8: {
        QVariantMap map;
        for (int i = 0; i < count; ++i) {
            const QString key = QString::fromUtf8(input->takeUntil(';'));
            map.insert(key, takeValue(input, nesting + 1));
        }
        return map;
    }
    default:
        return {};
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size)
{
    Bytes input(data, size);
    const QByteArray type = input.takeUntil('\0');
    if (type.isEmpty()) {
        store(takeValue(&input, 0));
        return 0;
    }
    const char *end = nullptr;
    if (!g_variant_type_string_scan(type.constData(), nullptr, &end) || *end != '\0'
        || !g_variant_type_is_definite(G_VARIANT_TYPE(type.constData()))) {
        return 0;
    }
    const QByteArray content = input.rest();
    const GVariantPtr stored(g_variant_ref_sink(
        g_variant_new_from_data(G_VARIANT_TYPE(type.constData()), content.constData(),
                                gsize(content.size()), FALSE, nullptr, nullptr)));
    const QVariant value = toQVariant(stored.get());
    Fuzzing::require(!value.isValid() || g_variant_is_normal_form(stored.get()),
                     "damaged data is invalid");
    store(value);
    return 0;
}
