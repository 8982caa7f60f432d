// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "locationconfiguration.h"

#include "files/literals.h"
#include "files/regularfile.h"
#include "mgconfitem.h"

#include <QBuffer>
#include <QLocale>
#include <QPointer>
#include <QtDebug>

namespace {

constexpr QLatin1String customSettingsEnabledKey = "/settings/location/custom_settings_enabled"_L1;
constexpr QLatin1String customSettingsKey = "/settings/location/custom_settings"_L1;

constexpr QLatin1String gpsEntry = "gps/enabled"_L1;
constexpr QLatin1String mlsEntry = "mls/enabled"_L1;
constexpr QLatin1String mlsOnlineEntry = "mls/online_enabled"_L1;
constexpr QLatin1String hereEntry = "here/enabled"_L1;

// The platform's library may use other names for the states, but the numbers are always the same.
using State = LocationSettings::OnlineAGpsState;
constexpr auto unavailable = State(0);
constexpr auto disabled = State(1);
constexpr auto enabled = State(2);

constexpr QLatin1String mlsAgreement =
    "/usr/share/geoclue-provider-mlsdb/agreements/mls_consent_"_L1;
constexpr QLatin1String hereAgreement = "/usr/share/libherepositioning/agreements/here_consent_"_L1;
constexpr QLatin1String englishSuffix = "en_GB.txt"_L1;
constexpr QLatin1String suffix = ".txt"_L1;

State toState(const QVariant &saved)
{
    return saved.toBool() ? enabled : disabled;
}

QString agreementText(QLatin1String base)
{
    const QString locale = QLocale().name();
    QString path = base + locale + suffix;
    if (!fileExists(path)) {
        qWarning() << "No agreement found for" << locale << ", falling back to english";
        path = base + englishSuffix;
    }
    RegularFile file = readRegularFile(path, maximumTextSize);
    if (file.state != RegularFile::State::Read) {
        //% "The terms of this service could not be found."
        return qtTrId("settings_location-la-no_agreement_text_found");
    }
    QBuffer text(&file.content);
    text.open(QIODevice::ReadOnly | QIODevice::Text);
    return textUpToNul(text.readAll());
}

} // namespace

/*!
    \qmltype LocationConfiguration
    \inqmlmodule com.marlo.settings.system
    \brief Switches the location services, and saves and restores the user's own choice.

    The switches are those of the platform's location settings: \l gpsEnabled for satellites;
    \l mlsEnabled for MLS, a service that finds the position from nearby radio networks, and
    \l mlsOnlineState for its online assistance; \l hereState for HERE, another positioning service.
    A device's own library implements them. Without such a library the module stores them in dconf,
    and every process sees the same values.

    A page saves the switches when the user changes one, and restores them when the user returns to
    their own choice:

    \qml
    Column {
        LocationConfiguration { id: location }

        Switch {
            text: "My own choice"
            checked: location.customSettingsEnabled
            onToggled: {
                location.customSettingsEnabled = checked
                if (checked) {
                    location.restoreCustomSettings()
                }
            }
        }
        Switch {
            text: "GPS"
            enabled: location.customSettingsEnabled
            checked: location.gpsEnabled
            onToggled: {
                location.gpsEnabled = checked
                location.saveCustomSettings()
            }
        }
    }
    \endqml

    \image gallery-location.png The gallery's page for this type

    \section1 What may surprise
    \section2 Services that were not saved are switched off
    restoreCustomSettings() switches off every service that the saved settings do not contain, even
    if nothing was ever saved: location services are on only if the user wanted them. If the user
    has not agreed to a service, its state does not change: only the user can agree.

    \section2 customSettingsEnabled does not change by itself
    It is read when the object is created and does not follow the dconf key. Saving and restoring do
    not change it, and changing it neither saves nor restores.

    \section2 The English agreement does not replace one that cannot be opened
    The English text would not be the one that this user agrees to.

    \section2 The agreement texts have no change signal
    Every read of a property reads its file, but a binding keeps the first text. Read the properties
    in a function instead.
*/

LocationConfiguration::LocationConfiguration(QObject *parent)
    : LocationSettings(parent),
      m_customSettingsEnabled(MGConfItem(customSettingsEnabledKey).value().toBool())
{
}

/*!
    \qmlproperty string LocationConfiguration::hereAgreementText
    \readonly
    \qmlproperty string LocationConfiguration::mlsOnlineAgreementText
    \readonly

    The texts that the user agrees to before HERE positioning and the online assistance of MLS are
    used, from \c{/usr/share/libherepositioning/agreements/here_consent_<locale>.txt} and
    \c{/usr/share/geoclue-provider-mlsdb/agreements/mls_consent_<locale>.txt}, where \c{<locale>} is
    the default locale, such as \c fi_FI. Without the file the text of \c en_GB is used and a
    warning is logged. If the file cannot be read or is larger than 16 MiB, the text is the
    translation of \c settings_location-la-no_agreement_text_found in the catalog
    \c settings-system. The file \c settings-system_eng_en.ts, which is installed next to this
    reference, is a template of that catalog.
*/
QString LocationConfiguration::hereAgreementText() const
{
    return agreementText(hereAgreement);
}

QString LocationConfiguration::mlsOnlineAgreementText() const
{
    return agreementText(mlsAgreement);
}

/*!
    \qmlproperty bool LocationConfiguration::customSettingsEnabled

    Whether the user has set each switch individually. Stored in
    \c /settings/location/custom_settings_enabled (dconf, bool). False by default.
*/
void LocationConfiguration::setCustomSettingsEnabled(bool isEnabled)
{
    if (m_customSettingsEnabled == isEnabled) {
        return;
    }
    // Other items on the key announce the change, and their handlers may set the property or delete
    // this object.
    const QPointer<LocationConfiguration> self(this);
    MGConfItem(customSettingsEnabledKey).set(isEnabled);
    if (self != nullptr && m_customSettingsEnabled != isEnabled) {
        m_customSettingsEnabled = isEnabled;
        Q_EMIT customSettingsEnabledChanged();
    }
}

/*!
    \qmlmethod void LocationConfiguration::saveCustomSettings()

    Stores the current values of the switches in \c /settings/location/custom_settings (dconf,
    dictionary of \c gps/enabled, \c mls/enabled, \c mls/online_enabled and \c here/enabled, all
    bool).
*/
void LocationConfiguration::saveCustomSettings()
{
    const QVariantMap settings = {
        {gpsEntry, gpsEnabled()},
        {mlsEntry, mlsEnabled()},
        {mlsOnlineEntry, mlsOnlineState() == enabled},
        {hereEntry, hereState() == enabled},
    };
    MGConfItem(customSettingsKey).set(settings);
}

/*!
    \qmlmethod void LocationConfiguration::restoreCustomSettings()

    Sets the switches to what saveCustomSettings() stored last, in this or any other process.
*/
void LocationConfiguration::restoreCustomSettings()
{
    const QVariantMap settings = MGConfItem(customSettingsKey).value().toMap();
    // A handler of a change may delete this object.
    const QPointer<LocationConfiguration> self(this);
    setGpsEnabled(settings.value(gpsEntry).toBool());
    if (self != nullptr) {
        setMlsEnabled(settings.value(mlsEntry).toBool());
    }
    // Read only now, because setting the other switches may have changed the states.
    if (self != nullptr && mlsOnlineState() != unavailable) {
        setMlsOnlineState(toState(settings.value(mlsOnlineEntry)));
    }
    if (self != nullptr && hereState() != unavailable) {
        setHereState(toState(settings.value(hereEntry)));
    }
}

/*!
    \qmlproperty bool LocationConfiguration::gpsEnabled
    \qmlproperty bool LocationConfiguration::mlsEnabled

    Whether the satellite receiver and the MLS network positioning are switched on. The module
    stores them in \c /settings/location/gps_enabled and \c /settings/location/mls_enabled (dconf,
    bool). False by default.
*/

/*!
    \qmlproperty enumeration LocationConfiguration::mlsOnlineState
    \qmlproperty enumeration LocationConfiguration::hereState

    The states of the online assistance of MLS and of the HERE positioning service:

    \value LocationConfiguration.OnlineAGpsNotAgreed The user has not agreed to the terms (0).
    \value LocationConfiguration.OnlineAGpsDisabled The user has agreed; it is switched off (1).
    \value LocationConfiguration.OnlineAGpsEnabled It is switched on (2).

    A device's own library may use other names for the states. Pages that must run on every device
    use the numbers.

    The module stores the states in \c /settings/location/mls_online_state and
    \c /settings/location/here_state (dconf, 32-bit integer). Any other value counts as 0. Setting
    another number changes nothing and gives a warning.
*/

/*!
    \qmlsignal LocationConfiguration::gpsEnabledChanged()
    \qmlsignal LocationConfiguration::mlsEnabledChanged()
    \qmlsignal LocationConfiguration::mlsOnlineStateChanged()
    \qmlsignal LocationConfiguration::hereStateChanged()
    \qmlsignal LocationConfiguration::customSettingsEnabledChanged()

    Emitted after the property has changed; all but customSettingsEnabledChanged() also after a
    change in another process.
*/
