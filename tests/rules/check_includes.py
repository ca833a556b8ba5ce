#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Fails when an include goes the wrong way through the house: which room may know which is written here, once."""
import pathlib
import re
import sys

ROOT = pathlib.Path(__file__).resolve().parents[2]

# Room: the rooms whose headers it may include. Longest folder first wins.
ROOMS = {
    "values": set(),
    "messages/runtime": {"values"},
    "messages": {"values", "messages/runtime"},
    "platform": {"values"},
    "radix": {"values", "platform", "messages/runtime"},
    "client": {"values", "platform", "radix"},
    "store": {"values", "platform", "messages/runtime", "messages", "client", "radix"},
    "ui": {"values", "platform", "store", "client"},
    "ui/terminal": {"values", "platform", "ui"},
    "ui/qt": {"values", "platform", "ui"},
    "app": {"values", "platform", "messages/runtime", "messages", "radix", "client", "store", "ui", "ui/qt", "ui/terminal"},
    "source": {"values", "platform", "radix"},
    "scenario": {"values", "platform", "messages/runtime", "messages", "source"},
    "service": {"values", "platform", "messages/runtime", "messages", "radix", "source", "service/sources"},
    "service/sources": {"values", "platform", "messages/runtime", "messages", "source", "scenario"},
    "schema": {"values", "messages/runtime", "messages"},
}
# These stand outside the house and may look into every room.
OUTSIDE = {"tools", "tests", "fuzz", "bench"}

# What only one room may know: toolkits stay behind their front, locks and threads stay in platform.
OWNED = [
    (re.compile(r"<(Q[A-Z]\w*|Qt\w+)(/\w+)?>"), {"ui/qt", "tests", "bench"}, "Qt"),
    (re.compile(r"<(ncursesw?/)?(n?curses|panel)\.h>"), {"ui/terminal"}, "ncurses"),
    (re.compile(r"<(mutex|thread|shared_mutex|condition_variable|future|semaphore|latch|barrier)>"),
     {"platform", "tests", "bench"}, "threads and locks"),
]

INCLUDE = re.compile(r'^\s*#\s*include\s*([<"][^>"]+[>"])')


def room_of(path: str) -> str | None:
    parts = path.split("/")
    for length in range(len(parts) - 1, 0, -1):
        name = "/".join(parts[:length])
        if name in ROOMS or name in OUTSIDE:
            return name
    return None


def main() -> int:
    faults = []
    files = [path for suffix in ("*.h", "*.cpp", "*.inc") for path in ROOT.rglob(suffix)]
    seen = 0
    for path in sorted(files):
        relative = path.relative_to(ROOT).as_posix()
        if relative.startswith(("build/", ".")):
            continue
        room = room_of(relative)
        if room is None:
            faults.append(f"{relative}: lies in no room that is known; name the room in {pathlib.Path(__file__).name}")
            continue
        seen += 1
        for number, line in enumerate(path.read_text(errors="replace").splitlines(), 1):
            match = INCLUDE.match(line)
            if not match:
                continue
            target = match.group(1)
            for pattern, owners, what in OWNED:
                if pattern.fullmatch(target) and room not in owners and room.split("/")[0] not in owners:
                    faults.append(f"{relative}:{number}: {what} may be included only in {', '.join(sorted(owners))}")
            if target[0] != '"' or room in OUTSIDE:
                continue
            other = room_of(target.strip('"'))
            if other is None or other == room:
                continue
            if other in OUTSIDE or other not in ROOMS[room]:
                faults.append(f"{relative}:{number}: {room} may not know {other}")
    for fault in faults:
        print(fault, file=sys.stderr)
    if not seen:
        print("no file was checked: the check itself is broken", file=sys.stderr)
        return 1
    print(f"includes: {seen} files checked, {len(faults)} faults")
    return 1 if faults else 0


if __name__ == "__main__":
    sys.exit(main())
