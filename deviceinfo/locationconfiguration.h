// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef LOCATIONCONFIGURATION_H
#define LOCATIONCONFIGURATION_H

#include "locationsettings.h"

// The location switches of the platform, a set of them that the user saves and restores, and the
// texts that the user agrees to.
class LocationConfiguration : public LocationSettings
{
    Q_OBJECT
    Q_PROPERTY(QString hereAgreementText READ hereAgreementText CONSTANT)
    Q_PROPERTY(QString mlsOnlineAgreementText READ mlsOnlineAgreementText CONSTANT)
    Q_PROPERTY(bool customSettingsEnabled READ customSettingsEnabled WRITE setCustomSettingsEnabled
                   NOTIFY customSettingsEnabledChanged)

public:
    explicit LocationConfiguration(QObject *parent = nullptr);

    QString hereAgreementText() const;
    QString mlsOnlineAgreementText() const;
    bool customSettingsEnabled() const { return m_customSettingsEnabled; }
    void setCustomSettingsEnabled(bool isEnabled);

    Q_INVOKABLE void saveCustomSettings();
    Q_INVOKABLE void restoreCustomSettings();

Q_SIGNALS:
    void customSettingsEnabledChanged();

private:
    bool m_customSettingsEnabled;
};

#endif
