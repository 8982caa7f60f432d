// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "mgconfitem.h"

#include <QAbstractEventDispatcher>
#include <QSemaphore>
#include <QSet>
#include <QTimer>
#include <QtDebug>
#include <array>
#include <cstdlib>
#include <cstring>
#include <dconf.h>

namespace {

// How long an exiting process waits for dconf-service to accept the last changes.
constexpr int exitTimeoutMs = 5000;

// How long a key stays watched when no item is left.
constexpr int unwatchDelayMs = 1000;

DConfClient *client();

// dconf sends changes in a thread of its own, so the last ones may not be sent yet when the process
// exits. dconf_client_sync() has no time limit and therefore runs in another thread.
void flushWrites()
{
    static auto *const done = new QSemaphore; // for the thread, which may outlast this function
    GThread *const thread = g_thread_try_new(
        "settings-flush",
        [](gpointer) -> gpointer {
            dconf_client_sync(client());
            done->release();
            return nullptr;
        },
        nullptr, nullptr);
    if (thread) {
        g_thread_unref(thread);
        done->tryAcquire(1, exitTimeoutMs);
    }
}

// One client per process: an item sees at once what another item sets.
DConfClient *client()
{
    static DConfClient *const client = [] {
        std::atexit(flushWrites);
        return dconf_client_new();
    }();
    return client;
}

bool sameData(GVariant *one, GVariant *other)
{
    if (!one || !other) {
        return !one && !other;
    }
    const gsize size = g_variant_get_size(one);
    return g_variant_type_equal(g_variant_get_type(one), g_variant_get_type(other))
        && size == g_variant_get_size(other)
        && (size == 0
            || std::memcmp(g_variant_get_data(one), g_variant_get_data(other), size) == 0);
}

// dconf_client_read() opens the database before it searches the queue of writes. A write that
// completes in between is in neither, and the read returns the previous value. This cannot happen
// again until this thread writes the key: if the first two reads differ, the third one is right.
GVariantPtr readStored(const QByteArray &path)
{
    const auto readOnce = [&path] {
        return GVariantPtr(dconf_client_read(client(), path.constData()));
    };
    GVariantPtr first = readOnce();
    const GVariantPtr second = readOnce();
    return sameData(first.get(), second.get()) ? std::move(first) : readOnce();
}

// Null if no value is stored, or if the stored value cannot be read.
GVariantPtr read(const QByteArray &path)
{
    const GVariantPtr stored = readStored(path);
    return stored ? trusted(stored.get()) : nullptr;
}

void meetBus(GObject *, GAsyncResult *result, gpointer)
{
    GError *error = nullptr;
    GDBusConnection *const bus = g_bus_get_finish(result, &error);
    if (bus) {
        // dconf uses the same connection. By default GLib ends the process when the bus
        // disconnects.
        g_dbus_connection_set_exit_on_close(bus, FALSE);
        g_object_unref(bus);
        return;
    }
    qWarning("MGConfItem: without a session bus settings can neither be stored nor followed: %s",
             error->message);
    g_error_free(error);
}

// Warns once per process, as soon as there is an event dispatcher to examine.
void warnOfLimits()
{
    static bool warned = false;
    const QAbstractEventDispatcher *const dispatcher = QAbstractEventDispatcher::instance();
    if (warned || !dispatcher) {
        return;
    }
    warned = true;
    if (dispatcher->inherits("QEventDispatcherGlib")) {
        g_bus_get(G_BUS_TYPE_SESSION, nullptr, meetBus, nullptr);
    } else {
        qWarning("MGConfItem: the event dispatcher is not GLib's: changes by other processes and "
                 "failures to store will not be seen");
    }
}

// dconf queues a message to the bus for each watch and unwatch, without a limit. Pages may create
// and destroy items faster than the bus takes messages, so a key stays watched for a moment.
void unwatchLater(const QByteArray &path)
{
    static QSet<QByteArray> kept;
    const QAbstractEventDispatcher *const dispatcher = QAbstractEventDispatcher::instance();
    if (!dispatcher || kept.contains(path)) {
        dconf_client_unwatch_fast(client(), path.constData());
        return;
    }
    kept.insert(path);
    QTimer::singleShot(unwatchDelayMs, dispatcher, [path] {
        kept.remove(path);
        dconf_client_unwatch_fast(client(), path.constData());
    });
}

} // namespace

MGConfItem::MGConfItem(const QString &key, QObject *parent) : QObject(parent), m_key(key)
{
    const QByteArray path = key.toUtf8();
    if (!key.isValidUtf16() || key.contains(QChar::Null) || !dconf_is_key(path, nullptr)) {
        qWarning("MGConfItem: \"%s\" is not a dconf key", path.constData());
        return;
    }
    m_path = path;
    warnOfLimits();

    const auto changed = [](DConfClient *, const char *prefix, const char *const *changes,
                            const char *, gpointer item) {
        auto *const self = static_cast<MGConfItem *>(item);
        if (self->isAmong(prefix, changes)) {
            self->update();
        }
    };
    m_handler = g_signal_connect(client(), "changed", G_CALLBACK(+changed), this);
    dconf_client_watch_fast(client(), m_path.constData());
    m_lastValue = read(m_path);
}

MGConfItem::~MGConfItem()
{
    if (!m_path.isEmpty()) {
        g_signal_handler_disconnect(client(), m_handler);
        unwatchLater(m_path);
    }
}

QVariant MGConfItem::value() const
{
    if (m_path.isEmpty()) {
        return {};
    }
    const GVariantPtr value = read(m_path);
    return value ? toQVariant(value.get()) : QVariant();
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
    if (!converted) {
        qWarning("MGConfItem: %s cannot hold %s", m_path.constData(), qUtf8Printable(reason));
        return;
    }
    write(converted.get());
}

void MGConfItem::unset()
{
    if (!m_path.isEmpty()) {
        write(nullptr);
    }
}

// A change names a key, or a whole directory if it ends with a slash.
bool MGConfItem::isAmong(const char *prefix, const char *const *changes) const
{
    for (; *changes; ++changes) {
        const QByteArray path = QByteArray(prefix) + *changes;
        if (path.endsWith('/') ? m_path.startsWith(path) : m_path == path) {
            return true;
        }
    }
    return false;
}

void MGConfItem::update()
{
    GVariantPtr value = read(m_path);
    const bool same = value && m_lastValue ? g_variant_equal(value.get(), m_lastValue.get())
                                           : !value && !m_lastValue;
    if (same) {
        return;
    }
    m_lastValue = std::move(value);
    Q_EMIT valueChanged(); // the last step: a slot may have deleted this item
}

void MGConfItem::write(GVariant *value)
{
    // A slot that is called from here may delete this item, so no member is used afterwards.
    const QByteArray path = m_path;
    GError *error = nullptr;
    if (!dconf_client_write_fast(client(), path.constData(), value, &error)) {
        qWarning("MGConfItem: %s cannot be written: %s", path.constData(), error->message);
        g_error_free(error);
        return;
    }
    // dconf reports the change itself, unless it reads an outdated value, as described at
    // readStored(), and that equals the new one. Items that know the value ignore this signal.
    const std::array<const char *, 2> changes = {"", nullptr};
    g_signal_emit_by_name(client(), "changed", path.constData(), changes.data(), "");
}
