#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Lets the program and the reference model decode and store the same random events, and compares every answer.

    compare.py --probectl build/dev/bin/probectl [--decodes N] [--sessions N] [--events N] [--seed S]

A difference ends with status 1 and prints the seed and the smallest case found; running again with that seed repeats it.
"""

import argparse
import json
import os
import random
import subprocess
import sys

import model
from tables import MESSAGES, METRIC_TAGS, METRICS, UNHANDLED

# --- random payloads --------------------------------------------------------------------------------------------------

INTERESTING = [0, 1, 2, 3, 5, 6, 11, 100, 127, 128, 255, 256, 2**31 - 141, 2**31 - 1, 2**31, 2**32 - 1, 2**32, 2**63, 2**64 - 1]
# Within a few hours of both changes to summer time and back, and far out.
TIMES = [0, 999, 1711846799999, 1711846800000, 1729990799999, 1729990800000, 2**53, 2**63, 2**64 - 1]


def padded_varint(value, rng):
    """A varint, now and then longer than need be, rarely one that does not end in ten bytes."""
    out = bytearray(model.write_varint(value))
    if rng.random() < 0.03:
        while len(out) < rng.randint(2, 10):
            out[-1] |= 128
            out.append(0)
    if rng.random() < 0.01:
        return bytes([255] * 10)
    return bytes(out)


def random_number(rng):
    choice = rng.random()
    if choice < 0.5:
        return rng.randint(0, 200)
    if choice < 0.7:
        return rng.choice(INTERESTING)
    return rng.getrandbits(rng.choice((16, 31, 32, 40, 64)))


def random_scalar(kind, key, rng):
    if key == "timestamp":
        return rng.choice(TIMES) if rng.random() < 0.2 else rng.randint(0, 4 * 10**12)
    if kind == "sint32" and rng.random() < 0.8:
        # Values that arithmetic can take, unless it is to overflow.
        return rng.randint(0, 30000)
    return random_number(rng)


def random_bytes(rng, length=None):
    return bytes(rng.getrandbits(8) for _ in range(rng.choice((0, 1, 3, 8, 31, 40)) if length is None else length))


def random_text(rng):
    alphabet = ["internet", "ims", '"', "\\", "\n", "\t", "\0", "\x1f", "\x7f", "ü", "€", "😀", " ", ":", ", "]
    text = "".join(rng.choice(alphabet) for _ in range(rng.randint(0, 6))).encode()
    return text + (random_bytes(rng) if rng.random() < 0.15 else b"")


def record(number, content, rng):
    return padded_varint(number * 8 + 2, rng) + padded_varint(len(content), rng) + content


def random_field(number, key, kind, rng, depth):
    if kind == "bytes":
        return record(number, random_bytes(rng), rng)
    if kind == "string":
        return record(number, random_text(rng), rng)
    if isinstance(kind, tuple) and kind[0] in ("message", "messages"):
        count = 1 if kind[0] == "message" else rng.choice((1, 1, 2, 3, 8))
        return b"".join(record(number, random_payload(kind[1], rng, depth + 1), rng) for _ in range(count))
    if isinstance(kind, tuple) and kind[0] == "packed":
        numbers = [random_scalar(kind[1], key, rng) for _ in range(rng.randint(0, 5))]
        if rng.random() < 0.5:
            return record(number, b"".join(padded_varint(value, rng) for value in numbers), rng)
        return b"".join(padded_varint(number * 8, rng) + padded_varint(value, rng) for value in numbers)
    if isinstance(kind, tuple):
        names = list(model.ENUMERATIONS[kind[1]])
        value = rng.choice(names) if rng.random() < 0.8 else random_number(rng)
    else:
        value = random_scalar(kind, key, rng)
    # For a known scalar the wire type does not matter.
    wire_type = 0 if rng.random() < 0.97 else rng.choice((0, 1, 2, 3, 5, 6, 7))
    return padded_varint(number * 8 + wire_type, rng) + padded_varint(value, rng)


def foreign_field(name, rng):
    """A field that the message does not know: skipped, dropped as a metric identifier, or the end of all."""
    known = {number for number, _, _ in MESSAGES[name]}
    choice = rng.random()
    if choice < 0.3:
        return model.write_varint(rng.choice(sorted(METRIC_TAGS)) * 8 + rng.choice((0, 0, 2, 5))) + padded_varint(random_number(rng), rng)
    number = rng.choice([number for number in (0, 6, 13, 35, 63, 64, 100, 2047, 65535, 65536 + 70) if number % 65536 not in known])
    if choice < 0.55:
        return model.write_varint(number * 8) + padded_varint(random_number(rng), rng)
    if choice < 0.75:
        return record(number, random_bytes(rng), rng)
    if choice < 0.85:
        return model.write_varint(number * 8 + 1) + random_bytes(rng, 8)
    if choice < 0.95:
        return model.write_varint(number * 8 + 5) + random_bytes(rng, 4)
    # Field numbers beyond 16 bits wrap around to a known one.
    return model.write_varint((65536 + rng.choice(sorted(known))) * 8) + padded_varint(random_number(rng), rng)


def random_payload(name, rng, depth=0):
    fields = [field for field in MESSAGES[name] if rng.random() < 0.7]
    if rng.random() < 0.3:
        rng.shuffle(fields)
    parts = [random_field(number, key, kind, rng, depth) for number, key, kind in fields]
    if parts and rng.random() < 0.15:
        parts.append(rng.choice(parts))
    if rng.random() < 0.2:
        parts.insert(rng.randint(0, len(parts)), foreign_field(name, rng))
    if rng.random() < 0.02:
        parts.insert(rng.randint(0, len(parts)), model.write_varint(rng.randint(0, 40) * 8 + 4))
    return b"".join(parts)


def damaged(payload, rng):
    if not payload:
        return payload
    choice = rng.random()
    at = rng.randrange(len(payload))
    if choice < 0.4:
        return payload[:at]
    if choice < 0.8:
        return payload[:at] + bytes([rng.getrandbits(8)]) + payload[at + 1 :]
    return random_bytes(rng, rng.randint(0, 30))


# --- the two sides ----------------------------------------------------------------------------------------------------


class Ordered(tuple):
    """A JSON object whose order counts."""


def comparable(value):
    if isinstance(value, dict):
        return Ordered((key, comparable(entry)) for key, entry in value.items())
    if isinstance(value, list):
        return [comparable(element) for element in value]
    if isinstance(value, bool):
        return ("bool", value)
    if isinstance(value, model.Real):
        return ("real", str(value))
    return value


def first_difference(mine, theirs, path=""):
    """Where two answers part, and what each says there."""
    if isinstance(mine, Ordered) and isinstance(theirs, Ordered) and [k for k, _ in mine] == [k for k, _ in theirs]:
        for (key, left), (_, right) in zip(mine, theirs):
            if left != right:
                return first_difference(left, right, path + "." + key)
    if isinstance(mine, list) and isinstance(theirs, list) and len(mine) == len(theirs):
        for index, (left, right) in enumerate(zip(mine, theirs)):
            if left != right:
                return first_difference(left, right, "%s[%d]" % (path, index))
    return "  at %s\n  model:   %r\n  program: %r" % (path or "the whole", mine, theirs)


def ask(probectl, command, lines):
    """The parsed answers, and whether the program stopped with a status other than 0."""
    environment = dict(os.environ, TZ=model.ZONE, LC_ALL="C.UTF-8")
    done = subprocess.run(
        [probectl, command, "--batch"], input="\n".join(lines) + "\n", capture_output=True, env=environment, text=True, timeout=300
    )
    answers = [comparable(json.loads(line, parse_float=model.Real)) for line in done.stdout.splitlines()]
    return answers, done.returncode


def hexadecimal(payload):
    return payload.hex() if payload else "-"


def expected_decode(name, payload):
    message, fine, log = model.decode(name, payload)
    return {
        "class": name,
        "ok": fine,
        "dict": model.as_json(model.dictionary(name, message)),
        "reencoded": model.encode(name, message).hex(),
        "log": log,
    }


# A session is a list of events: (identifier or None, payload or None). After each, the whole state is asked for.


def session_lines(events):
    lines = []
    for metric, payload in events:
        identifier = "none" if metric is None else str(metric)
        lines.append("event %s %s" % (identifier, "none" if payload is None else hexadecimal(payload)))
        lines.append("state")
    return lines


def expected_session(events):
    """(answers, whether the program stops)"""
    store, answers = model.Store(), []
    for metric, payload in events:
        try:
            result, log, syslog = store.event(metric, payload)
        except model.Stop:
            answers.append({"log": store.log})
            return answers, True
        answers.append({"result": result, "log": log, "syslog": syslog})
        answers.append(store.state())
    return answers, False


def without_reason(answer):
    """The words of a stop are the program's own; that there is one, and what was logged before it, is not."""
    if isinstance(answer, Ordered) and answer and answer[0][0] == "fatal":
        return Ordered(answer[1:])
    return answer


def session_difference(probectl, events):
    expected, stops = expected_session(events)
    answers, status = ask(probectl, "store", session_lines(events))
    if answers and stops and (not isinstance(answers[-1], Ordered) or not answers[-1] or answers[-1][0][0] != "fatal"):
        return "the model stops, the program does not"
    answers = [without_reason(answer) for answer in answers]
    expected = [comparable(answer) for answer in expected]
    if (status != 0) != stops:
        return "exit status %d, while the model says that it %s" % (status, "stops" if stops else "goes on")
    for index, (mine, theirs) in enumerate(zip(expected, answers)):
        if mine != theirs:
            return "answer %d\n%s" % (index, first_difference(mine, theirs))
    if len(answers) != len(expected):
        return "%d answers, %d expected" % (len(answers), len(expected))
    return None


def decode_difference(probectl, cases):
    """The index of the first case that differs, with the difference; None if there is none."""
    answers, status = ask(probectl, "decode", ["%s %s" % (name, hexadecimal(payload)) for name, payload in cases])
    for index, (name, payload) in enumerate(cases):
        mine = comparable(expected_decode(name, payload))
        theirs = answers[index] if index < len(answers) else None
        if mine != theirs:
            return index, first_difference(mine, theirs)
    if status != 0 or len(answers) != len(cases):
        return len(cases) - 1, "exit status %d, %d answers to %d cases" % (status, len(answers), len(cases))
    return None


# --- smallest cases ---------------------------------------------------------------------------------------------------


def shorter(content):
    """Ways to leave something out, the boldest first."""
    size = len(content) // 2
    while size:
        for begin in range(0, len(content), size):
            yield content[:begin] + content[begin + size :]
        size //= 2


def smallest(content, differs):
    found = True
    while found:
        found = False
        for candidate in shorter(content):
            if differs(candidate):
                content, found = candidate, True
                break
    return content


def report(seed, what, lines, difference):
    print("The program and the reference model differ (seed %d), %s:" % (seed, what))
    for line in lines:
        print("  " + line)
    print(difference)
    sys.exit(1)


# --- the comparison ---------------------------------------------------------------------------------------------------


def compare_decoding(probectl, seed, count):
    rng = random.Random(seed)
    names = list(MESSAGES)
    cases = []
    for index in range(count):
        name = names[index % len(names)]
        payload = random_payload(name, rng)
        cases.append((name, damaged(payload, rng) if rng.random() < 0.2 else payload))
    found = decode_difference(probectl, cases)
    if found is None:
        return
    name, payload = cases[found[0]]
    payload = smallest(payload, lambda candidate: decode_difference(probectl, [(name, candidate)]) is not None)
    difference = decode_difference(probectl, [(name, payload)]) or found
    report(seed, "probectl decode --batch", ["%s %s" % (name, hexadecimal(payload))], difference[1])


def random_stored_payload(name, rng):
    """Mostly one that decodes: a session is to go on for a while."""
    while True:
        payload = random_payload(name, rng)
        payload = damaged(payload, rng) if rng.random() < 0.1 else payload
        if rng.random() < 0.02 or model.decode(name, payload)[1]:
            return payload


def random_events(rng, count):
    identifiers = [number for number, _ in METRICS.values()]
    classes = {number: name for number, name in METRICS.values()}
    # A session dwells on few metrics, so that records are replaced and kept.
    chosen = rng.sample(identifiers, rng.randint(1, 6))
    events = []
    for _ in range(count):
        choice = rng.random()
        if choice < 0.03:
            events.append((rng.choice(UNHANDLED + [0, 9, 16, -1, 2**32 + 0x3C4E04, -(2**63)]), b""))
        else:
            metric = rng.choice(chosen)
            events.append((metric, random_stored_payload(classes[metric], rng)))
    if rng.random() < 0.1:
        events.append(rng.choice([(None, b""), (chosen[0], None), (None, None), (chosen[0], b"\x08")]))
    return events


def until_stop(events):
    """The events up to the first that stops the program, that one included."""
    store = model.Store()
    for index, (metric, payload) in enumerate(events):
        try:
            store.event(metric, payload)
        except model.Stop:
            return events[: index + 1]
    return events


def compare_stores(probectl, seed, sessions, count):
    stops = 0
    for index in range(sessions):
        rng = random.Random(seed * 1000003 + index)
        events = until_stop(random_events(rng, count))
        difference = session_difference(probectl, events)
        stops += expected_session(events)[1]
        if difference is None:
            continue
        differs = lambda candidate: session_difference(probectl, candidate) is not None
        events = smallest(events, differs)
        for place, (metric, payload) in enumerate(events):
            if payload:
                with_payload = lambda candidate: events[:place] + [(metric, candidate)] + events[place + 1 :]
                events = with_payload(smallest(payload, lambda candidate: differs(with_payload(candidate))))
        report(seed, "probectl store --batch, session %d" % index, session_lines(events), session_difference(probectl, events))
    return stops


def main():
    parser = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("--probectl", required=True)
    parser.add_argument("--decodes", type=int, default=3000)
    parser.add_argument("--sessions", type=int, default=60)
    parser.add_argument("--events", type=int, default=40, help="per session, at most")
    parser.add_argument("--seed", type=int, default=1)
    arguments = parser.parse_args()
    if arguments.decodes:
        compare_decoding(arguments.probectl, arguments.seed, arguments.decodes)
    stops = compare_stores(arguments.probectl, arguments.seed, arguments.sessions, arguments.events) if arguments.sessions else 0
    print(
        "%d payloads and %d sessions (%d of them to a stop) agree, seed %d"
        % (arguments.decodes, arguments.sessions, stops, arguments.seed)
    )


if __name__ == "__main__":
    main()
