// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef BLUETOOTHINFO_H
#define BLUETOOTHINFO_H

#include <QObject>

// The address of the device's Bluetooth adapter, read once.
class BluetoothInfo : public QObject
{
    Q_OBJECT
    Q_PROPERTY(QString adapterAddress READ adapterAddress CONSTANT)

public:
    explicit BluetoothInfo(QObject *parent = nullptr);

    QString adapterAddress() const { return m_adapterAddress; }

private:
    void initAdapterAddress();

    QString m_adapterAddress;
};

#endif
