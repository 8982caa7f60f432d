// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Layouts 1.15
import com.marlo.settings.system 1.0
import gallery.stage 1.0
import ".."

/*
    A memory card that is formatted, mounted and unmounted. The card is a name alone: the disk
    service and the program that formats are played.
*/
GalleryPage {
    id: page

    readonly property string cardName: "gallerycard1"
    readonly property string cardPath: "/dev/" + cardName
    // The error of the disk service that ended the last operation.
    property int error: noError
    readonly property int noError: -1

    title: qsTrId("gallery-card")
    ready: steps.count === 4 && !card.busy && fileSystem.type === "ext4"

    function demonstrate() {
        demonstration.enabled = true;
        demonstration.formatWhenIdle();
    }

    function start(operation) {
        error = noError;
        steps.clear();
        operation();
    }

    function statusText(status) {
        switch (status) {
        case MemoryCardFormatter.Unmounting: return qsTrId("gallery-card-unmounting");
        case MemoryCardFormatter.Formatting: return qsTrId("gallery-card-formatting");
        case MemoryCardFormatter.RemovingFiles: return qsTrId("gallery-card-removing-files");
        case MemoryCardFormatter.Mounting: return qsTrId("gallery-card-mounting");
        case MemoryCardFormatter.Probing: return qsTrId("gallery-card-probing");
        case MemoryCardFormatter.Error: return qsTrId("gallery-card-error");
        default: return qsTrId("gallery-card-idle");
        }
    }

    function errorText(error) {
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

    MemoryCardFormatter {
        id: card
        deviceName: page.cardName
        devicePath: page.cardPath
        onStatusChanged: steps.append({ status: status })
        onMountError: page.error = error
        onUnmountError: page.error = error
    }

    Connections {
        id: demonstration
        target: card
        enabled: false

        // The card may still be probed.
        function formatWhenIdle() {
            if (!card.busy) {
                enabled = false;
                page.start(() => card.format("ext4"));
            }
        }
        function onBusyChanged() {
            formatWhenIdle();
        }
    }

    // A path is probed when it is set, and not again after formatting: a formatter that is made
    // whenever the other has ended tells what is on the card then.
    Loader {
        id: fileSystem
        readonly property string type: item ? item.filesystemType : ""

        visible: false
        active: !card.busy
        sourceComponent: MemoryCardFormatter {
            devicePath: page.cardPath
        }
    }

    // The steps of what the user asked for last.
    ListModel {
        id: steps
    }

    Question {
        id: question
        property string type

        title: qsTrId("gallery-card-question")
        text: qsTrId("gallery-card-question-text")
        yes: qsTrId("gallery-card-erase")
        no: qsTrId("gallery-card-cancel")
        onAccepted: page.start(() => card.format(type))
    }

    Section {
        heading: qsTrId("gallery-card-state")

        Value {
            name: qsTrId("gallery-card-status")
            value: page.statusText(card.status)
        }
        Value {
            name: qsTrId("gallery-card-file-system")
            value: fileSystem.type || qsTrId("gallery-card-unknown")
        }
        Flow {
            Layout.fillWidth: true
            spacing: 8
            enabled: !card.busy

            Repeater {
                model: card.supportedFormatTypes
                Button {
                    text: qsTrId("gallery-card-format").arg(modelData)
                    onClicked: {
                        question.type = modelData;
                        question.open();
                    }
                }
            }
            Button {
                text: qsTrId("gallery-card-mount")
                onClicked: page.start(() => card.mount())
            }
            Button {
                text: qsTrId("gallery-card-unmount")
                onClicked: page.start(() => card.unmount())
            }
        }
    }

    Section {
        heading: qsTrId("gallery-card-steps")

        Repeater {
            model: steps
            Paragraph {
                text: (index + 1) + ". " + page.statusText(model.status)
            }
        }
        ProgressBar {
            Layout.fillWidth: true
            visible: card.busy
            indeterminate: visible
        }
        Paragraph {
            visible: page.error !== page.noError
            text: page.errorText(page.error)
            color: "#b00020"
        }
    }

    Section {
        heading: qsTrId("gallery-card-service")

        SwitchDelegate {
            Layout.fillWidth: true
            text: qsTrId("gallery-card-in-use")
            checked: Stage.diskServiceError === "DeviceBusy"
            onToggled: Stage.diskServiceError = checked ? "DeviceBusy" : ""
        }
        SwitchDelegate {
            Layout.fillWidth: true
            text: qsTrId("gallery-card-forbidden")
            checked: Stage.diskServiceError === "NotAuthorized"
            onToggled: Stage.diskServiceError = checked ? "NotAuthorized" : ""
        }
        Note {
            text: qsTrId("gallery-card-service-note")
        }
    }
}
