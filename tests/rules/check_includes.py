#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Fails when an include goes the wrong way through the house, or when the map of its rooms is not true.

Which room knows which is said once, by KNOWS in each room's CMakeLists.txt. A room may include the headers of the rooms
that it names itself, though it links more: what a room depends on is to be seen where the room is declared.

  tests/rules/check_includes.py [--mend] [FOLDER]     the tree to look at; this one unless told. With --mend the table
                                                      of rooms for readers is made to say what the build says.
"""
import pathlib
import re
import sys

import rooms

# What only one may know: toolkits stay behind their front, libraries that take the compiler seconds in one file each,
# locks and threads in platform.
OWNED = [
    (re.compile(r"<(Q[A-Z]\w*|Qt\w+)(/\w+)?>"), {"ui_qt"}, "Qt"),
    (re.compile(r"<(ncursesw?/)?(n?curses|panel)\.h>"), {"ui_terminal"}, "ncurses"),
    (re.compile(r"<(mutex|thread|shared_mutex|condition_variable|future|semaphore|latch|barrier)>"), {"platform"},
     "threads and locks"),
    (re.compile(r"<CLI/.*>"), {"command_line"}, "CLI11"),
    (re.compile(r"<toml\+\+/.*>"), {"configuration"}, "toml++"),
]
TABLE = "docs/architecture.md"

INCLUDE = re.compile(r'^\s*#\s*include\s*([<"][^>"]+[>"])')
ROW = re.compile(r"^\| `(\w+)` \| `[\w/]+/` \| (.*) \| [^|]* \|$")


def check_map(house: rooms.House) -> list[str]:
    faults = list(house.faults)
    for room in [*house.rooms.values(), *house.programs.values()]:
        for known in sorted(room.knows - house.rooms.keys()):
            faults.append(f"{room.folder}/CMakeLists.txt: {room} knows {known}, and there is no such room")
    way = rooms.circle(house.rooms)
    if way:
        faults.append(f"rooms know each other in a circle: {' -> '.join(way)}")
    return faults


def row_of(room: rooms.Room, what_for: str) -> str:
    knows = " ".join(f"`{known}`" for known in sorted(room.knows)) or "–"
    return f"| `{room.name}` | `{room.folder}/` | {what_for} | {knows} |"


def check_table(house: rooms.House, mend: bool) -> list[str]:
    """The table of rooms for readers says what CMake says; mended, but for rows that are missing or too many."""
    path = house.root / TABLE
    lines = path.read_text(encoding="utf-8").splitlines()
    faults = []
    seen = set()
    for index, line in enumerate(lines):
        match = ROW.match(line)
        if match is None:
            continue
        name = match.group(1)
        seen.add(name)
        if name not in house.rooms:
            faults.append(f"{TABLE}:{index + 1}: there is no room {name}")
            continue
        right = row_of(house.rooms[name], match.group(2))
        if mend:
            lines[index] = right
        elif line != right:
            faults.append(f"{TABLE}:{index + 1}: should be: {right} (tests/rules/check --mend)")
    for name in sorted(house.rooms.keys() - seen):
        faults.append(f"{TABLE}: has no row {row_of(house.rooms[name], 'what it is for')}")
    if mend:
        path.write_text("\n".join(lines) + "\n", encoding="utf-8")
    return faults


def included(path: pathlib.Path) -> list[tuple[int, str]]:
    lines = path.read_text(encoding="utf-8", errors="replace").splitlines()
    return [(number, match.group(1)) for number, line in enumerate(lines, 1) if (match := INCLUDE.match(line))]


def check_files(house: rooms.House) -> tuple[list[str], int]:
    faults = []
    files = rooms.product_files(house.root, ("*.h", "*.cpp", "*.inc"))
    used: dict[str, set[str]] = {}
    for path in files:
        relative = path.relative_to(house.root).as_posix()
        room = house.room_of(relative)
        if room is None:
            faults.append(f"{relative}: lies in no room; name it in SOURCES of the room that it belongs to")
            continue
        for number, target in included(path):
            where = f"{relative}:{number}"
            for pattern, owners, what in OWNED:
                if pattern.fullmatch(target) and room.name not in owners:
                    faults.append(f"{where}: {what} may be included only in {', '.join(sorted(owners))}")
            if target[0] != '"' or target.endswith('.moc"'):
                continue
            name = target.strip('"')
            if name.split("/")[0] in rooms.OUTSIDE:
                faults.append(f"{where}: {room} may not know {name.split('/')[0]}")
                continue
            other = house.room_of(name)
            if other is None or not (house.root / name).is_file():
                faults.append(f"{where}: {name} is no file of any room; includes are written from the top of the tree")
            elif other is not room:
                used.setdefault(str(room), set()).add(other.name)
                if other.is_program or other.name not in room.knows:
                    faults.append(f"{where}: {room} may not know {other}")
    for room in [*house.rooms.values(), *house.programs.values()]:
        for known in sorted(room.knows - used.get(str(room), set())):
            faults.append(f"{room.folder}/CMakeLists.txt: {room} names {known} under KNOWS and includes nothing of it")
    return faults, len(files)


def main() -> int:
    arguments = [argument for argument in sys.argv[1:] if argument != "--mend"]
    root = pathlib.Path(arguments[0]) if arguments else pathlib.Path(__file__).resolve().parents[2]
    house = rooms.House(root.resolve())
    faults, seen = check_files(house)
    faults = check_map(house) + check_table(house, "--mend" in sys.argv) + faults
    for fault in faults:
        print(fault, file=sys.stderr)
    if not seen:
        print("no file was checked: the check itself is broken", file=sys.stderr)
        return 1
    print(f"includes: {seen} files in {len(house.rooms)} rooms checked, {len(faults)} faults")
    return 1 if faults else 0


if __name__ == "__main__":
    sys.exit(main())
