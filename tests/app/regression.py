"""morvik compare on sets of vectors: 200 blocks over all configurations, one of them broken on purpose.

    regression.py MORVIK
"""

import csv
import gzip
import json
import pathlib
import subprocess
import sys
import tempfile
import unittest

import junitparser

MORVIK = pathlib.Path(sys.argv[1]).resolve()
CORES = [(units, algorithm) for units in (2, 4, 8) for algorithm in ("max-log", "scaled", "table")]
MISTAKE = "extrinsic values: bit 0 is flipped; with so few, this may be chance"
BLOCKS = [23] * 2 + [22] * 7  # of each core, 200 in all


def rows_of(file):
    return list(csv.reader(file.read_text().splitlines()))


def player(words, blocks, rows):
    """A module that shows internal values of blocks, of so many rows each, as a core has them in registers."""
    names = ["intrinsic"] + [f"{kind}{i}" for kind, count in (("g", 4), ("alpha", 8), ("beta", 8)) for i in range(count)]
    names += ["llr", "extrinsic"]
    wires = "".join(f"  wire [11:0] {name} = row[{24 + 12 * i} +: 12];\n" for i, name in enumerate(names))
    return f"""module player;
  reg [{23 + 12 * len(names)}:0] all [0:{blocks * rows - 1}];
  reg [{23 + 12 * len(names)}:0] row;
  reg [7:0] block;
  wire [4:0] half_iteration = row[4:0];
  wire [12:0] step = row[20:8];
{wires}  integer i;
  initial begin
    $readmemh("{words}", all);
    $dumpfile("player.fst");
    $dumpvars(0, player);
    for (i = 0; i < {blocks * rows}; i = i + 1) begin
      #1 row = all[i];
      block = i / {rows};
    end
    #1 $finish;
  end
endmodule
"""


class Regression(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        cls.scratch = tempfile.TemporaryDirectory(prefix="morvik-regression-")
        cls.folder = pathlib.Path(cls.scratch.name)
        cls.sets = []
        for (units, algorithm), blocks in zip(CORES, BLOCKS):
            cls.sets.append(f"{units}_{algorithm}")
            cls.run_morvik("vectors", "--out", cls.sets[-1], "--num-pu", units, "--algorithm", algorithm,
                           "--block-size", 40, "--blocks", blocks, "--no-directed", "--iterations", 1,
                           "--format", "csv", "--internal")
        cls.break_one("4_scaled", block=7, step=5)

    @classmethod
    def tearDownClass(cls):
        cls.scratch.cleanup()

    @classmethod
    def run_morvik(cls, *arguments, status=0):
        result = subprocess.run([MORVIK, *map(str, arguments)], cwd=cls.folder, capture_output=True, text=True)
        assert result.returncode == status, (result.returncode, result.stdout, result.stderr)
        return result

    @classmethod
    def break_one(cls, name, block, step):
        """Copies the internal values of each set to rtl.csv, and of one set one extrinsic value wrong."""
        for each in cls.sets:
            rows = rows_of(cls.folder / each / "internal.csv")
            for row in rows[1:] if each == name else []:
                if row[:3] == [str(block), "1", str(step)]:
                    row[-1] = str(int(row[-1]) ^ 1)
            with (cls.folder / each / "rtl.csv").open("w") as file:
                csv.writer(file, lineterminator="\n").writerows(rows)

    def expect_one_broken(self, report, dump):
        cases = {(suite.name, case.name): case for suite in report for case in suite}
        self.assertEqual(len(cases), 200)
        self.assertEqual((report.tests, report.failures, report.errors), (200, 1, 0))
        broken = [(place, case) for place, case in cases.items() if case.result]
        self.assertEqual([place for place, _ in broken], [("4_scaled", "block 7 (random, K = 40)")])
        failure = broken[0][1].result[0]
        self.assertIsInstance(failure, junitparser.Failure)
        self.assertEqual(failure.type, "different")
        self.assertEqual(failure.message, "1 difference, 1 fault; the first is extrinsic of half-iteration 1, step 5")
        self.assertTrue(failure.text.startswith(f"{dump}: compared 2 of 2 half-iterations"), failure.text)

    def test_one_command_names_the_broken_block(self):
        result = self.run_morvik("compare", "--set", *self.sets, "--dump", "{set}/rtl.csv", "--junit", "results.xml",
                                 "--json", "results.json", "--coverage", "met.csv", status=1)
        self.expect_one_broken(junitparser.JUnitXml.fromfile(str(self.folder / "results.xml")), "4_scaled/rtl.csv")
        self.assertIn("4_scaled (4 units, scaled, 1 iteration), 22 blocks: 21 equal, 1 different\n"
                      "  block 7 (random, K = 40), 4_scaled/rtl.csv: different: 1 difference, 1 fault; "
                      "the first is extrinsic of half-iteration 1, step 5\n", result.stdout)
        self.assertIn(f"\nin 1 block: {MISTAKE}\n", result.stdout)
        self.assertIn("\n200 blocks: 199 equal, 1 different\n", result.stdout)
        self.assertIn("\nThe first that differs, 4_scaled, block 7 (random, K = 40):\n4_scaled/rtl.csv: compared",
                      result.stdout)
        results = json.loads((self.folder / "results.json").read_text())
        summary = results["summary"]
        self.assertEqual([summary[key] for key in ("blocks", "equal", "different", "incomplete", "unreadable")],
                         [200, 199, 1, 0, 0])
        self.assertEqual(summary["mistakes"], [{"mistake": MISTAKE, "blocks": 1}])
        self.assertEqual([(each["signal"], each["differences"], each["blocks"]) for each in summary["signals"]
                          if each["differences"]], [("extrinsic", 1, 1)])
        self.assertEqual(sum(core["blocks"] for core in summary["coverage"]["cores"]), 200)
        self.assertEqual(json.loads(self.run_morvik("coverage", "met.csv", "--json", status=1).stdout)["situations"],
                         summary["coverage"]["situations"])
        self.assertRegex(result.stdout, r"\nsituations: \d+ of \d+ met; missing: ")
        block = results["sets"][4]["blocks"][7]
        self.assertEqual(block["first"], {"half_iteration": 1, "step": 5, "signal": "extrinsic"})
        self.assertEqual(block["result"], "different")

    def test_a_right_dump_meets_what_its_set_meets(self):
        self.run_morvik("vectors", "--out", "right", "--block-size", "40,136", "--blocks", 2, "--iterations", 2,
                        "--algorithm", "table", "--no-directed", "--internal", "--format", "csv", "--coverage", "set.csv")
        self.run_morvik("compare", "--set", "right", "--dump", "right/internal.csv", "--coverage", "dump.csv")
        self.assertEqual((self.folder / "dump.csv").read_text(), (self.folder / "set.csv").read_text())
        # Ratios alone meet no wrap of a metric, and wrong ratios nothing.
        rows = rows_of(self.folder / "right/internal.csv")
        places = [0, 1, 2, rows[0].index("llr")]
        for name, wrong in (("ratios", 0), ("wrong", 1)):
            with (self.folder / f"{name}.csv").open("w") as file:
                csv.writer(file).writerows([[row[i] for i in places[:3]] + [str(int(row[places[3]]) ^ wrong)
                                                                          if row is not rows[0] else "llr"]
                                            for row in rows])
            self.run_morvik("compare", "--set", "right", "--dump", f"{name}.csv", "--coverage", f"{name}_met.csv",
                            status=wrong)
        counts = {name: dict(row[2:] for row in rows_of(self.folder / f"{name}.csv"))
                  for name in ("set", "ratios_met", "wrong_met")}
        self.assertEqual(counts["ratios_met"]["wrap.ratio.one.above"], counts["set"]["wrap.ratio.one.above"])
        self.assertEqual(counts["ratios_met"]["tie.ratio.one.last"], counts["set"]["tie.ratio.one.last"])
        self.assertEqual(counts["ratios_met"]["tie.forward.3"], "0")
        self.assertGreater(int(counts["set"]["tie.forward.3"]), 0)
        self.assertEqual(counts["wrong_met"]["pass.first.natural"], "0")

    def test_results_do_not_depend_on_threads(self):
        results = [self.run_morvik("compare", "--set", *self.sets, "--dump", "{set}/rtl.csv", "--threads", threads,
                                   status=1).stdout for threads in (1, 3)]
        self.assertEqual(*results)

    def test_each_block_has_a_dump(self):
        folder = self.folder / "2_table"
        rows = rows_of(folder / "rtl.csv")
        for block in range(22):
            with gzip.open(folder / f"rtl_{block}.csv.gz", "wt") as file:
                csv.writer(file).writerows(row for row in rows if row[0] in ("block", str(block)))
        (folder / "rtl_3.csv.gz").unlink()
        arguments = ("compare", "--set", "2_table", "--dump", "{set}/rtl_{block}.csv.gz", "--junit", "each.xml")
        result = self.run_morvik(*arguments, status=2)
        reason = "2_table/rtl_3.csv.gz: cannot be opened: No such file or directory"
        self.assertIn(f"22 blocks: 21 equal, 1 unreadable\n  block 3 (random, K = 40), 2_table/rtl_3.csv.gz: "
                      f"unreadable: {reason}\n", result.stdout)
        report = junitparser.JUnitXml.fromfile(str(self.folder / "each.xml"))
        self.assertEqual((report.tests, report.failures, report.errors), (22, 0, 1))
        one = self.run_morvik(*arguments, "--block-number", 4)
        self.assertTrue(one.stdout.startswith("core: 2 units, table, 1 iteration\n2_table/rtl_4.csv.gz: compared 2 of"))

    def test_a_file_that_ends_early_fails_the_rest(self):
        lines = (self.folder / "2_scaled" / "rtl.csv").read_text().splitlines(keepends=True)
        (self.folder / "early.csv").write_text("".join(lines[:1 + 2 * 86 + 5]))
        result = self.run_morvik("compare", "--set", "2_scaled", "--dump", "early.csv", status=2)
        self.assertIn("23 blocks: 2 equal, 1 incomplete, 20 unreadable\n", result.stdout)
        self.assertTrue(result.stdout.endswith("Use --partial if that is intended.\n"), result.stdout)
        (self.folder / "early.csv").write_text("".join(lines[:1 + 2 * 86 + 5]) + "0,1,1,1\n")
        result = self.run_morvik("compare", "--set", "2_scaled", "--dump", "early.csv", status=2)
        self.assertIn("23 blocks: 1 equal, 22 unreadable\n", result.stdout)
        self.assertIn(", early.csv: unreadable: early.csv:179: 4 fields, expected the 26 of the header\n", result.stdout)

    def test_every_format_of_vectors_is_read(self):
        formats = ("memh", "csv", "npy", "c")
        self.run_morvik("vectors", "--out", "all", "--block-size", 48, "--blocks", 2, "--iterations", 1,
                        "--no-directed", "--internal", "--format", ",".join(formats))
        decisions = {self.run_morvik("decode", name).stdout
                     for name in ["all"] + [f"all/stimulus.{each}" for each in formats]}
        self.assertEqual([len(each.split()) for each in decisions], [2])
        for each in formats:
            result = self.run_morvik("compare", "--set", "all", "--dump", f"all/internal.{each}")
            self.assertIn("2 blocks: 2 equal\n", result.stdout)
        for each in ("memh", "npy", "c"):
            self.run_morvik("vectors", "--out", "one", "--block-size", 48, "--blocks", 1, "--iterations", 1,
                            "--no-directed", "--internal", "--format", each)
            arguments = ("compare", "--block", f"one/stimulus.{each}", "--dump", f"one/internal.{each}")
            self.assertIn(" values: all equal to the model\n",
                          self.run_morvik(*arguments, "--iterations", 1).stdout)
            self.assertIn("Incomplete: ", self.run_morvik(*arguments, "--iterations", 2, status=1).stdout)
        result = self.run_morvik("compare", "--block", "all", "--dump", "all/internal.npy", "--iterations", 1, status=2)
        self.assertEqual(result.stderr, "morvik compare: all/internal.npy: row 102: has more rows than the block needs\n")

    def test_a_simulators_waveform_has_all_blocks(self):
        self.run_morvik("vectors", "--out", "played", "--block-size", 40, "--blocks", 2, "--iterations", 1,
                        "--no-directed", "--internal", "--format", "memh")
        (self.folder / "player.v").write_text(player("played/internal.memh", 2, 2 * 43))
        for command in (["iverilog", "-o", "player.vvp", "player.v"], ["vvp", "-n", "player.vvp", "-fst"]):
            subprocess.run(command, cwd=self.folder, check=True, capture_output=True)
        result = self.run_morvik("compare", "--set", "played", "--dump", "player.fst")
        self.assertIn("2 blocks: 2 equal\n", result.stdout)

    def test_results_replace_nothing_that_is_read(self):
        folder = self.folder / "2_scaled"
        (folder / "rtl_1.csv").write_text((folder / "rtl.csv").read_text())
        arguments = ("compare", "--set", "2_scaled", "--dump")
        for option in ("--json", "--junit", "--coverage"):
            for dump, name in (("{set}/rtl.csv", "rtl.csv"), ("{set}/rtl_{block}.csv", "rtl_1.csv"),
                               ("{set}/rtl.csv", "stimulus.csv"), ("{set}/rtl.csv", "manifest.json")):
                before = (folder / name).read_bytes()
                result = self.run_morvik(*arguments, dump, option, f"{folder}/{name}", status=2)
                self.assertEqual(result.stderr, f"morvik compare: {folder}/{name}: is read as 2_scaled/{name}, results need a "
                                                "file of their own\n")
                self.assertEqual((folder / name).read_bytes(), before)
        result = self.run_morvik(*arguments, "{set}/rtl.csv", "--json", "both", "--junit", "./both", status=2)
        self.assertEqual(result.stderr, "morvik compare: both: is the same file as ./both, each output needs its own\n")

    def test_wrong_use_is_refused(self):
        for message, *arguments in (
                ("either --block or --set is required; see 'morvik compare --help'",),
                ("--num-pu cannot be combined with --set, whose manifest has it", "--set", "2_table", "--num-pu", 2),
                ("--dump needs {set} in its name, as there are several sets", "--set", "2_table", "2_scaled"),
                ("2_table: has 22 blocks, there is no block 22", "--set", "2_table", "--block-number", 22),
                ("nowhere/manifest.json: cannot be opened: No such file or directory", "--set", "nowhere")):
            result = self.run_morvik("compare", "--dump", "2_table/rtl.csv", *arguments, status=2)
            self.assertEqual(result.stderr, f"morvik compare: {message}\n")


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
