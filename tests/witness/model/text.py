# SPDX-License-Identifier: Apache-2.0
"""The text and JSON forms of values: int, bool, float, str (surrogates stand for bytes that are no UTF-8), bytes, list,
dict. A 32-bit float is the Python float with the same digits."""

from decimal import Decimal
from typing import NamedTuple

ESCAPES = {code: "\\u{%x}" % code for code in [*range(32), 127]}
ESCAPES.update({ord("\\"): "\\\\", ord('"'): '\\"', 10: "\\n", 13: "\\r", 9: "\\t", 0: "\\0"})


def shown(text):
    """A text as it can be shown: what is no UTF-8 becomes U+FFFD, once for each ill-formed sequence."""
    return text.encode("utf-8", "surrogateescape").decode("utf-8", "replace")


def digits(real):
    text = format(Decimal(repr(real)), "f")
    return text if "." in text else text + ".0"


def printed(value):
    """A value as it stands inside a dictionary or list."""
    match value:
        case bool():
            return "1" if value else "0"
        case int():
            return str(value)
        case float():
            return digits(value)
        case str():
            return '"' + shown(value).translate(ESCAPES) + '"'
        case bytes():
            return "<" + value.hex() + ">"
        case dict():
            return "[" + ", ".join(printed(key) + ": " + printed(part) for key, part in value.items()) + "]"
        case list():
            return "[" + ", ".join(map(printed, value)) + "]"
    raise TypeError(value)


def bare(value):
    """A value as it stands alone, in a cell."""
    return shown(value) if isinstance(value, str) else printed(value)


class Real(NamedTuple):
    """A real number in JSON, as the digits that stand there."""

    digits: str


def json_form(value):
    """What a JSON reader should find, with reals kept as Real."""
    match value:
        case float():
            return Real(digits(value))
        case bytes():
            return {"bytes": value.hex()}
        case str() if shown(value) != value:
            return {"text": value.encode("utf-8", "surrogateescape").hex()}
        case dict():
            return {key: json_form(part) for key, part in value.items()}
        case list():
            return [json_form(part) for part in value]
    return value
