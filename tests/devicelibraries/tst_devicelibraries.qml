// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQml 2.15
import QtTest 1.15
import com.marlo.settings.system 1.0

// Tests the module when it is built with one or both of a device's libraries. For each of the two,
// the test program runs either the function for the library or the one for its stand-in.
TestCase {
    name: "DeviceLibraries"

    readonly property string lamp: "/usr/share/glimmera/quickactions/lamp.conf"
    readonly property string radio: "/usr/share/glimmera/quickactions/radio.conf"

    Component {
        id: actionsComponent

        QuickActionsModel {}
    }

    Component {
        id: widgetsComponent

        EventsWidgetsModel {}
    }

    Component {
        id: locationComponent

        LocationConfiguration {}
    }

    function useActions(known) {
        const actions = createTemporaryObject(actionsComponent, this)
        compare(actions.count, known)
        actions.enableAction(radio)
        tryCompare(actions, "count", known + 1)
        compare(actions.get(known).path, radio)
        actions.disableAction(radio)
        tryCompare(actions, "count", known)
    }

    function useWidgets(enabled) {
        const widgets = createTemporaryObject(widgetsComponent, this)
        compare(widgets.rowCount(), 2)
        for (let row = 0; row < 2; ++row) {
            const index = widgets.index(row, 0)
            compare(widgets.data(index, 259), enabled.includes(widgets.data(index, 258)))
        }
    }

    function useLocation() {
        const location = createTemporaryObject(locationComponent, this)
        for (const property of ["gpsEnabled", "mlsEnabled"]) {
            location[property] = true
        }
        location.mlsOnlineState = 2
        location.hereState = 0
        location.saveCustomSettings()
        location.gpsEnabled = false
        location.mlsOnlineState = 1
        location.restoreCustomSettings()
        verify(location.gpsEnabled)
        verify(location.mlsEnabled)
        compare(location.mlsOnlineState, 2)
        compare(location.hereState, 0)
        location.customSettingsEnabled = !location.customSettingsEnabled
    }

    function test_keysOfTheDevice() {
        useActions(1)
        useWidgets(["weather"])
        verify(createTemporaryObject(locationComponent, this).customSettingsEnabled)
        useLocation()
    }

    function test_keysOfTheStandIn() {
        useActions(0)
        useWidgets([])
        verify(!createTemporaryObject(locationComponent, this).customSettingsEnabled)
        useLocation()
    }

    function test_locationOfTheDevice() {
        const location = createTemporaryObject(locationComponent, this)
        compare(location.device, "device with location settings")
        verify(location.gpsEnabled)
        compare(location.mlsOnlineState, LocationConfiguration.SwitchedOn)
        compare(location.hereState, 0)
        useLocation()
    }

    function test_locationOfTheStandIn() {
        const location = createTemporaryObject(locationComponent, this)
        compare(location.device, undefined)
        compare(LocationConfiguration.OnlineAGpsEnabled, 2)
        useLocation()
    }
}
