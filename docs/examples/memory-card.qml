import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Layouts 1.15
import com.marlo.settings.system 1.0

Page {
    id: page

    property string cardName: "mmcblk1p1" // of the partition; empty while there is no card
    readonly property bool running: operation.active
    property int step: MemoryCardFormatter.Idle
    property string fileSystem
    property string note
    property string problem

    // A formatter serves one operation. The operation starts when the path has been set, so the
    // formatter probes the card afterwards, and its status always changes to Idle or Error.
    function run(start) {
        note = "";
        problem = "";
        step = MemoryCardFormatter.Idle;
        operation.active = true;
        operation.item.devicePathChanged.connect(() => start(operation.item));
        operation.item.devicePath = "/dev/" + cardName;
    }

    function follow(card) {
        if (card.status === MemoryCardFormatter.Idle) {
            fileSystem = card.filesystemType;
        } else if (card.status === MemoryCardFormatter.Error) {
            problem = problem || cause(step);
        } else {
            step = card.status;
            return;
        }
        operation.active = false;
    }

    // Two errors do not stop the operation: the card is in the requested state, or will be.
    function fail(error) {
        switch (error) {
        case MemoryCardFormatter.ErrorAlreadyMounted:
            note = qsTr("The card was mounted already.");
            break;
        case MemoryCardFormatter.ErrorAlreadyUnmounting:
            note = qsTr("The card is already being unmounted.");
            break;
        case MemoryCardFormatter.ErrorDeviceBusy:
            problem = qsTr("A program uses the card.");
            break;
        case MemoryCardFormatter.ErrorNotMounted:
            problem = qsTr("The card is not mounted.");
            break;
        default:
            problem = qsTr("The disk service refused (error %1).").arg(error);
        }
    }

    // For errors without a code: what was being done.
    function cause(step) {
        switch (step) {
        case MemoryCardFormatter.Probing:
            return qsTr("The file system could not be detected.");
        case MemoryCardFormatter.Formatting:
            return qsTr("Formatting failed.");
        case MemoryCardFormatter.RemovingFiles:
            return qsTr("Some files could not be removed.");
        default:
            return qsTr("The disk service did not answer.");
        }
    }

    function progress(step) {
        switch (step) {
        case MemoryCardFormatter.Unmounting:
            return qsTr("Unmounted…");
        case MemoryCardFormatter.Formatting:
            return qsTr("Formatting…");
        case MemoryCardFormatter.RemovingFiles:
            return qsTr("Removing files…");
        case MemoryCardFormatter.Mounting:
            return qsTr("Mounted…");
        case MemoryCardFormatter.Probing:
            return qsTr("Detecting the file system…");
        default: // no status for this: the formatter stays Idle until the disk service answers
            return qsTr("Waiting for the disk service…");
        }
    }

    onCardNameChanged: {
        operation.active = false;
        fileSystem = "";
        if (cardName) {
            run(card => {}); // only detects the file system
        }
    }
    Component.onCompleted: cardNameChanged()

    Loader {
        id: operation
        active: false
        sourceComponent: MemoryCardFormatter {
            deviceName: page.cardName
            onStatusChanged: page.follow(this)
            onMountError: function(error) { page.fail(error); }
            onUnmountError: function(error) { page.fail(error); }
        }
    }

    MemoryCardFormatter {
        id: types // only lists the types
    }

    Dialog {
        id: question
        property string type

        anchors.centerIn: parent
        width: parent.width - 32
        modal: true
        focus: true // otherwise keys still reach the page behind the dialog
        title: qsTr("Erase the card?")
        onAccepted: page.run(card => card.format(type))

        Label {
            width: question.availableWidth
            text: qsTr("All files are lost. The card gets the file system %1.").arg(question.type)
            wrapMode: Text.Wrap
        }
        footer: DialogButtonBox {
            Button {
                text: qsTr("Cancel")
                DialogButtonBox.buttonRole: DialogButtonBox.RejectRole
            }
            Button {
                text: qsTr("Erase")
                DialogButtonBox.buttonRole: DialogButtonBox.AcceptRole
            }
        }
    }

    ColumnLayout {
        anchors { left: parent.left; right: parent.right; top: parent.top; margins: 16 }

        Label {
            Layout.fillWidth: true
            text: page.running ? page.progress(page.step)
                               : page.problem
                    || qsTr("File system: %1").arg(page.fileSystem || qsTr("unknown"))
            wrapMode: Text.Wrap
        }
        Label {
            visible: text !== ""
            text: page.note
        }
        ProgressBar {
            Layout.fillWidth: true
            opacity: page.running ? 1 : 0
            indeterminate: page.running
            Accessible.name: page.progress(page.step)
            Accessible.ignored: !page.running
        }
        Button {
            text: qsTr("Mount")
            enabled: page.cardName !== "" && !page.running
            onClicked: page.run(card => card.mount())
        }
        Button {
            text: qsTr("Unmount")
            enabled: page.cardName !== "" && !page.running
            onClicked: page.run(card => card.unmount())
        }
        Repeater {
            model: types.supportedFormatTypes
            Button {
                text: qsTr("Format as %1").arg(modelData)
                enabled: page.cardName !== "" && !page.running
                onClicked: {
                    question.type = modelData;
                    question.open();
                }
            }
        }
    }
}
