#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Shows what the benchmark gate lets through and what not, by records that are made up."""

import copy
import json
import pathlib
import subprocess
import sys
import tempfile
import unittest

BENCH = pathlib.Path(__file__).resolve().parents[2] / "bench"
RECORD = {
    "surroundings": {"architecture": "x86_64", "compiler": "g++ 12.2.0"},
    "per message": {"decode/ours/a": {"instructions": 100.0, "allocations": 0.0},
                    "print/ours/f": {"instructions": 5000.0, "allocations": 1.5}},
}


class Gate(unittest.TestCase):
    def judge(self, change=lambda record: None, recorded=RECORD):
        """Exit status and all that the gate says when the change has happened since the record."""
        now = copy.deepcopy(recorded)
        change(now)
        with tempfile.TemporaryDirectory() as folder:
            paths = [pathlib.Path(folder) / name for name in ("recorded.json", "measured.json")]
            for path, content in zip(paths, (recorded, now)):
                path.write_text(json.dumps(content), encoding="utf-8")
            command = [sys.executable, "-B", BENCH / "gate", "--recorded", paths[0], "--measured", paths[1]]
            done = subprocess.run(command, capture_output=True, text=True, check=False)
        return done.returncode, done.stdout + done.stderr

    @staticmethod
    def setting(name, what, value):
        def change(record):
            record["per message"][name][what] = value
        return change

    def test_the_same_again_passes(self):
        self.assertEqual(self.judge()[0], 0)

    def test_two_per_cent_more_instructions_pass(self):
        self.assertEqual(self.judge(self.setting("decode/ours/a", "instructions", 102.0))[0], 0)

    def test_more_than_two_per_cent_fails_and_names_the_case_and_both_figures(self):
        status, text = self.judge(self.setting("decode/ours/a", "instructions", 102.1))
        self.assertEqual(status, 1)
        self.assertIn("error: decode/ours/a: 102.1 instructions a message, recorded are 100.0: +2.1%", text)
        self.assertIn("bench/record", text)

    def test_fewer_instructions_pass(self):
        self.assertEqual(self.judge(self.setting("print/ours/f", "instructions", 10.0))[0], 0)

    def test_a_single_allocation_more_fails(self):
        status, text = self.judge(self.setting("print/ours/f", "allocations", 1.534))
        self.assertEqual(status, 1)
        self.assertIn("error: print/ours/f: 1.534 allocations a message, recorded are 1.5; none more", text)

    def test_a_case_that_is_no_longer_measured_fails(self):
        status, text = self.judge(lambda record: record["per message"].pop("print/ours/f"))
        self.assertEqual(status, 1)
        self.assertIn("print/ours/f: is recorded and was not measured", text)

    def test_a_case_without_a_record_fails(self):
        def change(record):
            record["per message"]["encode/ours/a"] = {"instructions": 1.0, "allocations": 0.0}
        status, text = self.judge(change)
        self.assertEqual(status, 1)
        self.assertIn("encode/ours/a: is measured and not recorded", text)

    def test_another_compiler_is_told_and_compared_all_the_same(self):
        def change(record):
            record["surroundings"]["compiler"] = "g++ 13.1.0"
            record["per message"]["decode/ours/a"]["instructions"] = 150.0
        status, text = self.judge(change)
        self.assertEqual(status, 1)
        self.assertIn("another compiler: recorded with g++ 12.2.0, here is g++ 13.1.0", text)

    def test_another_architecture_is_told_and_not_compared(self):
        def change(record):
            record["surroundings"]["architecture"] = "aarch64"
            record["per message"]["decode/ours/a"]["instructions"] = 150.0
        status, text = self.judge(change)
        self.assertEqual(status, 0)
        self.assertIn("nothing can be compared", text)

    def test_the_record_of_the_repository_holds_decoding_encoding_and_printing(self):
        record = json.loads((BENCH / "recorded.json").read_text(encoding="utf-8"))
        names = {f"{task}/ours/{of}" for task in ("decode", "encode", "print") for of in ("a", "f")}
        self.assertEqual(set(record["per message"]), names)
        self.assertEqual(self.judge(recorded=record)[0], 0)
        name = "print/ours/a"
        dearer = 1.03 * record["per message"][name]["instructions"]
        self.assertEqual(self.judge(self.setting(name, "instructions", dearer), record)[0], 1)

    def test_every_script_has_help_and_refuses_what_it_does_not_understand_before_it_builds(self):
        for script in ("run", "gate", "record"):
            shown = subprocess.run([sys.executable, "-B", BENCH / script, "--help"], capture_output=True, text=True,
                                   check=False)
            self.assertEqual(shown.returncode, 0)
            self.assertTrue(shown.stdout.startswith(f"usage: bench/{script}"), shown.stdout)
        for command in (["run", "--only", "nothing"], ["run", "--seconds", "0"], ["gate", "x"], ["record", "x"]):
            refused = subprocess.run([sys.executable, "-B", BENCH / command[0], *command[1:]], capture_output=True,
                                     text=True, check=False)
            self.assertEqual((refused.returncode, refused.stdout), (2, ""), command)


if __name__ == "__main__":
    unittest.main()
