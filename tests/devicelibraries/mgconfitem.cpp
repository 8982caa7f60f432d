// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include <mgconfitem.h>

#include <QHash>
#include <QSet>

#include <cstring>

namespace {

constexpr char filler = 0x5a;

QSet<MGConfItem *> items;
// The user's settings when the device starts.
QHash<QString, QVariant> values = {
    {"/desktop/glimmera-marlo-home/events_screen_actions",
     QStringList{"/usr/share/glimmera/quickactions/lamp.conf"}},
    {"/desktop/glimmera-marlo-home/events_screen_widgets", QStringList{"weather"}},
    {"/settings/location/custom_settings_enabled", true},
};

} // namespace

MGConfItem::MGConfItem(const QString &key, QObject *parent) : QObject(parent), m_key(key)
{
    std::memset(m_cache, filler, sizeof(m_cache));
    items.insert(this);
}

MGConfItem::~MGConfItem()
{
    for (const char byte : m_cache) {
        if (byte != filler) {
            qFatal("the device's MGConfItem was overwritten");
        }
    }
    items.remove(this);
}

QVariant MGConfItem::value() const
{
    return values.value(m_key);
}

QVariant MGConfItem::value(const QVariant &defaultValue) const
{
    return values.value(m_key, defaultValue);
}

void MGConfItem::set(const QVariant &value)
{
    if (values.value(m_key) == value) {
        return;
    }
    values[m_key] = value;
    const QString key = m_key;
    for (MGConfItem *const item : QSet<MGConfItem *>(items)) {
        if (items.contains(item) && item->key() == key) {
            emit item->valueChanged();
        }
    }
}

void MGConfItem::unset()
{
    set(QVariant());
}
