#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""The scripts run, test, fuzz/run and packaging/packages.sh, in a copy of the tree that holds little else."""
import os
import pathlib
import re
import shutil
import subprocess
import tempfile
import unittest

ROOT = pathlib.Path(__file__).resolve().parents[2]
NEEDED = ["run", "test", "packaging/packages.sh", "fuzz/run", "fuzz/targets.cmake"]


def scripts() -> list[pathlib.Path]:
    """Every script of the tree that bash reads."""
    found = [ROOT / "packaging/packages.sh"]
    for folder in [ROOT, *(ROOT / name for name in (".ci", "bench", "fuzz", "packaging", "tests"))]:
        for path in sorted(folder.glob("*")):
            first = path.read_bytes().split(b"\n", 1)[0] if path.is_file() else b""
            if first in (b"#!/usr/bin/env bash", b"#!/bin/bash", b"#!/bin/sh"):
                found.append(path)
    return found


class Scripts(unittest.TestCase):
    def setUp(self):
        holder = tempfile.TemporaryDirectory(prefix="probeview-scripts-")
        self.addCleanup(holder.cleanup)
        self.top = pathlib.Path(holder.name) / "tree with blanks"
        for name in NEEDED:
            (self.top / name).parent.mkdir(parents=True, exist_ok=True)
            shutil.copy2(ROOT / name, self.top / name)
        self.stubs = pathlib.Path(holder.name) / "bin"
        self.stubs.mkdir()
        self.calls = pathlib.Path(holder.name) / "calls"
        self.calls.touch()

    def stub(self, name: str, body: str = "exit 0", folder: pathlib.Path | None = None):
        """A program of that name which writes down how it was called."""
        path = (folder or self.stubs) / name
        path.parent.mkdir(parents=True, exist_ok=True)
        path.write_text(f'#!/bin/bash\necho "{name} $*" >>"{self.calls}"\n{body}\n')
        path.chmod(0o755)

    def called(self, program: str) -> list[str]:
        return [line for line in self.calls.read_text().splitlines() if line.split(" ")[0] == program]

    def run_script(self, *command: str, **environment: str) -> subprocess.CompletedProcess:
        clean = {name: value for name, value in os.environ.items() if name not in ("DISPLAY", "WAYLAND_DISPLAY")}
        clean |= {"PATH": f"{self.stubs}:{os.environ['PATH']}", "LC_ALL": "C", "TMPDIR": str(self.calls.parent)} | environment
        return subprocess.run(command, cwd=self.top, env=clean, stdin=subprocess.DEVNULL, capture_output=True, text=True,
                              timeout=50)

    def with_packages(self, commands: str) -> subprocess.CompletedProcess:
        (self.top / "build").mkdir(exist_ok=True)
        return self.run_script("bash", "-euo", "pipefail", "-c", f'top=$PWD; . packaging/packages.sh; {commands}')

    def pretend_installed(self, *packages: str):
        known = "|".join(packages) or "none-at-all"
        self.stub("dpkg-query", f'case "${{@: -1}}" in {known}) echo installed ;; *) exit 1 ;; esac')

    def testEveryScriptIsBash(self):
        self.assertGreaterEqual(len(scripts()), 5)
        for path in scripts():
            checked = subprocess.run(["bash", "-n", str(path)], capture_output=True, text=True)
            self.assertEqual((checked.returncode, checked.stderr), (0, ""), path)
            if path.suffix != ".sh":
                self.assertTrue(os.access(path, os.X_OK), f"{path} cannot be executed")

    def testShellcheckFindsNothing(self):
        if shutil.which("shellcheck") is None:
            self.skipTest("shellcheck is not installed")
        checked = subprocess.run(["shellcheck", *map(str, scripts())], cwd=ROOT, capture_output=True, text=True)
        self.assertEqual(checked.returncode, 0, checked.stdout)

    def testHelpIsShownAndNothingElseDone(self):
        for script in ("./run", "./test", "fuzz/run"):
            for flag in ("--help", "-h"):
                with self.subTest(script=script, flag=flag):
                    shown = self.run_script(script, flag)
                    self.assertEqual((shown.returncode, shown.stderr), (0, ""))
                    self.assertTrue(shown.stdout.startswith(f"usage: {script}"), shown.stdout)
        self.assertIn("--source", self.run_script("./run", "--help").stdout)
        self.assertIn("--deep", self.run_script("./test", "--help").stdout)
        self.assertFalse((self.top / "build").exists())

    def testWhatIsNotUnderstoodEndsWithStatusTwoAndAText(self):
        for command, text in [
            (("./run", "--sauce"), "run: '--sauce' is not understood; ./run --help lists what is"),
            (("./run", "--source"), "run: --source needs a source, as in --source scenario:city"),
            (("./run", "scenario:city"), "run: 'scenario:city' is not understood"),
            (("./test", "--fast"), "test: '--fast' is not understood; ./test --help lists what is"),
            (("./test", "--deep", "x"), "test: 'x' is not understood"),
            (("fuzz/run",), "usage: fuzz/run TARGET MINUTES"),
            (("fuzz/run", "frames"), "usage: fuzz/run TARGET MINUTES"),
            (("fuzz/run", "no_such", "1"), "fuzz/run: there is no target 'no_such'"),
            (("fuzz/run", "frames", "soon"), "fuzz/run: 'soon' is no number of minutes"),
            (("fuzz/run", "frames", "0"), "fuzz/run: '0' is no number of minutes"),
        ]:
            with self.subTest(command=command):
                refused = self.run_script(*command)
                self.assertEqual((refused.returncode, refused.stdout), (2, ""), refused.stderr)
                self.assertIn(text, refused.stderr)
        self.assertFalse((self.top / "build").exists(), "something was begun")

    def testOnlyMissingPackagesAreInstalled(self):
        self.pretend_installed("one", "two")
        self.stub("apt-get")
        self.stub("id", "echo 0")
        self.assertEqual(self.with_packages("install_packages one two").returncode, 0)
        self.assertEqual(self.called("apt-get"), [])
        done = self.with_packages("install_packages one three two four")
        self.assertEqual((done.returncode, done.stdout), (0, "installing: three four\n"))
        self.assertEqual(len(self.called("apt-get")), 1)
        self.assertTrue(self.called("apt-get")[0].endswith("install -y --no-install-recommends three four"))

    def testWhatCannotBeInstalledIsSaid(self):
        self.pretend_installed()
        self.stub("id", "echo 0")
        self.stub("apt-get", 'echo "E: no network"; exit 100')
        failed = self.with_packages("install_packages three")
        self.assertEqual(failed.returncode, 1)
        self.assertIn("E: no network", failed.stderr)
        self.assertIn("error: the packages could not be installed; the whole story is in build/packages.log", failed.stderr)
        self.assertIn(" update", "".join(self.called("apt-get")))
        # Neither root nor sudo: of all programs only those that the script itself needs are left.
        self.stub("id", "echo 1000")
        for name in ("bash", "env", "grep"):
            (self.stubs / name).symlink_to(shutil.which(name))
        helpless = self.run_script(shutil.which("bash"), "-c", 'top=$PWD; . packaging/packages.sh; install_packages three',
                                   PATH=str(self.stubs))
        self.assertEqual(helpless.returncode, 1)
        self.assertIn("there is neither root nor sudo to install them: three", helpless.stderr)

    def testAFailedBuildIsSaid(self):
        self.stub("cmake", 'echo "CMake Error: nothing here"; exit 1')
        failed = self.with_packages("configure_and_build release")
        self.assertEqual(failed.returncode, 1)
        self.assertIn("CMake Error: nothing here", failed.stderr)
        self.assertIn("error: configuring failed; the whole story is in build/release.log", failed.stderr)
        self.stub("cmake", 'case "$1" in --preset) ;; *) echo "x.cpp:1: error: broken"; exit 1 ;; esac')
        failed = self.with_packages("configure_and_build release")
        self.assertEqual(failed.returncode, 1)
        self.assertIn("x.cpp:1: error: broken", failed.stderr)
        self.assertIn("error: the build failed; the whole story is in build/release.log", failed.stderr)

    def pretend_built(self, service: str, viewer: str):
        self.stub("dpkg-query", "echo installed")
        self.stub("cmake")
        built = self.top / "build/release/bin"
        self.stub("radixd", service, built)
        self.stub("probeview", viewer, built)
        self.stub("probeview-pictures", "exit 0", built)

    def testRunEndsWithTheViewersStatusAndLeavesNothingBehind(self):
        # A service that listens and then waits to be ended.
        listen = ("exec python3 -c 'import os, socket, sys, time\n"
                  "open(sys.argv[3], \"w\").write(str(os.getpid()))\n"
                  "s = socket.socket(socket.AF_UNIX, socket.SOCK_SEQPACKET); s.bind(sys.argv[2]); time.sleep(60)' "
                  f'"$1" "$2" "{self.calls}.pid"')
        for status in (0, 3):
            self.pretend_built(listen, f'[ -S "$RADIXD_SOCKET" ] || exit 9\nexit {status}')
            ended = self.run_script("./run", "--source", "scenario:city,seed=2", "--source=trace:a b.csv", "--terminal")
            self.assertEqual(ended.returncode, status, ended.stderr)
            service = self.called("radixd")[-1]
            self.assertRegex(service, r"--socket \S+/radixd.sock --source scenario:city,seed=2 --source trace:a b.csv$")
            self.assertFalse(pathlib.Path(service.split(" ")[2]).parent.exists(), "the private folder is still there")
            process = int(pathlib.Path(f"{self.calls}.pid").read_text())
            self.assertFalse(pathlib.Path(f"/proc/{process}").exists(), "the service is still there")
        # With neither display nor terminal everything is printed once.
        self.pretend_built(listen, "echo pages")
        printed = self.run_script("./run")
        self.assertEqual(printed.returncode, 0, printed.stderr)
        self.assertIn("pages\n", printed.stdout)
        self.assertEqual(self.called("probeview")[-1], "probeview --print")
        self.assertEqual(len(self.called("probeview-pictures")), 1)
        self.assertTrue(re.search(r"^-- build: \d+ s$", printed.stdout, re.M), printed.stdout)

    def testRunSaysThatTheServiceDidNotStart(self):
        self.pretend_built('echo "radixd: error: the source cannot be had" >&2; exit 1', "exit 0")
        failed = self.run_script("./run", "--terminal")
        self.assertEqual(failed.returncode, 1)
        self.assertIn("radixd: error: the source cannot be had", failed.stderr)
        self.assertIn("run: the service did not start", failed.stderr)
        self.assertEqual(self.called("probeview"), [])


if __name__ == "__main__":
    unittest.main()
