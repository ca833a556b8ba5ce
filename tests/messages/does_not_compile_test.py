# SPDX-License-Identifier: Apache-2.0
"""Rows that the table of metrics must refuse: each is tried in a copy of it by the compiler, as in the build.

does_not_compile_test.py COMPILE_COMMANDS [TEST…]
"""

import json
import pathlib
import re
import shlex
import subprocess
import sys
import tempfile
import unittest

TOP = pathlib.Path(__file__).resolve().parents[2]
COMMANDS = pathlib.Path(sys.argv.pop(1))
TABLE = (TOP / "messages/metrics.inc").read_text("utf-8")
# The next free places: every row has a tag, and all but those without a class have a dictionary.
TAGS = len(re.findall(r"^METRIC", TABLE, re.MULTILINE))
PLACES = TAGS - len(re.findall(r"^METRIC_WITHOUT_CLASS", TABLE, re.MULTILINE))


def compiled(source, row):
    """What the compiler says of the source when the table of metrics has one more row; empty if it compiles."""
    entry = next(entry for entry in json.loads(COMMANDS.read_text("utf-8")) if entry["file"] == str(TOP / source))
    command = shlex.split(entry["command"])
    del command[command.index("-o"):command.index("-o") + 2]
    with tempfile.TemporaryDirectory() as folder:
        table = pathlib.Path(folder) / "messages/metrics.inc"
        table.parent.mkdir()
        table.write_text(TABLE.replace("// clang-format on\n", row + "\n// clang-format on\n"), "utf-8")
        first = next(index for index, word in enumerate(command) if word.startswith("-I"))
        done = subprocess.run([*command[:first], f"-I{folder}", *command[first:], "-fsyntax-only"],
                              cwd=entry["directory"], capture_output=True, text=True, check=False)
        return done.stderr if done.returncode != 0 else ""


class MadeUpMetric(unittest.TestCase):
    IDENTIFIERS = "messages/metric_identifiers.cpp"
    TAG_TABLE = "messages/metric_utility.cpp"
    DICTIONARIES = "store/handlers.cpp"

    def row(self, identifier, *, place=PLACES, tag=TAGS):
        return f"METRIC(K_NEVER_TAKEN, {identifier}, KCellularLteRrcState, myNeverTakenDict, {place}, {tag})"

    def test_a_number_that_no_field_has_compiles(self):
        for source in (self.IDENTIFIERS, self.TAG_TABLE, self.DICTIONARIES):
            self.assertEqual(compiled(source, self.row("0x3CD3FF")), "")

    def test_the_number_of_a_field_does_not_compile(self):
        for identifier in ("0x3C0004", "0x3D0013"):
            self.assertIn("the low 16 bits of K_NEVER_TAKEN are the number of a field",
                          compiled(self.IDENTIFIERS, self.row(identifier)))

    def test_the_number_of_another_metric_does_not_compile(self):
        self.assertIn("two metrics share their low 16 bits", compiled(self.TAG_TABLE, self.row("0x3DD30E")))

    def test_a_tags_place_that_is_taken_or_lies_behind_a_free_one_does_not_compile(self):
        self.assertIn("a place is taken twice", compiled(self.TAG_TABLE, self.row("0x3CD3FF", tag=3)))
        self.assertIn("a place lies behind one that is free",
                      compiled(self.TAG_TABLE, self.row("0x3CD3FF", tag=TAGS + 1)))

    def test_a_dictionarys_place_that_is_taken_or_lies_behind_a_free_one_does_not_compile(self):
        self.assertNotEqual(compiled(self.DICTIONARIES, self.row("0x3CD3FF", place=3)), "")
        self.assertIn("a place lies behind one that is free",
                      compiled(self.DICTIONARIES, self.row("0x3CD3FF", place=PLACES + 1)))


if __name__ == "__main__":
    unittest.main()
