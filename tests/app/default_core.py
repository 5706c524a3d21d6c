"""Checks that one core, the library's own, is the default everywhere, and that commands tell which core they use.

default_core.py MORVIK
"""

import json
import re
import subprocess
import sys
import tempfile
import unittest
from pathlib import Path

MORVIK = Path(sys.argv.pop(1)).absolute() if len(sys.argv) > 1 else None
TREE = Path(__file__).resolve().parents[2]
BLOCK = TREE / "tests" / "data" / "vectors" / "k40.csv"
NAMES = ("max-log", "scaled", "table")


def run(*arguments, folder=None, status=0):
    done = subprocess.run([MORVIK, *map(str, arguments)], capture_output=True, text=True, cwd=folder)
    assert done.returncode == status, (arguments, done)
    return done


def source(name):
    return (TREE / name).read_text(encoding="utf-8")


CORE = json.loads(run("info", "--json").stdout)["default_core"]


def line_of(units, algorithm, iterations):
    return f"core: {units} units, {algorithm}, {iterations} iteration{'s' if iterations > 1 else ''}"


class Library(unittest.TestCase):
    def test_gives_the_default(self):
        text = source("src/morvik_v1_0_bitacc_cmodel.cpp")
        for name, value in (("NUM_PU", CORE["num_pu"]), ("ALGORITHM_TYPE", NAMES.index(CORE["algorithm"])),
                            ("TAG_WIDTH", CORE["tag_width"])):
            self.assertEqual(re.findall(rf"generics\.C_{name} = (\d+);", text), [str(value)])


class Commands(unittest.TestCase):
    def test_have_the_default_in_their_help(self):
        for command in ("decode", "trace", "compare", "vectors", "doctor", "ber"):
            shown = dict(re.findall(r"^  --(num-pu|algorithm|iterations|tag-width) [^ =]+=(\S+)",
                                    run(command, "--help").stdout, re.MULTILINE))
            expected = {"num-pu": str(CORE["num_pu"]), "algorithm": CORE["algorithm"],
                        "iterations": str(CORE["iterations"]), "tag-width": str(CORE["tag_width"])}
            if command == "ber":
                del expected["tag-width"]
            self.assertEqual(shown, expected, command)

    def test_simulate_and_decode_with_the_default(self):
        with tempfile.TemporaryDirectory() as folder:
            run("ber", "--block-size", "40", "--ebn0", "0", "--max-blocks", "1", "--quiet", "--output", "a.json",
                folder=folder)
            point, = json.loads((Path(folder) / "a.json").read_text())["rows"]
            run("vectors", "--out", "k40", "--block-size", "40", "--blocks", "1", folder=folder)
            manifest = json.loads((Path(folder) / "k40" / "manifest.json").read_text())["parameters"]
        for made in (point, manifest):
            self.assertEqual([made[name] for name in ("num_pu", "algorithm", "iterations")],
                             [CORE[name] for name in ("num_pu", "algorithm", "iterations")])

    def test_tell_the_core_first(self):
        chosen = ("--num-pu", "8", "--algorithm", "table", "--iterations", "1")
        for options, line in (((), line_of(CORE["num_pu"], CORE["algorithm"], CORE["iterations"])),
                              (chosen, line_of(8, "table", 1))):
            with tempfile.TemporaryDirectory() as folder:
                bits = Path(folder) / "bits"
                bits.write_text(run("decode", BLOCK, *options).stdout)
                dump = Path(folder) / "dump.csv"
                values = run("trace", BLOCK, "--format", "csv", *options)
                dump.write_text(values.stdout)
                told = [run("decode", BLOCK, *options).stderr, values.stderr,
                        run("compare", "--block", BLOCK, "--dump", dump, *options).stdout,
                        run("doctor", BLOCK, "--reference", bits, *options).stdout,
                        run("vectors", "--out", "k40", "--block-size", "40", *options, folder=folder).stdout,
                        run("vectors", "--check", "k40", folder=folder).stdout]
            self.assertEqual([text.split("\n")[0] for text in told], [line] * len(told))

    def test_of_simulation_tell_the_core_above_each_table(self):
        heading = run("ber", "--block-size", "40", "--ebn0", "0", "--max-blocks", "1").stdout.split("\n")[0]
        self.assertEqual(heading, f"K = 40, {CORE['num_pu']} units, {CORE['algorithm']}, scale auto, "
                                  f"{CORE['iterations']} iterations")


class Bindings(unittest.TestCase):
    def expect(self, file, pattern, *values, times=1):
        found = re.findall(pattern, source(f"bindings/{file}"))
        self.assertEqual(found, [tuple(map(str, values)) if len(values) > 1 else str(values[0])] * times, file)

    def test_octave(self):
        self.expect("octave/morvik_decode.m",
                    r"struct\('num_pu', (\d), 'algorithm', (\d), 'iterations', (\d), 'tag_width', (\d),",
                    CORE["num_pu"], NAMES.index(CORE["algorithm"]), CORE["iterations"], CORE["tag_width"])
        self.expect("octave/morvik_decode.m", r"%   num_pu +(\d) ", CORE["num_pu"])

    def test_systemverilog(self):
        self.expect("systemverilog/morvik_pkg.sv",
                    r"int num_pu = (\d), int algorithm = ALGORITHM_(\w+), int tag_width = (\d)",
                    CORE["num_pu"], CORE["algorithm"].upper().replace("-", "_"), CORE["tag_width"])
        self.expect("systemverilog/morvik_pkg.sv", r"input int iterations = (\d)", CORE["iterations"], times=2)

    def test_vhdl(self):
        self.expect("vhdl/morvik_pkg.vhd",
                    r"num_pu +: integer := (\d);\s+algorithm +: integer := morvik_(\w+);\s+tag_width +: integer := (\d)",
                    CORE["num_pu"], CORE["algorithm"].replace("-", "_"), CORE["tag_width"], times=2)

    def test_systemc(self):
        self.expect("systemc/MorvikDecoder.h", r"int tagWidth = (\d)", CORE["tag_width"])

    def test_python(self):
        text = source("bindings/python/morvik/_arguments.py")
        self.assertIn("DEFAULT_NUM_PU = _core.default_num_pu\n", text)
        self.expect("python/morvik/_arguments.py", r"DEFAULT_ITERATIONS = (\d)", CORE["iterations"])


if __name__ == "__main__":
    unittest.main()
