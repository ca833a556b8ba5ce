#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Writes fuzz/corpus/replies: dictionaries as a service sends them, sound and hostile. The same every time."""
import pathlib
import struct

FOLDER = pathlib.Path(__file__).resolve().parent / "corpus" / "replies"
INT64, UINT64, BOOLEAN, FLOAT, DOUBLE, TEXT, BYTES, LIST, DICTIONARY = 3, 4, 5, 6, 7, 8, 9, 10, 11


def varint(number: int) -> bytes:
    number &= (1 << 64) - 1
    out = bytearray()
    while number >= 0x80:
        out.append(number & 0x7F | 0x80)
        number >>= 7
    return bytes(out + bytes([number]))


def record(field: int, content: bytes) -> bytes:
    return bytes([field << 3 | 2]) + varint(len(content)) + content


def real(number: float) -> tuple[int, int]:
    return DOUBLE, struct.unpack("<Q", struct.pack("<d", number))[0]


def value(kind: int, content) -> bytes:
    if kind in (TEXT, BYTES):
        data = content if isinstance(content, bytes) else content.encode()
    elif kind == LIST:
        data = items([("", each) for each in content])
    elif kind == DICTIONARY:
        data = items(content.items())
    else:
        return bytes([2 << 3]) + varint(kind) + bytes([3 << 3]) + varint(content)
    return bytes([2 << 3]) + varint(kind) + record(4, data)


def items(pairs) -> bytes:
    out = b""
    for key, content in pairs:
        out += record(1, (record(1, key.encode()) if key else b"") + value(*content))
    return out


LEAST, MOST = -(1 << 63), (1 << 63) - 1
NOON = 1709640000000
STEERING = bytes(range(256)) + "\u009b31m\u202e\u2028".encode()


def report(source: dict, client: dict, **more) -> dict:
    return {"service": (TEXT, "radixd 1"), "uptime_ms": (INT64, 61000), "base_configuration": (BOOLEAN, 1),
            "configured_metrics": (UINT64, 2), "sources": (LIST, [(DICTIONARY, source)]),
            "clients": (LIST, [(DICTIONARY, client)])} | more


def source(**more) -> dict:
    return {"origin": (TEXT, "trace:x.csv"), "metrics": (UINT64, 3), "records": (UINT64, 10),
            "records_per_second": real(1.5), "withheld": (UINT64, 0), "last_record_ms": (INT64, NOON - 2000),
            "last_record_age_ms": (INT64, 2000), "state": (TEXT, "running"), "rows_read": (UINT64, 12),
            "rows_skipped": (UINT64, 2)} | more


def client(**more) -> dict:
    return {"number": (UINT64, 1), "name": (TEXT, "probectl"), "process": (INT64, 7), "user": (INT64, 0),
            "listening": (BOOLEAN, 1), "observes": (BOOLEAN, 1), "records": (UINT64, 10),
            "records_per_second": real(0.5), "queued": (UINT64, 0), "lost": (UINT64, 0)} | more


def event(**more) -> dict:
    return {"kKeyMetricID": (INT64, 0x3C4E04), "kKeyPayload": (BYTES, b"\x08\x01\x10\x03"), "kKeyTime": (INT64, NOON),
            "kKeyOrigin": (TEXT, "scenario:city")} | more


INPUTS = {
    "report": report(source(), client()),
    "report_of_nothing": {},
    "rate_that_is_no_number": report(source(records_per_second=real(float("nan"))),
                                     client(records_per_second=real(1e308))),
    "rate_below_nothing": report(source(records_per_second=real(-1e308)), client(records_per_second=(INT64, LEAST))),
    "times_at_the_ends": report(source(last_record_age_ms=(INT64, LEAST), rows_read=(INT64, -1)), client(),
                                uptime_ms=(INT64, LEAST)),
    "times_at_the_other_ends": report(source(last_record_age_ms=(INT64, MOST), state=(LIST, [])), client(),
                                      uptime_ms=(INT64, MOST)),
    "texts_that_steer": report(source(origin=(TEXT, STEERING), failure=(TEXT, STEERING)),
                               client(name=(TEXT, STEERING))),
    "foreign_kinds": report(source(origin=(LIST, []), records=(TEXT, "x"), withheld=(DICTIONARY, {})),
                            client(number=(BYTES, b"\xff"), queued=real(0.5)), service=(BOOLEAN, 1)),
    "lists_that_are_none": {"sources": (TEXT, "x"), "clients": (LIST, [(INT64, 1), (LIST, [])])},
    "many_entries": {"clients": (LIST, [(DICTIONARY, {})] * 1100)},
    "event": event(),
    "event_with_a_text_that_steers": event(kKeyMetricID=(INT64, 0x3CD50D),
                                           kKeyPayload=(BYTES, b"\x1a\x07\x1a\x05\x1b[2J\xff"),
                                           kKeyOrigin=(TEXT, STEERING)),
    "event_at_the_end_of_time": event(kKeyTime=(INT64, MOST)),
    "event_before_time": event(kKeyTime=(INT64, LEAST), kKeyMetricID=(INT64, LEAST)),
    "event_of_foreign_kinds": event(kKeyPayload=(TEXT, "x"), kKeyOrigin=(BYTES, b"x"), kKeyTime=real(1e300)),
}


def main():
    FOLDER.mkdir(parents=True, exist_ok=True)
    for old in FOLDER.iterdir():
        old.unlink()
    for name, content in INPUTS.items():
        (FOLDER / name).write_bytes(items(content.items()))


if __name__ == "__main__":
    main()
