#!/usr/bin/python3
# SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
# SPDX-License-Identifier: BSD-3-Clause
#
# usage: tst_reference.py SOURCES INDEX
#
# Checks that the documentation covers plugins.qmltypes: each type, each of its members and each
# enumeration value has an entry in the reference, each type an example and a picture, and the table in
# the README lists each type. INDEX is the index file that qdoc writes.

import collections
import pathlib
import re
import sys
import xml.etree.ElementTree

sources, index = map(pathlib.Path, sys.argv[1:])
failures = []


def module_types():
    """The members and enumeration values of each exported type, with those it inherits."""
    own = {}
    text = (sources / "plugin/plugins.qmltypes").read_text()
    for component in text.split("\n    Component {")[1:]:
        members = set(re.findall(r'(?:Property|Signal|Method) \{\s*name: "(\w+)"', component))
        values = re.findall(r'"(\w+)": -?\d+', component)
        name = re.search(r'name: "(\w+)"', component)[1]
        prototype = re.search(r'prototype: "(\w+)"', component)
        exported = re.search(r'exports: \["[\w.]+/(\w+) ', component)
        own[name] = (members, values, prototype and prototype[1], exported and exported[1])
    types = {}
    for members, values, base, exported in own.values():
        while exported and base in own and not base.startswith("Q"):
            members = members | own[base][0]
            values = values + own[base][1]
            base = own[base][2]
        if exported:
            types[exported] = (members, values)
    return types


def documented_members():
    """The members of each type in the reference."""
    documented = collections.defaultdict(set)
    for page in xml.etree.ElementTree.parse(index).iter():
        # Newer versions of qdoc name the element after the current term for a QML type.
        if page.tag in ("qmlclass", "qmltype"):
            documented[page.get("name")] |= {member.get("name") for member in page}
    return documented


types = module_types()
documented = documented_members()
if len(types) == 0 or len(documented) == 0:
    failures.append("no type was found")
for name in sorted(set(types) ^ set(documented)):
    where = "the reference" if name in types else "plugins.qmltypes"
    failures.append(f"{name} is missing in {where}")

pages = "".join(path.read_text() for path in sources.glob("*/*.cpp"))
for name, (members, values) in types.items():
    for member in sorted(members - documented[name]):
        failures.append(f"{name}.{member} is not documented")
    for value in values:
        if f"\\value {name}.{value} " not in pages:
            failures.append(f"{name}.{value} is not documented")
comments = {re.search(r"\\qmltype (\w+)", comment)[1]: comment
            for comment in re.findall(r"/\*!(?:(?!\*/).)*\\qmltype (?:(?!\*/).)*\*/", pages, re.DOTALL)}
for name in types:
    for what, command in (("example", r"\\qml$"), ("picture", r"\\image gallery-[\w-]+\.png ")):
        if not re.search(command, comments.get(name, ""), re.MULTILINE):
            failures.append(f"the reference has no {what} for {name}")

# The template of the catalog has the texts that the module itself shows.
used = set()
for path in sources.glob("*/*.cpp"):
    if path.parent.name not in ("definitions-tool", "fuzz", "gallery", "tests"):
        used |= {(id, text) for text, id in re.findall(
            r'(?://% "(.*)"\n\s*)?.*\bqtTrId\("(.*?)"\)', path.read_text())}
template = xml.etree.ElementTree.parse(sources / "docs/settings-system_eng_en.ts")
for field in "source", "translation":
    texts = {(message.get("id"), message.find(field).text) for message in template.iter("message")}
    if texts != used:
        failures.append(f"the catalog's template has {texts} instead of {used}")

readme = (sources / "README.md").read_text()
for name in types:
    if not re.search(rf"^\|.*`{name}`", readme, re.MULTILINE):
        failures.append(f"the table in README.md does not list {name}")

for failure in failures:
    print("FAILED:", failure)
print(f"{len(types)} types, {sum(len(members) for members, values in types.values())} members")
sys.exit(1 if failures else 0)
