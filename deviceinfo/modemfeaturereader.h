// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef MODEMFEATUREREADER_H
#define MODEMFEATUREREADER_H

#include <QObject>

// The variant of the modem software on the device. The QML type is ModemFeatures.
class ModemFeatureReader : public QObject
{
    Q_OBJECT
    Q_PROPERTY(QString variant READ variant CONSTANT)

public:
    using QObject::QObject;

    QString variant() const;
};

#endif
