// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Layouts 1.15
import gallery.simulation 1.0

/*
    The messages of the module and of QML: the latest one in a line, or all of them in a list.
*/
Rectangle {
    id: pane

    property bool open

    implicitHeight: open ? 160 : bar.implicitHeight
    color: "#263238"

    ColumnLayout {
        anchors.fill: parent
        spacing: 0

        RowLayout {
            Layout.fillHeight: false
            spacing: 0

            ItemDelegate {
                id: bar
                focusPolicy: Qt.StrongFocus
                Accessible.description: pane.open ? "" : Messages.latest
                Layout.fillWidth: true
                implicitHeight: 40
                padding: 10
                text: qsTrId("gallery-log").arg(Messages.count)
                onClicked: pane.open = !pane.open
                contentItem: RowLayout {
                    spacing: 10

                    Label {
                        text: (pane.open ? "\u25be " : "\u25b4 ") + qsTrId("gallery-log").arg(Messages.count)
                        color: "white"
                        font.pixelSize: 13
                    }
                    Label {
                        // The list shows the whole message.
                        readonly property bool mayBeCut: true

                        Layout.fillWidth: true
                        visible: !pane.open
                        // The URL of the file would take all the room.
                        text: Messages.latest.replace(/^file:\S+ /, "")
                        textFormat: Text.PlainText
                        color: "#cfd8dc"
                        font.pixelSize: 13
                        elide: Text.ElideRight
                        maximumLineCount: 1
                    }
                }
            }
            ToolButton {
                visible: pane.open && Messages.count > 0
                text: qsTrId("gallery-log-clear")
                onClicked: Messages.clear()
                contentItem: Label {
                    verticalAlignment: Text.AlignVCenter
                    text: parent.text
                    color: "white"
                    font.pixelSize: 13
                }
            }
        }
        ListView {
            id: list
            Layout.fillWidth: true
            Layout.fillHeight: true
            visible: pane.open
            clip: true
            model: Messages
            currentIndex: -1 // the highlight of a current row would be animated
            boundsBehavior: Flickable.StopAtBounds
            onCountChanged: positionViewAtEnd()
            ScrollBar.vertical: VisibleScrollBar {}
            delegate: Label {
                width: ListView.view.width
                leftPadding: 10
                rightPadding: 10
                text: model.text
                textFormat: Text.PlainText
                color: "#cfd8dc"
                font.pixelSize: 12
                wrapMode: Text.WrapAtWordBoundaryOrAnywhere
            }
        }
    }
}
