// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "modemfeaturereader.h"

#include "files/inifile.h"
#include "files/literals.h"

#include <QSettings>

namespace {

constexpr QLatin1String featuresFile = "/usr/share/modem-software/features.ini"_L1;
constexpr QLatin1String variantKey = "variant"_L1;

} // namespace

/*!
    \qmltype ModemFeatures
    \inqmlmodule com.marlo.settings.system
    \brief Provides the variant of the modem software on the device.

    \qml
    Label {
        text: modem.variant || "Standard"

        ModemFeatures { id: modem }
    }
    \endqml

    \image gallery-modem.png The gallery's page for this type
*/

/*!
    \qmlproperty string ModemFeatures::variant
    \readonly

    The key \c variant of \c /usr/share/modem-software/features.ini, before the first section or in
    the section \c General. Empty if there is no such file or key, if an unquoted comma makes the
    value a list, or if the file is larger than 1 MiB or mentions \c{@Variant(} or \c{@DateTime(}
    outside a comment.

    Every read of the property reads the file, unless its size and modification time are those of
    the last read: QSettings keeps a file until one of them changes. A file that is replaced by one
    of the same size and time keeps its old values until the process ends. There is no change
    signal, so a binding keeps the first value: read the property in a function instead.
*/
QString ModemFeatureReader::variant() const
{
    const IniFault fault = findIniFault(featuresFile);
    if (fault == IniFault::Unreadable || fault == IniFault::PackedValue) {
        return {};
    }
    const QSettings features(featuresFile, QSettings::IniFormat);
    return features.value(variantKey).toString();
}
