# SPDX-License-Identifier: Apache-2.0
"""The store: which metric goes where, what is rewritten, what is logged, and when the program stops.

A handler is a list of steps. Each step takes the store and the name of the display dictionary and does its one thing.
"""

from . import wire
from .clock import Clock
from .tables import TABLES
from .text import printed

PLACEHOLDER = "Waiting for Update"
MEGAHERTZ = [1.4, 3.0, 5.0, 10.0, 15.0, 20.0]


class Stop(Exception):
    """The program stops here."""


# What a handler takes for an integer and for a real number.


def is_integer(value):
    return type(value) is int and -(2**31) <= value < 2**31


def checked(value):
    if not is_integer(value):
        raise Stop("an integer overflows")
    return value


def plus(amount):
    return lambda value: checked(value + amount) if is_integer(value) else value


def over(divisor):
    def divide(value):
        if not is_integer(value):
            return value
        return -(-value // divisor) if value < 0 else value // divisor
    return divide


def real(function):
    return lambda value: function(float(value)) if type(value) in (int, float) else value


def megahertz(index):
    return MEGAHERTZ[index] if is_integer(index) and 0 <= index < len(MEGAHERTZ) else index


def adjusted(entry, changes):
    return {key: changes[key](value) if key in changes else value for key, value in entry.items()}


def entries(value):
    """A list of dictionaries, or None when it is no such thing."""
    if isinstance(value, list) and all(isinstance(entry, dict) for entry in value):
        return value
    return None


DBM_GSM = plus(-110)
DBM_UTRA = plus(-116)
DBM_EUTRA = plus(-140)
DB_RSRQ = real(lambda value: value * 0.5 - 19.5)
DB_ECNO = real(lambda value: value * 0.5 - 24.5)
HALF = real(lambda value: value * 0.5)
HUNDREDTH = real(lambda value: value / 100.0)


def halved_twice(value):
    """Two truncations, one after the other."""
    return over(2)(over(2)(value))


# Steps.


def stamp(store, name):
    shown = store.dicts[name]
    if "timestamp" in shown:
        shown["timestamp"] = store.clock.text(shown["timestamp"])


def say(prefix):
    return lambda store, name: store.say(prefix + printed(store.dicts[name]))


def change(**changes):
    def step(store, name):
        store.dicts[name] = adjusted(store.dicts[name], changes)
    return step


def inherited(shown, keys):
    return {key: shown[key] for key in keys if key in shown}


def rewrite(key, *, with_keys=("timestamp",), **changes):
    """Changes the elements of a list inside the display dictionary."""
    def step(store, name):
        shown = store.dicts[name]
        source = entries(shown.get(key))
        if source is not None:
            shown[key] = [adjusted(entry, changes) | inherited(shown, with_keys) for entry in source]
    return step


def collect(key, owner, field, *, with_keys=("timestamp",), **changes):
    """Copies the elements of a list into a record; the display dictionary keeps them raw."""
    def step(store, name):
        shown = store.dicts[name]
        source = entries(shown.get(key))
        if source is not None:
            store.records[owner][field] = [
                adjusted(entry, changes) | inherited(shown, with_keys) for entry in source]
    return step


def flatten_bands(store, name):
    bands = store.dicts[name].get("multi_band_info")
    if isinstance(bands, list) and all(map(is_integer, bands)):
        store.dicts[name]["multi_band_info"] = printed(bands)
        store.say(printed(bands))


def merge_reselection(owner):
    def step(store, name):
        known = store.records[owner]["SelReselCellInfo"]
        for key in known:
            known[key] = store.dicts[name].get(key, "")
    return step


def flatten(key, suits):
    def step(store, name):
        shown = store.dicts[name]
        if key in shown and suits(shown[key]):
            shown[key] = printed(shown[key])
    return step


# What is done beside the timestamp and the line of the log, in this order: the step that writes the line is handed in.
STEPS = {
    "K_LTE_SCELL_INFO": lambda line: [stamp, change(dl_bw=halved_twice), line],
    "K_LTE_SEL_RESEL_INFO": lambda line: [
        line, stamp, flatten_bands, merge_reselection("LTE"),
        collect("nbr_eutra", "LTE", "EutraNbrs", dl_bw=megahertz)],
    "K_LTE_TX_POWER": lambda line: [stamp, line, rewrite("tx_power_info")],
    "K_LTE_RSRP_RSRQ_SINR": lambda line: [line, stamp, rewrite("inst_values", sinr0=HALF, sinr1=HALF)],
    "K_LTE_CA_STATUS": lambda line: [
        stamp, line, collect("scc_list", "LTE", "CAStatusList", dl_bandwidth=megahertz, rsrp=over(100), rssi=over(100),
                             rsrq=HUNDREDTH)],
    "K_LTE_INTERRAT_MEAS": lambda line: [
        stamp, line, rewrite("meas_nbr_utra", rscp=DBM_UTRA, ecno=DB_ECNO), rewrite("meas_nbr_geran", rxlev=DBM_GSM)],
    "K_LTE_INTRARAT_MEAS": lambda line: [stamp, line, rewrite("meas_nbr_eutra", nbr_rsrp=DBM_EUTRA, nbr_rsrq=DB_RSRQ)],
    "K_CELLULAR_ACTIVE_BEARER": lambda line: [stamp, line, collect("bearer_contexts", "Common", "activeBearer")],
    "K_LTE_EMM_CTXT": lambda line: [
        stamp, flatten("guti", lambda value: isinstance(value, dict)),
        flatten("tai_list", lambda value: entries(value) is not None), line],
    "K_UMTS_SCELL_MEAS": lambda line: [
        stamp, line, collect("rx_info", "UMTS", "rXInfo", with_keys=("timestamp", "connected_mode"))],
    "K_UMTS_TX_POWER": lambda line: [stamp, line, collect("tx_power_info", "UMTS", "TxPower")],
    "K_UMTS_SEL_RESEL_INFO": lambda line: [
        stamp, line, flatten_bands, merge_reselection("UMTS"), collect("eutra_prio_info", "UMTS", "eUtraNbrs"),
        collect("utra_prio_info", "UMTS", "utraNbrs"), collect("gsm_prio_info", "UMTS", "geraNbrs")],
    "K_UMTS_NCELL_MEAS": lambda line: [
        stamp, line, collect("meas_utra_result", "UMTS", "utraNbrMeas", rscp=DBM_UTRA, ecno=DB_ECNO),
        collect("meas_gsm_result", "UMTS", "geraNbrMeas", rxlev=DBM_GSM),
        collect("meas_lte_result", "UMTS", "eUtraNbrMeas", rsrp=DBM_EUTRA, rsrq=DB_RSRQ)],
    "K_GSM_NCELL_MEAS": lambda line: [
        stamp, line, collect("gsm_ncell_meas", "GSM", "geraNbrMeas", rxlev=DBM_GSM),
        # "cpich_ecno" is never there: the message says "cpich_ecn0", whose value stays raw.
        collect("umts_ncell_meas", "GSM", "utraNbrMeas", cpich_rscp=DBM_UTRA, cpich_ecno=DB_ECNO),
        collect("lte_ncell_meas", "GSM", "eUtraNbrMeas", rsrp=DBM_EUTRA, rsrq=DB_RSRQ)],
    "K_SIM_FILE_INFO": lambda line: [stamp, line, collect("ef_list", "Common", "simContents", with_keys=())],
}


def steps_of(metric):
    return STEPS.get(metric.constant, lambda line: [stamp, line])(say(metric.prefix))


HANDLERS = {number: (metric.message, metric.dictionary, steps_of(metric)) for number, metric in TABLES.metrics.items()}
UNHANDLED = TABLES.left_alone
DISPLAY_DICTIONARIES = TABLES.dictionaries

LTE_RESELECTION = """
    timestamp ims_emergency_support ac_barring_for_emergency mo_signalling_ac_barring_factor
    mo_signalling_ac_barring_time mo_signalling_ac_barring_for_special_ac mo_data_ac_barring_factor
    mo_data_ac_barring_time mo_data_ac_barring_for_special_ac QRxLevMin QQualMin Q_hyst S_non_intra_search_P
    S_non_intra_search_Q S_intra_search_P S_intra_search_Q Thresh_serving_lowP Thresh_serving_lowQ
    priority_operating_freq multi_band_info""".split()

UMTS_RESELECTION = """
    timestamp ims_emergency_support hsdpa_capable edch_capable duplex_mode cell_barred fach_meas_occ_info_present
    s_rxlev s_qual s_intrasearch s_intersearch s_search_rat s_cell_prio multi_band_info""".split()

RECORD_FIELDS = {
    "LTE": "SelReselCellInfo EutraNbrs RsrpRsrqSinr TxPower EutraNbrsMeas UtraNbrsMeas GeraNbrsMeas CAStatusList "
           "MMCommonInfo IMSI",
    "UMTS": "rXInfo TxPower SelReselCellInfo eUtraNbrs utraNbrs geraNbrs eUtraNbrMeas utraNbrMeas geraNbrMeas",
    "GSM": "eUtraNbrMeas utraNbrMeas geraNbrMeas",
    "Common": "activeBearer simContents",
}


def first_value(owner, field):
    if field == "SelReselCellInfo":
        return dict.fromkeys(LTE_RESELECTION if owner == "LTE" else UMTS_RESELECTION, "")
    return "Come Back Later" if field == "IMSI" else [{PLACEHOLDER: PLACEHOLDER}]


class Store:
    def __init__(self, clock=None):
        self.clock = clock or Clock()
        self.dicts = dict.fromkeys(DISPLAY_DICTIONARIES)
        self.records = {owner: {field: first_value(owner, field) for field in fields.split()}
                        for owner, fields in RECORD_FIELDS.items()}
        self.log = []
        self.system_log = []

    def say(self, line):
        self.log.append(line)

    def event(self, identifier, payload):
        """One metric event, either part None when it is missing; true when the metric was recognised and stored."""
        if identifier is None:
            raise Stop("an event without a metric identifier")
        self.say("Metric ID in Hex = %2X" % (identifier & 0xFFFFFFFF))
        if identifier not in HANDLERS:
            self.say("I dont care for this Metric")
            return False
        message_class, name, steps = HANDLERS[identifier]
        if payload is None:
            raise Stop("an event without a payload")
        message, complete = wire.decode(message_class, payload, self.system_log.append)
        if not complete:
            raise Stop("a payload that does not decode")
        self.dicts[name] = wire.dictionary(message)
        for step in steps:
            step(self, name)
        self.say("Received Valid Metric")
        return True

    def trigger(self):
        self.say("I dont care for events")
