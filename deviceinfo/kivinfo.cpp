// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "kivinfo.h"

#include "files/literals.h"

#include <QDBusArgument>
#include <QDBusConnection>
#include <QDBusMessage>
#include <QDBusPendingCallWatcher>
#include <QDBusPendingReply>
#include <QPointer>

namespace {

constexpr QLatin1String daemonService = "com.marlo.kivd"_L1;
constexpr QLatin1String daemonPath = "/com/marlo/kivd"_L1;
constexpr QLatin1String daemonInterface = "com.marlo.kivd"_L1;
constexpr QLatin1String propertiesInterface = "org.freedesktop.DBus.Properties"_L1;
constexpr QLatin1String getMethod = "Get"_L1;
constexpr QLatin1String changedSignal = "PropertiesChanged"_L1;
constexpr QLatin1String changedSignature = "a{sv}"_L1;

constexpr QLatin1String idProperty = "KIVID"_L1;
constexpr QLatin1String readyProperty = "Ready"_L1;
constexpr int ready = 1;

// The value of a reply, or the default if the reply has another type, such as a variant.
template<typename Value> Value valueOf(const QDBusPendingCall &call)
{
    const QDBusPendingReply<Value> reply = call;
    // For an error, value() would return the error message.
    return reply.isError() ? Value() : reply.value();
}

QVariantMap changedProperties(const QDBusMessage &message)
{
    const QVariant changed = message.arguments().value(1);
    // QtDBus crashes when it reads a map from an argument of another type.
    if (changed.userType() == qMetaTypeId<QDBusArgument>()
        && changed.value<QDBusArgument>().currentSignature() != changedSignature) {
        return {};
    }
    return qdbus_cast<QVariantMap>(changed);
}

} // namespace

/*!
    \qmltype KivInfo
    \inqmlmodule com.marlo.settings.system
    \brief Identifies the smart back cover that is attached to the device.

    When the object is created, it asks the cover daemon for both properties. It then follows the
    daemon's \c PropertiesChanged signal, even if the daemon starts later. It may miss a signal that
    a daemon sends at the moment of its start. Without the daemon, or after an error, the properties
    have their defaults. Nothing is logged.

    The daemon is the service \c com.marlo.kivd on the system bus. The object calls the method \c
    Get of \c org.freedesktop.DBus.Properties at the path \c /com/marlo/kivd, for properties of the
    interface \c com.marlo.kivd.

    \qml
    Label {
        text: cover.kivReady ? cover.kivId || "No cover" : "Not ready"

        KivInfo { id: cover }
    }
    \endqml

    \image gallery-cover.png The gallery's page for this type

    \section1 What may surprise
    \section2 Only values of the exact type count
    The daemon replies with a bare string and a bare 32-bit integer. Any other type, even a D-Bus
    variant, counts as an error. Only the number 1 means ready.

    \section2 A late reply wins
    If a reply to the initial request arrives after a change signal, it replaces the value of the
    signal. The next signal corrects it. A property that a signal only invalidates keeps its value.
    The interface that a signal names does not matter: the daemon has only one.
*/

KivInfo::KivInfo(QObject *parent) : QObject(parent)
{
    // Not QDBusInterface, which would wait for the daemon.
    connect(get(idProperty), &QDBusPendingCallWatcher::finished, this, &KivInfo::slotIdFinished);
    connect(get(readyProperty), &QDBusPendingCallWatcher::finished, this,
            &KivInfo::slotReadyFinished);
    QDBusConnection::systemBus().connect(daemonService, daemonPath, propertiesInterface,
                                         changedSignal, this,
                                         SLOT(propertiesChanged(QDBusMessage)));
}

/*!
    \qmlproperty string KivInfo::kivId
    \readonly

    The identifier of the attached cover, the daemon's property \c KIVID. Empty if none is attached.
*/

/*!
    \qmlproperty bool KivInfo::kivReady
    \readonly

    Whether the daemon is ready: its property \c Ready is 1.
*/

/*!
    \qmlsignal KivInfo::kivIdChanged()
    \qmlsignal KivInfo::kivReadyChanged()

    Emitted after the property has changed, kivIdChanged() first if both have changed.
*/

void KivInfo::slotIdFinished(QDBusPendingCallWatcher *watcher)
{
    watcher->deleteLater();
    setKivId(valueOf<QString>(*watcher));
}

void KivInfo::slotReadyFinished(QDBusPendingCallWatcher *watcher)
{
    watcher->deleteLater();
    m_latestReady = valueOf<int>(*watcher) == ready;
    setKivReady(m_latestReady);
}

void KivInfo::propertiesChanged(const QDBusMessage &message)
{
    const QVariantMap changed = changedProperties(message);
    const auto id = changed.constFind(idProperty);
    const auto readiness = changed.constFind(readyProperty);
    if (readiness != changed.constEnd()) {
        // A number that is too large for an int would wrap around.
        m_latestReady = readiness->toLongLong() == ready;
    }
    // A handler of the change may delete this object, or run an event loop in which a newer signal
    // arrives.
    const QPointer<KivInfo> self(this);
    if (id != changed.constEnd()) {
        setKivId(id->toString());
    }
    if (self != nullptr) {
        setKivReady(m_latestReady);
    }
}

QDBusPendingCallWatcher *KivInfo::get(const QString &property)
{
    QDBusMessage call =
        QDBusMessage::createMethodCall(daemonService, daemonPath, propertiesInterface, getMethod);
    call.setArguments({daemonInterface, property});
    return new QDBusPendingCallWatcher(QDBusConnection::systemBus().asyncCall(call), this);
}

void KivInfo::setKivId(const QString &kivId)
{
    if (m_kivId != kivId) {
        m_kivId = kivId;
        Q_EMIT kivIdChanged();
    }
}

void KivInfo::setKivReady(bool kivReady)
{
    if (m_kivReady != kivReady) {
        m_kivReady = kivReady;
        Q_EMIT kivReadyChanged();
    }
}
