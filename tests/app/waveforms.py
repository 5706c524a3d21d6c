"""Waveforms of morvik trace: a reader of value change dumps finds every value of the CSV, and so do GTKWave's tools.

    waveforms.py MORVIK BLOCKS
"""

import csv
import pathlib
import re
import subprocess
import sys
import tempfile
import unittest

MORVIK, BLOCKS = (pathlib.Path(argument).resolve() for argument in sys.argv[1:3])
SIGNALS = (["intrinsic"] + [f"g{i}" for i in range(4)] + [f"alpha{i}" for i in range(8)]
           + [f"beta{i}" for i in range(8)] + ["llr", "extrinsic"])
TAIL = 3


class Dump:
    """A value change dump: `at(time)` maps the path of each variable to its value, None if unknown."""

    def __init__(self, text):
        head, body = text.split("$enddefinitions $end\n")
        self.sizes, self.names, scopes = {}, {}, []
        for keyword, content in re.findall(r"\$(\w+)\s+(.*?)\s*\$end", head, re.S):
            fields = content.split()
            if keyword == "scope":
                scopes.append(fields[1])
            elif keyword == "upscope":
                scopes.pop()
            elif keyword == "var":
                path = ".".join(scopes + [fields[3]])
                assert path not in self.sizes
                self.sizes[path] = (fields[0], int(fields[1]))
                self.names.setdefault(fields[2], []).append(path)
        assert not scopes
        self.changes = {}
        now = None
        for line in body.splitlines():
            if line.startswith("#"):
                assert now is None or int(line[1:]) > now
                now = int(line[1:])
                self.changes[now] = {}
            elif not line.startswith("$"):
                value, code = line.split()
                for path in self.names[code]:
                    self.changes[now][path] = self.number(value, *self.sizes[path])

    @staticmethod
    def number(text, kind, bits):
        if kind == "real":
            assert text[0] == "r"
            return float(text[1:])
        assert text[0] == "b"
        if "x" in text:
            return None
        value = int(text[1:], 2)
        assert value < 1 << bits
        return value - (1 << bits) if bits == 12 and value >= 1 << 11 else value

    def times(self):
        """All times from the first to the last, with all values."""
        now = {}
        for time in range(min(self.changes), max(self.changes)):
            now.update(self.changes.get(time, {}))
            yield time, now


def run(*arguments):
    return subprocess.run(arguments, check=True, capture_output=True, text=True).stdout


def trace(name, form, *options):
    return run(MORVIK, "trace", BLOCKS / name, "--format", form, *options)


class Waveforms(unittest.TestCase):
    def expect_values(self, dump, rows, segments, length):
        """Every value of the rows, none else, and reals that say the same."""
        rows = {(int(row["half_iteration"]), int(row["step"])): row for row in rows}
        seen = 0
        for time, now in dump.times():
            half_iteration, local = divmod(time, length + TAIL)
            self.assertEqual(now["morvik.half_iteration"], half_iteration)
            self.assertEqual(now["morvik.code"], 2 - half_iteration % 2)
            for segment in range(segments):
                step = segment * length + local
                works = local < length or segment == segments - 1
                row = rows[half_iteration, step]
                if not works:
                    row = rows[half_iteration, segment * length]
                scope = f"morvik.unit{row['unit']}.thread{row['thread']}."
                self.assertEqual(now[scope + "step"], step if works else None)
                self.assertEqual(now[scope + "window"], int(row["window"]) if works else None)
                for signal in SIGNALS:
                    value = now[scope + signal]
                    tail = local >= length
                    known = not tail or (works and (signal == "intrinsic" or
                                                    (signal.startswith("alpha") and local == length)))
                    self.assertEqual(value, int(row[signal]) if known else None, (time, scope, signal))
                    if known:
                        self.assertEqual(now[scope + signal + "_real"], value / 8)
                        seen += 1
        self.assertEqual(seen, sum((segments * length) * len(SIGNALS) + TAIL + 8 for _ in {h for h, _ in rows}))

    def test_every_value_is_there(self):
        for name, pu, passes, segments, length in (("k40.csv", 2, "0:3", 1, 40), ("k1024.csv", 2, "2:3", 8, 128),
                                                   ("k512.csv", 8, "1:1", 8, 64)):
            options = ("--num-pu", str(pu), "--half-iterations", passes)
            dump = Dump(trace(name, "vcd", *options))
            rows = list(csv.DictReader(trace(name, "csv", *options).splitlines()))
            with self.subTest(name):
                self.expect_values(dump, rows, segments, length)

    def test_scopes_are_units_and_threads(self):
        dump = Dump(trace("k2048.csv", "vcd", "--num-pu", "4", "--half-iterations", "0", "--signals", "llr"))
        scopes = {path.rsplit(".", 1)[0] for path in dump.sizes if path.endswith(".llr")}
        self.assertEqual(scopes, {f"morvik.unit{unit}.thread{thread}" for unit in range(4) for thread in range(4)})
        self.assertEqual(dump.sizes["morvik.unit3.thread2.llr"], ("wire", 12))
        self.assertEqual(dump.sizes["morvik.unit3.thread2.llr_real"], ("real", 64))
        self.assertEqual(len(dump.sizes), 2 + 16 * 4)
        self.assertEqual(max(dump.changes), 128 + TAIL)

    def test_units_and_signals_are_selected(self):
        whole = Dump(trace("k1024.csv", "vcd", "--half-iterations", "5"))
        part = Dump(trace("k1024.csv", "vcd", "--half-iterations", "5", "--units", "1", "--signals", "beta,llr"))
        self.assertEqual(len(part.sizes), 2 + 4 * (2 + 2 * 9))
        for (time, all_values), (same_time, values) in zip(whole.times(), part.times()):
            self.assertEqual(time, same_time)
            self.assertEqual(values, {path: all_values[path] for path in part.sizes})

    def test_gtkwave_reads_the_same(self):
        with tempfile.TemporaryDirectory(prefix="morvik-waveforms-") as folder:
            folder = pathlib.Path(folder)
            text = trace("k1024.csv", "vcd", "--half-iterations", "0:2", "--algorithm", "table")
            (folder / "trace.vcd").write_text(text)
            run("vcd2fst", folder / "trace.vcd", folder / "trace.fst")
            again = Dump(run("fst2vcd", folder / "trace.fst"))
        dump = Dump(text)
        self.assertEqual(again.sizes, dump.sizes)
        times = 0
        for (time, values), (same_time, same_values) in zip(dump.times(), again.times()):
            self.assertEqual(time, same_time)
            self.assertEqual(values, same_values)
            times += 1
        self.assertEqual(times, 3 * (128 + TAIL))


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
