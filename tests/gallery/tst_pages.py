#!/usr/bin/python3
# SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
# SPDX-License-Identifier: BSD-3-Clause
#
# usage: tst_pages.py SOURCES
#
# Checks the list of the gallery's pages: each type of plugins.qmltypes has a page that uses it,
# each page has its panel and its picture in the reference, and every such file belongs to a page.

import pathlib
import re
import sys

sources = pathlib.Path(sys.argv[1])
gallery = sources / "gallery"
failures = []

types = set(re.findall(r'exports: \["[\w.]+/(\w+) ', (sources / "plugin/plugins.qmltypes").read_text()))
listed = (gallery / "Pages.qml").read_text()
pages = re.findall(r'\{ name: "([\w-]+)", file: "(\w+)Page\.qml",\s+type: "(\w+)"', listed)
if not types or not pages or len(pages) != len(re.findall(r"\bname:", listed)):
    failures.append("the lists cannot be read")

for name in sorted(types ^ {used for _, _, used in pages}):
    where = "Pages.qml" if name in types else "plugins.qmltypes"
    failures.append(f"{name} is missing in {where}")
for _, file, used in pages:
    page = gallery / f"pages/{file}Page.qml"
    if page.exists() and not re.search(rf"\b{used}( \{{|\.)", page.read_text()):
        failures.append(f"{page.name} does not use {used}")


def compare(directory, pattern, expected):
    found = {path.name for path in (sources / directory).glob(pattern)}
    failures.extend(f"{directory}/{name} is missing" for name in sorted(expected - found))
    failures.extend(f"{directory}/{name} belongs to no page" for name in sorted(found - expected))


compare("gallery/pages", "*.qml", {f"{file}Page.qml" for _, file, _ in pages})
compare("gallery/simulations", "*.qml", {f"{file}Simulation.qml" for _, file, _ in pages})
compare("docs/images", "gallery-*.png", {f"gallery-{name}.png" for name, _, _ in pages}
        | {"gallery-start.png"})

for failure in failures:
    print("FAILED:", failure)
print(f"{len(types)} types, {len(pages)} pages")
sys.exit(1 if failures else 0)
