// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef LOCATIONSWITCHES_H
#define LOCATIONSWITCHES_H

#include "locationsettings.h"
#include "mgconfitem.h"
#include "texts.h"

#include <QStringList>
#include <QVariant>

// The four location switches, in the order in which a Switches lists their values.
const QStringList switchNames = {"gps"_s, "mls"_s, "mls online"_s, "here"_s};
const QString gpsKey = "/settings/location/gps_enabled"_s;
const QString mlsKey = "/settings/location/mls_enabled"_s;
const QString mlsOnlineKey = "/settings/location/mls_online_state"_s;
const QString hereKey = "/settings/location/here_state"_s;
const QStringList switchKeys = {gpsKey, mlsKey, mlsOnlineKey, hereKey};

using Switches = QList<int>;
using State = LocationSettings::OnlineAGpsState;

inline Switches switchesOf(const LocationSettings &settings)
{
    return {settings.gpsEnabled(), settings.mlsEnabled(), settings.mlsOnlineState(),
            settings.hereState()};
}

inline void setSwitches(LocationSettings *settings, const Switches &values)
{
    settings->setGpsEnabled(values[0] != 0);
    settings->setMlsEnabled(values[1] != 0);
    settings->setMlsOnlineState(State(values[2]));
    settings->setHereState(State(values[3]));
}

inline QVariant stored(const QString &key)
{
    return MGConfItem(key).value();
}

inline void store(const QString &key, const QVariant &value)
{
    MGConfItem(key).set(value);
}

// Appends the name and the new value of each switch that changes, such as "mls online 2".
inline void recordChanges(const LocationSettings *settings, QStringList *changes)
{
    using Settings = LocationSettings;
    const auto note = [=](int index) {
        return [=] {
            changes->append(switchNames[index] + QLatin1Char(' ')
                            + QString::number(switchesOf(*settings)[index]));
        };
    };
    QObject::connect(settings, &Settings::gpsEnabledChanged, settings, note(0));
    QObject::connect(settings, &Settings::mlsEnabledChanged, settings, note(1));
    QObject::connect(settings, &Settings::mlsOnlineStateChanged, settings, note(2));
    QObject::connect(settings, &Settings::hereStateChanged, settings, note(3));
}

#endif
