#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Vectors made by hand, so that a mistake that the model and the programs share is less likely. The meaning of each
stands above it; the bytes were put together by hand from the published encoding."""

import os
import sys
import unittest

sys.path.insert(0, os.path.dirname(os.path.abspath(__file__)))

from model import pages, wire
from model.clock import Clock
from model.store import DISPLAY_DICTIONARIES, HANDLERS, STEPS, UNHANDLED, Stop, Store
from model.tables import CHOICES, MESSAGES, METRIC_TAGS, TABLES
from model.text import Real, bare, json_form, printed


def decoded(name, hexadecimal):
    log = []
    message, complete = wire.decode(name, bytes.fromhex(hexadecimal), log.append)
    return wire.dictionary(message), complete, wire.encode(message).hex(), log


class Vectors(unittest.TestCase):
    def expect(self, name, hexadecimal, shown, complete=True, reencoded=None, log=()):
        """Without `reencoded` the payload itself must come back."""
        reencoded = hexadecimal.replace(" ", "") if reencoded is None else reencoded.replace(" ", "")
        self.assertEqual(decoded(name, hexadecimal), (shown, complete, reencoded, list(log)))


class Scalars(Vectors):
    def test_an_empty_payload_is_an_empty_message(self):
        self.expect("KCellularLteRrcState", "", {})

    def test_timestamp_1_state_connected_from_idle_after_300_ms_by_mobile_originated_data(self):
        self.expect("KCellularLteRrcState", "08 01 10 03 18 01 20 ac02 28 04",
                    {"timestamp": 1, "state": "KLTE_RRC_STATE_CONNECTED", "prev_state": "KLTE_RRC_STATE_IDLE",
                     "prev_state_dur_ms": 300, "cause": "KLTE_RRC_CAUSE_EST_MO_DATA"})

    def test_fields_come_back_in_the_order_of_their_numbers(self):
        self.expect("KCellularLteRrcState", "2004 0801",
                    {"timestamp": 1, "prev_state_dur_ms": 4}, reencoded="0801 2004")

    def test_the_later_of_two_scalars_stays(self):
        self.expect("KCellularLteRrcState", "2004 2005", {"prev_state_dur_ms": 5}, reencoded="2005")

    def test_the_largest_timestamp(self):
        self.expect("KCellularLteRrcState", "08 ffffffffffffffffff01", {"timestamp": 2**64 - 1})

    def test_bits_past_the_64th_are_dropped(self):
        self.expect("KCellularLteRrcState", "08 ffffffffffffffffff7f", {"timestamp": 2**64 - 1},
                    reencoded="08 ffffffffffffffffff01")

    def test_a_uint32_keeps_the_low_32_bits_of_ten_bytes(self):
        self.expect("KCellularLteRrcState", "20 8580808090 8080808001", {"prev_state_dur_ms": 5}, reencoded="2005")

    def test_ten_bytes_without_an_end_read_as_0_and_the_next_byte_is_a_key(self):
        self.expect("KCellularLteRrcState", "20 ffffffffffffffffffff 0807", {"timestamp": 7, "prev_state_dur_ms": 0},
                    reencoded="0807 2000")

    def test_a_scalar_cut_short_is_kept_as_0(self):
        self.expect("KCellularLteRrcState", "0807 20 ff", {"timestamp": 7, "prev_state_dur_ms": 0}, complete=False,
                    reencoded="0807 2000")

    def test_a_key_without_a_value_keeps_0(self):
        self.expect("KCellularLteRrcState", "20", {"prev_state_dur_ms": 0}, complete=False, reencoded="2000")

    def test_a_choice_past_the_table_shows_its_number(self):
        self.expect("KCellularLteRrcState", "2820 1007", {"state": "(unknown: 7)", "cause": "(unknown: 32)"},
                    reencoded="1007 2820")

    def test_a_negative_choice_takes_ten_bytes(self):
        self.expect("KCellularLteRrcState", "10 ffffffff0f", {"state": "(unknown: -1)"},
                    reencoded="10 ffffffffffffffffff01")

    def test_causes_254_and_255_have_names(self):
        self.expect("KCellularLteRrcState", "28 fe01", {"cause": "KLTE_RRC_CAUSE_NO_SERVICE"})
        self.expect("KCellularLteRrcState", "28 ff01", {"cause": "KLTE_RRC_CAUSE_NA"})

    def test_zigzag_minus_9550(self):
        # 2 * 9550 - 1 = 19099 = 0x4a9b -> 9b 95 01
        self.expect("SecondaryComponentCarrier", "58 9b9501", {"rsrp": -9550})

    def test_zigzag_extremes(self):
        self.expect("SecondaryComponentCarrier", "58 ffffffff0f 60 feffffff0f", {"rsrp": -(2**31), "rsrq": 2**31 - 1})

    def test_zigzag_looks_at_the_low_32_bits_only(self):
        # 2^32 + 1: bit 32 does not count, 1 is -1.
        self.expect("SecondaryComponentCarrier", "58 8180808010", {"rsrp": -1}, reencoded="5801")

    def test_a_bool_tests_all_64_bits(self):
        # 2^32
        self.expect("SecondaryComponentCarrier", "38 8080808010", {"has_uplink": True}, reencoded="3801")
        self.expect("SecondaryComponentCarrier", "3800", {"has_uplink": False})

    def test_band_numbers_in_the_gaps_have_no_names(self):
        for number, name in [("02", "(unknown: 2)"), ("59", "(unknown: 89)"), ("8601", "(unknown: 134)"),
                             ("a801", "SYS_BAND_UMTS_BAND6"), ("a901", "(unknown: 169)")]:
            self.expect("KCellularWcdmaCellInfo", "40" + number, {"wcdma_band": name})

    def test_the_wire_type_of_a_known_field_is_not_looked_at(self):
        # Field 4 as fixed 32-bit, yet one varint is read; field 1 as a start of a group.
        self.expect("KCellularLteRrcState", "25 05 0b 07", {"timestamp": 7, "prev_state_dur_ms": 5},
                    reencoded="0807 2005")

    def test_a_field_number_is_cut_to_16_bits(self):
        # 65536 + 4 = 0x10004, times 8 is 0x80020 -> a0 80 20
        self.expect("KCellularLteRrcState", "a08020 05", {"prev_state_dur_ms": 5}, reencoded="2005")


class Unknown(Vectors):
    def test_unknown_fields_of_every_form_are_skipped_and_not_kept(self):
        # Field 6 as varint, 64 bits, record and 32 bits.
        self.expect("KCellularLteRrcState", "30 ff01 31 0102030405060708 32 02 aabb 35 01020304 0807", {"timestamp": 7},
                    reencoded="0807")

    def test_a_group_cannot_be_skipped(self):
        self.expect("KCellularLteRrcState", "0807 33 2001", {"timestamp": 7}, complete=False, reencoded="0807")

    def test_forms_6_and_7_cannot_be_skipped(self):
        self.expect("KCellularLteRrcState", "36 2001", {}, complete=False, reencoded="")
        self.expect("KCellularLteRrcState", "37 2001", {}, complete=False, reencoded="")

    def test_an_unknown_field_cut_short_fails(self):
        for cut in ("30", "30 80", "31 01020304050607", "32 03 aabb", "35 010203"):
            self.expect("KCellularLteRrcState", cut, {}, complete=False, reencoded="")

    def test_a_key_cut_short_fails(self):
        self.expect("KCellularLteRrcState", "0807 80", {"timestamp": 7}, complete=False, reencoded="0807")

    def test_an_end_of_a_group_ends_the_message(self):
        self.expect("KCellularLteRrcState", "0807 0c 2001", {"timestamp": 7}, reencoded="0807")

    def test_a_key_of_ten_bytes_without_an_end_is_unknown_field_0_with_a_varint(self):
        self.expect("KCellularLteRrcState", "ffffffffffffffffffff 05 0807", {"timestamp": 7}, reencoded="0807")

    def test_the_key_of_all_ones_is_unknown_field_65535_of_a_form_that_cannot_be_skipped(self):
        self.expect("KCellularLteRrcState", "0807 ffffffffffffffffff01 2001", {"timestamp": 7}, complete=False,
                    reencoded="0807")

    def test_the_largest_key_that_can_be_skipped_is_unknown_field_65535(self):
        # 2^64 - 3: form 5
        self.expect("KCellularLteRrcState", "fdffffffffffffffff01 01020304 0807", {"timestamp": 7}, reencoded="0807")

    def test_an_unknown_varint_without_an_end_is_skipped(self):
        self.expect("KCellularLteRrcState", "30 ffffffffffffffffffff 0807", {"timestamp": 7}, reencoded="0807")

    def test_field_19_is_dropped_as_a_metric_identifier(self):
        # Thresh_serving_lowQ is field 19: 19 * 8 = 152 = 0x98 -> 98 01
        self.expect("KCellularLteSelReselCellInfo", "9801 05 a001 06", {"priority_operating_freq": 6},
                    reencoded="a001 06", log=["valid metricId tag", "Unknown tag: 13:5"])

    def test_a_metric_identifier_is_dropped_with_its_low_32_bits_logged(self):
        # 0xD302 * 8 = 0x69810 -> 90 b0 1a; the value is 2^32 + 9
        self.expect("KCellularLteTxPower", "90b01a 8980808010 0807", {"timestamp": 7}, reencoded="0807",
                    log=["valid metricId tag", "Unknown tag: d302:9"])

    def test_a_metric_identifier_cut_short_logs_0_and_fails(self):
        self.expect("KCellularLteTxPower", "0807 9801 80", {"timestamp": 7}, complete=False, reencoded="0807",
                    log=["valid metricId tag", "Unknown tag: 13:0"])

    def test_a_metric_identifier_is_one_inside_a_nested_record_too(self):
        self.expect("KCellularLteTxPower", "12 05 9801 05 1802", {"tx_power_info": [{"subframe_index": 2}]},
                    reencoded="12 02 1802", log=["valid metricId tag", "Unknown tag: 13:5"])


class Nested(Vectors):
    def test_two_elements(self):
        self.expect("KCellularLteTxPower", "0801 12 04 0803 1002 12 02 1807",
                    {"timestamp": 1, "tx_power_info": [{"pucch_tx_power": -2, "pusch_tx_power": 1},
                                                       {"subframe_index": 7}]})

    def test_an_empty_element_is_an_element(self):
        self.expect("KCellularLteTxPower", "1200", {"tx_power_info": [{}]})

    def test_a_record_longer_than_the_payload_leaves_an_empty_element(self):
        self.expect("KCellularLteTxPower", "12 03 1807", {"tx_power_info": [{}]}, complete=False, reencoded="1200")

    def test_a_fault_inside_an_element_keeps_what_was_read(self):
        self.expect("KCellularLteTxPower", "12 03 1807 08 1801",
                    {"tx_power_info": [{"pucch_tx_power": 0, "subframe_index": 7}]}, complete=False,
                    reencoded="12 04 0800 1807")

    def test_a_length_counts_up_to_the_enclosing_record_only(self):
        # In a GUTI's place an area identity whose bytes field says 2 bytes but only 1 belongs to the record.
        self.expect("KCellularMmContext", "22 03 0a 02 62 2801", {"lai": {}}, complete=False, reencoded="2200")

    def test_after_an_end_of_a_group_in_an_element_reading_goes_on_at_its_end(self):
        self.expect("KCellularLteTxPower", "12 05 1807 0c 1809 0805",
                    {"timestamp": 5, "tx_power_info": [{"subframe_index": 7}]}, reencoded="0805 12 02 1807")

    def test_a_second_single_message_replaces_the_first(self):
        # GUTI with mmegi 1, then GUTI with mmec 2.
        self.expect("KCellularEmmContext", "32 02 0801 32 02 1002", {"guti": {"mmec": 2}}, reencoded="32 02 1002")

    def test_a_length_of_ten_bytes_without_an_end_is_0(self):
        self.expect("KCellularLteTxPower", "12 ffffffffffffffffffff 0805", {"timestamp": 5, "tx_power_info": [{}]},
                    reencoded="0805 1200")

    def test_a_length_near_2_to_the_64_fails(self):
        self.expect("KCellularLteTxPower", "12 ffffffffffffffffff01 0805", {"tx_power_info": [{}]}, complete=False,
                    reencoded="1200")


class BytesAndTexts(Vectors):
    def test_bytes_and_empty_bytes(self):
        self.expect("Plmn", "0a 03 62f210", {"encoded_plmn": bytes.fromhex("62f210")})
        self.expect("Plmn", "0a00", {"encoded_plmn": b""})

    def test_bytes_cut_short_leave_what_was_there(self):
        self.expect("Plmn", "0a 01 62 0a 03 62f2", {"encoded_plmn": b"\x62"}, complete=False, reencoded="0a 01 62")
        self.expect("Plmn", "0a 03 62f2", {}, complete=False, reencoded="")
        self.expect("Plmn", "0a", {}, complete=False, reencoded="")

    def test_a_text_keeps_bytes_that_are_not_utf8(self):
        self.expect("BearerContext", "1a 03 61c328", {"apn": "a\udcc3("})
        self.assertEqual(json_form({"apn": "a\udcc3("}), {"apn": {"text": "61c328"}})
        self.assertEqual(printed({"apn": "a\udcc3("}), '["apn": "a\ufffd("]')


class RepeatedScalars(Vectors):
    def test_packed(self):
        self.expect("KCellularGsmCsRfMeasurement", "2a 03 3b 8001", {"cs_tx_pwr": [-30, 64]})

    def test_packed_and_unpacked_occurrences_append(self):
        self.expect("KCellularGsmCsRfMeasurement", "28 02 2a 02 0406 2d 08", {"cs_tx_pwr": [1, 2, 3, 4]},
                    reencoded="2a 04 02040608")

    def test_an_empty_packed_record_leaves_nothing(self):
        self.expect("KCellularGsmCsRfMeasurement", "2a00", {}, reencoded="")

    def test_a_last_element_cut_short_appends_0_and_fails(self):
        self.expect("KCellularGsmCsRfMeasurement", "2a 02 02 80 0805", {"cs_tx_pwr": [1, 0]}, complete=False,
                    reencoded="2a 02 0200")
        self.expect("KCellularGsmCsRfMeasurement", "28 80", {"cs_tx_pwr": [0]}, complete=False, reencoded="2a 01 00")

    def test_an_element_without_an_end_is_0(self):
        self.expect("KCellularLteSelReselCellInfo", "12 0b ffffffffffffffffffff 05", {"multi_band_info": [0, 5]},
                    reencoded="12 02 0005")

    def test_a_packed_record_past_the_payload_appends_nothing(self):
        self.expect("KCellularGsmCsRfMeasurement", "2a 03 0204", {}, complete=False, reencoded="")


class Tables(unittest.TestCase):
    def test_counts(self):
        # Two area identities and the one that nothing takes.
        self.assertEqual(sum(name.startswith("KCellular") for name in MESSAGES), len(HANDLERS) + 2 + 1)
        self.assertEqual(sorted(METRIC_TAGS), sorted(number & 0xFFFF for number in [*HANDLERS, *UNHANDLED.values()]))
        self.assertEqual(len(CHOICES["KCellularWcdmaCellInfo.wcdmaBand"]), 78)
        self.assertEqual(len(set(pages.PAGE_KEYS)), len(pages.PAGE_KEYS))
        self.assertEqual(len(set(DISPLAY_DICTIONARIES)), len(HANDLERS) + 1)

    def test_every_detail_is_there(self):
        for fields in MESSAGES.values():
            for field in fields.values():
                self.assertIn(field.kind, "uint64 uint32 sint32 choice bool bytes string message".split())
                if field.kind in ("choice", "message"):
                    self.assertIn(field.detail, CHOICES if field.kind == "choice" else MESSAGES)
                else:
                    self.assertEqual(field.detail, "")

    def test_what_has_steps_of_its_own_is_a_metric(self):
        self.assertLessEqual(set(STEPS), {metric.constant for metric in TABLES.metrics.values()})

    def test_the_dictionaries_of_the_handlers_are_all_but_the_one_that_nothing_fills(self):
        filled = {name for _, name, _ in HANDLERS.values()}
        self.assertEqual(set(DISPLAY_DICTIONARIES) - filled, {"myLTESCellMeasDict"})


class TextForms(unittest.TestCase):
    def test_values(self):
        self.assertEqual(printed({"a": 1, "b": "x", "c": [1, 4], "d": b"\x62\xf2\x10", "e": b"", "f": True, "g": []}),
                         '["a": 1, "b": "x", "c": [1, 4], "d": <62f210>, "e": <>, "f": 1, "g": []]')
        self.assertEqual(printed({}), "[]")
        self.assertEqual([printed(real) for real in (1.4, 10.0, -9.5, 0.0, -0.01, 2147483628.0)],
                         ["1.4", "10.0", "-9.5", "0.0", "-0.01", "2147483628.0"])

    def test_a_printed_text_stays_on_its_line(self):
        self.assertEqual(printed('\\ " \n \r \t \0 \x1b \x7f \x85 ü'),
                         '"\\\\ \\" \\n \\r \\t \\0 \\u{1b} \\u{7f} \x85 ü"')

    def test_a_cell_is_bare(self):
        self.assertEqual(bare("a\n\"b\""), "a\n\"b\"")
        self.assertEqual(bare(b"\x01"), "<01>")

    def test_json(self):
        self.assertEqual(json_form({"a": 10.0, "b": b"\x01", "c": True, "d": 2**64 - 1}),
                         {"a": Real("10.0"), "b": {"bytes": "01"}, "c": True, "d": 2**64 - 1})


class Clocks(unittest.TestCase):
    def test_the_epoch(self):
        self.assertEqual(Clock().text(0), "1970-01-01 00:00:00 UTC")
        self.assertEqual(Clock("Europe/Berlin").text(999), "1970-01-01 01:00:00 CET")

    def test_the_last_second_of_winter_and_the_first_of_summer(self):
        self.assertEqual(Clock("Europe/Berlin").text(1711846799999), "2024-03-31 01:59:59 CET")
        self.assertEqual(Clock("Europe/Berlin").text(1711846800000), "2024-03-31 03:00:00 CEST")

    def test_years_past_9999_are_whole(self):
        self.assertEqual(Clock().text(253402300799999), "9999-12-31 23:59:59 UTC")
        self.assertEqual(Clock().text(253402300800000), "10000-01-01 00:00:00 UTC")

    def test_the_largest_timestamp_goes_through_a_double(self):
        # 2^64 - 1 rounds to 2^64; divided by 1000 it rounds to ...552 seconds.
        self.assertEqual(Clock().text(2**64 - 1), "584556019-04-03 14:25:52 UTC")


class Stores(unittest.TestCase):
    def setUp(self):
        self.store = Store()

    def event(self, identifier, hexadecimal):
        self.store.log = []
        return self.store.event(identifier, bytes.fromhex(hexadecimal))

    def test_an_unhandled_metric(self):
        self.assertFalse(self.event(0x3C4E25, "ff"))
        self.assertEqual(self.store.log, ["Metric ID in Hex = 3C4E25", "I dont care for this Metric"])

    def test_the_identifier_is_printed_with_32_bits_and_compared_with_64(self):
        self.assertFalse(self.event(0x1003C4E04, ""))
        self.assertFalse(self.event(5, ""))
        self.assertEqual(self.store.log[0], "Metric ID in Hex =  5")
        self.assertFalse(self.event(-1, ""))
        self.assertEqual(self.store.log[0], "Metric ID in Hex = FFFFFFFF")

    def test_fatal_stops(self):
        self.assertRaises(Stop, self.store.event, None, b"")
        self.assertEqual(self.store.log, [])
        self.assertRaises(Stop, self.store.event, 0x3C4E04, None)
        self.assertEqual(self.store.log, ["Metric ID in Hex = 3C4E04"])
        self.assertRaises(Stop, self.event, 0x3C4E04, "08")
        self.assertFalse(self.store.event(0x3CD301, None))

    def test_a_serving_cell_is_halved_twice_before_its_line(self):
        for raw, quarter in [("05", 1), ("03", 0), ("64", 25), ("ffffffff07", (2**31 - 1) // 4),
                             ("ffffffff0f", 2**32 - 1)]:
            self.assertTrue(self.event(0x3C40C2, "28" + raw))
            self.assertEqual(self.store.log[1], 'Current Serving Cell Info is ["dl_bw": %d]' % quarter)
            self.assertEqual(self.store.dicts["myLTESCellInfoDict"], {"dl_bw": quarter})

    def test_a_neighbour_of_40_and_20_is_minus_100_dbm_and_minus_9_5_db(self):
        self.event(0x3CD30F, "0800 12 04 2050 2828")
        self.assertEqual(self.store.log, [
            "Metric ID in Hex = 3CD30F",
            'Received LTE IRAT Meas is ["timestamp": "1970-01-01 00:00:00 UTC", '
            '"meas_nbr_eutra": [["nbr_rsrp": 40, "nbr_rsrq": 20]]]',
            "Received Valid Metric"])
        self.assertEqual(self.store.dicts["myLTEIntraRatMeasDict"]["meas_nbr_eutra"],
                         [{"nbr_rsrp": -100, "nbr_rsrq": -9.5, "timestamp": "1970-01-01 00:00:00 UTC"}])

    def test_an_overflow_stops_after_the_line(self):
        self.assertRaises(Stop, self.event, 0x3CD30F, "12 06 20 ffffffff0f")
        self.assertEqual(len(self.store.log), 2)

    def test_a_carrier(self):
        # index 3 of the bandwidths; rsrp -9550 -> -95, rsrq -1050 -> -10.5
        self.event(0x3CD313, "12 09 3003 58 9b9501 60 b310")
        self.assertEqual(self.store.records["LTE"]["CAStatusList"],
                         [{"dl_bandwidth": 10.0, "rsrp": -95, "rsrq": -10.5}])
        self.assertEqual(self.store.dicts["myLTECAStatusDict"]["scc_list"],
                         [{"dl_bandwidth": 3, "rsrp": -9550, "rsrq": -1050}])

    def test_a_reselection_blanks_what_it_lacks_and_keeps_its_neighbours(self):
        self.event(0x3CD30E, "0800 12 02 0307 a001 05 aa01 04 0805 3006")
        self.assertEqual(self.store.log[1:3], [
            'Received LTE Cell Resel Info is ["timestamp": 0, "multi_band_info": [3, 7], "priority_operating_freq": 5, '
            '"nbr_eutra": [["earfcn": 5, "dl_bw": 6]]]', "[3, 7]"])
        known = self.store.records["LTE"]["SelReselCellInfo"]
        self.assertEqual((known["priority_operating_freq"], known["multi_band_info"], known["Q_hyst"]),
                         (5, "[3, 7]", ""))
        self.event(0x3CD30E, "6801")
        known = self.store.records["LTE"]["SelReselCellInfo"]
        self.assertEqual((known["priority_operating_freq"], known["multi_band_info"], known["Q_hyst"], len(known)),
                         ("", "", 1, 20))
        self.assertEqual(self.store.records["LTE"]["EutraNbrs"],
                         [{"earfcn": 5, "dl_bw": 6, "timestamp": "1970-01-01 00:00:00 UTC"}])

    def test_a_band_that_is_no_signed_32_bit_integer_keeps_the_list(self):
        self.event(0x3CD104, "2a 05 ffffffff0f")
        self.assertEqual(len(self.store.log), 3)
        self.assertEqual(self.store.records["UMTS"]["SelReselCellInfo"]["multi_band_info"], [2**32 - 1])

    def test_the_misspelt_ecno_stays_raw(self):
        self.event(0x3CD009, "1a 04 2000 280a")
        self.assertEqual(self.store.records["GSM"]["utraNbrMeas"], [{"cpich_rscp": -116, "cpich_ecn0": 10}])

    def test_only_what_the_parent_has_is_handed_to_the_elements(self):
        self.event(0x3CD102, "1001 1a 00")
        self.assertEqual(self.store.records["UMTS"]["rXInfo"], [{"connected_mode": True}])
        self.event(0x3CD102, "1000")
        self.assertEqual(self.store.records["UMTS"]["rXInfo"], [{"connected_mode": True}])

    def test_an_emm_context_is_flattened_before_its_line(self):
        self.event(0x3CD50C, "2a 07 0a 03 00f110 1001 32 02 0801")
        self.assertEqual(self.store.dicts["myLTEEMMContextDict"],
                         {"tai_list": '[["encoded_plmn": <00f110>, "tac": 1]]', "guti": '["mmegi": 1]'})
        self.assertEqual(self.store.log[1], 'Received EMM Context is ["tai_list": '
                         '"[[\\"encoded_plmn\\": <00f110>, \\"tac\\": 1]]", "guti": "[\\"mmegi\\": 1]"]')

    def test_sim_entries_have_no_timestamp_and_bearers_have_one(self):
        self.event(0x3C0013, "0800 12 02 0801")
        self.assertEqual(self.store.records["Common"]["simContents"], [{"ef_id": 1}])
        self.event(0x3CD50D, "0800 1a 02 0801")
        self.assertEqual(self.store.records["Common"]["activeBearer"],
                         [{"cid": 1, "timestamp": "1970-01-01 00:00:00 UTC"}])


class Pages(unittest.TestCase):
    def setUp(self):
        self.store = Store()

    def test_an_absent_dictionary_has_no_rows(self):
        self.assertEqual(pages.sections(self.store, "LTE NAS"), [{"title": None, "rows": []}])

    def test_an_absent_serving_cell_is_lamented_once(self):
        self.assertEqual(pages.sections(self.store, "LTE Serving Cell Info"), [{"title": None, "rows": [[None, None]]}])
        self.assertEqual(self.store.log, ["You are screwed"])

    def test_a_placeholder_has_its_title(self):
        self.assertEqual(pages.sections(self.store, "UMTS Tx Power"),
                         [{"title": "TxPowerInfo 0", "rows": [["Waiting for Update", "Waiting for Update"]]}])

    def test_the_umts_serving_cell_measurements_fall_back(self):
        self.store.event(0x3CD102, bytes.fromhex("1001 1a00 1a02 0801"))
        self.assertEqual(pages.sections(self.store, "UMTS Serving Cell Meas"), [
            {"title": "RxInfo 0", "rows": [["Come back later", "Come back later"]]},
            {"title": "RxInfo 1", "rows": [["Come back later", "Come back later"]] * 2}])
        self.assertEqual(pages.sections(self.store, "UMTS Serving Cell Measurement"),
                         [{"title": None, "rows": [["connected_mode", "1"]]}])

    def test_a_gsm_dictionary_shows_its_first_pair_and_stops_when_it_has_none(self):
        self.assertEqual(pages.sections(self.store, "GSM Idle Config"), [{"title": None, "rows": [[None, None]]}])
        self.store.event(0x3CD001, bytes.fromhex("0800 1005"))
        self.assertEqual(pages.sections(self.store, "GSM Idle Config"),
                         [{"title": None, "rows": [["timestamp", "1970-01-01 00:00:00 UTC"]]}])
        self.store.event(0x3CD001, b"")
        self.assertRaises(Stop, pages.sections, self.store, "GSM Idle Config")

    def test_keys_without_a_branch_fall_back(self):
        for key in ("Device Info IMSI", "GSM Connected Serv Cell Meas", "GSM GSM GPRS Config", "no such page"):
            self.assertEqual(pages.sections(self.store, key),
                             [{"title": None, "rows": [["Come back later", "Come back later"]]}])


if __name__ == "__main__":
    unittest.main()
