// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "gvariantconversion.h"

#include <QString>
#include <QStringList>

#include <algorithm>

#include <glib.h>

namespace {

GVariantPtr sink(GVariant *floating)
{
    return GVariantPtr(g_variant_ref_sink(floating));
}

// Why dconf does not get a value; empty if it does.
QString whyRefused(const QVariant &value)
{
    switch (value.userType()) {
    case QMetaType::Bool:
    case QMetaType::Int:
        return {};
    case QMetaType::QString:
    case QMetaType::QStringList:
        break;
    default:
        return value.isValid()
            ? QStringLiteral("a value of type %1").arg(QLatin1String(value.typeName()))
            : QStringLiteral("an invalid QVariant");
    }
    const QStringList texts = value.toStringList();
    const bool areUnicode = std::all_of(texts.cbegin(), texts.cend(), [](const QString &text) {
        return text.isValidUtf16() && !text.contains(QChar::Null);
    });
    return areUnicode ? QString()
                      : QStringLiteral("text of type QString with a NUL or half a surrogate pair");
}

GVariant *newValue(const QVariant &value)
{
    switch (value.userType()) {
    case QMetaType::Bool:
        return g_variant_new_boolean(value.toBool() ? TRUE : FALSE);
    case QMetaType::Int:
        return g_variant_new_int32(value.toInt());
    case QMetaType::QString:
        return g_variant_new_string(value.toString().toUtf8().constData());
    default:
        break;
    }
    GVariantBuilder builder;
    g_variant_builder_init(&builder, G_VARIANT_TYPE_STRING_ARRAY);
    const QStringList list = value.toStringList();
    for (const QString &text : list) {
        g_variant_builder_add(&builder, "s", text.toUtf8().constData());
    }
    return g_variant_builder_end(&builder);
}

GVariant *newMap(const QVariantMap &map)
{
    GVariantBuilder builder;
    g_variant_builder_init(&builder, G_VARIANT_TYPE_VARDICT);
    for (auto it = map.cbegin(); it != map.cend(); ++it) {
        g_variant_builder_add(&builder, "{sv}", it.key().toUtf8().constData(),
                              newValue(it.value()));
    }
    return g_variant_builder_end(&builder);
}

QVariant convert(GVariant *value);

QString toText(const char *utf8)
{
    // fromUtf8() drops a byte-order mark at the start, which may be the text's own.
    return QString::fromUtf8(QByteArray("\xEF\xBB\xBF") + utf8);
}

QStringList toStringList(GVariant *array)
{
    QStringList list;
    GVariantIter texts;
    g_variant_iter_init(&texts, array);
    const char *text = nullptr;
    while (g_variant_iter_next(&texts, "&s", &text)) {
        list.append(toText(text));
    }
    return list;
}

QVariantMap toMap(GVariant *dictionary)
{
    QVariantMap map;
    GVariantIter entries;
    g_variant_iter_init(&entries, dictionary);
    const char *utf8 = nullptr;
    GVariant *value = nullptr;
    while (g_variant_iter_loop(&entries, "{&s@*}", &utf8, &value)) {
        const QString key = toText(utf8);
        if (!map.contains(key)) { // the first of equal keys counts, as in GLib's own look-up
            map.insert(key, convert(value));
        }
    }
    return map;
}

QVariantList toList(GVariant *container)
{
    QVariantList list;
    GVariantIter elements;
    g_variant_iter_init(&elements, container);
    while (const GVariantPtr element{g_variant_iter_next_value(&elements)}) {
        list.append(convert(element.get()));
    }
    return list;
}

QVariant convert(GVariant *value)
{
    switch (g_variant_classify(value)) {
    case G_VARIANT_CLASS_BOOLEAN:
        return g_variant_get_boolean(value) != FALSE;
    case G_VARIANT_CLASS_INT32:
        return g_variant_get_int32(value);
    case G_VARIANT_CLASS_STRING:
        return toText(g_variant_get_string(value, nullptr));
    case G_VARIANT_CLASS_VARIANT:
        return convert(GVariantPtr(g_variant_get_variant(value)).get());
    default:
        break;
    }
    if (g_variant_is_of_type(value, G_VARIANT_TYPE_STRING_ARRAY)) {
        return toStringList(value);
    }
    if (g_variant_is_of_type(value, G_VARIANT_TYPE("a{s*}"))) {
        return toMap(value);
    }
    return g_variant_is_container(value) ? toList(value) : QVariantList();
}

// The same value, marked as trusted; null if it is damaged. GLib needs half a minute to read a list
// of 100,000 elements that is not marked.
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

} // namespace

void GVariantUnref::operator()(GVariant *value) const
{
    g_variant_unref(value);
}

GVariantPtr toGVariant(const QVariant &value, QString *reason)
{
    if (value.userType() != QMetaType::QVariantMap) {
        *reason = whyRefused(value);
        return reason->isEmpty() ? sink(newValue(value)) : nullptr;
    }
    const QVariantMap map = value.toMap();
    *reason = whyRefused(QStringList(map.keys()));
    for (const QVariant &each : map) {
        if (reason->isEmpty()) {
            *reason = whyRefused(each);
        }
    }
    return reason->isEmpty() ? sink(newMap(map)) : nullptr;
}

QVariant toQVariant(GVariant *value)
{
    // Data in normal form is safe to convert: its strings are Unicode, its nesting is limited, and
    // its parts do not overlap, so that it cannot unfold into more than was stored.
    const GVariantPtr normal = verified(value);
    return normal != nullptr ? convert(normal.get()) : QVariant();
}
