#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""The scripts run, test, fuzz/run and packaging/packages.sh, in a copy of the tree that holds little else."""
import fcntl
import os
import pathlib
import pty
import re
import shutil
import signal
import subprocess
import tempfile
import time
import unittest

# A service that listens and then waits to be ended; $1 and $2 are its option and its socket.
LISTEN = ("exec python3 -c 'import os, socket, sys, time\n"
          "open(sys.argv[3], \"w\").write(str(os.getpid()))\n"
          "s = socket.socket(socket.AF_UNIX, socket.SOCK_SEQPACKET); s.bind(sys.argv[2]); time.sleep(60)' "
          '"$1" "$2" "{calls}.pid"')
ROOT = pathlib.Path(__file__).resolve().parents[2]
NEEDED = ["run", "test", "packaging/packages.sh", "fuzz/run", "fuzz/targets.cmake"]


def scripts() -> list[pathlib.Path]:
    """Every script of the tree that bash reads."""
    found = [ROOT / "packaging/packages.sh"]
    for folder in [ROOT, *(ROOT / name for name in (".ci", "bench", "fuzz", "packaging", "tests", "tests/rules"))]:
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

    def surroundings(self) -> dict[str, str]:
        clean = {name: value for name, value in os.environ.items() if name not in ("DISPLAY", "WAYLAND_DISPLAY")}
        return clean | {"PATH": f"{self.stubs}:{os.environ['PATH']}", "LC_ALL": "C", "TMPDIR": str(self.calls.parent)}

    def run_script(self, *command: str, where: pathlib.Path | None = None,
                   **environment: str) -> subprocess.CompletedProcess:
        return subprocess.run(command, cwd=where or self.top, env=self.surroundings() | environment,
                              stdin=subprocess.DEVNULL, capture_output=True, text=True, timeout=50)

    def begin(self, *command: str, **options) -> subprocess.Popen:
        """Starts a script and leaves it running, at most as long as the test does."""
        process = subprocess.Popen(command, cwd=self.top, env=self.surroundings() | options.pop("environment", {}),
                                   stdin=subprocess.DEVNULL, text=True, **options)
        self.addCleanup(process.wait)
        self.addCleanup(process.kill)
        for stream in (process.stdout, process.stderr):
            if stream is not None:
                self.addCleanup(stream.close)
        return process

    def wait_until(self, condition):
        deadline = time.monotonic() + 30
        while not condition():
            self.assertLess(time.monotonic(), deadline, "it never came to that")
            time.sleep(0.02)

    def listening_service(self) -> str:
        return LISTEN.replace("{calls}", str(self.calls))

    def require_nothing_left(self, *processes: pathlib.Path):
        self.assertEqual(list(self.calls.parent.glob("probeview.*")), [], "the private folder is still there")
        for noted in processes:
            process = int(noted.read_text())
            self.assertFalse(pathlib.Path(f"/proc/{process}").exists(), f"{noted} is still there")

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
        self.assertIn("error: the packages could not be installed; the whole story is in build/packages.log",
                      failed.stderr)
        self.assertIn(" update", "".join(self.called("apt-get")))
        # Neither root nor sudo: of all programs only those that the script itself needs are left.
        self.stub("id", "echo 1000")
        for name in ("bash", "env", "grep"):
            (self.stubs / name).symlink_to(shutil.which(name))
        helpless = self.run_script(shutil.which("bash"), "-c",
                                   'top=$PWD; . packaging/packages.sh; install_packages three', PATH=str(self.stubs))
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
        listen = self.listening_service()
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
        self.assertEqual(self.called("probeview")[-1], "probeview --print --log -")
        self.assertEqual(len(self.called("probeview-pictures")), 1)
        self.assertTrue(re.search(r"^-- build: \d+ s$", printed.stdout, re.M), printed.stdout)

    def testRunIntoAReaderThatGoesAwayEndsCleanAfterAnyNumberOfLines(self):
        self.pretend_built(self.listening_service(),
                           "for line in {1..300}; do echo \"line $line\" 2>/dev/null || exit 0; done")
        for lines in (1, 2, 3, 4, 5, 100, 1000):
            # A reader that has gone is told of by a signal, or, where that is ignored, by an error.
            for ignored in ("", "trap '' PIPE; "):
                with self.subTest(lines=lines, ignored=ignored):
                    ended = self.run_script("bash", "-c", f"{ignored}./run | head -n {lines} | wc -l; "
                                                          'echo "status ${PIPESTATUS[0]}"')
                    # The stages, the lines of the viewer, the picture.
                    self.assertEqual(ended.stdout.split(), [str(min(lines, 305)), "status", "0"], ended.stderr)
                    self.assertEqual(ended.stderr, "")
                    self.require_nothing_left()

    def testASignalEndsRunWithItsViewerAndItsService(self):
        viewer = pathlib.Path(f"{self.calls}.viewer")
        self.pretend_built(self.listening_service(),
                           f'echo $$ >"{viewer}.new"; mv "{viewer}.new" "{viewer}"\nexec sleep 60')
        for sent, status in ((signal.SIGTERM, 143), (signal.SIGHUP, 129)):
            for front in (["--terminal"], []):
                with self.subTest(signal=sent, front=front):
                    viewer.unlink(missing_ok=True)
                    run = self.begin("./run", *front, stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
                    self.wait_until(viewer.exists)
                    run.send_signal(sent)
                    self.assertEqual(run.wait(timeout=20), status)
                    self.require_nothing_left(viewer, pathlib.Path(f"{self.calls}.pid"))

    def testATraceIsNamedFromWhereTheCallerStands(self):
        self.pretend_built(f'pwd >"{self.calls}.where"\n' + self.listening_service(), "exit 0")
        elsewhere = self.calls.parent / "else where"
        elsewhere.mkdir()
        ended = self.run_script(str(self.top / "run"), "--source", "trace:drive.csv,speed=2", where=elsewhere)
        self.assertEqual(ended.returncode, 0, ended.stderr)
        self.assertTrue(self.called("radixd")[-1].endswith(" --source trace:drive.csv,speed=2"))
        self.assertEqual(pathlib.Path(f"{self.calls}.where").read_text(), f"{elsewhere}\n")
        self.assertIn("pictures of the window", ended.stdout)

    def testRunPassesWarningsOfTheServiceOnEachOnceAndAtMostTwenty(self):
        told = ('echo "radixd: info: listening" >&2\n'
                "for row in {1..30}; do for again in 1 2; do\n"
                '  echo "radixd: warning: trace:x.csv: line $row: no number" >&2; done; done\n')
        for count, front in ((30, []), (30, ["--terminal"]), (3, []), (3, ["--terminal"])):
            with self.subTest(count=count, front=front):
                self.pretend_built(told.replace("30", str(count)) + self.listening_service(), "exit 0")
                ended = self.run_script("./run", *front)
                self.assertEqual(ended.returncode, 0, ended.stderr)
                expected = [f"radixd: warning: trace:x.csv: line {row}: no number" for row in range(1, count + 1)]
                if count > 20:
                    expected[19:] = ["run: further warnings of the service are not shown"]
                self.assertEqual(ended.stderr.splitlines(), expected)
                self.require_nothing_left()

    def testProgressIsShownOnATerminalAlone(self):
        self.stub("cmake", 'case "$1" in --preset) echo "-- configuring" ;; *) echo "[1/2] Building one"; '
                           'echo "[2/2] Linking all, whose name is far too long for the line of a small terminal" ;;'
                           ' esac')
        command = ["bash", "-euo", "pipefail", "-c", "top=$PWD; . packaging/packages.sh; configure_and_build release"]
        (self.top / "build").mkdir()
        quiet = self.run_script(*command)
        self.assertEqual((quiet.returncode, quiet.stdout, quiet.stderr), (0, "", ""))
        ours, theirs = pty.openpty()
        with open(ours, "rb") as shown:
            run = self.begin(*command, stderr=theirs, stdout=subprocess.DEVNULL)
            os.close(theirs)
            self.assertEqual(run.wait(timeout=30), 0)
            # All of it waits in the terminal; its other end is closed.
            text = os.read(shown.fileno(), 65536).decode()
        self.assertIn("\r\x1b[K-- configuring\r", text)
        self.assertIn("\r\x1b[K[1/2] Building one\r\x1b[K[2/2] Linking", text)
        self.assertTrue(text.endswith("\r\x1b[K"), repr(text))
        self.assertNotIn("\n", text)
        self.assertLessEqual(max(map(len, re.split(r"\r\x1b\[K", text))), 79)
        self.assertIn("[1/2] Building one\n", (self.top / "build/release.log").read_text())

    def testWhatIsWaitedForIsSaid(self):
        (self.top / "build").mkdir()
        self.stub("cmake")
        with open(self.top / "build/release.lock", "w") as lock:
            fcntl.flock(lock, fcntl.LOCK_EX)
            build = self.begin("bash", "-euo", "pipefail", "-c",
                               "top=$PWD; . packaging/packages.sh; configure_and_build release", stderr=subprocess.PIPE)
            self.assertEqual(build.stderr.readline(), "waiting for another build of build/release to end\n")
            self.assertEqual(self.called("cmake"), [])
        self.assertEqual(build.wait(timeout=30), 0)
        self.assertEqual(len(self.called("cmake")), 2)
        self.pretend_installed()
        self.stub("id", "echo 0")
        self.stub("apt-get")
        held = self.calls.parent / "lock-frontend"
        install = ("bash", "-euo", "pipefail", "-c", "top=$PWD; . packaging/packages.sh; install_packages three")
        with open(held, "w") as lock:
            fcntl.lockf(lock, fcntl.LOCK_EX)
            waiting = self.run_script(*install, dpkg_lock=str(held))
        self.assertIn(f"waiting for process {os.getpid()}, which is installing packages", waiting.stderr)
        self.assertEqual(self.run_script(*install, dpkg_lock=str(held)).stderr, "")

    def testRunSaysThatTheServiceDidNotStart(self):
        self.pretend_built('echo "radixd: error: the source cannot be had" >&2; exit 1', "exit 0")
        failed = self.run_script("./run", "--terminal")
        self.assertEqual(failed.returncode, 1)
        self.assertEqual(failed.stderr, "radixd: error: the source cannot be had\nrun: the service did not start\n")
        self.assertEqual(self.called("probeview"), [])


if __name__ == "__main__":
    unittest.main()
