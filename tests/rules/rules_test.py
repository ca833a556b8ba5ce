#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""tests/rules/check and what it calls, each held against a small tree that breaks one rule."""
import pathlib
import shutil
import subprocess
import sys
import tempfile
import unittest

import check_lengths

RULES = pathlib.Path(__file__).resolve().parent
ROOT = RULES.parents[1]

# A house of four rooms and a program: values is below everything, ui_qt and ui_terminal are the fronts.
HOUSE = {
    "values/CMakeLists.txt": "probeview_room(values SOURCES value.cpp)  # text(\n",
    "values/value.h": "",
    "values/value.cpp": '#include "values/value.h"\n#include <string>\n',
    "platform/CMakeLists.txt": "probeview_room(platform SOURCES\n  queue.cpp\n  KNOWS values\n  LINKS ${THREADS})\n",
    "platform/queue.h": '#include "values/value.h"\n',
    "platform/queue.cpp": '#include "platform/queue.h"\n#include <mutex>\n',
    "ui/qt/CMakeLists.txt": "probeview_room(ui_qt SOURCES window.cpp KNOWS platform)\n",
    "ui/qt/window.h": "#include <QWindow>\n",
    "ui/qt/window.cpp": '#include "platform/queue.h"\n#include "ui/qt/window.h"\n#include "window.moc"\n',
    "ui/terminal/CMakeLists.txt": "probeview_room(ui_terminal SOURCES screen.cpp)\n",
    "ui/terminal/screen.cpp": "#include <ncurses.h>\n",
    "app/CMakeLists.txt": "if(WINDOW)\n  probeview_program(viewer SOURCES main.cpp window.cpp KNOWS ui_qt)\nelse()\n"
                          "  probeview_program(viewer SOURCES main.cpp)\nendif()\n",
    "app/main.cpp": "int main() {}\n",
    "app/window.cpp": '#include "ui/qt/window.h"\n',
    "tests/values_test.cpp": '#include "app/window.h"\n#include <thread>\n',
    "docs/architecture.md": "| room | folder | what it is for | knows |\n|---|---|---|---|\n"
                            "| `values` | `values/` | values | – |\n"
                            "| `platform` | `platform/` | queues \\| clocks | `values` |\n"
                            "| `ui_qt` | `ui/qt/` | the window | `platform` |\n"
                            "| `ui_terminal` | `ui/terminal/` | the terminal | – |\n",
}


class Rules(unittest.TestCase):
    def setUp(self):
        holder = tempfile.TemporaryDirectory(prefix="probeview-rules-")
        self.addCleanup(holder.cleanup)
        self.top = pathlib.Path(holder.name) / "tree with blanks"
        for name, content in HOUSE.items():
            self.write(name, content)

    def write(self, name: str, content: str):
        path = self.top / name
        path.parent.mkdir(parents=True, exist_ok=True)
        path.write_text(content, encoding="utf-8")

    def add(self, name: str, line: str):
        self.write(name, HOUSE[name] + line)

    def run_rule(self, *command) -> subprocess.CompletedProcess:
        return subprocess.run([str(word) for word in command], capture_output=True, text=True, timeout=50,
                              stdin=subprocess.DEVNULL)

    def includes(self) -> subprocess.CompletedProcess:
        return self.run_rule(sys.executable, "-B", RULES / "check_includes.py", self.top)

    def require_fault(self, *faults: str):
        checked = self.includes()
        self.assertEqual(checked.returncode, 1, checked.stdout)
        self.assertEqual(sorted(checked.stderr.splitlines()), sorted(faults))

    def testAHouseInOrderPasses(self):
        checked = self.includes()
        self.assertEqual((checked.returncode, checked.stderr), (0, ""))
        self.assertEqual(checked.stdout, "includes: 9 files in 4 rooms checked, 0 faults\n")

    def testAnIncludeOfARoomThatIsNotNamedFails(self):
        self.add("values/value.cpp", '  #  include "platform/queue.h"\n')
        self.require_fault("values/value.cpp:3: values may not know platform")

    def testWhatIsLinkedThroughAnotherRoomMustBeNamedToBeIncluded(self):
        self.add("ui/qt/window.cpp", '#include "values/value.h"\n')
        self.require_fault("ui/qt/window.cpp:4: ui_qt may not know values")

    def testARoomThatIsNamedAndNotUsedFails(self):
        self.write("platform/queue.h", "")
        self.require_fault("platform/CMakeLists.txt: platform names values under KNOWS and includes nothing of it")

    def testAnUnknownRoomFails(self):
        self.write("app/CMakeLists.txt", "probeview_program(viewer SOURCES main.cpp window.cpp KNOWS ui_qt capture)\n")
        self.require_fault(
            "app/CMakeLists.txt: the program viewer knows capture, and there is no such room",
            "app/CMakeLists.txt: the program viewer names capture under KNOWS and includes nothing of it")

    def testACircleFails(self):
        self.write("values/CMakeLists.txt", "probeview_room(values SOURCES value.cpp KNOWS ui_qt)\n")
        self.add("values/value.h", '#include "ui/qt/window.h"\n')
        self.require_fault(
            "rooms know each other in a circle: platform -> values -> ui_qt -> platform",
            "docs/architecture.md:3: should be: | `values` | `values/` | values | `ui_qt` | (tests/rules/check --mend)")

    def testAFileInNoRoomFails(self):
        self.write("recordings/reader.h", "")
        # Two rooms in one folder: which has a header that neither names, nobody can tell, unless one is the folder's.
        self.add("ui/qt/CMakeLists.txt", "probeview_room(colours SOURCES theme.cpp)\n")
        self.write("ui/qt/theme.cpp", "")
        self.write("ui/qt/theme.h", "")
        self.write("ui/qt/picture.h", "")
        self.add("platform/CMakeLists.txt", "probeview_room(clock SOURCES clock.cpp)\n")
        self.write("platform/clock.cpp", "")
        self.write("platform/file.h", "")
        why = "lies in no room; name it in SOURCES of the room that it belongs to"
        self.require_fault(f"recordings/reader.h: {why}", f"ui/qt/picture.h: {why}",
                           "docs/architecture.md: has no row | `colours` | `ui/qt/` | what it is for | – |",
                           "docs/architecture.md: has no row | `clock` | `platform/` | what it is for | – |")

    def testAFileInTwoRoomsFails(self):
        self.add("values/CMakeLists.txt", "probeview_program(printer SOURCES value.cpp)\n")
        self.require_fault("values/value.cpp: belongs to values and to the program printer; a file has one room")

    def testAnIncludeOfNoFileFails(self):
        self.add("platform/queue.h", '#include "values/number.h"\n')
        self.require_fault("platform/queue.h:2: values/number.h is no file of any room; "
                           "includes are written from the top of the tree")

    def testNothingOfTheHouseIncludesWhatStandsOutside(self):
        self.add("app/main.cpp", '#include "tests/support/golden.h"\n')
        self.require_fault("app/main.cpp:2: the program viewer may not know tests")

    def testAProgramIsKnownToNobody(self):
        self.add("ui/qt/window.cpp", '#include "app/main.cpp"\n')
        self.require_fault("ui/qt/window.cpp:4: ui_qt may not know the program viewer")

    def testAToolkitStaysBehindItsFront(self):
        self.add("app/window.cpp", "#include <QtCore/QString>\n#include <thread>\n#include <CLI/CLI.hpp>\n")
        self.add("ui/qt/window.cpp", "#include <curses.h>\n#include <QString>\n")
        self.require_fault("app/window.cpp:2: Qt may be included only in ui_qt",
                           "app/window.cpp:3: threads and locks may be included only in platform",
                           "app/window.cpp:4: CLI11 may be included only in command_line",
                           "ui/qt/window.cpp:4: ncurses may be included only in ui_terminal")

    def testTheTableForReadersSaysWhatTheBuildSays(self):
        table = HOUSE["docs/architecture.md"]
        self.write("docs/architecture.md", table.replace("| `values` |\n", "| `values` `wire` |\n")
                   .replace("`ui/terminal/`", "`ui/curses/`") + "| `capture` | `capture/` | recordings | – |\n")
        left_over = "docs/architecture.md:7: there is no room capture"
        self.require_fault(
            left_over,
            "docs/architecture.md:4: should be: | `platform` | `platform/` | queues \\| clocks | `values` | "
            "(tests/rules/check --mend)",
            "docs/architecture.md:6: should be: | `ui_terminal` | `ui/terminal/` | the terminal | – | "
            "(tests/rules/check --mend)")
        mended = self.run_rule(sys.executable, "-B", RULES / "check_includes.py", "--mend", self.top)
        self.assertEqual(mended.stderr, left_over + "\n")
        self.assertEqual((self.top / "docs/architecture.md").read_text(encoding="utf-8"),
                         table + "| `capture` | `capture/` | recordings | – |\n")

    def testATreeWithoutFilesFails(self):
        for path in [*self.top.rglob("*.h"), *self.top.rglob("*.cpp")]:
            path.unlink()
        checked = self.includes()
        self.assertEqual(checked.returncode, 1)
        self.assertIn("no file was checked", checked.stderr)

    def testAFileThatIsTooLongFails(self):
        self.write("values/value.cpp", "\n" * 401)
        self.write("values/value.h", "\n" * 400)
        self.write("values/value.csv", "\n" * 1000)
        self.write("tests/values_test.cpp", "\n" * 1000)
        self.write("build/dev/values.cpp", "\n" * 1000)
        checked = self.run_rule(sys.executable, "-B", RULES / "check_lengths.py", self.top)
        self.assertEqual(checked.returncode, 1)
        self.assertEqual(checked.stderr.splitlines(),
                         ["values/value.cpp: 401 lines, and 400 are the most: split it by what it is about"])

    def testAnExceptionThatIsNeededNoMoreFails(self):
        name = next(iter(check_lengths.EXCEPTED))
        self.write(name, "\n" * 401)
        self.assertEqual(self.run_rule(sys.executable, "-B", RULES / "check_lengths.py", self.top).returncode, 0)
        self.write(name, "\n" * 400)
        checked = self.run_rule(sys.executable, "-B", RULES / "check_lengths.py", self.top)
        self.assertEqual(checked.returncode, 1)
        self.assertIn(f"{name}: is excepted from the most lines and needs it no more", checked.stderr)

    def copy_rules(self):
        for path in sorted(RULES.iterdir()):
            if path.is_file():
                (self.top / "tests/rules").mkdir(parents=True, exist_ok=True)
                shutil.copy2(path, self.top / "tests/rules")
        (self.top / "packaging").mkdir()
        for name in (".clang-format", ".flake8", "packaging/packages.sh"):
            shutil.copy2(ROOT / name, self.top / name)

    def mend(self):
        mended = self.run_rule(self.top / "tests/rules/check", "--mend")
        self.assertEqual((mended.returncode, mended.stderr), (0, ""), mended.stdout)

    def require_linters(self):
        for program in ("clang-format-14", "shellcheck"):
            if shutil.which(program) is None:
                self.skipTest(f"{program} is not installed; ./test installs it")
        if self.run_rule("/usr/bin/python3", "-m", "flake8", "--version").returncode != 0:
            self.skipTest("flake8 is not installed; ./test installs it")

    def testWhatIsNotFormattedFailsAndIsMended(self):
        self.require_linters()
        self.copy_rules()
        check = self.top / "tests/rules/check"
        self.mend()
        self.write("values/value.cpp", '#include "values/value.h"\n\nint  one( ) {return 1;}\n')
        checked = self.run_rule(check)
        self.assertEqual(checked.returncode, 1)
        self.assertEqual(checked.stderr.splitlines(),
                         ["values/value.cpp:3: is not formatted as .clang-format asks",
                          "error: tests/rules/check --mend formats them",
                          "error: rules are broken: format"])
        self.mend()
        self.assertEqual(self.run_rule(check).returncode, 0)
        self.assertTrue((self.top / "values/value.cpp").read_text().endswith("\nint one() { return 1; }\n"))

    def testAConstantWithAKFails(self):
        self.require_linters()
        self.copy_rules()
        self.mend()
        self.write("values/value.h", "constexpr char kKeyOrigin[] = \"kKeyOrigin\";\nconstexpr int mostValues = 3;\n"
                                     "constexpr int kMost = 3;\nconst Milliseconds kPause{5};\n")
        checked = self.run_rule(self.top / "tests/rules/check")
        self.assertEqual(checked.returncode, 1)
        self.assertEqual(checked.stderr.splitlines(),
                         ["values/value.h:3:constexpr int kMost = 3;", "values/value.h:4:const Milliseconds kPause{5};",
                          "error: constants are named as variables are, without a k",
                          "error: rules are broken: names"])

    def testAFaultOfAScriptFails(self):
        self.require_linters()
        self.copy_rules()
        check = self.top / "tests/rules/check"
        self.mend()
        self.write("packaging/paths.sh", "cd $HOME\n")
        self.write("packaging/completion/viewer", "COMPREPLY=($(compgen -W $words))\n")
        self.write("bench/gate", "#!/usr/bin/env python3\nprint(nothing)\n")
        (self.top / "bench/gate").chmod(0o755)
        self.write("bench/counts.py", "import os\n")
        checked = self.run_rule(check)
        self.assertEqual(checked.returncode, 1)
        self.assertEqual(checked.stderr, "error: rules are broken: shell Python\n")
        for found in ("./packaging/paths.sh line 1:", "./packaging/completion/viewer line 1:",
                      "./bench/gate:2:7: F821 undefined name 'nothing'",
                      "./bench/counts.py:1:1: F401 'os' imported but unused"):
            self.assertIn(found, checked.stdout)

    def testHelpIsShownAndNothingElseDone(self):
        self.copy_rules()
        for script in ("check", "tidy"):
            with self.subTest(script=script):
                program = self.top / "tests/rules" / script
                shown = self.run_rule(program, "--help")
                self.assertEqual((shown.returncode, shown.stderr), (0, ""))
                self.assertTrue(shown.stdout.startswith(f"usage: tests/rules/{script}"), shown.stdout)
                refused = self.run_rule(program, "--quickly")
                self.assertEqual((refused.returncode, refused.stdout), (2, ""))
                self.assertIn(f"tests/rules/{script}: '--quickly' is not understood", refused.stderr)
        self.assertFalse((self.top / "build").exists(), "something was begun")


if __name__ == "__main__":
    unittest.main()
