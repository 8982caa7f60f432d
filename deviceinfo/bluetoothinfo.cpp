// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "bluetoothinfo.h"

#include "files/literals.h"
#include "files/regularfile.h"

#include <QtDebug>

namespace {

constexpr QLatin1String addressFile = "/var/lib/bluetooth/board-address"_L1;

} // namespace

/*!
    \qmltype BluetoothInfo
    \inqmlmodule com.marlo.settings.system
    \brief Provides the address of the device's Bluetooth adapter.

    \qml
    Label {
        text: bluetooth.adapterAddress || "No Bluetooth"

        BluetoothInfo { id: bluetooth }
    }
    \endqml

    \image gallery-bluetooth.png The gallery's page for this type
*/

BluetoothInfo::BluetoothInfo(QObject *parent) : QObject(parent)
{
    initAdapterAddress();
}

/*!
    \qmlproperty string BluetoothInfo::adapterAddress
    \readonly

    The address of the Bluetooth adapter in lower case, such as \c{00:1a:7d:da:71:13}. It is the
    first line of \c /var/lib/bluetooth/board-address, which is not validated. The file is read
    once, when the object is created, because the address does not change. Empty, with a warning, if
    the file cannot be read or the line is larger than 16 MiB.
*/

void BluetoothInfo::initAdapterAddress()
{
    const RegularFile file = readFirstLine(addressFile, maximumTextSize);
    if (file.state != RegularFile::State::Read) {
        qWarning() << "Unable to open file:" << QString(addressFile);
        return;
    }
    m_adapterAddress = QString::fromLatin1(file.content).toLower().trimmed();
}
