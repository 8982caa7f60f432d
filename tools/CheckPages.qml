// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15

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

    // The code without comments and texts, each replaced by as many blanks.
    function codeOf(source) {
        return source.replace(/\/\*[^]*?\*\/|\/\/.*|"(\\.|[^"\\\n])*"|'(\\.|[^'\\\n])*'/g, blank);
    }

    function blank(text) {
        return text.replace(/[^\n]/g, " ");
    }

    function offsetOf(source, line, column) {
        return source.split("\n").slice(0, line - 1).join("\n").length + (line > 1 ? 1 : 0) + column - 1;
    }

    // Where a binding or an object that begins at the offset ends.
    function endOf(code, start) {
        for (let i = start, depth = 0; i < code.length; ++i) {
            if ("([{".includes(code[i])) {
                ++depth;
            } else if (")]}".includes(code[i]) && --depth <= 0) {
                return depth < 0 ? i : i + 1;
            } else if (depth === 0 && (code[i] === ";" || code[i] === "\n")
                    && /[^\s:]/.test(code.substring(code.indexOf(":", start) + 1, i))) {
                return i;
            }
        }
        return code.length;
    }

    // The source without the mistake, so that the compiler finds the next one: an unknown property
    // becomes a declaration, an object of an unknown type an empty one, and any other binding is
    // left out. The same source if this is not possible.
    function withoutMistake(source, offset, text) {
        const code = codeOf(source);
        const before = code.substring(0, offset);
        const after = code.substring(offset);
        let start = offset;
        if (/^[A-Z][\w.]*\s*\{/.test(after)) {
            const end = endOf(code, offset);
            const empty = "QtObject {}";
            const rest = source.substring(offset + empty.length, end);
            return end - offset < empty.length ? source
                : source.substring(0, offset) + empty + blank(rest) + source.substring(end);
        }
        if (/non-existent property/.test(text) && /^\w+\s*:/.test(after) && !/\.\s*$/.test(before)) {
            return source.substring(0, offset) + "property var " + source.substring(offset);
        }
        if (!/^[\w.]+\s*:/.test(after) || /\.\s*$/.test(before)) {
            const binding = /[\w.]+(\s*:\s*|\.)$/.exec(before);
            if (!binding) {
                return source;
            }
            start = binding.index;
        }
        const end = endOf(code, start);
        return source.substring(0, start) + blank(source.substring(start, end)) + source.substring(end);
    }

    function checkTypes(name, url, isComplete) {
        const original = sourceOf(url);
        const root = isComplete ? /^[ \t]*[A-Z][\w.]*\s*\{/m.exec(codeOf(original)) : null;
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
                source = withoutMistake(source, offsetOf(source, line, column), error.message);
                if (source.length > before.length) {
                    declared.push({ line: line, column: column });
                }
                break;
            }
        }
    }

    function checkValues(name, url) {
        const code = codeOf(sourceOf(url));
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
