// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "locationsettings.h"

#include "mgconfitem.h"

#include <QtDebug>

namespace {

const QLatin1String gpsEnabledKey("/settings/location/gps_enabled");
const QLatin1String mlsEnabledKey("/settings/location/mls_enabled");
const QLatin1String mlsOnlineStateKey("/settings/location/mls_online_state");
const QLatin1String hereStateKey("/settings/location/here_state");

bool isState(int number)
{
    return number >= LocationSettings::OnlineAGpsNotAgreed
        && number <= LocationSettings::OnlineAGpsEnabled;
}

bool toSwitch(const QVariant &stored)
{
    return stored.toBool();
}

// Anybody may write anything to the key: what is no state counts as never agreed to. Other types
// of numbers are none either, as large ones would wrap around.
LocationSettings::OnlineAGpsState toState(const QVariant &stored)
{
    const int number = stored.userType() == QMetaType::Int ? stored.toInt() : -1;
    return isState(number) ? LocationSettings::OnlineAGpsState(number)
                           : LocationSettings::OnlineAGpsNotAgreed;
}

void store(QLatin1String key, LocationSettings::OnlineAGpsState state)
{
    if (isState(state)) {
        MGConfItem(key).set(int(state));
    } else {
        qWarning("LocationSettings: %d is no state of an online service", int(state));
    }
}

} // namespace

LocationSettings::LocationSettings(QObject *parent) : QObject(parent)
{
    follow(gpsEnabledKey, &LocationSettings::m_gpsEnabled, toSwitch,
           &LocationSettings::gpsEnabledChanged);
    follow(mlsEnabledKey, &LocationSettings::m_mlsEnabled, toSwitch,
           &LocationSettings::mlsEnabledChanged);
    follow(mlsOnlineStateKey, &LocationSettings::m_mlsOnlineState, toState,
           &LocationSettings::mlsOnlineStateChanged);
    follow(hereStateKey, &LocationSettings::m_hereState, toState,
           &LocationSettings::hereStateChanged);
}

// The setters only store: what this object holds is what dconf says, whoever wrote it.

void LocationSettings::setGpsEnabled(bool enabled)
{
    if (m_gpsEnabled != enabled) {
        MGConfItem(gpsEnabledKey).set(enabled);
    }
}

void LocationSettings::setMlsEnabled(bool enabled)
{
    if (m_mlsEnabled != enabled) {
        MGConfItem(mlsEnabledKey).set(enabled);
    }
}

void LocationSettings::setMlsOnlineState(OnlineAGpsState state)
{
    if (m_mlsOnlineState != state) {
        store(mlsOnlineStateKey, state);
    }
}

void LocationSettings::setHereState(OnlineAGpsState state)
{
    if (m_hereState != state) {
        store(hereStateKey, state);
    }
}

template<typename Value>
void LocationSettings::follow(const QString &key, Value LocationSettings::*member,
                              Value (*fromStored)(const QVariant &),
                              void (LocationSettings::*changed)())
{
    auto *item = new MGConfItem(key, this);
    connect(item, &MGConfItem::valueChanged, this, [=] {
        const Value value = fromStored(item->value());
        if (this->*member != value) {
            this->*member = value;
            Q_EMIT(this->*changed)();
        }
    });
    this->*member = fromStored(item->value());
}
