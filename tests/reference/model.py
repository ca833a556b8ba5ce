# SPDX-License-Identifier: Apache-2.0
"""A second opinion on decoding and on the store: slow, short, and written apart from the program.

Numbers are plain integers, messages plain dictionaries; nothing here is shared with the C++ code.
"""

import math

from tables import ENUMERATIONS, MESSAGES, METRIC_TAGS, METRICS


class Real(str):
    """A real by its digits, so that 10.0 and 10 differ."""


class Stop(Exception):
    """The program stops here."""


# --- decoding ---------------------------------------------------------------------------------------------------------


class Fail(Exception):
    """Decoding ends at once with failure."""


class Reader:
    def __init__(self, data):
        self.data = data
        self.position = 0
        self.limit = len(data)
        self.error = False

    def byte(self):
        if self.position >= self.limit:
            self.error = True
            return 0
        self.position += 1
        return self.data[self.position - 1]

    def varint(self):
        value = 0
        for group in range(10):
            byte = self.byte()
            if self.error:
                return 0
            value |= (byte & 127) << (7 * group)
            if byte < 128:
                return value & (2**64 - 1)
        return 0

    def delimited(self):
        """The bytes of a length-delimited value; None, and the error set, when they run past the record."""
        length = self.varint()
        if self.error or length > self.limit - self.position:
            self.error = True
            return None
        self.position += length
        return self.data[self.position - length : self.position]

    def place_mark(self):
        length = self.varint()
        if self.error or length > self.limit - self.position:
            raise Fail
        outer, self.limit = self.limit, self.position + length
        return outer

    def recall_mark(self, outer):
        self.position = self.limit
        self.limit = outer

    def skip(self, wire_type):
        if wire_type == 0:
            self.varint()
        elif wire_type == 2:
            self.delimited()
        elif wire_type in (1, 5):
            for _ in range(8 if wire_type == 1 else 4):
                self.byte()
        else:
            raise Fail
        if self.error:
            raise Fail


def signed(value):
    value &= 2**32 - 1
    return value - 2**32 if value >= 2**31 else value


def zigzag(value):
    value &= 2**32 - 1
    return value // 2 if value % 2 == 0 else -(value + 1) // 2


def scalar(kind, value):
    if kind == "uint64":
        return value
    if kind == "uint32":
        return value & (2**32 - 1)
    if kind == "bool":
        return value != 0
    if kind == "sint32":
        return zigzag(value)
    return signed(value)  # int32 and enumerations


def decode_into(reader, name, message, log):
    """Fills the message, a dictionary from field number to content. Raises Fail, with what was decoded kept."""
    fields = {number: kind for number, _, kind in MESSAGES[name]}
    while reader.position < reader.limit and not reader.error:
        key = reader.varint()
        if reader.error or key % 8 == 4:
            break
        number, wire_type = key // 8 % 2**16, key % 8
        if number in METRIC_TAGS:
            log.append("valid metricId tag")
            log.append("Unknown tag: %x:%u" % (number, reader.varint() & (2**32 - 1)))
        elif number not in fields:
            reader.skip(wire_type)
        else:
            take_field(reader, number, fields[number], wire_type, message, log)


def take_field(reader, number, kind, wire_type, message, log):
    if kind in ("bytes", "string"):
        content = reader.delimited()
        if content is not None:
            message[number] = bytes(content)
    elif isinstance(kind, str):
        message[number] = scalar(kind, reader.varint())
    elif kind[0] == "enum":
        message[number] = signed(reader.varint())
    elif kind[0] in ("message", "messages"):
        element = {}
        if kind[0] == "message":
            message[number] = element
        else:
            message.setdefault(number, []).append(element)
        outer = reader.place_mark()
        decode_into(reader, kind[1], element, log)
        if reader.error:
            raise Fail
        reader.recall_mark(outer)
    else:
        values = message.setdefault(number, [])
        if wire_type == 2:
            outer = reader.place_mark()
            while reader.position < reader.limit and not reader.error:
                values.append(scalar(kind[1], reader.varint()))
            if reader.error:
                # The element that was cut short stays as a zero; an outer record cannot go on behind it.
                raise Fail
            reader.recall_mark(outer)
        else:
            values.append(scalar(kind[1], reader.varint()))


def decode(name, data):
    """(message, whether it decodes, the decoder's lines)"""
    reader, message, log = Reader(data), {}, []
    try:
        decode_into(reader, name, message, log)
    except Fail:
        return message, False, log
    return message, not reader.error, log


# --- encoding ---------------------------------------------------------------------------------------------------------


def write_varint(value):
    value &= 2**64 - 1
    out = bytearray()
    while value >= 128:
        out.append(value % 128 + 128)
        value //= 128
    out.append(value)
    return bytes(out)


def write_zigzag(value):
    return write_varint(2 * value if value >= 0 else -2 * value - 1)


def write_record(number, content):
    return write_varint(number * 8 + 2) + write_varint(len(content)) + content


def encode(name, message):
    out = b""
    for number, _, kind in sorted(MESSAGES[name]):
        if number not in message:
            continue
        content = message[number]
        if kind in ("bytes", "string"):
            out += write_record(number, content)
        elif kind == "sint32":
            out += write_varint(number * 8) + write_zigzag(content)
        elif isinstance(kind, str) or kind[0] == "enum":
            out += write_varint(number * 8) + write_varint(int(content))
        elif kind[0] == "message":
            out += write_record(number, encode(kind[1], content))
        elif kind[0] == "messages":
            for element in content:
                out += write_record(number, encode(kind[1], element))
        elif content:
            write = write_zigzag if kind[1] == "sint32" else write_varint
            out += write_record(number, b"".join(write(value) for value in content))
    return out


# --- dictionaries and their text --------------------------------------------------------------------------------------


class Text:
    """A text by its bytes, which need not be UTF-8."""

    def __init__(self, content):
        self.content = content if isinstance(content, bytes) else content.encode()

    def __eq__(self, other):
        return isinstance(other, Text) and self.content == other.content


def dictionary(name, message):
    out = {}
    for number, key, kind in sorted(MESSAGES[name]):
        if number not in message:
            continue
        content = message[number]
        if kind == "string":
            out[key] = Text(content)
        elif isinstance(kind, str):
            out[key] = content
        elif kind[0] == "enum":
            out[key] = Text(ENUMERATIONS[kind[1]].get(content, "(unknown: %i)" % content))
        elif kind[0] == "message":
            out[key] = dictionary(kind[1], content)
        elif kind[0] == "messages":
            out[key] = [dictionary(kind[1], element) for element in content]
        elif content:
            out[key] = list(content)
    return out


def real_digits(number):
    text = repr(float(number))
    assert "e" not in text, text
    return Real(text)


def valid_utf8(content):
    return content.decode("utf-8", "replace")


def quoted(text):
    escapes = {"\\": "\\\\", '"': '\\"', "\n": "\\n", "\r": "\\r", "\t": "\\t", "\0": "\\0"}
    out = []
    for character in text:
        if character in escapes:
            out.append(escapes[character])
        elif ord(character) < 32 or ord(character) == 127:
            out.append("\\u{%x}" % ord(character))
        else:
            out.append(character)
    return '"' + "".join(out) + '"'


def printed(value):
    if isinstance(value, dict):
        return "[" + ", ".join(quoted(key) + ": " + printed(entry) for key, entry in value.items()) + "]"
    if isinstance(value, list):
        return "[" + ", ".join(printed(element) for element in value) + "]"
    if isinstance(value, Real):
        return str(value)
    if isinstance(value, Text):
        return quoted(valid_utf8(value.content))
    if isinstance(value, bytes):
        return "<" + value.hex() + ">"
    return str(int(value))


def as_json(value):
    """What the tools' JSON becomes when it is read back with reals kept by their digits."""
    if isinstance(value, dict):
        return {key: as_json(entry) for key, entry in value.items()}
    if isinstance(value, list):
        return [as_json(element) for element in value]
    if isinstance(value, bytes):
        return {"bytes": value.hex()}
    if isinstance(value, Text):
        try:
            return value.content.decode("utf-8")
        except UnicodeDecodeError:
            return {"text": value.content.hex()}
    return value


# --- time -------------------------------------------------------------------------------------------------------------

# The tests run the program under this setting: Central European time by the rule of today, for all years.
ZONE = "CET-1CEST,M3.5.0/2,M10.5.0/3"
DAYS = (31, 28, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31)


def is_leap(year):
    return year % 4 == 0 and (year % 100 != 0 or year % 400 == 0)


def days_before_year(year):
    """Days from 0001-01-01 to the first of the year."""
    past = year - 1
    return past * 365 + past // 4 - past // 100 + past // 400


def date_of_day(day):
    """(year, month, day of month) of a day counted from 0001-01-01."""
    year = day * 400 // 146097 + 1
    while days_before_year(year) > day:
        year -= 1
    while days_before_year(year + 1) <= day:
        year += 1
    rest = day - days_before_year(year)
    for month, length in enumerate(DAYS, start=1):
        length += month == 2 and is_leap(year)
        if rest < length:
            return year, month, rest + 1
        rest -= length
    raise AssertionError


EPOCH = days_before_year(1970)


def change_of(year, month):
    """When summer time begins or ends: the last Sunday of a month of 31 days, 01:00 UTC, in seconds since 1970."""
    last = days_before_year(year) + sum(DAYS[: month - 1]) + is_leap(year) + 30
    # 0001-01-01 was a Monday.
    return (last - (last + 1) % 7 - EPOCH) * 86400 + 3600


def timestamp_text(milliseconds):
    second = math.floor(float(milliseconds) / 1000.0)
    year = date_of_day(second // 86400 + EPOCH)[0]
    summer = change_of(year, 3) <= second < change_of(year, 10)
    local = second + (7200 if summer else 3600)
    year, month, day = date_of_day(local // 86400 + EPOCH)
    of_day = local % 86400
    clock = "%02d:%02d:%02d" % (of_day // 3600, of_day // 60 % 60, of_day % 60)
    return Text("%04d-%02d-%02d %s %s" % (year, month, day, clock, "CEST" if summer else "CET"))


# --- the store --------------------------------------------------------------------------------------------------------

BANDWIDTHS = ("1.4", "3.0", "5.0", "10.0", "15.0", "20.0")

DICTIONARIES = """
myLTERRCStateDict myLTECDRXConfigDict myLTESCellInfoDict myLTESCellMeasDict myLTESelReselDict myLTERsrpRsrqSinrDict
myLTECompCarrDict myLTETxPowerDict myLTEInterRatMeasDict myLTEIntraRatMeasDict myLTECAStatusDict myLTEEMMContextDict
myCellularMMCommonInfoDict myCellularActiveBearerDict myGMMContextDict myMMContextDict myUMTSRRCStateDict
myUMTSRRCConfigDict myUMTSCellInfoDict myUMTSCellMeasDict myUMTSTxPowerDict myUMTSSelReselDict myUMTSNbrMeasDict
myGSMScellInfoDict myGSMIdleConfigInfoDict myGSMIdleScellMeasDict myGSMConnRfMeasDict myGSMNbrMeasDict
myGSMGPRSConfigDict mySIMFileInfoDict
""".split()

LTE_RESELECTION = """
timestamp ims_emergency_support ac_barring_for_emergency mo_signalling_ac_barring_factor mo_signalling_ac_barring_time
mo_signalling_ac_barring_for_special_ac mo_data_ac_barring_factor mo_data_ac_barring_time
mo_data_ac_barring_for_special_ac QRxLevMin QQualMin Q_hyst S_non_intra_search_P S_non_intra_search_Q S_intra_search_P
S_intra_search_Q Thresh_serving_lowP Thresh_serving_lowQ priority_operating_freq multi_band_info
""".split()

UMTS_RESELECTION = """
timestamp ims_emergency_support hsdpa_capable edch_capable duplex_mode cell_barred fach_meas_occ_info_present s_rxlev
s_qual s_intrasearch s_intersearch s_search_rat s_cell_prio multi_band_info
""".split()

WAITING = {"Waiting for Update": Text("Waiting for Update")}


def is_integer(value):
    return isinstance(value, int) and not isinstance(value, bool) and -(2**31) <= value < 2**31


def is_number(value):
    return isinstance(value, int) and not isinstance(value, bool)


def minus(amount):
    def change(value):
        if not is_integer(value):
            return value
        if value - amount < -(2**31):
            raise Stop
        return value - amount

    return change


def truncated(divisor):
    return lambda value: int(math.copysign(abs(value) // divisor, value)) if is_integer(value) else value


def linear(factor, offset):
    return lambda value: real_digits(value * factor + offset) if is_number(value) else value


def over(divisor):
    return lambda value: real_digits(value / divisor) if is_number(value) else value


def megahertz(value):
    return Real(BANDWIDTHS[value]) if is_number(value) and 0 <= value < 6 else value


RSRQ, ECNO, HALF = linear(0.5, -19.5), linear(0.5, -24.5), linear(0.5, 0.0)


class Store:
    def __init__(self):
        self.dictionaries = dict.fromkeys(DICTIONARIES)
        lists = "EutraNbrs RsrpRsrqSinr TxPower EutraNbrsMeas UtraNbrsMeas GeraNbrsMeas CAStatusList MMCommonInfo".split()
        self.LTE = {"SelReselCellInfo": dict.fromkeys(LTE_RESELECTION, Text(""))}
        self.LTE.update({name: [dict(WAITING)] for name in lists})
        self.LTE["IMSI"] = Text("Come Back Later")
        self.UMTS = {"rXInfo": [dict(WAITING)], "TxPower": [dict(WAITING)]}
        self.UMTS["SelReselCellInfo"] = dict.fromkeys(UMTS_RESELECTION, Text(""))
        lists = "eUtraNbrs utraNbrs geraNbrs eUtraNbrMeas utraNbrMeas geraNbrMeas".split()
        self.UMTS.update({name: [dict(WAITING)] for name in lists})
        self.GSM = {name: [dict(WAITING)] for name in ("eUtraNbrMeas", "utraNbrMeas", "geraNbrMeas")}
        self.Common = {name: [dict(WAITING)] for name in ("activeBearer", "simContents")}

    def state(self):
        records = {name: as_json(getattr(self, name)) for name in ("LTE", "UMTS", "GSM", "Common")}
        return {"dicts": as_json(self.dictionaries), **records}

    def event(self, metric, payload):
        """(result, console lines, system-log lines). Raises Stop with the lines so far in self.log."""
        self.log, syslog = [], []
        if metric is None:
            raise Stop
        self.log.append("Metric ID in Hex = %2X" % (metric % 2**32))
        for name, (number, message_class) in METRICS.items():
            if number == metric:
                break
        else:
            self.log.append("I dont care for this Metric")
            return False, self.log, syslog
        if payload is None:
            raise Stop
        message, fine, lines = decode(message_class, payload)
        syslog += lines
        if not fine:
            raise Stop
        self.handle(name, dictionary(message_class, message))
        self.log.append("Received Valid Metric")
        return True, self.log, syslog

    # Each metric: the display dictionary's name, the prefix of its line, and what else happens.
    def handle(self, name, content):
        which, prefix = HANDLERS[name]
        early = name in ("K_LTE_SEL_RESEL_INFO", "K_LTE_RSRP_RSRQ_SINR")
        self.dictionaries[which] = content
        if early:
            self.log.append(prefix + printed(content))
        if "timestamp" in content:
            content["timestamp"] = timestamp_text(content["timestamp"])
        before = getattr(self, "before_" + name, None)
        if before:
            before(content)
        if not early:
            self.log.append(prefix + printed(content))
        after = getattr(self, "after_" + name, None)
        if after:
            after(content)

    def before_K_LTE_SCELL_INFO(self, content):
        if is_integer(content.get("dl_bw")):
            content["dl_bw"] = content["dl_bw"] // 4

    def before_K_LTE_EMM_CTXT(self, content):
        for key in ("guti", "tai_list"):
            if key in content:
                content[key] = Text(printed(content[key]))

    def after_K_LTE_TX_POWER(self, content):
        self.rewrite(content, "tx_power_info", {})

    def after_K_LTE_INTRARAT_MEAS(self, content):
        self.rewrite(content, "meas_nbr_eutra", {"nbr_rsrp": minus(140), "nbr_rsrq": RSRQ})

    def after_K_LTE_INTERRAT_MEAS(self, content):
        self.rewrite(content, "meas_nbr_utra", {"rscp": minus(116), "ecno": ECNO})
        self.rewrite(content, "meas_nbr_geran", {"rxlev": minus(110)})

    def after_K_LTE_RSRP_RSRQ_SINR(self, content):
        self.rewrite(content, "inst_values", {"sinr0": HALF, "sinr1": HALF})

    def after_K_LTE_CA_STATUS(self, content):
        changes = {"dl_bandwidth": megahertz, "rsrp": truncated(100), "rssi": truncated(100), "rsrq": over(100.0)}
        self.collect(content, "scc_list", self.LTE, "CAStatusList", changes)

    def after_K_LTE_SEL_RESEL_INFO(self, content):
        self.flatten_bands(content)
        self.merge(content, self.LTE["SelReselCellInfo"])
        self.collect(content, "nbr_eutra", self.LTE, "EutraNbrs", {"dl_bw": megahertz})

    def after_K_UMTS_SCELL_MEAS(self, content):
        self.collect(content, "rx_info", self.UMTS, "rXInfo", {}, ("timestamp", "connected_mode"))

    def after_K_UMTS_TX_POWER(self, content):
        self.collect(content, "tx_power_info", self.UMTS, "TxPower", {})

    def after_K_UMTS_SEL_RESEL_INFO(self, content):
        self.flatten_bands(content)
        self.merge(content, self.UMTS["SelReselCellInfo"])
        self.collect(content, "eutra_prio_info", self.UMTS, "eUtraNbrs", {})
        self.collect(content, "utra_prio_info", self.UMTS, "utraNbrs", {})
        self.collect(content, "gsm_prio_info", self.UMTS, "geraNbrs", {})

    def after_K_UMTS_NCELL_MEAS(self, content):
        self.collect(content, "meas_utra_result", self.UMTS, "utraNbrMeas", {"rscp": minus(116), "ecno": ECNO})
        self.collect(content, "meas_gsm_result", self.UMTS, "geraNbrMeas", {"rxlev": minus(110)})
        self.collect(content, "meas_lte_result", self.UMTS, "eUtraNbrMeas", {"rsrp": minus(140), "rsrq": RSRQ})

    def after_K_GSM_NCELL_MEAS(self, content):
        self.collect(content, "gsm_ncell_meas", self.GSM, "geraNbrMeas", {"rxlev": minus(110)})
        # The entry is "cpich_ecn0", so nothing rescales it.
        self.collect(content, "umts_ncell_meas", self.GSM, "utraNbrMeas", {"cpich_rscp": minus(116)})
        self.collect(content, "lte_ncell_meas", self.GSM, "eUtraNbrMeas", {"rsrp": minus(140), "rsrq": RSRQ})

    def after_K_CELLULAR_ACTIVE_BEARER(self, content):
        self.collect(content, "bearer_contexts", self.Common, "activeBearer", {})

    def after_K_SIM_FILE_INFO(self, content):
        self.collect(content, "ef_list", self.Common, "simContents", {}, ())

    def flatten_bands(self, content):
        bands = content.get("multi_band_info")
        if bands and all(is_integer(band) for band in bands):
            content["multi_band_info"] = Text(printed(bands))
            self.log.append(printed(bands))

    @staticmethod
    def merge(content, record):
        for key in record:
            record[key] = content.get(key, Text(""))

    @staticmethod
    def changed(element, changes):
        return {key: changes[key](value) if key in changes else value for key, value in element.items()}

    def rewrite(self, content, key, changes):
        if key in content:
            stamp = {"timestamp": content["timestamp"]} if "timestamp" in content else {}
            content[key] = [{**self.changed(element, changes), **stamp} for element in content[key]]

    def collect(self, content, key, record, field, changes, inherited=("timestamp",)):
        if key in content:
            extra = {name: content[name] for name in inherited if name in content}
            record[field] = [{**self.changed(element, changes), **extra} for element in content[key]]


HANDLERS = {
    "K_LTE_RRC_STATE": ("myLTERRCStateDict", "Current RRC state is "),
    "K_LTE_CDRX_CONFIG": ("myLTECDRXConfigDict", "Current CDRX Config is "),
    "K_LTE_SCELL_INFO": ("myLTESCellInfoDict", "Current Serving Cell Info is "),
    "K_LTE_TX_POWER": ("myLTETxPowerDict", "Received LTE Tx Power is "),
    "K_LTE_COMPCARR_INFO": ("myLTECompCarrDict", "Received Component Carrier info is "),
    "K_LTE_SEL_RESEL_INFO": ("myLTESelReselDict", "Received LTE Cell Resel Info is "),
    "K_LTE_INTRARAT_MEAS": ("myLTEIntraRatMeasDict", "Received LTE IRAT Meas is "),
    "K_LTE_INTERRAT_MEAS": ("myLTEInterRatMeasDict", "Received LTE InterRat Meas Info is "),
    "K_LTE_CA_STATUS": ("myLTECAStatusDict", "Received CA Status Dict is "),
    "K_LTE_RSRP_RSRQ_SINR": ("myLTERsrpRsrqSinrDict", "Received RSRP RSRQ SINR is : "),
    "K_UMTS_SCELL_MEAS": ("myUMTSCellMeasDict", "Received UMTS Serving Cell Meas is "),
    "K_UMTS_TX_POWER": ("myUMTSTxPowerDict", "Received Tx Power is "),
    "K_UMTS_SEL_RESEL_INFO": ("myUMTSSelReselDict", "Received UMTS Cell Resel Info is "),
    "K_UMTS_NCELL_MEAS": ("myUMTSNbrMeasDict", "Received UMTS InterRat Meas Info is "),
    "K_UMTS_RRC_STATE": ("myUMTSRRCStateDict", "Received UMTS RRC Connection State is "),
    "K_UMTS_RRC_CONFIG": ("myUMTSRRCConfigDict", "Received UMTS RRC Configuration is "),
    "K_UMTS_SCELL_INFO": ("myUMTSCellInfoDict", "Received UMTS Serving Cell Info is "),
    "K_GSM_SCELL_INFO": ("myGSMScellInfoDict", "Received GSM Serving Cell Info "),
    "K_GSM_IDLE_CONFIG": ("myGSMIdleConfigInfoDict", "Received GSM Idle Config Info is "),
    "K_GSM_IDLE_SCELL_MEAS": ("myGSMIdleScellMeasDict", "Received GSM Idle Serving Cell Meas Info is "),
    "K_GSM_CS_RF_MEAS": ("myGSMConnRfMeasDict", "Received GSM Connected Serving Cell Meas Info is "),
    "K_GSM_NCELL_MEAS": ("myGSMNbrMeasDict", "Received GSM Nbr Cell Meas Info is "),
    "K_GSM_GPRS_CONFIG": ("myGSMGPRSConfigDict", "Received GSM GPRS Config Info is "),
    "K_CELLULAR_MM_INFO": ("myCellularMMCommonInfoDict", "Received MM Common Info Dict is : "),
    "K_CELLULAR_MM_CTXT": ("myMMContextDict", "Received MM Context Info is "),
    "K_CELLULAR_GMM_CTXT": ("myGMMContextDict", "Received GMM Context Info is "),
    "K_LTE_EMM_CTXT": ("myLTEEMMContextDict", "Received EMM Context is "),
    "K_CELLULAR_ACTIVE_BEARER": ("myCellularActiveBearerDict", "Received Bearer Context Info is "),
    "K_SIM_FILE_INFO": ("mySIMFileInfoDict", "Received SIM Card File Info is "),
}
