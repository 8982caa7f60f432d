// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtQuick.Controls 2.15
import QtQuick.Controls.Universal 2.15
import QtQuick.Layouts 1.15
// Importing the module installs the texts of the settings pages.
import com.marlo.settings.system 1.0
import gallery.simulation 1.0

/*
    The gallery: a start page that lists the pages, and pages for all of the module's types.
*/
ApplicationWindow {
    id: window

    readonly property alias pages: pages.list
    readonly property alias currentPage: stack.currentItem
    // Contains everything that the window shows, including popups.
    readonly property Item surface: contentItem.parent
    property alias logOpen: log.open
    readonly property bool popupOpen: Overlay.overlay.visible

    function openPage(name) {
        close();
        Messages.clear();
        const entry = () => pages.list.find(page => page.name === name);
        stack.push("PageFrame.qml", { entry: entry() }, StackView.Immediate);
        currentPage.entry = Qt.binding(entry);
        currentPage.forceActiveFocus();
        return currentPage.page;
    }

    // The return key presses the control that has the focus, as the space bar does.
    function pressFocused() {
        const button = activeFocusItem;
        if (!button || typeof button.clicked !== "function") {
            return;
        }
        if (button.checkable && !(button.autoExclusive && button.checked)) {
            button.toggle();
            button.toggled();
        }
        button.clicked();
    }

    function close() {
        stack.pop(null, StackView.Immediate);
        currentPage.forceActiveFocus();
    }

    width: 360
    height: 640
    minimumWidth: 320
    minimumHeight: 480
    visible: true
    title: qsTrId("gallery-title")

    Pages {
        id: pages
    }

    background: Rectangle {
        color: "#f2f4f4"
    }

    header: ToolBar {
        // The window sets the width. A width that follows the title sometimes causes a binding
        // loop.
        contentWidth: 0
        Keys.onReturnPressed: window.pressFocused()
        Keys.onEnterPressed: window.pressFocused()
        Universal.theme: Universal.Dark
        background: Rectangle {
            color: window.Universal.accent
        }

        RowLayout {
            anchors.fill: parent

            ToolButton {
                visible: stack.depth > 1
                icon.source: "icons/back.svg"
                Accessible.name: qsTrId("gallery-back")
                onClicked: window.close()
            }
            Label {
                Layout.fillWidth: true
                Layout.leftMargin: stack.depth > 1 ? 0 : 16
                text: stack.currentItem.title
                font.pixelSize: 18
                elide: Text.ElideRight
            }
            LanguageButton {}
        }
    }

    // Not as a footer: keys and screen readers reach a footer before the page.
    ColumnLayout {
        anchors.fill: parent
        spacing: 0
        Keys.onReturnPressed: window.pressFocused()
        Keys.onEnterPressed: window.pressFocused()

        StackView {
            id: stack
            Layout.fillWidth: true
            Layout.fillHeight: true
            focus: true
            initialItem: StartPage {
                pages: window.pages
                onOpened: window.openPage(page.name)
            }
        }
        LogPane {
            id: log
            Layout.fillWidth: true
        }
    }

    Shortcut {
        sequences: ["Esc", StandardKey.Back]
        enabled: !window.popupOpen
        onActivated: window.close()
    }

    Component.onCompleted: currentPage.forceActiveFocus()
}
