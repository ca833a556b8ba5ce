# SPDX-License-Identifier: Apache-2.0
"""The message tables, read from messages.table."""

import pathlib
from typing import NamedTuple


class Field(NamedTuple):
    number: int
    key: str
    kind: str  # the single form: "uint32" for "uint32s"
    repeated: bool
    detail: str  # the class of a nested message, the name of the choices of an enumeration


def _field(number, key, kind, detail=""):
    repeated = kind in ("uint32s", "sint32s", "messages")
    return Field(number, key, kind[:-1] if repeated else kind, repeated, detail)


def _read():
    messages, choices, row = {}, {}, None
    for line in pathlib.Path(__file__).with_name("messages.table").read_text("utf-8").splitlines():
        words = line.partition("#")[0].split()
        if not words:
            continue
        if words[0] == "message":
            rows, row = messages.setdefault(words[1], {}), _field
        elif words[0] == "choices":
            rows, row = choices.setdefault(words[1], {}), lambda number, name: name
        else:
            assert int(words[0]) not in rows, line
            rows[int(words[0])] = row(int(words[0]), *words[1:])
    return messages, choices


MESSAGES, CHOICES = _read()

# Field numbers that the decoder takes for a metric identifier, with the name each has in the decoder's own table.
METRIC_TAGS = {
    0x4E04: "KCellularLteRrcState",
    0x4E18: "KCellularLteCdrxConfig",
    0x4E25: "KCellularLteRadioLinkFailure",
    0x40C2: "KCellularLteScellInfo",
    0xD30E: "KCellularLteSelReselCellInfo",
    0xD301: "KCellularLteServingCellMeasurement",
    0xD302: "KCellularLteTxPower",
    0x4F6A: "KCellularRsrpRsrqSinr",
    0xD50C: "KCellularEmmContext",
    0xD30B: "KCellularLteComponentCarrierInfo",
    0xD313: "KCellularLteCarrierAggregationStatus",
    0xD310: "KCellularLteNbrInterRatCellMeas",
    0xD30F: "KCellularLteNbrEutraCellMeas",
    0xD509: "KCellularMmCommonInfo",
    0xD50D: "KCellularActivatedBearerContexts",
    0xD112: "KCellularWcdmaRrcConnectionState",
    0x300C: "KCellularWcdmaCellInfo",
    0xD102: "KCellularWcdmaScellMeasurement",
    0xD103: "KCellularWcdmaTxPower",
    0xD105: "KCellularWcdmaNbrCellMeas",
    0xD104: "KCellularWcdmaSelReselCellInfo",
    0xD113: "KCellularWcdmaRrcConfiguration",
    0xD50A: "KCellularMmContext",
    0xD50B: "KCellularGmmContext",
    0x2E0C: "kCellularGsmScellInfo",
    0xD001: "kCellularGsmIdleConfig",
    0xD002: "kCellularGsmIdleScellMeasurement",
    0xD003: "kCellularGsmCsRfMeasurement",
    0xD009: "kCellularGsmGrrEventMeasCr",
    0xD00C: "kCellularGsmGprsConfig",
    0x0013: "kCellularSimCardFiles",
}
