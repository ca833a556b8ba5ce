# SPDX-License-Identifier: Apache-2.0
"""What a category page answers when it is asked for its sections, titles, rows and cells."""

from .store import Stop
from .tables import TABLES
from .text import bare

PAGE_KEYS = [page.key for page in TABLES.pages]


def dictionaries(rule):
    return {page.key: page.dictionary for page in TABLES.pages + TABLES.cells if page.rule == rule}


# Whole dictionaries: one row for each entry.
DICTIONARIES = dictionaries("all")
# Dictionaries that only the cells know: one row, whatever the dictionary holds.
ONE_ROW_DICTIONARIES = dictionaries("first")

# Lists of entries: a section for each, its title, a row for each field.
LISTS = {
    "LTE Tx Power": ("LTE", "TxPower", "TxPowerInfo "),
    "LTE EUTRA Neighbor Info": ("LTE", "EutraNbrs", "EUTRA Neighbor "),
    "LTE LTE Neighbor Cell Meas": ("LTE", "EutraNbrsMeas", "LTE Neighbor "),
    "LTE UMTS Neighbor Cell Meas": ("LTE", "UtraNbrsMeas", "UMTS Neighbor "),
    "LTE GSM Neighbor Cell Meas": ("LTE", "GeraNbrsMeas", "GSM Neighbor "),
    "LTE CA Status": ("LTE", "CAStatusList", "Component Carrier "),
    "LTE Active Bearers": ("Common", "activeBearer", "PDP "),
    "UMTS Active Bearers": ("Common", "activeBearer", "PDP "),
    "GSM Active Bearers": ("Common", "activeBearer", "PDP "),
    "UMTS Serving Cell Meas": ("UMTS", "rXInfo", "RxInfo "),
    "UMTS Tx Power": ("UMTS", "TxPower", "TxPowerInfo "),
    "UMTS EUTRA Neighbor Info": ("UMTS", "eUtraNbrs", "EUTRA Neighbor "),
    "UMTS UTRA Neighbor Info": ("UMTS", "utraNbrs", "UTRA Neighbor "),
    "UMTS GSM Neighbor Info": ("UMTS", "geraNbrs", "GSM Neighbor "),
    "UMTS LTE Neighbor Cell Meas": ("UMTS", "eUtraNbrMeas", "LTE Neighbor "),
    "UMTS UMTS Neighbor Cell Meas": ("UMTS", "utraNbrMeas", "UMTS Neighbor "),
    "UMTS GSM Neighbor Cell Meas": ("UMTS", "geraNbrMeas", "GSM Neighbor "),
    "GSM LTE Neighbor Cell Meas": ("GSM", "eUtraNbrMeas", "LTE Neighbor "),
    "GSM UMTS Neighbor Cell Meas": ("GSM", "utraNbrMeas", "UMTS Neighbor "),
    "GSM GSM Neighbor Cell Meas": ("GSM", "geraNbrMeas", "GSM Neighbor "),
    "Device Info SIM Files": ("Common", "simContents", "SIM Content "),
}

RESELECTION = {"LTE Sel Resel Parameters": "LTE", "UMTS Sel Resel Parameters": "UMTS"}

# Keys that no navigation makes, and pages whose cells no branch knows.
MISMATCHED_CELLS = "UMTS Serving Cell Measurement"
WITHOUT_CELLS = "UMTS Serving Cell Meas"
ONE_LIST_WITHOUT_SECTIONS = "LTE Serving Cell Meas"

UNCHANGED = [None, None]
FALLBACK = ["Come back later", "Come back later"]


def at(sequence, index):
    if index >= len(sequence):
        raise Stop("past the end of a list")
    return sequence[index]


def pair(entry, row):
    key, value = at(list(entry.items()), row)
    return [bare(key), bare(value)]


def section_count(store, key):
    return len(store.records[LISTS[key][0]][LISTS[key][1]]) if key in LISTS else 1


def title(key, section):
    return LISTS[key][2] + str(section) if key in LISTS else None


def row_count(store, key, section):
    if key in DICTIONARIES:
        shown = store.dicts[DICTIONARIES[key]]
        if shown is not None:
            return len(shown)
        if key != "LTE Serving Cell Info":
            return 0
        store.say("You are screwed")
        return 1
    if key in LISTS:
        return len(at(store.records[LISTS[key][0]][LISTS[key][1]], section))
    if key == ONE_LIST_WITHOUT_SECTIONS:
        return len(at(store.records["LTE"]["RsrpRsrqSinr"], section))
    if key in RESELECTION:
        return len(store.records[RESELECTION[key]]["SelReselCellInfo"])
    return 1


def cell(store, key, section, row):
    if key in DICTIONARIES or key in ONE_ROW_DICTIONARIES:
        shown = store.dicts[DICTIONARIES.get(key) or ONE_ROW_DICTIONARIES[key]]
        return UNCHANGED if shown is None else pair(shown, row)
    if key in LISTS and key != WITHOUT_CELLS:
        return pair(at(store.records[LISTS[key][0]][LISTS[key][1]], section), row)
    if key == ONE_LIST_WITHOUT_SECTIONS:
        return pair(at(store.records["LTE"]["RsrpRsrqSinr"], section), row)
    if key == MISMATCHED_CELLS:
        return pair(at(store.records["UMTS"]["rXInfo"], section), row)
    if key in RESELECTION:
        return pair(store.records[RESELECTION[key]]["SelReselCellInfo"], row)
    return FALLBACK


def sections(store, key):
    """Every question once: the number of sections; for each its title, the number of its rows, its cells."""
    result = []
    for section in range(section_count(store, key)):
        heading, rows = title(key, section), row_count(store, key, section)
        result.append({"title": heading, "rows": [cell(store, key, section, row) for row in range(rows)]})
    return result
