# SPDX-License-Identifier: Apache-2.0
"""Random payloads, events and questions. Everything comes from the random.Random that is handed in.

A payload is a tree: a list of nodes, each either bytes or a Record, whose length is made when the tree is flattened. So
a failing payload can be made smaller by taking nodes away without breaking the lengths around them.
"""

from model import pages, store
from model.tables import CHOICES, MESSAGES, METRIC_TAGS
from model.wire import EVERY_BIT, to_varint, zigzag

CORNERS = [0, 1, 2, 3, 5, 6, 99, 100, 127, 128, 255, 256, 300, 16383, 16384, 2**21 - 1, 2**21, 2**28, 2**31 - 1, 2**31,
           2**32 - 1, 2**32, 2**32 + 1, 2**35 + 7, 2**63 - 1, 2**63, EVERY_BIT - 1, EVERY_BIT]
SIGNED_CORNERS = [0, -1, 1, -2, 50, -99, 99, -100, 100, -101, -140, -199, -1050, -9550, 2**31 - 1, -(2**31), 1 - 2**31,
                  116 - 2**31, 115 - 2**31, 139 - 2**31, 140 - 2**31]
MOMENTS = [0, 1, 999, 1000, 1711846799999, 1711846800000, 1729990799999, 1729990800000, 1729994400000, 253402300799999,
           253402300800000, 2**53, 2**53 + 1, 13569465600000, 2**63, EVERY_BIT]
TEXTS = [b"", b"internet", b'say "hi"\\', b"line\nline\r\tend", b"\x00\x01\x1f\x7f", "Grüße ☎ 𝄞".encode(),
         "\u0085\u2028\ufeff".encode(), b"\xc3(", b"\xff\xfe", b"\xe2\x82", b"\xed\xa0\x80", b"\xf0\x9f\x98",
         b"\xc0\x80", b"\xf4\x90\x80\x80", b"a\xe2\x82\xacb\xe2\x28\xa1", b"x" * 31, b"y" * 200]


class Record:
    def __init__(self, key, nodes, lie=0):
        self.key = key
        self.nodes = nodes
        self.lie = lie  # how much the length says too much or too little

    def with_nodes(self, nodes):
        return Record(self.key, nodes, self.lie)


def flatten(nodes):
    out = b""
    for node in nodes:
        if isinstance(node, Record):
            content = flatten(node.nodes)
            node = node.key + to_varint(max(0, len(content) + node.lie)) + content
        out += node
    return out


class Payloads:
    """Payloads of one temper: 0 is well formed in every respect, 1 likes everything that a decoder must bear."""

    def __init__(self, random, wildness):
        self.random = random
        self.wildness = wildness

    def wild(self, share=1.0):
        return self.random.random() < self.wildness * share

    def varint(self, number):
        """Encodes a number, now and then longer than need be."""
        random = self.random
        if self.wild(0.06):
            return bytes(random.randrange(128, 256) for _ in range(10))  # without an end
        if self.wild(0.06):
            return bytes(random.randrange(128, 256) for _ in range(9)) + bytes([random.randrange(128)])
        if self.wild(0.06):
            short = to_varint(number)
            padding = random.randrange(1, 11 - len(short)) if len(short) < 10 else 0
            if padding:
                return short[:-1] + bytes([short[-1] | 128]) + b"\x80" * (padding - 1) + b"\x00"
        return to_varint(number)

    def key(self, number, form):
        if self.wild(0.05):
            form = self.random.choice([0, 1, 2, 3, 5, 6, 7])
        if self.wild(0.02):
            form = 4
        if self.wild(0.05):
            number += 65536 * self.random.choice([1, 2, 8191, 2**40, self.random.randrange(2**44)])
        return self.varint(number * 8 + form)

    def scalar(self, field):
        """The number that goes on the wire for a scalar."""
        random = self.random
        if self.wild(0.3):
            return random.choice(CORNERS + [random.getrandbits(64)])
        if field.key == "timestamp" and random.random() < 0.9:
            return random.choice([random.randrange(1577836800000, 1893456000000), random.choice(MOMENTS),
                                  random.getrandbits(random.randrange(1, 65))])
        match field.kind:
            case "bool":
                return random.choice([0, 1, 1, 2, 2**32, 2**63])
            case "choice":
                named = list(CHOICES[field.detail])
                return random.choice([random.choice(named), random.choice(named), max(named) + 1, random.randrange(300),
                                      -1, -(2**31), 2**31 - 1])
            case "sint32":
                value = random.choice([random.choice(SIGNED_CORNERS), random.randrange(-12000, 12000),
                                       random.randrange(-150, 50)])
                # The extremes stop the program in a handler: rare, so that a story has time to tell something.
                return zigzag(value if abs(value) < 2**30 or random.random() < 0.1 else random.randrange(-99, 99))
            case "uint64":
                return random.choice(CORNERS)
        if field.key in ("dl_bw", "dl_bandwidth") and random.random() < 0.8:
            return random.randrange(8)
        return random.choice([random.randrange(130), random.randrange(70000), random.choice(CORNERS[:-8]),
                              random.getrandbits(32)])

    def content(self, field):
        random = self.random
        if field.kind == "string":
            return random.choice(TEXTS) + random.choice([b"", b"", random.choice(TEXTS)])
        return random.randbytes(random.choice([0, 1, 3, 4, 8, 16, 40]))

    def unknown(self, name):
        random = self.random
        table = MESSAGES[name]
        number = random.choice([0, 2, 6, 13, 20, 35, 64, 1000, 65535, random.randrange(65536)])
        if number in table and random.random() < 0.9:
            number = max(table) + random.randrange(1, 5)
        form = random.choice([0, 0, 1, 2, 2, 5] + ([3, 4, 6, 7] if self.wild(0.15) else []))
        head = to_varint(number * 8 + form)
        body = {0: lambda: self.varint(random.choice(CORNERS)), 1: lambda: random.randbytes(8),
                5: lambda: random.randbytes(4)}.get(form)
        if form == 2:
            content = random.randbytes(random.randrange(6))
            return head + to_varint(len(content)) + content
        return head + body() if body else head

    def metric_tag(self):
        number = self.random.choice([19, *METRIC_TAGS])
        return self.key(number, self.random.choice([0, 0, 0, 2])) + self.varint(self.random.choice(CORNERS))

    def nodes(self, name):
        """A message of the class as nodes."""
        random = self.random
        share = random.choice([0.1, 0.5, 0.9, 1.0])
        result = []
        for field in MESSAGES[name].values():
            if random.random() > share:
                continue
            if field.kind == "message":
                count = random.choice([1, 1, 2, 3, 9]) if field.repeated else random.choice([1, 1, 1, 2])
                for _ in range(count):
                    lie = random.choice([-2, -1, 1, 2, 100, 2**40, EVERY_BIT]) if self.wild(0.03) else 0
                    result.append(Record(self.key(field.number, 2), self.nodes(field.detail), lie))
            elif field.kind in ("string", "bytes"):
                for _ in range(random.choice([1, 1, 1, 2])):
                    lie = random.choice([-1, 1, 7, 2**33, 2**63]) if self.wild(0.03) else 0
                    result.append(Record(self.key(field.number, 2), [self.content(field)], lie))
            elif field.repeated:
                for _ in range(random.choice([1, 1, 2])):
                    values = [self.varint(self.scalar(field)) for _ in range(random.choice([0, 1, 2, 3, 5, 20]))]
                    if random.random() < 0.6:
                        result.append(Record(self.key(field.number, 2), values))
                    else:
                        result += [self.key(field.number, 0) + value for value in values]
            else:
                for _ in range(random.choice([1, 1, 1, 1, 2])):
                    result.append(self.key(field.number, 0) + self.varint(self.scalar(field)))
        if random.random() < 0.3:
            random.shuffle(result)
        if random.random() < 0.1:
            result.insert(random.randrange(len(result) + 1), self.unknown(name))
        if random.random() < 0.04:
            result.insert(random.randrange(len(result) + 1), self.metric_tag())
        while self.wild(0.2):
            extra = random.choice([lambda: self.unknown(name), self.metric_tag,
                                   lambda: to_varint(EVERY_BIT ^ random.getrandbits(random.choice([0, 3, 19]))),
                                   lambda: random.randbytes(random.randrange(1, 12)),
                                   lambda: b"\xff" * random.randrange(1, 12)])
            result.insert(random.randrange(len(result) + 1), extra())
        return result

    def payload(self, name):
        """A whole payload as nodes; mutated ones are a single node."""
        random = self.random
        if self.wild(0.02):
            return [random.randbytes(random.randrange(40))]
        nodes = self.nodes(name)
        if not self.wild(0.35):
            return nodes
        content = bytearray(flatten(nodes))
        for _ in range(random.choice([1, 1, 1, 2, 5])):
            place = random.randrange(len(content) + 1)
            match random.randrange(6):
                case 0 | 1:
                    del content[place:]
                case 2:
                    del content[place:place + random.randrange(1, 4)]
                case 3:
                    content[place:place] = random.randbytes(random.randrange(1, 4))
                case 4 if place < len(content):
                    content[place] ^= 1 << random.randrange(8)
                case _:
                    begin = random.randrange(len(content) + 1)
                    content[place:place] = content[begin:begin + random.randrange(12)]
        return [bytes(content)]


def metric_id(random):
    """An identifier, mostly one that has a handler, and how it may be written."""
    number = random.choice(list(store.HANDLERS))
    if random.random() < 0.06:
        number = random.choice([*store.UNHANDLED.values(), 0, 1, 0xF, 0x10, 19, -1, -number, number + 2**32, number ^ 1,
                                number - 2**32, 2**63 - 1, -(2**63), random.getrandbits(63)])
    return number


def written_id(random, number):
    if number < 0:
        return str(number)
    return random.choice(["0x%X", "0x%x", "%d"]) % number


def hex_of(random, payload):
    if not payload:
        return "-"
    return random.choice([payload.hex(), payload.hex(), payload.hex().upper()])


# Commands of a story, as tuples; an event carries its payload as nodes.

EXTRA_PAGE_KEYS = ["UMTS Serving Cell Measurement", "Connected Serv Cell Meas", "LTE Component Carrier Info",
                   "GSM GPRS Config", "lte nas", "LTE  NAS", "LTE NAS ", "Anything at all"]


# Lines that are to be answered with an error.
NONSENSE = ["dict myNoSuchDict", "record CDMA", "event", "event 0x3CD302", "event 0x3CD302 0", "event 0x3CD302 0g",
            "event x 00", "events 1 00", "event 0x3CD302 00 00", "event 99999999999999999999 00", "state all", "dict",
            "record", "reset now", "EVENT 0x3CD302 -", "trigger 1", "pages 1"]


def story(random, wildness, length):
    commands = []
    payloads = Payloads(random, wildness)
    favourites = random.sample(list(store.HANDLERS), random.choice([2, 4, len(store.HANDLERS)]))
    for _ in range(length):
        roll = random.random()
        if roll < 0.62:
            number = metric_id(random) if random.random() < 0.3 else random.choice(favourites)
            handler = store.HANDLERS.get(number)
            nodes = payloads.payload(handler[0] if handler else "KCellularLteRrcState")
            if random.random() < 0.004:
                nodes = None
            commands.append(("event", None if random.random() < 0.002 else number, nodes))
        elif roll < 0.72:
            commands.append(("page", random.choice(pages.PAGE_KEYS if random.random() < 0.85 else EXTRA_PAGE_KEYS)))
        elif roll < 0.82:
            commands.append(("dict", random.choice(store.DISPLAY_DICTIONARIES)))
        elif roll < 0.89:
            commands.append(("record", random.choice(list(store.RECORD_FIELDS))))
        elif roll < 0.92:
            commands.append(("state",))
        elif roll < 0.95:
            commands.append(("pages",))
        elif roll < 0.97:
            commands.append(("trigger",))
        elif roll < 0.98:
            commands.append(("reset",))
        else:
            commands.append(("nonsense", random.choice(NONSENSE)))
    return commands
