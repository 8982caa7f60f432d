// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DISKSERVICEERRORS_H
#define DISKSERVICEERRORS_H

#include <QStringList>

// The errors of the disk service, without "org.freedesktop.UDisks2.Error.".
inline QStringList diskServiceErrors()
{
    return {
        QStringLiteral("Failed"),
        QStringLiteral("Cancelled"),
        QStringLiteral("AlreadyCancelled"),
        QStringLiteral("NotAuthorized"),
        QStringLiteral("NotAuthorizedCanObtain"),
        QStringLiteral("NotAuthorizedDismissed"),
        QStringLiteral("AlreadyMounted"),
        QStringLiteral("NotMounted"),
        QStringLiteral("OptionNotPermitted"),
        QStringLiteral("MountedByOtherUser"),
        QStringLiteral("AlreadyUnmounting"),
        QStringLiteral("NotSupported"),
        QStringLiteral("Timedout"),
        QStringLiteral("WouldWakeup"),
        QStringLiteral("DeviceBusy"),
    };
}

#endif
