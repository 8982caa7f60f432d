// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Layouts 1.15
import com.marlo.settings.system 1.0
import "controls"

/*
    A memory card that is formatted, emptied, mounted and unmounted.
*/
GalleryPage {
    id: page

    // The kernel's name of the card. Empty without a card.
    property string cardName
    readonly property bool running: operation.active
    property string fileSystem
    property string note
    property string problem
    // How many steps the operation has when it succeeds.
    property int stepCount

    // A formatter serves one operation. The operation starts when the path has been set, so the
    // formatter probes the card afterwards, and its status always changes to Idle or Error.
    function run(count, start) {
        note = "";
        problem = "";
        steps.clear();
        stepCount = count + 1;
        operation.active = true;
        operation.item.devicePathChanged.connect(() => start(operation.item));
        operation.item.devicePath = "/dev/" + cardName;
    }

    function follow(card) {
        if (card.status === MemoryCardFormatter.Idle) {
            fileSystem = card.filesystemType;
        } else if (card.status === MemoryCardFormatter.Error) {
            if (step() !== MemoryCardFormatter.Idle) {
                fileSystem = "";
            }
            problem = problem || causeText(step());
        } else {
            steps.append({ status: card.status });
            return;
        }
        operation.active = false;
    }

    // The latest step. Idle until the disk service has answered the first request.
    function step() {
        return steps.count > 0 ? steps.get(steps.count - 1).status : MemoryCardFormatter.Idle;
    }

    function stepText(step) {
        switch (step) {
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
        default:
            return qsTrId("gallery-card-waiting");
        }
    }

    // For failures without a code: the step that was running has failed.
    function causeText(step) {
        switch (step) {
        case MemoryCardFormatter.Formatting:
            return qsTrId("gallery-card-formatting-failed");
        case MemoryCardFormatter.RemovingFiles:
            return qsTrId("gallery-card-removing-failed");
        case MemoryCardFormatter.Mounting:
            return qsTrId("gallery-card-mounting-failed");
        case MemoryCardFormatter.Probing:
            return qsTrId("gallery-card-probing-failed");
        default:
            return qsTrId("gallery-card-no-answer");
        }
    }

    function fail(error) {
        switch (error) {
        // These two do not stop the operation.
        case MemoryCardFormatter.ErrorAlreadyMounted:
            note = qsTrId("gallery-card-already-mounted");
            break;
        case MemoryCardFormatter.ErrorAlreadyUnmounting:
            note = qsTrId("gallery-card-already-unmounting");
            break;
        case MemoryCardFormatter.ErrorDeviceBusy:
            problem = qsTrId("gallery-card-device-busy");
            break;
        case MemoryCardFormatter.ErrorNotMounted:
            problem = qsTrId("gallery-card-not-mounted");
            break;
        case MemoryCardFormatter.ErrorMountedByOtherUser:
            problem = qsTrId("gallery-card-other-user");
            break;
        case MemoryCardFormatter.ErrorNotAuthorized:
        case MemoryCardFormatter.ErrorNotAuthorizedCanObtain:
        case MemoryCardFormatter.ErrorNotAuthorizedDismissed:
        case MemoryCardFormatter.ErrorOptionNotPermitted:
            problem = qsTrId("gallery-card-not-authorized");
            break;
        case MemoryCardFormatter.ErrorNotSupported:
            problem = qsTrId("gallery-card-not-supported");
            break;
        case MemoryCardFormatter.ErrorTimedout:
            problem = qsTrId("gallery-card-timed-out");
            break;
        default:
            problem = qsTrId("gallery-card-failed");
        }
    }

    // A new card is only probed.
    onCardNameChanged: {
        operation.active = false;
        fileSystem = "";
        if (cardName) {
            run(0, card => {});
        }
    }

    Loader {
        id: operation
        visible: false
        active: false
        sourceComponent: MemoryCardFormatter {
            deviceName: page.cardName
            onStatusChanged: page.follow(this)
            onMountError: page.fail(error)
            onUnmountError: page.fail(error)
        }
    }

    // Only lists the supported types, because it has no path.
    MemoryCardFormatter {
        id: types
    }

    // The steps of the latest operation.
    ListModel {
        id: steps
    }

    Question {
        id: formatQuestion
        property string type

        title: qsTrId("gallery-card-question")
        text: qsTrId("gallery-card-question-text").arg(type)
        yes: qsTrId("gallery-card-erase")
        no: qsTrId("gallery-card-cancel")
        onAccepted: page.run(3, card => card.format(type))
    }

    Question {
        id: emptyQuestion
        title: qsTrId("gallery-card-empty-question")
        text: qsTrId("gallery-card-empty-question-text")
        yes: qsTrId("gallery-card-remove")
        no: qsTrId("gallery-card-cancel")
        onAccepted: page.run(2, card => card.removeAllFiles())
    }

    Section {
        heading: qsTrId("gallery-card-state")

        Note {
            visible: page.cardName === ""
            text: qsTrId("gallery-card-none")
        }
        Value {
            visible: page.cardName !== ""
            name: qsTrId("gallery-card-status")
            value: page.running ? stepText(step())
                 : page.problem ? qsTrId("gallery-card-error") : qsTrId("gallery-card-idle")
        }
        Value {
            visible: page.cardName !== ""
            name: qsTrId("gallery-card-file-system")
            value: page.fileSystem || qsTrId("gallery-unknown")
        }
        Flow {
            Layout.fillWidth: true
            spacing: 8
            enabled: page.cardName !== "" && !page.running

            Button {
                text: qsTrId("gallery-card-mount")
                onClicked: page.run(1, card => card.mount())
            }
            Button {
                text: qsTrId("gallery-card-unmount")
                onClicked: page.run(1, card => card.unmount())
            }
            Repeater {
                model: types.supportedFormatTypes
                Button {
                    text: qsTrId("gallery-card-format").arg(modelData)
                    onClicked: {
                        formatQuestion.type = modelData;
                        formatQuestion.open();
                    }
                }
            }
            Button {
                text: qsTrId("gallery-card-empty")
                onClicked: emptyQuestion.open()
            }
        }
    }

    Section {
        visible: page.cardName !== ""
        heading: qsTrId("gallery-card-steps")

        Repeater {
            model: steps
            Paragraph {
                text: (index + 1) + ". " + stepText(model.status)
            }
        }
        // Shows how many steps of the operation have begun.
        ProgressBar {
            Layout.fillWidth: true
            visible: page.running
            to: page.stepCount
            value: steps.count
            Accessible.name: qsTrId("gallery-card-progress")
        }
        Note {
            visible: text !== ""
            text: page.note
        }
        Paragraph {
            visible: text !== ""
            text: page.problem
            color: "#b00020"
        }
    }
}
