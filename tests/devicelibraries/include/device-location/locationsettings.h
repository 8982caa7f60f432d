// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DEVICE_LOCATIONSETTINGS_H
#define DEVICE_LOCATIONSETTINGS_H

#include <QObject>
#include <QString>

// A device's LocationSettings, in the same style as the device's MGConfItem. Its enumeration values
// have their own names.
class LocationSettings : public QObject
{
    Q_OBJECT
    Q_PROPERTY(bool gpsEnabled READ gpsEnabled WRITE setGpsEnabled NOTIFY gpsEnabledChanged)
    Q_PROPERTY(bool mlsEnabled READ mlsEnabled WRITE setMlsEnabled NOTIFY mlsEnabledChanged)
    Q_PROPERTY(OnlineAGpsState mlsOnlineState READ mlsOnlineState WRITE setMlsOnlineState NOTIFY
                   mlsOnlineStateChanged)
    Q_PROPERTY(OnlineAGpsState hereState READ hereState WRITE setHereState NOTIFY hereStateChanged)
    Q_PROPERTY(QString device READ device CONSTANT)

public:
    enum OnlineAGpsState { AgreementNeeded, SwitchedOff, SwitchedOn };
    Q_ENUM(OnlineAGpsState)

    explicit LocationSettings(QObject *parent = nullptr);
    ~LocationSettings();

    bool gpsEnabled() const { return m_gpsEnabled; }
    bool mlsEnabled() const { return m_mlsEnabled; }
    OnlineAGpsState mlsOnlineState() const { return m_mlsOnlineState; }
    OnlineAGpsState hereState() const { return m_hereState; }
    QString device() const { return "device " + QString("with location settings"); }

public slots:
    void setGpsEnabled(bool enabled)
    {
        if (m_gpsEnabled != enabled) {
            m_gpsEnabled = enabled;
            emit gpsEnabledChanged();
        }
    }
    void setMlsEnabled(bool enabled)
    {
        if (m_mlsEnabled != enabled) {
            m_mlsEnabled = enabled;
            emit mlsEnabledChanged();
        }
    }
    void setMlsOnlineState(OnlineAGpsState state)
    {
        if (m_mlsOnlineState != state) {
            m_mlsOnlineState = state;
            emit mlsOnlineStateChanged();
        }
    }
    void setHereState(OnlineAGpsState state)
    {
        if (m_hereState != state) {
            m_hereState = state;
            emit hereStateChanged();
        }
    }

signals:
    void gpsEnabledChanged();
    void mlsEnabledChanged();
    void mlsOnlineStateChanged();
    void hereStateChanged();

private:
    char m_cache[4096];
    bool m_gpsEnabled = true;
    bool m_mlsEnabled = false;
    OnlineAGpsState m_mlsOnlineState = SwitchedOn;
    OnlineAGpsState m_hereState = AgreementNeeded;
};

#endif
