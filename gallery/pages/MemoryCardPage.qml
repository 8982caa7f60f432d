// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Layouts 1.15
import com.marlo.settings.system 1.0
import ".."

/*
    A memory card that is formatted, emptied, mounted and unmounted.
*/
GalleryPage {
    id: page

    // The kernel's name of the card, empty while there is none.
    property string cardName
    readonly property string cardPath: cardName ? "/dev/" + cardName : ""

    // The error of the disk service that the last operation met.
    property int error: noError
    readonly property int noError: -1

    function start(operation) {
        forget();
        operation();
    }

    function forget() {
        error = noError;
        steps.clear();
    }

    onCardPathChanged: forget()

    MemoryCardTexts {
        id: texts
    }

    MemoryCardFormatter {
        id: card
        deviceName: page.cardName
        devicePath: page.cardPath
        onStatusChanged: steps.append({ status: status })
        onMountError: page.error = error
        onUnmountError: page.error = error
    }

    // A path is probed when it is set, and not again after formatting: a formatter that is made
    // whenever the other has ended tells what is on the card then.
    Loader {
        id: fileSystem
        readonly property string type: item ? item.filesystemType : ""

        visible: false
        active: page.cardPath !== "" && !card.busy
        sourceComponent: MemoryCardFormatter {
            devicePath: page.cardPath
        }
    }

    // The steps of what the user asked for last.
    ListModel {
        id: steps
    }

    Question {
        id: formatQuestion
        property string type

        title: qsTrId("gallery-card-question")
        text: qsTrId("gallery-card-question-text")
        yes: qsTrId("gallery-card-erase")
        no: qsTrId("gallery-card-cancel")
        onAccepted: page.start(() => card.format(type))
    }

    Question {
        id: emptyQuestion
        title: qsTrId("gallery-card-empty-question")
        text: qsTrId("gallery-card-empty-question-text")
        yes: qsTrId("gallery-card-remove")
        no: qsTrId("gallery-card-cancel")
        onAccepted: page.start(() => card.removeAllFiles())
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
            value: texts.status(card.status)
        }
        Value {
            visible: page.cardName !== ""
            name: qsTrId("gallery-card-file-system")
            value: fileSystem.type || qsTrId("gallery-unknown")
        }
        Flow {
            Layout.fillWidth: true
            spacing: 8
            enabled: page.cardName !== "" && !card.busy

            Button {
                text: qsTrId("gallery-card-mount")
                onClicked: page.start(() => card.mount())
            }
            Button {
                text: qsTrId("gallery-card-unmount")
                onClicked: page.start(() => card.unmount())
            }
            Repeater {
                model: card.supportedFormatTypes
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
        // An empty path is probed like any other, and that fails.
        visible: page.cardName !== ""
        heading: qsTrId("gallery-card-steps")

        Repeater {
            model: steps
            Paragraph {
                text: (index + 1) + ". " + texts.status(model.status)
            }
        }
        ProgressBar {
            Layout.fillWidth: true
            visible: card.busy
            indeterminate: visible
        }
        Paragraph {
            visible: page.error !== page.noError || card.status === MemoryCardFormatter.Error
            text: texts.error(page.error)
            // A card that is mounted already is no obstacle.
            color: card.status === MemoryCardFormatter.Error ? "#b00020" : "black"
        }
    }
}
