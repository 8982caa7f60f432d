// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQml 2.15
import com.marlo.settings.system 1.0

/*
    What a formatter does, and what went wrong, in words.
*/
QtObject {
    function status(status) {
        switch (status) {
        case MemoryCardFormatter.Unmounting:
            return qsTrId("gallery-card-unmounting");
        case MemoryCardFormatter.Formatting:
            return qsTrId("gallery-card-formatting");
        case MemoryCardFormatter.RemovingFiles:
            return qsTrId("gallery-card-removing-files");
        case MemoryCardFormatter.Mounting:
            return qsTrId("gallery-card-mounting");
        case MemoryCardFormatter.Probing:
            return qsTrId("gallery-card-probing");
        case MemoryCardFormatter.Error:
            return qsTrId("gallery-card-error");
        default:
            return qsTrId("gallery-card-idle");
        }
    }

    function error(error) {
        switch (error) {
        case MemoryCardFormatter.ErrorDeviceBusy:
            return qsTrId("gallery-card-device-busy");
        case MemoryCardFormatter.ErrorAlreadyMounted:
            return qsTrId("gallery-card-already-mounted");
        case MemoryCardFormatter.ErrorNotMounted:
            return qsTrId("gallery-card-not-mounted");
        case MemoryCardFormatter.ErrorMountedByOtherUser:
            return qsTrId("gallery-card-other-user");
        case MemoryCardFormatter.ErrorNotAuthorized:
        case MemoryCardFormatter.ErrorNotAuthorizedCanObtain:
        case MemoryCardFormatter.ErrorNotAuthorizedDismissed:
        case MemoryCardFormatter.ErrorOptionNotPermitted:
            return qsTrId("gallery-card-not-authorized");
        case MemoryCardFormatter.ErrorNotSupported:
            return qsTrId("gallery-card-not-supported");
        case MemoryCardFormatter.ErrorTimedout:
            return qsTrId("gallery-card-timed-out");
        default:
            return qsTrId("gallery-card-failed");
        }
    }
}
