// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtTest 1.15
import com.marlo.settings.system 1.0

TestCase {
    id: test

    name: "MemoryCard"

    Component {
        id: card
        MemoryCardFormatter {
            property var heard: []
            onStatusChanged: heard.push("status " + status)
            onBusyChanged: heard.push("busy " + busy)
            onDeviceNameChanged: heard.push("name " + deviceName)
            onDevicePathChanged: heard.push("path " + devicePath)
            onFilesystemTypeChanged: heard.push("type " + filesystemType)
            onMountError: heard.push("mount error " + error)
            onUnmountError: heard.push("unmount error " + error)
        }
    }

    function initTestCase() {
        root.recordMessages();
    }

    function init() {
        root.removeFile("/usr/libexec/sdcardhelper");
    }

    function cleanup() {
        compare(root.takeMessages(), []);
    }

    function test_defaults() {
        const formatter = createTemporaryObject(card, test);
        compare(formatter.status, MemoryCardFormatter.Idle);
        compare(formatter.busy, false);
        compare(formatter.deviceName, "");
        compare(formatter.devicePath, "");
        compare(formatter.filesystemType, "");
        compare(formatter.heard, []);
    }

    function test_enums() {
        const statuses = ["Idle", "Unmounting", "Formatting", "RemovingFiles", "Mounting",
                          "Probing", "Error"];
        compare(statuses.map(key => MemoryCardFormatter[key]), statuses.map((key, i) => i));
        const errors = ["Failed", "Cancelled", "AlreadyCancelled", "NotAuthorized",
                        "NotAuthorizedCanObtain", "NotAuthorizedDismissed", "AlreadyMounted",
                        "NotMounted", "OptionNotPermitted", "MountedByOtherUser",
                        "AlreadyUnmounting", "NotSupported", "Timedout", "WouldWakeup",
                        "DeviceBusy"];
        compare(errors.map(key => MemoryCardFormatter["Error" + key]), errors.map((key, i) => i));
    }

    function test_supportedFormatTypesIsAnArray() {
        const formatter = createTemporaryObject(card, test);
        verify(formatter.supportedFormatTypes.every(type => ["vfat", "ext4"].includes(type)));
        // Each read looks up the programs again. A program that cannot be run does not count.
        root.removeFile("/sbin/mkfs.vfat");
        root.writeFile("/sbin/mkfs.vfat", "");
        root.removeFile("/sbin/mkfs.ext4");
        compare(formatter.supportedFormatTypes.map(type => type), []);
    }

    function test_probingWithoutHelper() {
        const formatter = createTemporaryObject(card, test);
        formatter.devicePath = "/dev/mmcblk1p1";
        compare(formatter.status, MemoryCardFormatter.Probing);
        compare(formatter.busy, true);
        formatter.format("vfat");
        compare(root.takeMessages(),
                ["format() called when not idle. Status is MemoryCardFormatter::Probing"]);
        tryCompare(formatter, "status", MemoryCardFormatter.Error);
        compare(formatter.heard, ["path /dev/mmcblk1p1", "status 5", "busy true", "status 6",
                                  "busy false"]);
    }

    function test_operationsWithoutTheirArguments_data() {
        return [
            { tag: "format", message: "devicePath is empty.", heard: ["status 6"] },
            { tag: "removeAllFiles", message: "devicePath is empty.", heard: ["status 6"] },
            // The verbs are swapped on purpose, because readers of logs know these messages.
            { tag: "mount", message: "Cannot unmount without device name", heard: ["busy false"] },
            { tag: "unmount", message: "Cannot mount without device name", heard: ["busy false"] },
        ];
    }

    function test_operationsWithoutTheirArguments(data) {
        const formatter = createTemporaryObject(card, test);
        formatter[data.tag]("");
        compare(root.takeMessages(), [data.message]);
        compare(formatter.heard, data.heard);
    }

    // The handler of a refused operation sets the missing path, which does not start the operation.
    function test_refusedOperationStaysRefused() {
        const formatter = createTemporaryObject(card, test);
        formatter.statusChanged.connect(() => formatter.devicePath = "/dev/mmcblk1p1");
        formatter.removeAllFiles();
        compare(root.takeMessages(), ["devicePath is empty."]);
        compare(formatter.heard, ["status 6", "path /dev/mmcblk1p1", "status 5", "busy true",
                                  "busy true"]);
        tryCompare(formatter, "status", MemoryCardFormatter.Error);
    }

    function test_withoutDiskService() {
        const formatter = createTemporaryObject(card, test, { deviceName: "mmcblk1p1" });
        formatter.heard = [];
        formatter.mount();
        tryCompare(formatter, "status", MemoryCardFormatter.Error);
        compare(root.takeMessages(),
                ['"Mount" error: org.freedesktop.DBus.Error.ServiceUnknown']);
        // Busy is announced when the operation is accepted; the error is not the disk service's own.
        compare(formatter.heard, ["busy false", "status 6"]);
    }
}
