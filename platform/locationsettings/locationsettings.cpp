// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "locationsettings.h"

#include "files/literals.h"
#include "mgconfitem.h"

#include <QLoggingCategory>

namespace {

Q_LOGGING_CATEGORY(lcPlatformLog, "org.tarnwickos.settings.platform", QtWarningMsg)

constexpr QLatin1String gpsEnabledKey = "/settings/location/gps_enabled"_L1;
constexpr QLatin1String mlsEnabledKey = "/settings/location/mls_enabled"_L1;
constexpr QLatin1String mlsOnlineStateKey = "/settings/location/mls_online_state"_L1;
constexpr QLatin1String hereStateKey = "/settings/location/here_state"_L1;

bool isState(int number)
{
    return number >= LocationSettings::OnlineAGpsNotAgreed
        && number <= LocationSettings::OnlineAGpsEnabled;
}

bool toSwitch(const QVariant &stored)
{
    return stored.toBool();
}

// A value that is not a state counts as OnlineAGpsNotAgreed. So does a number of another type,
// because a large one would wrap around.
LocationSettings::OnlineAGpsState toState(const QVariant &stored)
{
    const int number = stored.userType() == QMetaType::Int ? stored.toInt() : -1;
    return isState(number) ? LocationSettings::OnlineAGpsState(number)
                           : LocationSettings::OnlineAGpsNotAgreed;
}

void store(MGConfItem *item, LocationSettings::OnlineAGpsState state)
{
    if (!isState(state)) {
        qCWarning(lcPlatformLog).nospace()
            << "LocationSettings: " << int(state) << " is not a state of an online service";
    } else if (toState(item->value()) != state) {
        item->set(int(state));
    }
}

void store(MGConfItem *item, bool enabled)
{
    if (toSwitch(item->value()) != enabled) {
        item->set(enabled);
    }
}

} // namespace

LocationSettings::LocationSettings(QObject *parent)
    : QObject(parent),
      m_gpsEnabled(follow(gpsEnabledKey, toSwitch, &LocationSettings::gpsEnabledChanged)),
      m_mlsEnabled(follow(mlsEnabledKey, toSwitch, &LocationSettings::mlsEnabledChanged)),
      m_mlsOnlineState(
          follow(mlsOnlineStateKey, toState, &LocationSettings::mlsOnlineStateChanged)),
      m_hereState(follow(hereStateKey, toState, &LocationSettings::hereStateChanged))
{
}

// The accessors use the stored value: another process may have changed it before this process is
// notified.

bool LocationSettings::gpsEnabled() const
{
    return toSwitch(m_gpsEnabled->value());
}

void LocationSettings::setGpsEnabled(bool enabled)
{
    store(m_gpsEnabled, enabled);
}

bool LocationSettings::mlsEnabled() const
{
    return toSwitch(m_mlsEnabled->value());
}

void LocationSettings::setMlsEnabled(bool enabled)
{
    store(m_mlsEnabled, enabled);
}

LocationSettings::OnlineAGpsState LocationSettings::mlsOnlineState() const
{
    return toState(m_mlsOnlineState->value());
}

void LocationSettings::setMlsOnlineState(OnlineAGpsState state)
{
    store(m_mlsOnlineState, state);
}

LocationSettings::OnlineAGpsState LocationSettings::hereState() const
{
    return toState(m_hereState->value());
}

void LocationSettings::setHereState(OnlineAGpsState state)
{
    store(m_hereState, state);
}

template<typename Value>
MGConfItem *LocationSettings::follow(const QString &key, Value (*fromStored)(const QVariant &),
                                     void (LocationSettings::*changed)())
{
    auto *const item = new MGConfItem(key, this);
    connect(item, &MGConfItem::valueChanged, this,
            [this, item, fromStored, changed, last = fromStored(item->value())]() mutable {
                const Value value = fromStored(item->value());
                if (last != value) {
                    last = value;
                    Q_EMIT(this->*changed)(); // the last step: a slot may delete this object
                }
            });
    return item;
}
