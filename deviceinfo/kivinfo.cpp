// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "kivinfo.h"

#include <QDBusArgument>
#include <QDBusConnection>
#include <QDBusMessage>
#include <QDBusPendingCallWatcher>
#include <QDBusPendingReply>

namespace {

const QLatin1String daemonService("com.marlo.kivd");
const QLatin1String daemonPath("/com/marlo/kivd");
const QLatin1String daemonInterface("com.marlo.kivd");
const QLatin1String propertiesInterface("org.freedesktop.DBus.Properties");
const QLatin1String getMethod("Get");
const QLatin1String changedSignal("PropertiesChanged");
const QLatin1String changedSignature("a{sv}");

const QLatin1String idProperty("KIVID");
const QLatin1String readyProperty("Ready");
constexpr int ready = 1;

// What the daemon answers, or the default if it does not answer with just that type. The daemon
// sends bare values: a variant, which other services would send, is refused as any other type is.
template<typename Value> Value answer(const QDBusPendingCall &call)
{
    const QDBusPendingReply<Value> reply = call;
    // An error first: its message would pass for a text.
    return reply.isError() ? Value() : reply.value();
}

QVariantMap changedProperties(const QDBusMessage &message)
{
    const QVariant changed = message.arguments().value(1);
    // Taking a map out of anything else is no failure that QtDBus reports: it crashes.
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

    Asks the cover daemon when it is created, and follows its \c PropertiesChanged signal from then
    on, also when the daemon starts only later. (A signal that a daemon sends in the very moment of
    its start may be missed.) Without the daemon, or if it answers with an error, the properties
    keep their defaults; nothing is logged.

    The daemon is the service \c com.marlo.kivd on the system bus. It is asked with the method
    \c Get of \c org.freedesktop.DBus.Properties at the path \c /com/marlo/kivd, for properties of
    the interface \c com.marlo.kivd. Its answers have to be bare values, a string and a 32-bit
    integer: a value of any other type, wrapped in a D-Bus variant too, counts as an error.

    \qml
    Label {
        text: cover.kivReady ? cover.kivId || "No cover" : "Not ready"

        KivInfo { id: cover }
    }
    \endqml

    \image gallery-cover.png The gallery's page of this type

    \section1 What may surprise
    \section2 Only values of the exact type count
    The daemon answers with a bare string and a bare 32-bit integer. Any other type, a D-Bus variant
    too, counts as an error, and the property has its default until the daemon's next signal. Only
    the number 1 means ready.

    \section2 A late answer wins
    An answer to the first question that arrives after a change signal replaces the value of the
    signal. The next signal corrects it. A property that a signal merely invalidates keeps its
    value. The signal counts for whatever interface it names: the daemon has only one.
*/

KivInfo::KivInfo(QObject *parent) : QObject(parent)
{
    // Plain messages: an interface object would wait for the daemon to describe itself.
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

    Whether the daemon is ready: its property \c Ready is 1. False until it has answered, and
    without a daemon.
*/

/*!
    \qmlsignal KivInfo::kivIdChanged()

    Emitted after \l kivId has changed; before kivReadyChanged() if both change at once.
*/

/*!
    \qmlsignal KivInfo::kivReadyChanged()

    Emitted after \l kivReady has changed.
*/

// A reply overwrites the value of a signal that came before it. Each was right when it was sent, and
// the next signal corrects the value.

void KivInfo::slotIdFinished(QDBusPendingCallWatcher *watcher)
{
    watcher->deleteLater();
    setKivId(answer<QString>(*watcher));
}

void KivInfo::slotReadyFinished(QDBusPendingCallWatcher *watcher)
{
    watcher->deleteLater();
    setKivReady(answer<int>(*watcher) == ready);
}

void KivInfo::propertiesChanged(const QDBusMessage &message)
{
    const QVariantMap changed = changedProperties(message);
    const auto id = changed.constFind(idProperty);
    if (id != changed.constEnd()) {
        setKivId(id->toString());
    }
    const auto readiness = changed.constFind(readyProperty);
    if (readiness != changed.constEnd()) {
        // As the widest integer: a number that is too large for a smaller one would wrap around.
        setKivReady(readiness->toLongLong() == ready);
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
