#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Asks probectl and the model the same random questions and compares every answer.

    compare.py PROBECTL decode|sweep|store [--seed N|random] [--count N] [--seconds S] [--zone NAME]
               [--wildness W]

Without --seed, PROBEVIEW_SEED in the environment counts, without both the seed is 1. Ends with status 0 when all
answers agree. On a difference it prints the seed and the smallest case that it could find, and ends with status 1.
"""

import argparse
import json
import os
import random
import subprocess
import sys
import time

sys.path.insert(0, os.path.dirname(os.path.abspath(__file__)))

import generator
from generator import Payloads, Record, flatten
from model import pages, store, wire
from model.clock import Clock
from model.tables import MESSAGES
from model.text import Real, json_form

PATIENCE_SECONDS = 60


class Probectl:
    def __init__(self, path, zone):
        self.command = [sys.executable, "-B", path] if path.endswith(".py") else [path]
        self.environment = os.environ | {"TZ": zone, "LC_ALL": "C.UTF-8"}

    def ask(self, subcommand, lines):
        """The answers as text, the exit status and what stood on standard error."""
        text = "".join(line + "\n" for line in lines).encode()
        try:
            done = subprocess.run([*self.command, subcommand, "--batch"], input=text, capture_output=True,
                                  env=self.environment, timeout=PATIENCE_SECONDS, check=False)
            output, status, complaint = done.stdout, done.returncode, done.stderr.decode("utf-8", "replace")
        except subprocess.TimeoutExpired as silence:
            output, status, complaint = silence.stdout or b"", -1, "silent for %d s" % PATIENCE_SECONDS
        answers = output.decode("utf-8", "backslashreplace").split("\n")
        if answers.pop() != "":
            answers.append("an answer without its line end")
        return answers, status, complaint


# Answers.


def no_key_twice(pairs):
    result = dict(pairs)
    if len(result) != len(pairs):
        raise ValueError("a key stands twice")
    return result


def parsed(answer):
    try:
        return json.loads(answer, parse_float=Real, object_pairs_hook=no_key_twice)
    except ValueError as problem:
        return "no JSON: %s: %s" % (problem, answer)


def same(left, right, ordered=True):
    """Equality that tells true from 1 and knows that the order of entries is a promise."""
    if type(left) is not type(right):
        return False
    if isinstance(left, dict):
        if ordered and list(left) != list(right) or left.keys() != right.keys():
            return False
        return all(same(value, right[key]) for key, value in left.items())
    if isinstance(left, list):
        return len(left) == len(right) and all(map(same, left, right))
    return left == right


def agrees(expected, answer):
    """An error's and a fatal stop's reason are free, everything else is not."""
    if isinstance(expected, dict) and isinstance(answer, dict):
        for free in ("error", "fatal"):
            if free in expected and isinstance(answer.get(free), str):
                answer = answer | {free: expected[free]}
    return same(expected, answer, ordered=False)


def as_json(value):
    def plain(part):
        if isinstance(part, Real):
            return "real " + part.digits
        if isinstance(part, dict):
            return {key: plain(inner) for key, inner in part.items()}
        return [plain(inner) for inner in part] if isinstance(part, list) else part
    return json.dumps(plain(value), ensure_ascii=True)


def parting(wanted, answer, path="answer"):
    """Where two answers part for the first time, for long ones."""
    if isinstance(wanted, dict) and isinstance(answer, dict) and wanted.keys() == answer.keys():
        for key in wanted:
            if not same(wanted[key], answer[key]):
                return parting(wanted[key], answer[key], "%s[%s]" % (path, json.dumps(key)))
        return "%s: the entries have another order" % path
    if isinstance(wanted, list) and isinstance(answer, list) and len(wanted) == len(answer):
        for place, (left, right) in enumerate(zip(wanted, answer)):
            if not same(left, right):
                return parting(left, right, "%s[%d]" % (path, place))
    return "%s: model %s, probectl %s" % (path, as_json(wanted), as_json(answer))


def told_apart(question, wanted, answer):
    whole = "model:    %s\nprobectl: %s\n" % (as_json(wanted), answer)
    return "question: %s\n%sat:       %s" % (
        question, whole if len(whole) < 2000 else "", parting(wanted, parsed(answer)))


class Difference(Exception):
    """An answer that is not the model's, with what leads to it."""


def smaller_trees(nodes):
    """The tree with each node, or a half of the nodes, taken away, and with the same done inside each record."""
    for size in sorted({len(nodes), len(nodes) // 2, len(nodes) // 4, 1}, reverse=True):
        for begin in range(0, len(nodes) if size else 0, size or 1):
            yield nodes[:begin] + nodes[begin + size:]
    for place, node in enumerate(nodes):
        if isinstance(node, Record):
            for inside in smaller_trees(node.nodes):
                yield nodes[:place] + [node.with_nodes(inside)] + nodes[place + 1:]


def smaller_bytes(content):
    size = len(content)
    while size:
        for begin in range(0, len(content), size):
            yield content[:begin] + content[begin + size:]
        size //= 2
    for place, byte in enumerate(content):
        for simpler in (0, 1):
            if byte > simpler:
                yield content[:place] + bytes([simpler]) + content[place + 1:]


def shrink(start, candidates, first_failing):
    """Takes the first smaller case that still fails until there is none."""
    current = start
    while (found := first_failing(list(candidates(current)))) is not None:
        current = found
    return current


# decode --batch


def expected_decode(name, payload):
    log = []
    message, complete = wire.decode(name, payload, log.append)
    return {"class": name, "ok": complete, "dict": json_form(wire.dictionary(message)),
            "reencoded": wire.encode(message).hex(), "log": log}


class DecodeRun:
    BATCH = 1000
    NONSENSE = ["KNoSuchMessage 00", "KCellularLteRrcState", "KCellularLteRrcState 0", "KCellularLteRrcState 0x00",
                "KCellularLteRrcState zz", "0x3C4E25 00", "0 00", "0x3C4E04", "KCellularLteRrcState 00 00",
                "kcellularlterrcstate -", "99999999999999999999 -"]
    SILENT = ["", "# a remark", "#"]

    def __init__(self, probectl, arguments):
        self.probectl = probectl
        self.wildness = arguments.wildness

    def batch(self, rng):
        """Questions, the answers expected and the cases behind them (None where the question is nonsense)."""
        lines, expected, cases = [], [], []
        identifiers = {handler[0]: number for number, handler in store.HANDLERS.items()}
        for _ in range(self.BATCH):
            name = rng.choice(list(MESSAGES))
            nodes = Payloads(rng, self.wildness if self.wildness is not None else rng.choice([0, 0.3, 1])).payload(name)
            payload = flatten(nodes)
            asked = name
            if name in identifiers and rng.random() < 0.5:
                asked = generator.written_id(rng, identifiers[name])
            lines.append(asked + " " + generator.hex_of(rng, payload))
            expected.append(expected_decode(name, payload))
            cases.append((name, nodes))
            if rng.random() < 0.02:
                lines.append(rng.choice(self.NONSENSE))
                expected.append({"error": ""})
                cases.append(None)
            if rng.random() < 0.02:
                lines.append(rng.choice(self.SILENT))
        return lines, expected, cases

    def run(self, rng):
        lines, expected, cases = self.batch(rng)
        answers, status, complaint = self.probectl.ask("decode", lines)
        asked = [line for line in lines if line and not line.startswith("#")]
        for line, wanted, answer, case in zip(asked, expected, answers, cases):
            if not agrees(wanted, parsed(answer)):
                raise Difference(self.explain(line, wanted, answer, case))
        if len(answers) != len(expected) or status != 0:
            lost = min(len(answers), len(expected) - 1)
            raise Difference("%d answers to %d questions, exit status %d %s\n%s" % (
                len(answers), len(expected), status, complaint,
                self.explain(asked[lost], expected[lost], "nothing", cases[lost])))
        return len(expected)

    def explain(self, line, wanted, answer, case):
        if case is None:
            return told_apart(line, wanted, answer)
        name, nodes = case

        def first_failing(payloads):
            if not payloads:
                return None
            contents = [flatten(each) if isinstance(each, list) else each for each in payloads]
            answers, _, _ = self.probectl.ask("decode", [name + " " + (each.hex() or "-") for each in contents])
            for payload, content, reply in zip(payloads, contents, answers):
                if not agrees(expected_decode(name, content), parsed(reply)):
                    return payload
            # A program that ends early ended at the first question without an answer.
            return payloads[len(answers)] if len(answers) < len(payloads) else None

        if first_failing([nodes]) is None:
            return "not seen when asked alone\n" + told_apart(line, wanted, answer)
        content = shrink(flatten(shrink(nodes, smaller_trees, first_failing)), smaller_bytes, first_failing)
        reply = self.probectl.ask("decode", [name + " " + (content.hex() or "-")])[0]
        question = name + " " + (content.hex() or "-")
        return told_apart(question, expected_decode(name, content), "\n".join(reply)) + "\nfound in: " + line


class SweepRun(DecodeRun):
    """Not random: every small field number of every class as a varint and as a record, whether the model knows the
    field or not, and every small value of every enumeration."""

    NUMBERS = range(41)
    VALUES = [*range(-1, 261), 2**31 - 1, -(2**31)]

    def batch(self, rng):
        values = ((0, b"\x05"), (2, b"\x02\x08\x05"))
        cases = [(name, [wire.to_varint(number * 8 + form) + value])
                 for name in MESSAGES for number in self.NUMBERS for form, value in values]
        cases += [(name, [wire.to_varint(field.number * 8) + wire.to_varint(value)])
                  for name, fields in MESSAGES.items() for field in fields.values() if field.kind == "choice"
                  for value in self.VALUES]
        return ([name + " " + flatten(nodes).hex() for name, nodes in cases],
                [expected_decode(name, flatten(nodes)) for name, nodes in cases], cases)


# store --batch


class Told:
    """What the model answers to a story; ends with a fatal answer if the program has to stop."""

    def __init__(self, commands, zone):
        self.clock = Clock(zone)
        self.store = store.Store(self.clock)
        self.answers = []
        self.fatal = False
        for command in commands:
            self.store.log, self.store.system_log = [], []
            try:
                answer = self.answer(*command)
            except store.Stop as stop:
                self.answers.append({"fatal": str(stop), "log": self.store.log})
                self.fatal = True
                return
            self.answers.append(answer)

    def page(self, key):
        first_line = len(self.store.log)
        sections = json_form(pages.sections(self.store, key))
        return {"page": key, "sections": sections, "log": self.store.log[first_line:]}

    def answer(self, verb, *arguments):
        match verb:
            case "event":
                number, nodes = arguments
                result = self.store.event(number, None if nodes is None else flatten(nodes))
                return {"result": result, "log": self.store.log, "syslog": self.store.system_log}
            case "trigger":
                self.store.trigger()
                return {"log": self.store.log}
            case "dict":
                return {arguments[0]: json_form(self.store.dicts[arguments[0]])}
            case "record":
                return {arguments[0]: json_form(self.store.records[arguments[0]])}
            case "state":
                return {"dicts": json_form(self.store.dicts)} | json_form(self.store.records)
            case "page":
                return self.page(arguments[0])
            case "pages":
                return [self.page(key) for key in pages.PAGE_KEYS]
            case "reset":
                self.store = store.Store(self.clock)
                return {}
            case "nonsense":
                return {"error": ""}
        raise ValueError(verb)


def line_of(command, rng=None):
    verb, *arguments = command
    if verb == "nonsense":
        return arguments[0]
    if verb != "event":
        return " ".join(command)
    number, nodes = arguments
    rng = rng or random.Random(0)
    identifier = "none" if number is None else generator.written_id(rng, number)
    return "event %s %s" % (identifier, "none" if nodes is None else generator.hex_of(rng, flatten(nodes)))


class StoreRun:
    STORIES = 12
    LENGTH = 40

    def __init__(self, probectl, arguments):
        self.probectl = probectl
        self.zone = arguments.zone
        self.wildness = arguments.wildness

    def run(self, rng):
        """Stories one after the other in one process; the first that has to stop the program is the last."""
        told = 0
        commands = []
        for _ in range(self.STORIES):
            wildness = self.wildness if self.wildness is not None else rng.choice([0, 0, 0, 0.02, 0.5])
            commands += generator.story(rng, wildness, self.LENGTH) + [("reset",)]
        while commands:
            model = Told(commands, self.zone)
            told += len(model.answers)
            self.check(commands[:len(model.answers)], model, rng)
            commands = commands[len(model.answers):]
        return told

    def check(self, commands, model, rng):
        found = self.differs([line_of(command, rng) for command in commands], model)
        if found is None:
            return
        # What follows the difference plays no part, and what stands before the last reset hardly ever does.
        place, report = found
        story = commands[:place + 1]
        last_story = story[max((at + 1 for at, command in enumerate(story[:-1]) if command == ("reset",)), default=0):]
        start = self.first_failing([last_story, story, commands])
        if start is None:
            raise Difference("not seen a second time\n" + report)
        smallest = shrink(start, self.smaller_stories, self.first_failing)
        lines = [line_of(command) for command in smallest]
        place, report = self.differs(lines, Told(smallest, self.zone)) or (0, report)
        raise Difference("story:\n  %s\n%s" % ("\n  ".join(lines), report))

    def differs(self, lines, model):
        """Where probectl and the model part, as a place among the lines and a text, or None."""
        lines = lines[:len(model.answers)]
        # One more question after a fatal stop: nothing may answer it.
        answers, status, complaint = self.probectl.ask("store", lines + ["trigger"] if model.fatal else lines)
        for place, (line, wanted, answer) in enumerate(zip(lines, model.answers, answers)):
            if not agrees(wanted, parsed(answer)):
                return place, told_apart(line, wanted, answer)
        if len(answers) != len(model.answers) or (status != 0) != model.fatal or status < 0:
            report = "%d answers, the model has %d; exit status %d, the model %s\n%s"
            return min(len(answers), len(lines) - 1), report % (
                len(answers), len(model.answers), status, "stops" if model.fatal else "goes on", complaint)
        return None

    def first_failing(self, stories):
        for commands in stories:
            if self.differs([line_of(command) for command in commands], Told(commands, self.zone)) is not None:
                return commands
        return None

    @staticmethod
    def smaller_stories(commands):
        size = len(commands)
        while size:
            for begin in range(0, len(commands), size):
                if size < len(commands):
                    yield commands[:begin] + commands[begin + size:]
            size //= 2
        for place, command in enumerate(commands):
            if command[0] == "event" and command[2]:
                content = flatten(command[2])
                for nodes in smaller_trees(command[2]):
                    if flatten(nodes) != content:
                        yield commands[:place] + [("event", command[1], nodes)] + commands[place + 1:]
                if len(commands) <= 3:
                    for shorter in smaller_bytes(content):
                        yield commands[:place] + [("event", command[1], [shorter])] + commands[place + 1:]


def main():
    parser = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("probectl")
    parser.add_argument("subcommand", choices=["decode", "sweep", "store"])
    parser.add_argument("--seed", default=os.environ.get("PROBEVIEW_SEED", "1"), help="a number, or 'random'")
    parser.add_argument("--count", type=int, default=0, help="how many answers at least; 0: no bound")
    parser.add_argument("--seconds", type=float, default=0, help="for how long; 0: no bound")
    parser.add_argument("--zone", default="UTC", help="the time zone, as TZ names it")
    parser.add_argument("--wildness", type=float, help="from 0, well-formed payloads only, to 1")
    arguments = parser.parse_args()
    if arguments.subcommand == "sweep":
        arguments.count = 1
    elif not arguments.count and not arguments.seconds:
        arguments.count = 10000

    seed = random.SystemRandom().getrandbits(32) if arguments.seed == "random" else int(arguments.seed)
    probectl = Probectl(arguments.probectl, arguments.zone)
    run = {"decode": DecodeRun, "sweep": SweepRun, "store": StoreRun}[arguments.subcommand](probectl, arguments)
    begin, compared, batch = time.monotonic(), 0, 0
    while (not arguments.count or compared < arguments.count) and (
            not arguments.seconds or time.monotonic() - begin < arguments.seconds):
        try:
            compared += run.run(random.Random("%d %s %d" % (seed, arguments.subcommand, batch)))
        except Difference as difference:
            print("DIFFERENCE in batch %d of %s --seed %d --zone %s\n%s" % (
                batch, arguments.subcommand, seed, arguments.zone, difference))
            return 1
        batch += 1
    print("%d answers agree (%s, seed %d, zone %s, %.1f s)" % (
        compared, arguments.subcommand, seed, arguments.zone, time.monotonic() - begin))
    return 0


if __name__ == "__main__":
    sys.exit(main())
