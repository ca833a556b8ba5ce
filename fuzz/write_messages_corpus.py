#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Writes fuzz/corpus/messages: for each class one input with as many of its fields as fit, and one for each oddity of
the decoder. The same every time."""

import pathlib
import random
import re
import sys

TOP = pathlib.Path(__file__).resolve().parent.parent
sys.path.insert(0, str(TOP / "tests" / "witness"))

from generator import Payloads, flatten
from model.wire import decode

CLASSES = re.findall(r"&(\w+)::pbDescriptor", (TOP / "messages" / "registry.cpp").read_text("utf-8"))
LONGEST = 250  # the length of the second payload is a byte

ODDITIES = {
    "metric_number": ("KCellularGsmIdleConfig", "9001 01 9801 07 a001 02", ""),
    "metric_number_of_16_bits": ("KCellularLteTxPower", "90b41a 05 12 05 90b41a 05 0802", ""),
    "metric_number_cut": ("KCellularLteRrcState", "0805 9801 80", ""),
    "wire_types": ("KCellularLteRrcState", "12 03 25 07 0b 05", "0d01 1101"),
    "wire_type_of_numbers": ("KCellularGsmCsRfMeasurement", "2d 02 28 04 2a 02 06 08", "2a 02 02 80"),
    "number_of_17_bits": ("KCellularLteRrcState", "908020 03", "988120 07"),
    "end_of_group": ("KCellularLteTxPower", "12 05 08 02 0c 18 03 08 05", "08 05 0c 10 01"),
    "group": ("KCellularLteTxPower", "08 05 33 34 10 03", "08 05 36"),
    "varint_without_an_end": ("KCellularLteRrcState", "20 ffffffffffffffffffff 10 03", "ffffffffffffffffffff 07 10 03"),
    "key_of_ten_bytes": ("KCellularLteRrcState", "8880808080808080 8000 05", "90808080808080808001 03"),
    "key_of_all_ones": ("KCellularGsmIdleConfig", "9001 01 ffffffff0f 05", "a801 ffffffff0f 01"),
    "key_of_all_ones_at_the_end": ("TxPowerInfo", "18 7f ffffffff0f 01", "18 7f ffffffffffffffffff01 01"),
    "nested_twice": ("KCellularEmmContext", "32 02 08 01 32 02 10 02", "32 02 18 03"),
    "nested_cut": ("KCellularLteTxPower", "08 05 12 04 08 02 18 80", "12 7f 08 02"),
    "text_without_meaning": ("KCellularLteRsrpRsrqSinr", "1a 02 c328 72 00 7a 00", "1a 00"),
    "record_past_its_parent": ("KCellularMmCommonInfo", "1a 03 0a 05 01 02 03 04 05 06", "12 00"),
    "unknown_fields": ("KCellularSimCardFiles", "3001 31 0102030405060708 3a 02 0102 3d 01020304 08 05", "c53e 01"),
    "long_record": ("KCellularSimCardFiles", "12 8401 12 8101" + "5a" * 129, "12 00" * 9),
}


def whole(name):
    """The payload with the most fields among some that are well formed."""
    rng = random.Random(name)
    candidates = [flatten(Payloads(rng, 0).nodes(name)) for _ in range(60)]
    candidates = [each for each in candidates if len(each) <= LONGEST]
    return max(candidates, key=lambda each: (len(decode(name, each)[0].values), -len(each)))


def odd(name):
    rng = random.Random("odd " + name)
    return next(each for each in iter(lambda: flatten(Payloads(rng, 1).payload(name)), None) if len(each) <= 60)


def main():
    folder = TOP / "fuzz" / "corpus" / "messages"
    folder.mkdir(parents=True, exist_ok=True)
    for old in folder.iterdir():
        old.unlink()

    def write(file, name, first, second):
        (folder / file).write_bytes(bytes([CLASSES.index(name), len(second)]) + second + first)

    for name in CLASSES:
        write(name, name, whole(name), odd(name))
    for file, (name, first, second) in ODDITIES.items():
        write(file, name, bytes.fromhex(first), bytes.fromhex(second))


if __name__ == "__main__":
    main()
