// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "gvariantconversion.h"

#include <QByteArray>
#include <QString>
#include <QStringList>
#include <glib.h>

namespace {

GVariantPtr sink(GVariant *floating)
{
    return GVariantPtr(g_variant_ref_sink(floating));
}

bool isUnicodeWithoutNul(const QString &text)
{
    return text.isValidUtf16() && !text.contains(QChar::Null);
}

GVariantPtr refuseText(QString *reason)
{
    *reason = QStringLiteral("text of type QString with a NUL or half a surrogate pair");
    return nullptr;
}

GVariantPtr convertText(const QString &text, QString *reason)
{
    if (!isUnicodeWithoutNul(text)) {
        return refuseText(reason);
    }
    return sink(g_variant_new_string(text.toUtf8().constData()));
}

GVariantPtr convertStringList(const QStringList &list, QString *reason)
{
    GVariantBuilder builder;
    g_variant_builder_init(&builder, G_VARIANT_TYPE_STRING_ARRAY);
    for (const QString &text : list) {
        if (!isUnicodeWithoutNul(text)) {
            g_variant_builder_clear(&builder);
            return refuseText(reason);
        }
        g_variant_builder_add(&builder, "s", text.toUtf8().constData());
    }
    return sink(g_variant_builder_end(&builder));
}

GVariantPtr convertPlain(const QVariant &value, QString *reason)
{
    switch (value.userType()) {
    case QMetaType::Bool:
        return sink(g_variant_new_boolean(value.toBool() ? TRUE : FALSE));
    case QMetaType::Int:
        return sink(g_variant_new_int32(value.toInt()));
    case QMetaType::UInt:
        return sink(g_variant_new_uint32(value.toUInt()));
    case QMetaType::LongLong:
        return sink(g_variant_new_int64(value.toLongLong()));
    case QMetaType::ULongLong:
        return sink(g_variant_new_uint64(value.toULongLong()));
    case QMetaType::QString:
        return convertText(value.toString(), reason);
    case QMetaType::QStringList:
        return convertStringList(value.toStringList(), reason);
    default:
        *reason = value.isValid()
            ? QStringLiteral("a value of type %1").arg(QLatin1String(value.typeName()))
            : QStringLiteral("an invalid QVariant");
        return nullptr;
    }
}

GVariantPtr convertMap(const QVariantMap &map, QString *reason)
{
    GVariantBuilder builder;
    g_variant_builder_init(&builder, G_VARIANT_TYPE_VARDICT);
    for (auto it = map.cbegin(); it != map.cend(); ++it) {
        const GVariantPtr converted =
            isUnicodeWithoutNul(it.key()) ? convertPlain(it.value(), reason) : refuseText(reason);
        if (converted == nullptr) {
            g_variant_builder_clear(&builder);
            return nullptr;
        }
        g_variant_builder_add(&builder, "{sv}", it.key().toUtf8().constData(), converted.get());
    }
    return sink(g_variant_builder_end(&builder));
}

QVariant convert(GVariant *value);

QString toText(GVariant *value)
{
    gsize length = 0;
    const char *const utf8 = g_variant_get_string(value, &length);
    const QString text = QString::fromUtf8(utf8, int(length));
    // QString takes U+FEFF at the start for a byte order mark and drops it.
    const bool marked = QByteArray::fromRawData(utf8, int(length)).startsWith("\xEF\xBB\xBF");
    return marked ? QChar(QChar::ByteOrderMark) + text : text;
}

GVariantPtr childAt(GVariant *container, gsize index)
{
    return GVariantPtr(g_variant_get_child_value(container, index));
}

QVariantList toList(GVariant *container)
{
    const gsize count = g_variant_n_children(container);
    QVariantList list;
    list.reserve(int(count));
    for (gsize i = 0; i < count; ++i) {
        list.append(convert(childAt(container, i).get()));
    }
    return list;
}

QStringList toStringList(GVariant *array)
{
    const gsize count = g_variant_n_children(array);
    QStringList list;
    list.reserve(int(count));
    for (gsize i = 0; i < count; ++i) {
        list.append(toText(childAt(array, i).get()));
    }
    return list;
}

QVariantMap toMap(GVariant *dictionary)
{
    const gsize count = g_variant_n_children(dictionary);
    QVariantMap map;
    for (gsize i = 0; i < count; ++i) {
        const GVariantPtr entry = childAt(dictionary, i);
        const QString key = toText(childAt(entry.get(), 0).get());
        if (!map.contains(key)) { // the first of equal keys counts, as in GLib's own look-up
            map.insert(key, convert(childAt(entry.get(), 1).get()));
        }
    }
    return map;
}

QVariant convertContainer(GVariant *container)
{
    if (g_variant_is_of_type(container, G_VARIANT_TYPE_STRING_ARRAY)) {
        return toStringList(container);
    }
    if (g_variant_is_of_type(container, G_VARIANT_TYPE("a{s*}"))) {
        return toMap(container);
    }
    return toList(container);
}

QVariant convert(GVariant *value)
{
    switch (g_variant_classify(value)) {
    case G_VARIANT_CLASS_BOOLEAN:
        return g_variant_get_boolean(value) != FALSE;
    case G_VARIANT_CLASS_BYTE:
        return int(g_variant_get_byte(value));
    case G_VARIANT_CLASS_INT16:
        return int(g_variant_get_int16(value));
    case G_VARIANT_CLASS_UINT16:
        return uint(g_variant_get_uint16(value));
    case G_VARIANT_CLASS_INT32:
        return g_variant_get_int32(value);
    case G_VARIANT_CLASS_UINT32:
        return g_variant_get_uint32(value);
    case G_VARIANT_CLASS_INT64:
        return qlonglong(g_variant_get_int64(value));
    case G_VARIANT_CLASS_UINT64:
        return qulonglong(g_variant_get_uint64(value));
    case G_VARIANT_CLASS_DOUBLE:
        return g_variant_get_double(value);
    case G_VARIANT_CLASS_STRING:
        return toText(value);
    case G_VARIANT_CLASS_VARIANT:
        return convert(childAt(value, 0).get());
    default:
        return g_variant_is_container(value) ? convertContainer(value) : QVariantList();
    }
}

} // namespace

void GVariantUnref::operator()(GVariant *value) const
{
    g_variant_unref(value);
}

GVariantPtr toGVariant(const QVariant &value, QString *reason)
{
    return value.userType() == QMetaType::QVariantMap ? convertMap(value.toMap(), reason)
                                                      : convertPlain(value, reason);
}

QVariant toQVariant(GVariant *value)
{
    // Data in normal form is safe to convert: its strings are Unicode, its nesting is limited, and
    // its parts do not overlap, so that it cannot unfold into more than was stored.
    const GVariantPtr normal = verified(value);
    return normal != nullptr ? convert(normal.get()) : QVariant();
}

GVariantPtr verified(GVariant *value)
{
    if (!g_variant_is_normal_form(value)) {
        return nullptr;
    }
    GBytes *const data = g_variant_get_data_as_bytes(value);
    GVariantPtr same = sink(g_variant_new_from_bytes(g_variant_get_type(value), data, TRUE));
    g_bytes_unref(data);
    return same;
}
