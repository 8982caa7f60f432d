// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "dconfclient.h"

#include <QAbstractEventDispatcher>
#include <QSemaphore>
#include <QSet>
#include <QTimer>

#include <array>
#include <chrono>
#include <cstdlib>
#include <utility>

#include <dconf.h>

Q_LOGGING_CATEGORY(lcPlatformLog, "org.tarnwickos.settings.platform", QtWarningMsg)

namespace {

// How long an exiting process waits for dconf-service to accept the last changes.
constexpr std::chrono::milliseconds exitTimeout(5000);

// How long a key stays watched when no item is left.
constexpr std::chrono::seconds unwatchDelay(1);

// dconf sends changes in a thread of its own, so the last ones may not be sent yet when the process
// exits. dconf_client_sync() has no time limit and therefore runs in another thread.
void flushWrites()
{
    static auto *const done = new QSemaphore; // for the thread, which may outlast this function
    GThread *const thread = g_thread_try_new(
        "settings-flush",
        [](gpointer) -> gpointer {
            dconf_client_sync(dconfClient());
            done->release();
            return nullptr;
        },
        nullptr, nullptr);
    if (thread != nullptr) {
        g_thread_unref(thread);
        done->tryAcquire(1, int(exitTimeout.count()));
    }
}

void busReceived(GObject *, GAsyncResult *result, gpointer)
{
    GError *error = nullptr;
    GDBusConnection *const bus = g_bus_get_finish(result, &error);
    if (bus != nullptr) {
        // dconf uses the same connection. By default GLib ends the process when the bus
        // disconnects.
        g_dbus_connection_set_exit_on_close(bus, FALSE);
        g_object_unref(bus);
        return;
    }
    qCWarning(lcPlatformLog).noquote()
        << "MGConfItem: without a session bus settings can neither be stored nor followed:"
        << error->message;
    g_error_free(error);
}

} // namespace

DConfClient *dconfClient()
{
    static DConfClient *const client = [] {
        std::atexit(flushWrites);
        return dconf_client_new();
    }();
    return client;
}

void checkDconfOnce()
{
    static bool warned = false;
    const QAbstractEventDispatcher *const dispatcher = QAbstractEventDispatcher::instance();
    if (warned || dispatcher == nullptr) {
        return;
    }
    warned = true;
    if (dispatcher->inherits("QEventDispatcherGlib")) {
        g_bus_get(G_BUS_TYPE_SESSION, nullptr, busReceived, nullptr);
    } else {
        qCWarning(lcPlatformLog) << "MGConfItem: the event dispatcher is not GLib's: changes by "
                                    "other processes and failures to store will not be seen";
    }
}

// dconf_client_read() opens the database before it searches the queue of writes. A write that
// completes in between is in neither, and the read returns the previous value. This cannot happen
// again until this thread writes the key: if the first two reads differ, the third one is right.
GVariantPtr readDconf(const QByteArray &path)
{
    const auto readOnce = [&path] {
        return GVariantPtr(dconf_client_read(dconfClient(), path.constData()));
    };
    GVariantPtr first = readOnce();
    return dataOf(first.get()) == dataOf(readOnce().get()) ? std::move(first) : readOnce();
}

QByteArray dataOf(GVariant *value)
{
    if (value == nullptr) {
        return {};
    }
    return g_variant_get_type_string(value) + QByteArray(1, '\0')
        + QByteArray(static_cast<const char *>(g_variant_get_data(value)),
                     int(g_variant_get_size(value)));
}

void writeDconf(const QByteArray &path, GVariant *value)
{
    GError *error = nullptr;
    if (!dconf_client_write_fast(dconfClient(), path.constData(), value, &error)) {
        qCWarning(lcPlatformLog).noquote()
            << "MGConfItem:" << path << "cannot be written:" << error->message;
        g_error_free(error);
        return;
    }
    // dconf reports the change itself, unless it reads an outdated value, as described at
    // readDconf(), and that equals the new one. Items that know the value ignore this signal.
    const std::array<const char *, 2> changes = {"", nullptr};
    g_signal_emit_by_name(dconfClient(), "changed", path.constData(), changes.data(), "");
}

// dconf queues a message to the bus for each watch and unwatch, without a limit. Pages may create
// and destroy items faster than the bus takes messages, so a key stays watched for a moment.
void unwatchDconfLater(const QByteArray &path)
{
    static QSet<QByteArray> kept;
    const QAbstractEventDispatcher *const dispatcher = QAbstractEventDispatcher::instance();
    if (dispatcher == nullptr || kept.contains(path)) {
        dconf_client_unwatch_fast(dconfClient(), path.constData());
        return;
    }
    kept.insert(path);
    QTimer::singleShot(unwatchDelay, dispatcher, [path] {
        kept.remove(path);
        dconf_client_unwatch_fast(dconfClient(), path.constData());
    });
}
