#!/usr/bin/env python3
"""Runs what is built for Windows in Wine, and compares it with the Linux command.

  windows_test.py ROOT BUILD LINUX_COMMAND [UNITTEST_ARGUMENTS...]
"""

import filecmp
import os
import pathlib
import re
import shutil
import signal
import subprocess
import sys
import tempfile
import time
import unittest

ROOT, BUILD, LINUX = (pathlib.Path(argument).resolve() for argument in sys.argv[1:4])
PROGRAMS = BUILD / "bin"
MORVIK = PROGRAMS / "morvik.exe"
LIBRARIES = {"morvik_v1_0_bitacc_cmodel": "exports.64.txt", "morvik_link": "exports.link.txt",
             "morvik_checker": "exports.checker.txt"}
MACHINE = "x86_64-w64-mingw32-"

# Wine takes file names by the locale; a folder of its own keeps the user's as it is.
ENVIRONMENT = dict(os.environ, WINEPREFIX=str(BUILD / "wine"), WINEDEBUG="-all", LC_ALL="C.UTF-8")
ENVIRONMENT.pop("DISPLAY", None)

VECTORS = ROOT / "tests/data/vectors"
NAME = "Soft Bits – Größe 試"


def call(*command, folder=None, text=None):
    return subprocess.run([str(word) for word in command], cwd=folder, input=text, capture_output=True, env=ENVIRONMENT)


def windows(*arguments, folder, text=None):
    return call("wine", MORVIK, *arguments, folder=folder, text=text)


def linux(*arguments, folder, text=None):
    return call(LINUX, *arguments, folder=folder, text=text)


def tool(name, *arguments):
    result = call(MACHINE + name, *arguments)
    assert result.returncode == 0, result.stderr
    return result.stdout.decode()


def exports_of(library):
    table = tool("objdump", "-p", PROGRAMS / f"{library}.dll").partition("[Ordinal/Name Pointer]")[2]
    return re.findall(r"^\t\[ *\d+\] (\w+)$", table, re.MULTILINE)


def without_times(text):
    """Results without the seconds that they took."""
    text = re.sub(rb'"seconds": [0-9.]+', b'"seconds": 0', text)
    return re.sub(rb",[0-9.]+(,[0-9]+,[0-9.]+\n)", rb",0\1", text)


class Windows(unittest.TestCase):
    def setUp(self):
        holder = tempfile.TemporaryDirectory(dir=BUILD)
        self.addCleanup(holder.cleanup)
        self.folder = pathlib.Path(holder.name) / f"{NAME} folder"
        self.folder.mkdir()
        for name in ("windows", "linux"):
            (self.folder / name).mkdir()

    def both(self, *arguments, status=0, text=None):
        """Runs the command for both systems, each in its folder; returns the results, which are the same."""
        ours = windows(*arguments, folder=self.folder / "windows", text=text)
        theirs = linux(*arguments, folder=self.folder / "linux", text=text)
        self.assertEqual(ours.returncode, status, ours.stderr)
        self.assertEqual(theirs.returncode, status, theirs.stderr)
        return ours, theirs

    def files(self, name):
        """The contents of a file of both."""
        return [(self.folder / system / name).read_bytes() for system in ("windows", "linux")]

    def assert_same_files(self):
        names = {system: sorted(str(path.relative_to(self.folder / system))
                                for path in (self.folder / system).rglob("*")) for system in ("windows", "linux")}
        self.assertEqual(names["windows"], names["linux"])
        for name in names["linux"]:
            if (self.folder / "linux" / name).is_file():
                self.assertTrue(filecmp.cmp(self.folder / "windows" / name, self.folder / "linux" / name, False), name)


class Built(unittest.TestCase):
    def test_needs_only_what_windows_has(self):
        for file in [MORVIK, *(PROGRAMS / f"{library}.dll" for library in (*LIBRARIES, "morvik_dpi"))]:
            needed = set(re.findall(r"DLL Name: (\S+)", tool("objdump", "-p", file)))
            self.assertTrue(needed)
            self.assertLessEqual({name.lower() for name in needed},
                                 {"kernel32.dll", "msvcrt.dll", "advapi32.dll", "shell32.dll"}, file)

    def test_exports_the_interface_for_c(self):
        for library, names in LIBRARIES.items():
            listed = re.findall(r"^(?:veltra|morvik)_\w+$", (ROOT / "tests/data" / names).read_text(), re.MULTILINE)
            self.assertEqual(sorted(exports_of(library)), sorted(listed))

    def test_exports_what_systemverilog_imports(self):
        exported = exports_of("morvik_dpi")
        package = (ROOT / "bindings/systemverilog/morvik_pkg.sv").read_text()
        imported = re.findall(r'import "DPI-C".*?\b(morvik_\w+) *\(', package)
        self.assertGreater(len(imported), 20)
        self.assertLessEqual(set(imported), set(exported))

    def test_moves_no_wide_vector_as_if_the_stack_were_aligned(self):
        for file in (MORVIK, PROGRAMS / "morvik_v1_0_bitacc_cmodel.dll"):
            moves = re.findall(r"\t(vmov\w+) .*%[yz]mm", tool("objdump", "-d", "--no-show-raw-insn", file))
            self.assertGreater(len(moves), 1000)
            self.assertFalse([move for move in moves if re.match(r"vmov(aps|apd|dqa)", move)])

    def test_an_installed_copy_is_linked_with(self):
        with tempfile.TemporaryDirectory(dir=BUILD) as holder:
            copy = pathlib.Path(holder) / "a copy"
            self.assertEqual(call("cmake", "--install", BUILD, "--prefix", copy).returncode, 0)
            for library in LIBRARIES:
                self.assertTrue((copy / "bin" / f"{library}.dll").exists())
            # By the import library, and as other linkers do it: by one that is made of the list of exports.
            name = "morvik_v1_0_bitacc_cmodel"
            tool("dlltool", "-d", copy / "lib" / f"{name}.def", "-l", copy / "made.lib")
            for library in (copy / "lib" / f"lib{name}.dll.a", copy / "made.lib"):
                program = copy / "bin" / "program.exe"
                tool("gcc-posix", "-std=c99", "-Wall", "-Werror", "-I", copy / "include", ROOT / "tests/builds/c_program.c",
                     library, "-o", program)
                self.assertEqual(call("wine", program).returncode, 0)


class Commands(Windows):
    def test_computes_the_promised_bits_by_each_instruction_set(self):
        ours, theirs = self.both("selftest")
        plain = [re.sub(rb" +[0-9.]+ s\b", b"", result.stdout) for result in (ours, theirs)]
        self.assertEqual(plain[0], plain[1])
        self.assertIn(b"Passed", plain[0])

    def test_decodes_files_with_either_line_ending(self):
        text = (VECTORS / "k512.csv").read_bytes()
        for system in ("windows", "linux"):
            (self.folder / system / f"{NAME}.csv").write_bytes(text.replace(b"\n", b"\r\n"))
            shutil.copy(VECTORS / "k512.bits", self.folder / system)
        arguments = ("decode", f"{NAME}.csv", "--reference", "k512.bits", "--output", f"{NAME}.txt")
        ours, theirs = self.both(*arguments)
        self.assertEqual(*(re.sub(rb"[0-9.]+ Mbit/s", b"", result.stderr) for result in (ours, theirs)))
        self.assert_same_files()
        ours, theirs = self.both("decode", "-", text=text)
        self.assertEqual(ours.stdout, theirs.stdout)

    def test_tells_what_is_wrong(self):
        for status, arguments in ((2, ("decode", f"{NAME} that is not there.csv")), (2, ("ber", "--block-size", "41")),
                                  (2, ("nothing",)), (2, ())):
            ours, theirs = self.both(*arguments, status=status)
            self.assertEqual(ours.stderr, theirs.stderr)

    def test_takes_names_as_windows_does(self):
        block = VECTORS / "k40.csv"
        self.both("trace", block, "--iterations", "1", "--format", "csv", "--output", "dump.csv")
        compare = ("compare", "--dump", "dump.csv", "--block", block, "--iterations", "1", "--json")
        folder = self.folder / "windows"
        result = windows(*compare, "Found.json", "--coverage", "found.JSON", folder=folder)
        self.assertIn(b"is the same file as found.JSON", result.stderr)
        self.assertEqual(windows(*compare, "NUL", "--coverage", "nul", folder=folder).returncode, 0)

    def test_tells_that_nobody_reads_on(self):
        run = subprocess.Popen(["wine", MORVIK, "trace", VECTORS / "k512.csv", "--format", "csv", "--output", "-"],
                               stdout=subprocess.PIPE, stderr=subprocess.PIPE, env=ENVIRONMENT)
        run.stdout.close()
        with run.stderr:
            message = run.stderr.read()
        self.assertEqual(run.wait(), 2)
        self.assertIn(b"<stdout>: cannot be written: Broken pipe", message)

    def test_simulates_the_same_error_rates(self):
        for number, arguments in enumerate((
                ("--block-size", "40,1024", "--num-pu", "2,8", "--algorithm", "scaled,table", "--ebn0", "0:0.5:1.5"),
                ("--mcs", "4,20", "--resource-blocks", "3", "--channel", "rayleigh", "--demapper", "exact"))):
            for ending in ("json", "csv"):
                name = f"{NAME} {number}.{ending}"
                self.both("ber", *arguments, "--max-blocks", "300", "--threads", "2", "--seed", "7", "--output", name,
                          "--report", f"{number}.html", "--overwrite", "--quiet")
                self.assertEqual(*map(without_times, self.files(name)))
        names = [sorted(os.listdir(self.folder / system)) for system in ("windows", "linux")]
        self.assertEqual(names[0], names[1], "no file is left over")

    def test_refuses_results_that_another_run_writes(self):
        with self.running("--max-blocks", "100000000") as run:
            second = windows("ber", "--block-size", "6144", "--output", "rates.json", "--overwrite",
                             folder=self.folder / "windows")
            self.assertEqual(second.returncode, 2)
            self.assertIn(b"another run is writing it", second.stderr)
            run.kill()
            run.wait()

    def test_goes_on_after_being_killed(self):
        self.goes_on_after(signal.SIGKILL, -signal.SIGKILL)

    def test_goes_on_after_ctrl_c(self):
        self.goes_on_after(signal.SIGINT, 128 + signal.SIGINT)

    def goes_on_after(self, number, status):
        limit = ("--max-blocks", "4000", "--block-errors", "4000")
        with self.running(*limit) as run:
            run.send_signal(number)
            self.assertEqual(run.wait(), status)
        arguments = ("ber", "--block-size", "6144", "--ebn0", "0.5", *limit, "--output", "rates.json", "--quiet")
        self.assertEqual(windows(*arguments, "--resume", folder=self.folder / "windows").returncode, 0)
        self.assertEqual(linux(*arguments, folder=self.folder / "linux").returncode, 0)
        self.assertEqual(*map(without_times, self.files("rates.json")))
        self.assertEqual(os.listdir(self.folder / "windows"), ["rates.json"])

    def running(self, *arguments):
        """A slow simulation that has saved something."""
        run = subprocess.Popen(
            ["wine", MORVIK, "ber", "--block-size", "6144", "--ebn0", "0.5", *arguments, "--output", "rates.json",
             "--instruction-set", "component", "--checkpoint-interval", "0.2", "--quiet"],
            cwd=self.folder / "windows", env=ENVIRONMENT)
        self.addCleanup(run.kill)
        checkpoint = self.folder / "windows" / "rates.json.checkpoint"
        while run.poll() is None and (not checkpoint.exists() or b'"blocks"' not in checkpoint.read_bytes()):
            time.sleep(0.05)
        self.assertIsNone(run.poll(), "it runs")
        return run

    def test_writes_the_same_vectors(self):
        for blocks, formats in (("3", "memh,csv,npy,c"), ("2", "csv")):  # the second replaces the first
            self.both("vectors", "--out", f"{NAME} set", "--block-size", "40,512", "--blocks", blocks, "--internal",
                      "--format", formats)
            self.assert_same_files()
        ours, theirs = self.both("vectors", "--check", f"{NAME} set")
        self.assertEqual(ours.stdout, theirs.stdout)

    def test_writes_the_same_traces_and_compares_them(self):
        block = VECTORS / "k512.csv"
        for ending in ("csv", "vcd"):
            self.both("trace", block, "--iterations", "1", "--format", ending, "--output", f"{NAME}.{ending}")
        self.assert_same_files()
        dump = (self.folder / "linux" / f"{NAME}.csv").read_bytes()
        lines = dump.split(b"\n")
        lines[200] = re.sub(rb"-?[0-9]+$", b"77", lines[200])
        for system in ("windows", "linux"):
            (self.folder / system / "wrong.csv").write_bytes(b"\r\n".join(lines))
        for status, name in ((0, f"{NAME}.csv"), (1, "wrong.csv")):
            ours, theirs = self.both("compare", "--dump", name, "--block", block, "--iterations", "1", status=status)
            self.assertEqual(ours.stdout, theirs.stdout)


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1] + sys.argv[4:])
