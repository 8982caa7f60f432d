// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause
.pragma library

// How pages show the rows of the models.

// The URL of an icon or of a widget. A definition file has an absolute path, or for an icon a URL such
// as image://theme/name.
function url(value) {
    return /^\//.test(value) ? "file://" + encodeURI(value).replace(/[?#]/g, encodeURIComponent)
                             : value || "";
}

// The title of a row. A row without one shows the name of its file. A row that is being removed has
// neither.
function title(title, path) {
    return title || (path || "").replace(/^.*\//, "");
}
