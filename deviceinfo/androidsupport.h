// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef ANDROIDSUPPORT_H
#define ANDROIDSUPPORT_H

#include <QObject>

// Whether the support for Android applications is installed.
class AndroidSupport : public QObject
{
    Q_OBJECT
    Q_PROPERTY(bool dataDirectoriesVisible READ dataDirectoriesVisible CONSTANT)

public:
    using QObject::QObject;

    bool dataDirectoriesVisible() const;
};

#endif
