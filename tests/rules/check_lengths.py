#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Fails when a file that people read as a whole has more lines than one can keep in mind: then it holds two things.

  tests/rules/check_lengths.py [FOLDER]     the tree to look at; this one unless told
"""
import pathlib
import sys

MOST_LINES = 400
# Tests are read one at a time.
NOT_READ_WHOLE = ("build", "tests")
# Neither read nor written by hand.
DATA = (".bin", ".csv", ".json", ".log", ".png", ".svg", ".toml")
EXCEPTED = {
    "docs/metrics.md": "written by metrics_page",
    "schema/lte.proto": "a published schema, one file for each family, as others compile it",
}


def long_files(root: pathlib.Path) -> dict[str, int]:
    found = {}
    for path in sorted(root.rglob("*")):
        parts = path.relative_to(root).parts
        if parts[0] in NOT_READ_WHOLE or parts[0].startswith(".") or not path.is_file() or path.suffix in DATA:
            continue
        content = path.read_bytes()
        if b"\0" not in content and content.count(b"\n") > MOST_LINES:
            found["/".join(parts)] = content.count(b"\n")
    return found


def main() -> int:
    root = pathlib.Path(sys.argv[1]) if len(sys.argv) > 1 else pathlib.Path(__file__).resolve().parents[2]
    found = long_files(root)
    faults = [f"{name}: {lines} lines, and {MOST_LINES} are the most: split it by what it is about"
              for name, lines in found.items() if name not in EXCEPTED]
    faults += [f"{name}: is excepted from the most lines and needs it no more; take it out of check_lengths.py"
               for name in EXCEPTED if (root / name).exists() and name not in found]
    for fault in faults:
        print(fault, file=sys.stderr)
    return 1 if faults else 0


if __name__ == "__main__":
    sys.exit(main())
