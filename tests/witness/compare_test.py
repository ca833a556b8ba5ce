#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Shows that the comparison can fail: a program that lies is found out, with a case that is small."""

import os
import pathlib
import subprocess
import sys
import unittest

sys.path.insert(0, str(pathlib.Path(__file__).parent))

import compare
from model.text import Real

FOLDER = pathlib.Path(__file__).parent


def comparison_with_the_liar(subcommand):
    done = subprocess.run([sys.executable, "-B", FOLDER / "compare.py", str(FOLDER / "liar.py"), subcommand],
                          capture_output=True, text=True, check=False, env=os.environ | {"PROBEVIEW_SEED": "1"})
    return done.returncode, done.stdout


class Comparison(unittest.TestCase):
    def test_a_decoder_that_keeps_field_19_is_found_out_by_a_two_byte_payload(self):
        status, report = comparison_with_the_liar("decode")
        self.assertEqual(status, 1)
        self.assertIn("--seed 1", report)
        self.assertRegex(report, r"question: \w+ 9801\n")

    def test_a_store_that_does_not_scale_rsrq_is_found_out_by_a_story_of_two_lines(self):
        status, report = comparison_with_the_liar("store")
        self.assertEqual(status, 1)
        self.assertRegex(report, r"story:\n  event 0x3cd313 12\w{6,10}\n  \w.*\nquestion: ")
        self.assertRegex(report, r"\nat: .*(rsrq|rows)")

    def test_true_is_not_1_and_order_counts(self):
        self.assertTrue(compare.same({"a": [1, Real("1.0")]}, {"a": [1, Real("1.0")]}))
        self.assertFalse(compare.same(True, 1))
        self.assertFalse(compare.same(Real("1.0"), Real("1.00")))
        self.assertFalse(compare.same({"a": 1, "b": 2}, {"b": 2, "a": 1}))

    def test_reasons_are_free_and_everything_else_is_not(self):
        self.assertTrue(compare.agrees({"fatal": "", "log": ["a"]}, {"log": ["a"], "fatal": "because"}))
        self.assertFalse(compare.agrees({"fatal": "", "log": []}, {"fatal": "because", "log": ["a"]}))
        self.assertFalse(compare.agrees({"fatal": "", "log": []}, {"fatal": None, "log": []}))
        self.assertFalse(compare.agrees({"error": ""}, {"error": "because", "log": []}))

    def test_an_answer_that_is_no_json_or_says_a_key_twice_is_a_difference(self):
        self.assertFalse(compare.agrees({}, compare.parsed("{")))
        self.assertFalse(compare.agrees({"a": 1}, compare.parsed('{"a":1,"a":1}')))

    def test_payloads_shrink_to_what_matters(self):
        def needs_a_seven(candidates):
            return next((each for each in candidates if b"\x07" in each), None)
        self.assertEqual(compare.shrink(b"\x01\x07\x02\x03", compare.smaller_bytes, needs_a_seven), b"\x07")


if __name__ == "__main__":
    unittest.main()
