// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// What CheckPages.qml reads and changes in the source of a page.
.pragma library

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
