// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef LOCATIONSETTINGS_H
#define LOCATIONSETTINGS_H

#include <QObject>

class MGConfItem;
class QVariant;

// The switches of the device's location services: the satellite receiver (GPS), the MLS network
// positioning with its online assistance, and the HERE positioning service. They are stored in
// dconf, so that every process sees the same switches.
class LocationSettings : public QObject
{
    Q_OBJECT
    Q_PROPERTY(bool gpsEnabled READ gpsEnabled WRITE setGpsEnabled NOTIFY gpsEnabledChanged)
    Q_PROPERTY(bool mlsEnabled READ mlsEnabled WRITE setMlsEnabled NOTIFY mlsEnabledChanged)
    Q_PROPERTY(OnlineAGpsState mlsOnlineState READ mlsOnlineState WRITE setMlsOnlineState NOTIFY
                   mlsOnlineStateChanged)
    Q_PROPERTY(OnlineAGpsState hereState READ hereState WRITE setHereState NOTIFY hereStateChanged)

public:
    // The numbers are stored. The type is fixed because QML may write any number.
    enum OnlineAGpsState : int {
        OnlineAGpsNotAgreed = 0, // the user has not agreed to the terms of the service
        OnlineAGpsDisabled = 1,
        OnlineAGpsEnabled = 2,
    };
    Q_ENUM(OnlineAGpsState)

    explicit LocationSettings(QObject *parent = nullptr);

    // Return the stored values, even before the change signal is emitted.
    bool gpsEnabled() const;
    bool mlsEnabled() const;
    OnlineAGpsState mlsOnlineState() const;
    OnlineAGpsState hereState() const;

    // Emit the change signal before they return. A number that is not a state is refused with
    // a warning.
    void setGpsEnabled(bool enabled);
    void setMlsEnabled(bool enabled);
    void setMlsOnlineState(OnlineAGpsState state);
    void setHereState(OnlineAGpsState state);

Q_SIGNALS:
    void gpsEnabledChanged();
    void mlsEnabledChanged();
    void mlsOnlineStateChanged();
    void hereStateChanged();

private:
    template<typename Value>
    MGConfItem *follow(const QString &key, Value (*fromStored)(const QVariant &),
                       void (LocationSettings::*changed)());

    MGConfItem *const m_gpsEnabled;
    MGConfItem *const m_mlsEnabled;
    MGConfItem *const m_mlsOnlineState;
    MGConfItem *const m_hereState;
};

#endif
