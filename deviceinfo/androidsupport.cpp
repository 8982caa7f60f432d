// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "androidsupport.h"

#include "files/literals.h"

#include <QFile>

namespace {

constexpr QLatin1String runtimeDaemon = "/usr/sbin/apkd"_L1;

} // namespace

/*!
    \qmltype AndroidSupport
    \inqmlmodule com.marlo.settings.system
    \brief Shows whether the support for Android applications is installed.

    \qml
    Label {
        text: "Android folders are shown"
        visible: android.dataDirectoriesVisible

        AndroidSupport { id: android }
    }
    \endqml

    \image gallery-android.png The gallery's page for this type
*/

/*!
    \qmlproperty bool AndroidSupport::dataDirectoriesVisible
    \readonly

    Whether pages should show the data directories of Android applications: true exactly when the
    daemon of the Android support, \c /usr/sbin/apkd, exists. Every read checks it. There is no
    change signal, so a binding keeps the first value: read the property in a function instead.
*/
bool AndroidSupport::dataDirectoriesVisible() const
{
    return QFile::exists(runtimeDaemon);
}
