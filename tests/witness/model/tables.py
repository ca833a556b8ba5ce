# SPDX-License-Identifier: Apache-2.0
"""What there is of metrics, pages and messages, read from second_opinion.table."""

import pathlib
from typing import NamedTuple


class Metric(NamedTuple):
    constant: str
    message: str
    dictionary: str
    prefix: str  # of its line in the log


class Page(NamedTuple):
    key: str
    rule: str  # "all" or "first" entries of a dictionary; empty for a page of something else
    dictionary: str


class Field(NamedTuple):
    number: int
    key: str
    kind: str  # the single form: "uint32" for "uint32s"
    repeated: bool
    detail: str  # the class of a nested message, the name of the choices of an enumeration


def _field(number, key, kind, detail=""):
    repeated = kind in ("uint32s", "sint32s", "messages")
    return Field(number, key, kind[:-1] if repeated else kind, repeated, detail)


class Tables:
    def __init__(self, text):
        self.messages, self.choices, self.metrics, self.left_alone, self.tags = {}, {}, {}, {}, {}
        self.dictionaries, self.pages, self.cells = [], [], []
        self.rows, self.row = {}, None
        for line in text.splitlines():
            if words := line.partition("#")[0].split():
                self.read(words[0], words[1:], line)

    def read(self, kind, words, line):
        match kind:
            case "metric":
                self.metrics[int(words[1], 16)] = Metric(words[0], words[2], words[3], line.split('"')[1])
            case "left-alone":
                self.left_alone[words[0]] = int(words[1], 16)
            case "dictionary":
                self.dictionaries += words
            case "tag":
                self.tags[int(words[0], 16)] = words[1]
            case "page":
                technology, category, *shown = " ".join(words).split(" | ")
                self.pages.append(self.page(technology + " " + category, shown))
            case "cells":
                key, *shown = " ".join(words).split(" | ")
                self.cells.append(self.page(key, shown))
            case "message":
                self.rows, self.row = self.messages.setdefault(words[0], {}), _field
            case "choices":
                self.rows, self.row = self.choices.setdefault(words[0], {}), lambda number, name: name
            case number:
                assert int(number) not in self.rows, line
                self.rows[int(number)] = self.row(int(number), *words)

    @staticmethod
    def page(key, shown):
        return Page(key, *(shown[0].split() if shown else ("", "")))


TABLES = Tables(pathlib.Path(__file__).with_name("second_opinion.table").read_text("utf-8"))
MESSAGES, CHOICES = TABLES.messages, TABLES.choices

# Field numbers that the decoder takes for a metric identifier, with the name each has in the decoder's own table.
METRIC_TAGS = TABLES.tags
