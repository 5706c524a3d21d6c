"""The Es/N0 behind the LTE chain at which 1 of 10 transport blocks fails: what the hardware needs more than the
floating-point reference, by modulation and code rate, and by MCS."""

import concurrent.futures
import csv
import math
import os
import subprocess
from typing import NamedTuple

from distances import crossing, paired_step, read_curves, read_reference, read_rows
from needed import bracketed
from needed_plot import LOOKS, curve, limits, panel, picture

RATE = 0.1
STEP = 200  # thousandths of a dB between points
BITS_PER_SYMBOL = {"qpsk": 2, "16qam": 4, "64qam": 6, "256qam": 8}
CODE_RATES = (0.1, 0.33, 0.5, 0.67, 0.75, 0.85, 0.93)
COLUMNS = ("name", "modulation", "transport_block_size", "coded_bits", "scale", "esn0_db", "decoder", "blocks",
           "block_errors", "disagreements")
DECODERS = ("reference", "input", "undivided", "hardware")
REFERENCES = {"1000, 1500": "link_k1024_qpsk_g1500.csv", "488, 5120": "link_k512_qpsk_g5120.csv"}
PARITY = 24  # bits of the CRC

# Transport blocks of MCS 0 and up on 6 pairs of resource blocks: TS 36.213, tables 7.1.7.1-1 and 7.1.7.2.1-1; those of
# 256QAM, table 7.1.7.1-1A from MCS 20 on. The last MCS of each has a code rate above 1 here.
RESOURCE_ELEMENTS = 6 * 120
MCS = (
    ("qpsk", 0, (152, 208, 256, 328, 408, 504, 600, 712, 808, 936)),
    ("16qam", 10, (936, 1032, 1192, 1352, 1544, 1736, 1800)),
    ("64qam", 17, (1800, 1928, 2152, 2344, 2600, 2792, 2984, 3240, 3496, 3624, 3752)),
    ("256qam", 20, (3752, 4008, 4264, 4392, 4776, 4968, 5160)),
)


class Format(NamedTuple):
    """What is sent, once, and by which name it is known in the results."""
    name: str
    modulation: str
    bits: int
    coded_bits: int

    @property
    def code_rate(self):
        return (self.bits + PARITY) / self.coded_bits

    @property
    def place(self):
        """Where to begin the search: some dB above the Es/N0 whose capacity is the rate."""
        capacity = self.code_rate * BITS_PER_SYMBOL[self.modulation]
        return round(10000 * math.log10(2 ** capacity - 1)) + 1000


def grid():
    """Each modulation at each code rate, in code blocks of 2048 bits."""
    for modulation, symbol in BITS_PER_SYMBOL.items():
        for rate in CODE_RATES:
            coded = round(2048 / rate / symbol) * symbol
            yield Format(f"{rate:.2f}", modulation, 2048 - PARITY, coded)


def schemes():
    for modulation, first, sizes in MCS:
        for mcs, bits in enumerate(sizes, first):
            yield Format(str(mcs), modulation, bits, RESOURCE_ELEMENTS * BITS_PER_SYMBOL[modulation])


class Loss(NamedTuple):
    """A simulation; its results are the points around the rate."""
    formats: tuple[Format, ...]
    decoders: tuple[str, ...]
    bits: int = 3_000_000  # at each point

    def rows_of(self, programs, form):
        def rates(place, in_full):
            blocks = max(self.bits // form.bits // (1 if in_full else 10), 64)
            done = subprocess.run(
                [programs / "morvik_loss", "--modulation", form.modulation, "--transport-block-size", str(form.bits),
                 "--coded-bits", str(form.coded_bits), f"--esn0-millidb={place}", "--block-errors", str(blocks),
                 "--max-blocks", str(blocks), "--decoders", ",".join(self.decoders if in_full else
                                                                     (self.decoders[0], self.decoders[-1]))],
                check=True, capture_output=True, text=True)
            rows = [{**row, "name": form.name} for row in csv.DictReader(done.stdout.splitlines())]
            return rows, [int(row["block_errors"]) / int(row["blocks"]) for row in rows]

        return bracketed(form.place, STEP, rates, RATE)[0]

    def run(self, programs, target):
        """Writes the results."""
        with concurrent.futures.ThreadPoolExecutor(os.cpu_count()) as pool:
            rows = [row for rows in pool.map(lambda form: self.rows_of(programs, form), self.formats) for row in rows]
        with open(target, "w", encoding="utf-8", newline="") as file:
            writer = csv.DictWriter(file, COLUMNS, extrasaction="ignore", lineterminator="\n")
            writer.writeheader()
            writer.writerows(rows)


CHAIN_REFERENCES = tuple(Format(name, "qpsk", *map(int, name.split(", "))) for name in REFERENCES)
SIMULATIONS = {
    "chain": Loss(CHAIN_REFERENCES, ("reference", "hardware")),
    "loss": Loss(tuple(grid()), DECODERS),
    "mcs": Loss(tuple(schemes()), ("reference", "hardware")),
}


def estimates(path):
    """For each name and modulation: the Es/N0 of the reference, the dB that the hardware needs more, and the cost of
    each step in between."""
    curves = read_curves(path, "name", "modulation", "decoder")
    differing = {}
    for row in read_rows(path):
        differing.setdefault((row["name"], row["modulation"], row["decoder"]), {})[float(row["esn0_db"])] = int(
            row["disagreements"])
    found = {}
    for name, modulation in dict.fromkeys(key[:2] for key in curves):
        decoders = [decoder for decoder in DECODERS if (name, modulation, decoder) in curves]
        points = [curves[name, modulation, decoder] for decoder in decoders]
        steps = [paired_step(before, after, differing[name, modulation, decoder], RATE)
                 for before, after, decoder in zip(points, points[1:], decoders[1:])]
        first, last = crossing(points[0], RATE), crossing(points[-1], RATE)
        found[name, modulation] = first, last.db - first.db, steps
    return found


def loss_table(results):
    for (rate, modulation), (needed, loss, steps) in estimates(results / "loss.csv").items():
        yield [modulation, rate, f"{needed.db:.2f}", f"{loss:.2f}", *map(str, steps)]


def mcs_table(results):
    found = estimates(results / "mcs.csv")
    for form in schemes():
        needed, loss, _ = found[form.name, form.modulation]
        table = "256qam" if form.modulation == "256qam" else "64qam"
        yield [table, form.name, form.modulation, str(form.bits), f"{form.code_rate:.2f}", f"{needed.db:.2f}", f"{loss:.2f}"]


def chain_table(results, references):
    """Our reference and the hardware beside the curves of another program."""
    found = estimates(results / "chain.csv")
    for name, file in REFERENCES.items():
        other = crossing(read_reference(references / file), RATE)
        needed, loss, (step,) = found[name, "qpsk"]
        yield [name, f"`{file}`", str(other), str(needed - other), str(step)]


def draw_loss(results):
    """The loss over the code rate, in all and by segments and windows alone."""
    found = estimates(results / "loss.csv")
    rates = [float(rate) for rate in dict.fromkeys(name for name, _ in found)]
    curves = {modulation: [found[f"{rate:.2f}", modulation] for rate in rates] for modulation in BITS_PER_SYMBOL}
    panels = []
    for number, (title, value) in enumerate((("The core with 2 units", lambda one: one[1]),
                                             ("of this, segments and windows", lambda one: one[2][2].db),
                                             ("of this, eight bits and number formats", lambda one: one[2][0].db + one[2][1].db))):
        panels.append(panel(
            title,
            ["set xrange [0.05:1]", "set xtics 0.2", 'set xlabel "code rate" offset 0,0.5', "set ytics 0.1",
             f"set yrange [-0.05:{limits([one[1] for of in curves.values() for one in of], 0.1)[1]:g}]",
             'set ylabel "dB more than the reference"' if number == 0 else "unset ylabel",
             "set key top left" if number == 0 else "unset key"],
            [curve(list(zip(rates, map(value, of))), look, 1, modulation)
             for look, (modulation, of) in zip(LOOKS, curves.items())]))
    return picture(420, 1, panels)
