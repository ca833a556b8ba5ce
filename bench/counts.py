# SPDX-License-Identifier: Apache-2.0
"""Building the benchmarks, and counting instructions: what bench/run, bench/record and bench/gate share."""

import dataclasses
import os
import pathlib
import platform
import re
import subprocess
import sys
import tempfile

TOP = pathlib.Path(__file__).resolve().parents[1]
PROGRAMS = TOP / "build/bench/bench"
TOOLS = TOP / "build/bench/bin"

BUILD = """
top=$1; targets=$2; cd "$top"; mkdir -p build; . packaging/packages.sh
install_packages $packages_build $packages_window $packages_bench
build_targets=${targets:-all} configure_and_build bench
"""

# The same work on every machine: which of its copying loops the C library uses depends on the processor, how it finds
# its functions on the moment, and where the stack begins on the environment.
FIXED_ENVIRONMENT = {
    "GLIBC_TUNABLES": "glibc.cpu.hwcaps=-AVX,-AVX2,-AVX512F,-AVX512VL,-AVX512BW,-ERMS,-FSRM,-BMI1,-BMI2,-LZCNT,-MOVBE,"
                      "-SSE4_1,-SSE4_2,-SSSE3,-Fast_Unaligned_Copy",
    "LD_BIND_NOW": "1",
    "LC_ALL": "C",
    "TZ": "UTC",
}


@dataclasses.dataclass
class Count:
    """What one message takes."""
    instructions: float
    allocations: float


def build(targets=""):
    """Installs what is missing and builds the bench tree, or these targets of it. Ends the program if it fails."""
    done = subprocess.run(["bash", "-euo", "pipefail", "-c", BUILD, "build", str(TOP), targets], check=False)
    if done.returncode != 0:
        sys.exit(1)


def count(program, *arguments):
    """Runs a program that counts by callgrind's requests; what it counted by name."""
    with tempfile.TemporaryDirectory() as folder:
        out = pathlib.Path(folder) / "out"
        done = subprocess.run(
            ["valgrind", "--tool=callgrind", "--collect-atstart=no", f"--callgrind-out-file={out}", str(program),
             *arguments], env={"PATH": os.environ["PATH"], **FIXED_ENVIRONMENT}, capture_output=True, text=True,
            check=False)
        if done.returncode != 0:
            sys.exit(f"{program} failed under callgrind:\n{done.stderr}")
        totals = {}
        for dump in pathlib.Path(folder).glob("out.*"):
            text = dump.read_text(encoding="utf-8", errors="replace")
            name = re.search(r"^desc: Trigger: Client Request: (.*)$", text, re.MULTILINE)
            total = re.search(r"^(?:totals|summary): (\d+)", text, re.MULTILINE)
            if name and total:
                totals[name[1].strip()] = int(total[1])
    counts = {}
    for line in done.stdout.splitlines():
        name, messages, allocations = line.split("\t")
        if not totals.get(name):
            sys.exit(f"callgrind counted nothing for {name}; is valgrind whole?")
        counts[name] = Count(totals[name] / int(messages), float(allocations))
    return counts


def first_line(*command):
    done = subprocess.run(command, capture_output=True, text=True, check=False)
    lines = done.stdout.splitlines()
    return lines[0] if done.returncode == 0 and lines else "unknown"


def version(package):
    text = first_line("dpkg-query", "-W", "-f", "${Version}\n", package)
    return f"{package} {text}"


def processor():
    model = re.search(r"^model name\s*: (.*)$", pathlib.Path("/proc/cpuinfo").read_text(encoding="utf-8"), re.MULTILINE)
    return model[1] if model else "unknown"


def surroundings():
    """What the counts depend on."""
    cache = (TOP / "build/bench/CMakeCache.txt").read_text(encoding="utf-8")
    compiler = re.search(r"^CMAKE_CXX_COMPILER:\w+=(.*)$", cache, re.MULTILINE)[1]
    return {
        "architecture": platform.machine(),
        "compiler": first_line(compiler, "--version"),
        "libc": version("libc6"),
        "libstdc++": version("libstdc++6"),
        "valgrind": version("valgrind"),
        "processor": processor(),
    }
