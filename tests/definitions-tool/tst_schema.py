#!/usr/bin/python3
# SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
# SPDX-License-Identifier: BSD-3-Clause
"""The JSON Schema and the checker judge alike.

usage: tst_schema.py SCHEMA CORPUS EXAMPLES
"""

import json
import pathlib
import re
import sys

import jsonschema

# The rules that a schema cannot express: duplicates, and the contents of other files.
BEYOND = re.compile(r"\[(repeated-key|duplicate-path|text-id|translation)\]$| is not installed in ")

schema = json.loads(pathlib.Path(sys.argv[1]).read_text())
jsonschema.Draft7Validator.check_schema(schema)
validator = jsonschema.Draft7Validator(schema)
compared = {True: 0, False: 0}
failed = False


def fail(text):
    global failed
    failed = True
    print("FAILED:", text)


corpus = pathlib.Path(sys.argv[2])
findings = (corpus / "eventswidgetsfile.findings").read_text().splitlines()
for path in sorted((corpus / "eventswidgetsfile").iterdir()):
    rules = {
        finding.rpartition("[")[2].rstrip("]")
        for finding in findings
        if finding.startswith(f"{path.name}:") and not BEYOND.search(finding)
    }
    try:
        value = json.loads(path.read_bytes().decode("utf-8-sig"), strict=False)
    except (ValueError, RecursionError):
        if rules != {"json"}:
            fail(f"{path.name} is not JSON")
        continue
    valid = validator.is_valid(value)
    compared[valid] += 1
    if valid != (not rules):
        fail(f"{path.name}: valid is {valid}, but the findings are {rules}")

for path in sorted(pathlib.Path(sys.argv[3]).glob("*.json")):
    for error in validator.iter_errors(json.loads(path.read_text())):
        fail(f"{path.name}: {error.message}")

print(f"{compared[True]} valid, {compared[False]} not")
if min(compared.values()) < 15:
    fail("too few to compare")
sys.exit(failed)
