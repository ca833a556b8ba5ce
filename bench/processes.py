# SPDX-License-Identifier: Apache-2.0
"""Programs of ours that run beside bench/run, and what the system says of them."""

import contextlib
import os
import pathlib
import re
import signal
import subprocess
import sys
import tempfile
import time

PATIENCE = 30.0


class Process:
    """A program that runs until the end of its block, which ends it by SIGTERM."""

    def __init__(self, *command, stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL, **environment):
        self._process = subprocess.Popen([str(word) for word in command], stdin=subprocess.DEVNULL, stdout=stdout,
                                         stderr=stderr, env={**os.environ, **environment})
        self.stdout, self.stderr = self._process.stdout, self._process.stderr

    def __enter__(self):
        return self

    def __exit__(self, *_):
        self._process.send_signal(signal.SIGTERM)
        self._process.communicate()

    def end(self):
        """Ends it at once; the processor time of its whole life in ms."""
        # Not by Popen, which would reap one that has ended already, and its times with it.
        os.kill(self._process.pid, signal.SIGKILL)
        _, status, usage = os.wait4(self._process.pid, 0)
        self._process.returncode = os.waitstatus_to_exitcode(status)
        return 1000 * (usage.ru_utime + usage.ru_stime)

    def resident(self):
        """In MB, now and at its highest."""
        return self._status("VmRSS") / 1024, self._status("VmHWM") / 1024

    def processor_seconds(self):
        """Of all threads that live."""
        return sum(int((self._folder() / task / "schedstat").read_text(encoding="utf-8").split()[0])
                   for task in self._tasks()) * 1e-9

    def wake_ups(self):
        """How often a thread has gone to sleep of its own will: each time, something had woken it before."""
        return sum(self._status("voluntary_ctxt_switches", f"{task}/status") for task in self._tasks())

    def _folder(self):
        if self._process.poll() is not None:
            sys.exit(f"bench: {self._process.args[0]} ended too early, with status {self._process.returncode}")
        return pathlib.Path(f"/proc/{self._process.pid}")

    def _tasks(self):
        return [f"task/{task.name}" for task in (self._folder() / "task").iterdir()]

    def _status(self, key, of="status"):
        text = (self._folder() / of).read_text(encoding="utf-8")
        return int(re.search(rf"^{key}:\s+(\d+)", text, re.MULTILINE)[1])


@contextlib.contextmanager
def listening(*command):
    """Runs a service on a private socket, whose path stands for SOCKET in the command; gives process and path."""
    with tempfile.TemporaryDirectory() as folder:
        socket = f"{folder}/radixd.sock"
        with Process(*[socket if word == "SOCKET" else word for word in command]) as process:
            deadline = time.monotonic() + PATIENCE
            while not os.path.exists(socket):
                if time.monotonic() > deadline:
                    sys.exit(f"bench: {command[0]} does not listen")
                time.sleep(0.01)
            yield process, socket


def without_display(socket, folder, **more):
    """The environment of a viewer that draws into memory."""
    return {"RADIXD_SOCKET": socket, "QT_QPA_PLATFORM": "offscreen", "QT_QUICK_BACKEND": "software",
            "XDG_RUNTIME_DIR": folder, **more}
