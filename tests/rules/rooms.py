# SPDX-License-Identifier: Apache-2.0
"""The rooms of the house as CMake declares them: the one map, which the checks of includes and of the docs read."""
import dataclasses
import pathlib
import re

# These stand outside the house: they may look into every room, and no room may look into them.
OUTSIDE = ("tests", "fuzz", "bench")

CALL = re.compile(r"probeview_(room|program)\(([^)]*)\)")
COMMENT = re.compile(r"#[^\n]*")
WORDS = ("SOURCES", "KNOWS", "LINKS")


@dataclasses.dataclass
class Room:
    name: str
    folder: str
    is_program: bool
    sources: set[str] = dataclasses.field(default_factory=set)
    knows: set[str] = dataclasses.field(default_factory=set)

    def __str__(self) -> str:
        return f"the program {self.name}" if self.is_program else self.name


class House:
    """All rooms and programs below a folder, and which file belongs to which of them."""

    def __init__(self, root: pathlib.Path):
        self.root = root
        self.rooms: dict[str, Room] = {}
        self.programs: dict[str, Room] = {}
        self.faults: list[str] = []
        for path in product_files(root, ("CMakeLists.txt",)):
            self._read(path)
        self._owner: dict[str, Room] = {}
        for room in [*self.rooms.values(), *self.programs.values()]:
            for source in sorted(room.sources):
                if source in self._owner:
                    self.faults.append(f"{source}: belongs to {self._owner[source]} and to {room}; a file has one room")
                else:
                    self._owner[source] = room

    def room_of(self, path: str) -> Room | None:
        """Whoever names the file, or the source of the same name; the rest is the room's that is named as the folder
        or is alone there."""
        stem = path.rpartition(".")[0]
        owner = self._owner.get(path) or self._owner.get(f"{stem}.cpp")
        if owner is not None:
            return owner
        folder = path.rpartition("/")[0]
        here = {room.name: room for room in self.rooms.values() if room.folder == folder}
        return here.get(folder.rpartition("/")[2]) or (next(iter(here.values())) if len(here) == 1 else None)

    def _read(self, path: pathlib.Path):
        where = path.relative_to(self.root).as_posix()
        folder = path.parent.relative_to(self.root).as_posix()
        for kind, body in CALL.findall(COMMENT.sub("", path.read_text(encoding="utf-8"))):
            name, *words = body.split()
            if "$" in body.partition("LINKS")[0]:
                self.faults.append(f"{where}: {name}: write out what SOURCES and KNOWS name, so that it can be checked")
            found = self.programs if kind == "program" else self.rooms
            # A program may be declared with a window and without: then it has what both say.
            room = found.setdefault(name, Room(name, folder, kind == "program"))
            if room.folder != folder:
                self.faults.append(f"{where}: {room} is declared in {room.folder}/, too")
            lists: dict[str, list[str]] = {word: [] for word in WORDS}
            current = "SOURCES"
            for word in words:
                if word in WORDS:
                    current = word
                else:
                    lists[current].append(word)
            room.sources.update(f"{folder}/{source}" for source in lists["SOURCES"])
            room.knows.update(lists["KNOWS"])


def product_files(root: pathlib.Path, patterns: tuple[str, ...]) -> list[pathlib.Path]:
    """The files of the house itself: neither what is built, nor hidden, nor outside."""
    found = [path for pattern in patterns for path in root.rglob(pattern)]
    hidden = ("build", *OUTSIDE)
    return sorted(path for path in found
                  if (first := path.relative_to(root).parts[0]) not in hidden and not first.startswith("."))


def circle(rooms: dict[str, Room]) -> list[str]:
    """The names of rooms that know each other in a circle, the first again as the last; empty when there is none."""
    done: set[str] = set()

    def search(name: str, way: list[str]) -> list[str]:
        if name in way:
            return [*way[way.index(name):], name]
        if name in done or name not in rooms:
            return []
        for known in sorted(rooms[name].knows):
            found = search(known, [*way, name])
            if found:
                return found
        done.add(name)
        return []

    for name in sorted(rooms):
        found = search(name, [])
        if found:
            return found
    return []
