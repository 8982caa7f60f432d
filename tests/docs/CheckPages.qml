// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15

/*
    Checks pages without running them:

        qml CheckPages.qml -- FILE...

    Compiling a page finds types that do not exist and properties and signal handlers that its types
    do not have. A name such as Type.Value that the engine does not know is an error, too.
*/
Item {
    id: checker

    property bool failed: false

    function report(text) {
        console.error(text);
        failed = true;
    }

    function sourceOf(url) {
        const request = new XMLHttpRequest();
        request.open("GET", url, false);
        request.send();
        return request.responseText;
    }

    function checkValues(url) {
        const source = sourceOf(url).replace(/\/\*[^]*?\*\/|\/\/.*|"(\\.|[^"\\\n])*"/g, text =>
            text.startsWith('"') ? text : text.replace(/[^\n]/g, " "));
        const imports = (source.match(/^[ \t]*import .*$/gm) || []).join("\n");
        const code = source.replace(/^[ \t]*import .*$/gm, "").replace(/"(\\.|[^"\\\n])*"/g, '""');
        const names = /(^|[^.\w])([A-Z]\w*(?:\.[A-Z]\w*)+)(?=[^\w.({]|\s*[)\]:;,]|$)(?!\s*\{)/gm;
        const checked = new Set();
        for (let found = names.exec(code); found; found = names.exec(code)) {
            const name = found[2];
            if (checked.has(name)) {
                continue;
            }
            checked.add(name);
            const object = Qt.createQmlObject(imports + "\nimport QtQml 2.15 as Checked\nChecked.QtObject {"
                + "function value() { try { return %1; } catch (e) { return undefined; } } }".arg(name),
                checker, url);
            if (object.value() === undefined) {
                const line = code.substring(0, found.index + found[1].length).split("\n").length;
                report("%1:%2: unknown value %3".arg(url).arg(line).arg(name));
            }
        }
    }

    Component.onCompleted: {
        const urls = Qt.application.arguments;
        urls.slice(urls.indexOf("--") + 1).forEach(url => {
            const page = Qt.createComponent(url);
            if (page.status === Component.Error) {
                report(page.errorString().trim());
            } else {
                checkValues(url);
            }
        });
        Qt.callLater(Qt.exit, failed ? 1 : 0);
    }
}
