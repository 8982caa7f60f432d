// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import QtTest 1.15
import com.marlo.settings.system 1.0

TestCase {
    id: test

    readonly property string helper: "/usr/libexec/sdcardhelper"

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
        root.removeFile(helper);
    }

    function cleanup() {
        compare(root.takeMessages(), []);
    }

    // A card whose probe has failed: there is no helper.
    function addProbed() {
        const formatter = createTemporaryObject(card, test, { devicePath: "/dev/mmcblk1p1" });
        tryCompare(formatter, "status", MemoryCardFormatter.Error);
        formatter.heard = [];
        return formatter;
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

    function test_supportedFormatTypes() {
        const formatter = createTemporaryObject(card, test);
        const types = formatter.supportedFormatTypes;
        verify(types.every(type => ["vfat", "ext4"].includes(type)), types);
        // Looked up again: a program that cannot be run does not count.
        root.removeFile("/sbin/mkfs.vfat");
        root.writeFile("/sbin/mkfs.vfat", "");
        root.removeFile("/sbin/mkfs.ext4");
        compare(formatter.supportedFormatTypes.length, 0);
        compare(formatter.supportedFormatTypes.map(type => type), []);
    }

    function test_deviceName() {
        const formatter = createTemporaryObject(card, test);
        formatter.deviceName = "mmcblk1p1";
        formatter.deviceName = "mmcblk1p1";
        compare(formatter.deviceName, "mmcblk1p1");
        compare(formatter.heard, ["name mmcblk1p1"]);
    }

    function test_probingWithoutHelper() {
        const formatter = createTemporaryObject(card, test);
        formatter.devicePath = "/dev/mmcblk1p1";
        compare(formatter.status, MemoryCardFormatter.Probing);
        compare(formatter.busy, true);
        tryCompare(formatter, "status", MemoryCardFormatter.Error);
        compare(formatter.busy, false);
        compare(formatter.devicePath, "/dev/mmcblk1p1");
        compare(formatter.filesystemType, "");
        compare(formatter.heard, ["path /dev/mmcblk1p1", "status 5", "busy true", "status 6",
                                  "busy false"]);
    }

    function test_theSamePathIsNotProbedAgain() {
        const formatter = addProbed();
        formatter.devicePath = "/dev/mmcblk1p1";
        compare(formatter.status, MemoryCardFormatter.Error);
        compare(formatter.heard, []);
    }

    function test_nothingIsAcceptedWhileBusy() {
        const formatter = createTemporaryObject(card, test, { deviceName: "mmcblk1p1" });
        formatter.devicePath = "/dev/mmcblk1p1";
        compare(formatter.busy, true);
        formatter.heard = [];

        formatter.devicePath = "/dev/other";
        formatter.format("vfat");
        formatter.removeAllFiles();
        formatter.mount();
        formatter.unmount();
        compare(root.takeMessages(), [
            "Cannot change device path when not idle. Status is MemoryCardFormatter::Probing",
            "format() called when not idle. Status is MemoryCardFormatter::Probing",
            "removeAllFiles() called when not idle. Status is MemoryCardFormatter::Probing",
            "mount() called when not idle. Status is MemoryCardFormatter::Probing",
            "unmount() called when not idle. Status is MemoryCardFormatter::Probing",
        ]);
        compare(formatter.heard, []);
        compare(formatter.devicePath, "/dev/mmcblk1p1");
        tryCompare(formatter, "status", MemoryCardFormatter.Error);
    }

    function test_operationsThatLackAnArgument_data() {
        return [
            { tag: "format without path", run: formatter => formatter.format("vfat"),
              message: "devicePath is empty." },
            { tag: "format without both", run: formatter => formatter.format(""),
              message: "devicePath is empty." },
            { tag: "empty without path", run: formatter => formatter.removeAllFiles(),
              message: "devicePath is empty." },
        ];
    }

    function test_operationsThatLackAnArgument(data) {
        const formatter = createTemporaryObject(card, test);
        data.run(formatter);
        compare(root.takeMessages(), [data.message]);
        compare(formatter.status, MemoryCardFormatter.Error);
        compare(formatter.heard, ["status 6"]);
    }

    function test_formatWithoutType() {
        const formatter = addProbed();
        formatter.format("");
        compare(root.takeMessages(), ["type is empty."]);
        compare(formatter.status, MemoryCardFormatter.Error);
        compare(formatter.heard, []);
    }

    // The words are crossed; log readers know them so.
    function test_withoutDeviceNameNothingHappens() {
        const formatter = createTemporaryObject(card, test);
        formatter.mount();
        compare(root.takeMessages(), ["Cannot unmount without device name"]);
        formatter.unmount();
        compare(root.takeMessages(), ["Cannot mount without device name"]);
        compare(formatter.status, MemoryCardFormatter.Idle);
        compare(formatter.heard, ["busy false", "busy false"]);
    }

    function test_withoutDiskService_data() {
        return [
            { tag: "mount", run: formatter => formatter.mount(), method: "Mount" },
            { tag: "unmount", run: formatter => formatter.unmount(), method: "Unmount" },
            { tag: "format", run: formatter => formatter.format("vfat"), method: "Unmount" },
            { tag: "empty", run: formatter => formatter.removeAllFiles(), method: "Mount" },
        ];
    }

    function test_withoutDiskService(data) {
        const formatter = addProbed();
        formatter.deviceName = "mmcblk1p1";
        formatter.heard = [];
        const messages = [];
        data.run(formatter);
        // Accepted, so users are told, although nothing has changed yet.
        compare(formatter.heard, ["busy false"]);
        tryVerify(() => {
            root.takeMessages().forEach(message => messages.push(message));
            return messages.length > 0;
        });
        compare(messages,
                ['"' + data.method + '" error: org.freedesktop.DBus.Error.ServiceUnknown']);
        // The error is not one of the disk service's own, and it ends the sequence.
        compare(formatter.status, MemoryCardFormatter.Error);
        compare(formatter.heard, ["busy false"]);
    }
}
