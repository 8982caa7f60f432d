// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause
.pragma library

// Finds what is on the screen, for tests and screenshots. `root` is the item that contains all of it.

// Returns an item and all its visible descendants, in the order in which they are drawn.
function visibleItems(item, found) {
    found = found || [];
    if (item.visible && item.opacity > 0) {
        found.push(item);
        for (let i = 0; i < item.children.length; ++i) {
            visibleItems(item.children[i], found);
        }
    }
    return found;
}

function isText(item) {
    return item.truncated !== undefined && item.contentWidth !== undefined;
}

function texts(root) {
    return visibleItems(root).filter(item => isText(item) && item.text);
}

// Returns the button, switch or the like with a text. If there are several, the topmost one.
function control(root, text) {
    return visibleItems(root).reverse().find(item => item.text === text
                                                     && typeof item.clicked === "function");
}

// Returns the part of an item that is not clipped.
function seenPart(root, item) {
    let seen = item.mapToItem(root, 0, 0, item.width, item.height);
    for (let clip = item; clip && clip !== root.parent; clip = clip.parent) {
        if (clip.clip || clip === root) {
            const part = clip.mapToItem(root, 0, 0, clip.width, clip.height);
            const left = Math.max(seen.x, part.x);
            const top = Math.max(seen.y, part.y);
            seen = Qt.rect(left, top, Math.min(seen.x + seen.width, part.x + part.width) - left,
                           Math.min(seen.y + seen.height, part.y + part.height) - top);
        }
    }
    return seen;
}

// Returns the first mistake in the layout, or an empty text.
function flaw(root) {
    const all = texts(root);
    for (const text of all) {
        if (text.mayBeCut) {
            continue;
        }
        const name = '"' + text.text + '"';
        if (text.truncated || text.contentWidth > text.width + 1) {
            return name + " is cut off";
        }
        const whole = text.mapToItem(root, 0, 0, text.width, text.height);
        if (whole.x < 0 || whole.x + text.width > root.width + 1) {
            return name + " is not on the screen";
        }
    }
    const parts = all.map(text => seenPart(root, text));
    for (let i = 0; i < all.length; ++i) {
        for (let j = 0; j < i; ++j) {
            const a = parts[i];
            const b = parts[j];
            const width = Math.min(a.x + a.width, b.x + b.width) - Math.max(a.x, b.x);
            const height = Math.min(a.y + a.height, b.y + b.height) - Math.max(a.y, b.y);
            if (width > 2 && height > 2 && inPopup(root, all[i]) === inPopup(root, all[j])) {
                return '"' + all[i].text + '" overlaps "' + all[j].text + '"';
            }
        }
    }
    return "";
}

// Returns whether an item belongs to a popup. Popups cover other items.
function inPopup(root, item) {
    while (item && item.parent !== root) {
        item = item.parent;
    }
    return item !== null && /Overlay/.test(item.toString());
}

// Returns a text without translation, which shows as its identifier, or an empty text.
function untranslated(root) {
    const text = texts(root).find(item => /^(gallery|settings_location)-/.test(item.text));
    return text ? text.text : "";
}
