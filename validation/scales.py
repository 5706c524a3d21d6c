"""How far the default scale of log-likelihood ratios is from the best one, by modulation and code rate: the table of
docs/scale.md. Runs with other scales have the same noise, so that small differences can be seen."""

import concurrent.futures
import csv
import math
import os
import pathlib
import re
import subprocess
import tempfile
from typing import NamedTuple

DOCUMENT = pathlib.Path(__file__).parent.parent / "docs/scale.md"
MARK = re.compile(r"(?<=<!-- scales: begin -->\n).*?(?=<!-- scales: end -->)", re.S)

MODULATIONS = {"bpsk": 1, "qpsk": 2, "16qam": 4, "64qam": 6, "256qam": 8}
RATES = ("0.1", "0.2", "0.333", "0.5", "0.67", "0.8", "0.9")
FACTORS = (0.5, 0.63, 0.8, 0.9, 1, 1.12, 1.25, 1.6, 2)
BITS = 6120
TARGET = 0.2  # the BLER, about
STEP = 50  # thousandths of a dB between the two points of a line
COLUMNS = ("modulation", "code_rate", "scale", "esn0_db", "blocks", "block_errors")


class Line(NamedTuple):
    """A modulation at a code rate."""
    modulation: str
    rate: str

    @property
    def start(self):
        """The Es/N0 at which to begin: some dB above that whose capacity is the rate."""
        efficiency = float(self.rate) * MODULATIONS[self.modulation]
        if self.modulation == "bpsk":
            efficiency *= 2  # one dimension
        return round(10 * math.log10(2 ** efficiency - 1)) * 1000 + 2000


def simulated(command, line, milli_decibels, scales, blocks):
    """The rows of points at each Es/N0 and scale."""
    with tempfile.TemporaryDirectory(prefix="morvik-scales-") as folder:
        path = pathlib.Path(folder) / "results.csv"
        subprocess.run(
            [command, "ber", "--transport-block-size", str(BITS), "--code-rate", line.rate, "--modulation",
             line.modulation, f"--esn0={','.join(f'{place / 1000:g}' for place in milli_decibels)}", "--scale",
             ",".join(scales), "--max-blocks", str(blocks), "--block-errors", str(blocks), "--seed", "5", "--threads",
             "1", "--quiet", "--output", path], check=True)
        with open(path, encoding="utf-8", newline="") as file:
            return list(csv.DictReader(file))


def rate_of(row):
    return int(row["block_errors"]) / int(row["blocks"])


def rows_of(command, line, blocks):
    """All scales at two neighbouring points around the target."""
    place = line.start
    for step in (1000, 200, STEP):
        probe = max(blocks // 10, 50) if step > STEP else max(blocks // 4, 50)
        while rate_of(simulated(command, line, [place], ["auto"], probe)[0]) < TARGET:
            place -= step
        while rate_of(row := simulated(command, line, [place], ["auto"], probe)[0]) >= TARGET:
            place += step
    scales = [f"{float(row['scale']) * factor:.3f}" for factor in FACTORS]
    rows = simulated(command, line, [place - STEP, place], scales, blocks)
    return [{**row, "modulation": line.modulation, "code_rate": line.rate} for row in rows]


def losses(rows):
    """What each scale needs more than the default one, in dB; the rows are those of a line."""
    points = sorted({float(row["esn0_db"]) for row in rows})
    scales = list(dict.fromkeys(row["scale"] for row in rows))
    rates = {(row["scale"], float(row["esn0_db"])): rate_of(row) for row in rows}
    middle = scales[FACTORS.index(1)]
    # Fewer than half a block error cannot be told from none.
    logarithm = {key: math.log(max(rate, 0.5 / int(rows[0]["blocks"]))) for key, rate in rates.items()}
    slope = (logarithm[middle, points[0]] - logarithm[middle, points[1]]) / (points[1] - points[0])
    return scales, [sum(logarithm[scale, point] - logarithm[middle, point] for point in points) / 2 / slope
                    for scale in scales]


def lines_of(path):
    """The rows of each modulation and code rate."""
    lines = {}
    with open(path, encoding="utf-8", newline="") as file:
        for row in csv.DictReader(file):
            lines.setdefault((row["modulation"], row["code_rate"]), []).append(row)
    return lines


def table(path):
    header = ["modulation", "code rate", "Es/N0", "default scale", "best scale", "default loses",
              *(f"x {factor:g}" for factor in FACTORS if factor != 1)]
    shown = [header, ["---"] + ["--:"] * (len(header) - 1)]
    for (modulation, rate), rows in lines_of(path).items():
        scales, needed = losses(rows)
        best = min(range(len(scales)), key=needed.__getitem__)
        shown.append([modulation, rate, f"{float(rows[-1]['esn0_db']):.2f}", f"{float(scales[FACTORS.index(1)]):.2f}",
                      f"{float(scales[best]):.2f}", f"{abs(needed[best]):.3f}",
                      *(f"{loss:+.2f}" for factor, loss in zip(FACTORS, needed) if factor != 1)])
    return "".join("| " + " | ".join(line) + " |\n" for line in shown)


def with_table(text, results):
    """The document with the table of the results."""
    return MARK.sub(lambda _: table(results), text)


class Scales(NamedTuple):
    """The simulation, with so many blocks at each point."""
    blocks: int = 600

    def run(self, programs, target):
        """Writes the results."""
        lines = [Line(modulation, rate) for modulation in MODULATIONS for rate in RATES]
        with concurrent.futures.ThreadPoolExecutor(os.cpu_count()) as pool:
            rows = [row for rows in pool.map(lambda line: rows_of(programs / "morvik", line, self.blocks), lines)
                    for row in rows]
        with open(target, "w", encoding="utf-8", newline="") as file:
            writer = csv.DictWriter(file, COLUMNS, extrasaction="ignore", lineterminator="\n")
            writer.writeheader()
            writer.writerows(rows)


SIMULATIONS = {"scales": Scales()}
