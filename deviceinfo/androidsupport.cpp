// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "androidsupport.h"

#include <QFile>

namespace {

const QLatin1String runtimeDaemon("/usr/sbin/apkd");

} // namespace

/*!
    \qmltype AndroidSupport
    \inqmlmodule com.marlo.settings.system
    \brief Says whether the support for Android applications is installed.

    \qml
    Label {
        text: "Android folders are shown"
        visible: android.dataDirectoriesVisible

        AndroidSupport { id: android }
    }
    \endqml

    \image gallery-android.png The gallery's page of this type

    \section1 What may surprise
    \section2 A binding does not notice the installation
    \l dataDirectoriesVisible is checked on every read and has no change signal, so a binding keeps
    the first value. Read it in a function to get the current one. Packages are not installed while
    a page is open, and watching for them would cost more than it gives.
*/

AndroidSupport::AndroidSupport(QObject *parent) : QObject(parent)
{
}

/*!
    \qmlproperty bool AndroidSupport::dataDirectoriesVisible
    \readonly

    Whether the data directories of Android applications are to be shown: true exactly when there
    is a \c /usr/sbin/apkd, the daemon of the Android support. Looked up on every read. A binding
    does not follow: an installation or removal shows when the property is read again.
*/
bool AndroidSupport::dataDirectoriesVisible() const
{
    return QFile::exists(runtimeDaemon);
}
