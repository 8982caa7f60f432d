// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "mgconfitem.h"

#include "dconfclient.h"

#include <utility>

#include <dconf.h>

MGConfItem::MGConfItem(const QString &key, QObject *parent) : QObject(parent), m_key(key)
{
    const QByteArray path = key.toUtf8();
    if (!key.isValidUtf16() || key.contains(QChar::Null) || !dconf_is_key(path, nullptr)) {
        qCWarning(lcPlatformLog).noquote()
            << "MGConfItem:" << '"' + QByteArray(path.constData()) + '"' << "is not a dconf key";
        return;
    }
    m_path = path;
    checkDconfOnce();

    const auto changed = [](DConfClient *, const char *prefix, const char *const *changes,
                            const char *, gpointer item) {
        auto *const self = static_cast<MGConfItem *>(item);
        if (self->isOneOf(prefix, changes)) {
            self->update();
        }
    };
    m_handler = g_signal_connect(dconfClient(), "changed", G_CALLBACK(+changed), this);
    dconf_client_watch_fast(dconfClient(), m_path.constData());
    m_lastValue = dataOf(readDconf(m_path).get());
}

MGConfItem::~MGConfItem()
{
    if (!m_path.isEmpty()) {
        g_signal_handler_disconnect(dconfClient(), m_handler);
        unwatchDconfLater(m_path);
    }
}

QVariant MGConfItem::value() const
{
    if (m_path.isEmpty()) {
        return {};
    }
    const GVariantPtr value = readDconf(m_path);
    return value != nullptr ? toQVariant(value.get()) : QVariant();
}

QVariant MGConfItem::value(const QVariant &defaultValue) const
{
    const QVariant current = value();
    return current.isValid() ? current : defaultValue;
}

void MGConfItem::set(const QVariant &value)
{
    if (!value.isValid()) {
        unset();
        return;
    }
    if (m_path.isEmpty()) {
        return;
    }
    QString reason;
    const GVariantPtr converted = toGVariant(value, &reason);
    if (converted == nullptr) {
        qCWarning(lcPlatformLog).noquote() << "MGConfItem:" << m_path << "cannot hold" << reason;
        return;
    }
    writeDconf(QByteArray(m_path), converted.get());
}

void MGConfItem::unset()
{
    if (!m_path.isEmpty()) {
        writeDconf(QByteArray(m_path), nullptr);
    }
}

bool MGConfItem::isOneOf(const char *prefix, const char *const *changes) const
{
    for (; *changes != nullptr; ++changes) {
        const QByteArray path = QByteArray(prefix) + *changes;
        if (path.endsWith('/') ? m_path.startsWith(path) : m_path == path) {
            return true;
        }
    }
    return false;
}

void MGConfItem::update()
{
    QByteArray value = dataOf(readDconf(m_path).get());
    if (value != m_lastValue) {
        m_lastValue = std::move(value);
        Q_EMIT valueChanged(); // the last step: a slot may have deleted this item
    }
}
