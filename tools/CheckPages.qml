// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import "pagesource.js" as Source

/*
    Checks pages without running them:

        qml CheckPages.qml -- NAME URL...

    Compiling a page finds types that do not exist and properties and signal handlers that its types
    do not have. A name such as Type.Value that the engine does not know is an error, too. Each
    finding is a line "NAME:LINE:COLUMN: text".
*/
Item {
    id: checker

    property bool failed: false

    function report(name, line, column, text) {
        console.error("%1:%2:%3: %4".arg(name).arg(line).arg(column).arg(text.trim()));
        failed = true;
    }

    function sourceOf(url) {
        const request = new XMLHttpRequest();
        request.open("GET", url, false);
        request.send();
        return request.responseText;
    }

    function checkTypes(name, url, isComplete) {
        const original = sourceOf(url);
        const root = isComplete ? /^[ \t]*[A-Z][\w.]*\s*\{/m.exec(Source.codeOf(original)) : null;
        const head = "import QtQml 2.15 as Checked; Checked.Component { ";
        const start = root ? root.index : 0;
        const startLine = original.substring(0, start).split("\n").length;
        const declared = []; // places of "property var" that are not the page's
        let source = original;
        for (let previous = ""; source !== previous;) {
            previous = source;
            let errors = [];
            try {
                // Within a component, the page is compiled and no object of it is created.
                Qt.createQmlObject(root ? source.substring(0, start) + head + source.substring(start) + "\n}"
                                        : source, checker, url).destroy();
            } catch (failure) {
                errors = failure.qmlErrors || [{ lineNumber: 1, columnNumber: 1, message: String(failure) }];
            }
            for (const error of errors) {
                if (error.fileName && String(error.fileName) !== url) {
                    report(String(error.fileName).replace("file://", ""), error.lineNumber,
                           error.columnNumber, error.message);
                    continue;
                }
                const line = error.lineNumber;
                const column = error.columnNumber - (root && line === startLine ? head.length : 0);
                const added = declared.filter(place => place.line === line && place.column < column).length;
                report(name, line, column - added * "property var ".length, error.message);
                const before = source;
                source = Source.withoutMistake(source, Source.offsetOf(source, line, column), error.message);
                if (source.length > before.length) {
                    declared.push({ line: line, column: column });
                }
                break;
            }
        }
    }

    function checkValues(name, url) {
        const code = Source.codeOf(sourceOf(url));
        const imports = (sourceOf(url).match(/^[ \t]*import .*$/gm) || []).join("\n");
        const names = /(^|[^.\w])([A-Z]\w*(?:\.[A-Z]\w*)+)(?=[^\w.({]|\s*[)\]:;,]|$)(?!\s*\{)/gm;
        const values = {};
        for (let found = names.exec(code); found; found = names.exec(code)) {
            const value = found[2];
            if (/^[ \t]*import /.test(code.substring(code.lastIndexOf("\n", found.index) + 1))) {
                continue;
            }
            if (!(value in values)) {
                const object = Qt.createQmlObject(imports + "\nimport QtQml 2.15 as Checked\nChecked.QtObject {"
                    + "function value() { try { return %1; } catch (e) { return undefined; } } }".arg(value),
                    checker, url);
                values[value] = object.value() !== undefined;
            }
            if (!values[value]) {
                const lines = code.substring(0, found.index + found[1].length).split("\n");
                report(name, lines.length, lines[lines.length - 1].length + 1, "unknown value " + value);
            }
        }
    }

    Component.onCompleted: {
        const pages = Qt.application.arguments;
        for (let i = pages.indexOf("--") + 1; i < pages.length; i += 2) {
            const name = pages[i];
            const url = pages[i + 1];
            const page = Qt.createComponent(url);
            const isComplete = !/Expected token|Unexpected token|Syntax error/.test(page.errorString());
            if (page.status === Component.Error) {
                checkTypes(name, url, isComplete);
            }
            if (isComplete) {
                checkValues(name, url);
            }
        }
        Qt.callLater(Qt.exit, failed ? 1 : 0);
    }
}
