# SPDX-License-Identifier: Apache-2.0
"""Payloads to messages and back.

A message is its class's name and a dictionary from field number to what was read. A fault anywhere ends everything;
what was read before it stays, because every part is attached to its parent before it is filled.
"""

from .tables import CHOICES, MESSAGES, METRIC_TAGS

EVERY_BIT = (1 << 64) - 1


class Fault(Exception):
    """The payload cannot be read any further."""


class Message:
    def __init__(self, name):
        self.name = name
        self.values = {}

    def table(self):
        return MESSAGES[self.name]


def low32(number):
    return number & 0xFFFFFFFF


def signed32(number):
    return (low32(number) ^ 0x80000000) - 0x80000000


def unzigzag(number):
    number = low32(number)
    return -(number >> 1) - 1 if number & 1 else number >> 1


def varint(data, at):
    """The number at a position and the position after it. Ten bytes without an end read as 0, which is no fault."""
    total = 0
    for count, byte in enumerate(data[at:at + 10]):
        total += (byte % 128) << (7 * count)
        if byte < 128:
            return total & EVERY_BIT, at + count + 1
    if at + 10 > len(data):
        raise Fault("a number is cut short")
    return 0, at + 10


def record(data, at):
    """The bytes of a length-delimited record and the position after it."""
    length, at = varint(data, at)
    if length > len(data) - at:
        raise Fault("a record runs past what holds it")
    return data[at:at + length], at + length


def after_unknown(data, at, form):
    if form == 0:
        return varint(data, at)[1]
    if form == 2:
        return record(data, at)[1]
    if form not in (1, 5):
        raise Fault("a field of this form cannot be skipped")
    at += 8 if form == 1 else 4
    if at > len(data):
        raise Fault("a fixed number is cut short")
    return at


FROM_VARINT = {
    "uint64": lambda number: number,
    "uint32": low32,
    "choice": signed32,
    "sint32": unzigzag,
    "bool": lambda number: number != 0,
}


def number_or_zero(data, at, keep):
    """Reads a scalar and keeps it; one that is cut short is kept as 0 before the fault goes on."""
    try:
        number, at = varint(data, at)
    except Fault:
        keep(0)
        raise
    keep(number)
    return at


def fill(message, data, log):
    """Reads a payload into the message; raises Fault. Gives the decoder's lines to log."""
    at = 0
    while at < len(data):
        key, at = varint(data, at)
        form, number = key & 7, (key >> 3) & 0xFFFF
        if form == 4:
            return
        if number in METRIC_TAGS:
            log("valid metricId tag")
            at = number_or_zero(data, at, lambda value: log("Unknown tag: %x:%u" % (number, low32(value))))
            continue
        field = message.table().get(number)
        if field is None:
            at = after_unknown(data, at, form)
        elif field.kind == "message":
            part = Message(field.detail)
            if field.repeated:
                message.values.setdefault(number, []).append(part)
            else:
                message.values[number] = part
            content, at = record(data, at)
            fill(part, content, log)
        elif field.kind in ("bytes", "string"):
            message.values[number], at = record(data, at)
        elif field.repeated:
            def append(value, values=message.values.setdefault(number, []), convert=FROM_VARINT[field.kind]):
                values.append(convert(value))
            if form == 2:
                content, at = record(data, at)
                inside = 0
                while inside < len(content):
                    inside = number_or_zero(content, inside, append)
            else:
                at = number_or_zero(data, at, append)
        else:
            def replace(value, convert=FROM_VARINT[field.kind]):
                message.values[number] = convert(value)
            at = number_or_zero(data, at, replace)


def decode(name, data, log=lambda line: None):
    """A message and whether all of the payload could be read."""
    message = Message(name)
    try:
        fill(message, data, log)
    except Fault:
        return message, False
    return message, True


def to_varint(number):
    number &= EVERY_BIT
    groups = [number >> shift & 127 for shift in range(0, 70, 7)]
    while len(groups) > 1 and groups[-1] == 0:
        groups.pop()
    return bytes([group | 128 for group in groups[:-1]] + groups[-1:])


def zigzag(number):
    return number * 2 if number >= 0 else -number * 2 - 1


def to_number(kind, value):
    return to_varint(zigzag(value) if kind == "sint32" else int(value))


def delimited(number, content):
    return to_varint(number * 8 + 2) + to_varint(len(content)) + content


def encode(message):
    out = b""
    for number in sorted(message.values):
        field, value = message.table()[number], message.values[number]
        if field.kind == "message":
            for part in value if field.repeated else [value]:
                out += delimited(number, encode(part))
        elif field.kind in ("bytes", "string"):
            out += delimited(number, value)
        elif field.repeated:
            if value:
                out += delimited(number, b"".join(to_number(field.kind, element) for element in value))
        else:
            out += to_varint(number * 8) + to_number(field.kind, value)
    return out


def named(choices, value):
    return CHOICES[choices].get(value, "(unknown: %i)" % value)


def dictionary(message):
    """The dictionary form. Texts are str whose bytes that are no UTF-8 are kept as surrogates."""
    result = {}
    for number in sorted(message.values):
        field, value = message.table()[number], message.values[number]
        if field.kind == "message":
            value = [dictionary(part) for part in value] if field.repeated else dictionary(value)
        elif field.kind == "string":
            value = value.decode("utf-8", "surrogateescape")
        elif field.kind == "choice":
            value = named(field.detail, value)
        if value != [] or not field.repeated:
            result[field.key] = list(value) if field.repeated else value
    return result
