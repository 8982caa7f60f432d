#!/usr/bin/python3
# SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
# SPDX-License-Identifier: BSD-3-Clause
"""Writes the definition files of the corpus, and what is found in each.

usage: write.py DIR

The files go to DIR/quickaction and DIR/eventswidgetsfile, which are also what the fuzzers of these
names begin with. DIR/findings has a file for each, empty if nothing is found. The first word of a
name says what is worst: good, warn or bad.
"""

import pathlib
import shutil
import sys


class Corpus:
    def __init__(self, name, suffix):
        self.name = name
        self.suffix = suffix
        self.cases = {}

    def case(self, name, content, *findings):
        """Text is written in UTF-8, and "\\udcff" in it is the byte 0xff."""
        if isinstance(content, str):
            content = content.encode("utf-8", "surrogateescape")
        assert name not in self.cases, name
        self.cases[name] = content, "".join(f"{finding}\n" for finding in findings)

    def write(self, directory):
        for part in self.name, "findings":
            (directory / part).mkdir(parents=True, exist_ok=True)
        for name, (content, findings) in self.cases.items():
            (directory / self.name / (name + self.suffix)).write_bytes(content)
            (directory / "findings" / (name + self.suffix)).write_text(findings, "utf-8")


if __name__ == "__main__":
    sys.dont_write_bytecode = True
    sys.modules["write"] = sys.modules["__main__"]
    import eventswidgets
    import quickactions

    target = pathlib.Path(sys.argv[1])
    shutil.rmtree(target, ignore_errors=True)
    quickactions.corpus.write(target)
    eventswidgets.corpus.write(target)
