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
    // An application knows this of its package's dependencies. The formatter does not report why the
    // helper program failed.
    property bool helperInstalled: true
    property string fileSystem
    // The statuses of the operation in their order. The last one is Probing.
    property var plan: []
    property bool failed

    function mount() {
        run([MemoryCardFormatter.Mounting], card => card.mount());
    }

    function unmount() {
        run([MemoryCardFormatter.Unmounting], card => card.unmount());
    }

    function format(type) {
        run([MemoryCardFormatter.Unmounting, MemoryCardFormatter.Formatting,
             MemoryCardFormatter.Mounting], card => card.format(type));
    }

    function removeAllFiles() {
        run([MemoryCardFormatter.Mounting, MemoryCardFormatter.RemovingFiles],
            card => card.removeAllFiles());
    }

    // A formatter serves one operation. The operation starts when the path has been set, so the
    // formatter probes the card afterwards, and its status always changes to Idle or Error.
    function run(statuses, start) {
        failed = false;
        steps.clear();
        plan = statuses.concat(MemoryCardFormatter.Probing);
        operation.active = true;
        operation.item.devicePathChanged.connect(() => start(operation.item));
        operation.item.devicePath = "/dev/" + cardName;
    }

    function follow(card) {
        if (card.status === MemoryCardFormatter.Idle) {
            fileSystem = card.filesystemType;
        } else if (card.status === MemoryCardFormatter.Error) {
            // Nothing has changed if the first step failed.
            if (steps.count > (failed ? 1 : 0)) {
                fileSystem = "";
            }
            if (!failed) {
                failWithoutCode();
            }
        } else {
            addStep("");
            return;
        }
        operation.active = false;
    }

    // Adds the next step of the plan, with what there is to say about it.
    function addStep(remark) {
        steps.append({ status: plan[steps.count], remark: remark, failed: failed });
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

    // The steps Unmounting and Mounting are done when they are listed. The others have begun.
    function failWithoutCode() {
        failed = true;
        switch (step()) {
        case MemoryCardFormatter.Formatting:
        case MemoryCardFormatter.Probing:
            setRemark(helperInstalled ? "gallery-card-helper-failed" : "gallery-card-helper-missing");
            break;
        case MemoryCardFormatter.RemovingFiles:
            setRemark("gallery-card-removing-failed");
            break;
        default:
            addStep("gallery-card-no-answer");
        }
    }

    function setRemark(remark) {
        steps.set(steps.count - 1, { remark: remark, failed: true });
    }

    // These two do not stop the operation.
    function forgives(error) {
        return error === MemoryCardFormatter.ErrorAlreadyMounted
            || error === MemoryCardFormatter.ErrorAlreadyUnmounting;
    }

    function fail(error) {
        failed = !forgives(error);
        addStep(errorId(error));
    }

    function errorId(error) {
        switch (error) {
        case MemoryCardFormatter.ErrorAlreadyMounted:
            return "gallery-card-already-mounted";
        case MemoryCardFormatter.ErrorAlreadyUnmounting:
            return "gallery-card-already-unmounting";
        case MemoryCardFormatter.ErrorDeviceBusy:
            return "gallery-card-device-busy";
        case MemoryCardFormatter.ErrorNotMounted:
            return "gallery-card-not-mounted";
        case MemoryCardFormatter.ErrorMountedByOtherUser:
            return "gallery-card-other-user";
        case MemoryCardFormatter.ErrorNotAuthorized:
        case MemoryCardFormatter.ErrorNotAuthorizedCanObtain:
        case MemoryCardFormatter.ErrorNotAuthorizedDismissed:
        case MemoryCardFormatter.ErrorOptionNotPermitted:
            return "gallery-card-not-authorized";
        case MemoryCardFormatter.ErrorNotSupported:
            return "gallery-card-not-supported";
        case MemoryCardFormatter.ErrorTimedout:
            return "gallery-card-timed-out";
        default:
            return "gallery-card-failed";
        }
    }

    // A new card is only probed.
    function probe() {
        operation.active = false;
        fileSystem = "";
        if (cardName) {
            run([], card => {});
        }
    }

    // The name may be set before the Loader can make a formatter.
    property bool complete
    onCardNameChanged: {
        if (complete) {
            probe();
        }
    }
    Component.onCompleted: {
        complete = true;
        probe();
    }

    Loader {
        id: operation
        visible: false
        active: false
        sourceComponent: MemoryCardFormatter {
            deviceName: page.cardName
            onStatusChanged: page.follow(this)
            onMountError: function(error) { page.fail(error); }
            onUnmountError: function(error) { page.fail(error); }
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
        onAccepted: page.format(type)
    }

    Question {
        id: emptyQuestion
        title: qsTrId("gallery-card-empty-question")
        text: qsTrId("gallery-card-empty-question-text")
        yes: qsTrId("gallery-card-remove")
        no: qsTrId("gallery-card-cancel")
        onAccepted: page.removeAllFiles()
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
                 : page.failed ? qsTrId("gallery-card-error") : qsTrId("gallery-card-idle")
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

            PushButton {
                text: qsTrId("gallery-card-mount")
                onClicked: page.mount()
            }
            PushButton {
                text: qsTrId("gallery-card-unmount")
                onClicked: page.unmount()
            }
            Repeater {
                model: types.supportedFormatTypes
                PushButton {
                    tint: "#b00020"
                    text: qsTrId("gallery-card-format").arg(modelData)
                    onClicked: {
                        formatQuestion.type = modelData;
                        formatQuestion.open();
                    }
                }
            }
            PushButton {
                tint: "#b00020"
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
                      + (model.remark ? ": " + qsTrId(model.remark) : "")
                color: model.failed ? "#b00020" : "black"
            }
        }
        // Shows how many steps of the operation have begun.
        ProgressBar {
            Layout.fillWidth: true
            visible: page.running
            to: page.plan.length
            value: steps.count
            Accessible.name: qsTrId("gallery-card-progress")
        }
    }
}
