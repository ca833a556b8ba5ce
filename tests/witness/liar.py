#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Stands in for probectl: answers from the model but for one lie, so that the comparison can show that it finds it."""

import json
import os
import sys

sys.path.insert(0, os.path.dirname(os.path.abspath(__file__)))

import compare
import generator
from model import store, tables
from model.text import Real


def written(value):
    if isinstance(value, Real):
        return value.digits
    if isinstance(value, dict):
        return "{" + ",".join(json.dumps(key) + ":" + written(part) for key, part in value.items()) + "}"
    return "[" + ",".join(map(written, value)) + "]" if isinstance(value, list) else json.dumps(value)


def bytes_of(text):
    return bytes.fromhex("" if text == "-" else text)


def decode(lines):
    """The lie: field 19 is an unknown field like any other."""
    del tables.METRIC_TAGS[19]
    identifiers = {number: handler[0] for number, handler in store.HANDLERS.items()}
    for line in lines:
        try:
            name, payload = line.split()
            name = name if name in tables.MESSAGES else identifiers[int(name, 0)]
            yield compare.expected_decode(name, bytes_of(payload))
        except (KeyError, ValueError):
            yield {"error": "nonsense"}


def tell(lines):
    """The lie: a carrier's RSRQ is not in hundredths of a dB."""
    carriers = store.HANDLERS[0x3CD313][2]
    carriers[-1] = store.collect("scc_list", "LTE", "CAStatusList", dl_bandwidth=store.megahertz, rsrp=store.over(100),
                                 rssi=store.over(100))
    commands = []
    for line in lines:
        verb, *arguments = line.split()
        if line in generator.NONSENSE:
            commands.append(("nonsense", line))
        elif verb == "page":
            commands.append((verb, line[len("page "):]))
        elif verb == "event":
            number, payload = arguments
            commands.append((verb, None if number == "none" else int(number, 0),
                             None if payload == "none" else [bytes_of(payload)]))
        else:
            commands.append((verb, *arguments))
    return compare.Told(commands, os.environ["TZ"]).answers


if __name__ == "__main__":
    questions = [line for line in sys.stdin.read().splitlines() if line and not line.startswith("#")]
    answers = list((decode if sys.argv[1] == "decode" else tell)(questions))
    for answer in answers:
        print(written(answer))
    sys.exit(3 if answers and "fatal" in answers[-1] else 0)
