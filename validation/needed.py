"""Simulates the Eb/N0 at which 1 of 100 blocks fails, by block size, algorithm, iterations and units, and for decoders
that do not divide blocks."""

import concurrent.futures
import csv
import json
import os
import pathlib
import subprocess
import tempfile
from collections.abc import Callable
from typing import NamedTuple

from distances import crossing, read_curves, read_rows
from needed_plot import TYPES, draw_undivided, draw_units

RATE = 0.01
UNITS = ("2", "4", "8")
ITERATIONS = (8, 6, 4, 3)  # ascending Eb/N0: each search starts where the previous one ended
KEYS = ("block_size", "algorithm", "iterations")


class Scope(NamedTuple):
    """What is simulated. As many bits at each point make the interval of a size as wide as that of another: what a
    larger block has in fewer failures, its steeper curve makes good."""
    sizes: tuple[int, ...]
    bits: int  # at each point


UNITS_SCOPE = Scope((40, 104, 128, 256, 512, 1024, 1504, 2048, 3072, 4096, 6144), 40_000_000)
UNDIVIDED_SCOPE = Scope((128, 512, 2048, 6144), 6_000_000)


def step_of(size):
    """The spacing of points, in thousandths of a dB: small enough for linear interpolation."""
    return 200 if size < 512 else 100 if size < 2048 else 50


def decibels(thousandths):
    return f"{thousandths / 1000:g}"


def bracketed(start, step, rates, rate=RATE):
    """The rows of neighbouring points between which all curves fall below the rate.

    `rates` simulates a point, in full or with few blocks, and returns its rows and the rates in them.
    """
    place = start - start % step
    while max(rates(place, False)[1]) >= rate:
        place += step
    while min(rates(place - step, False)[1]) < rate:
        place -= step
    points = {}

    def full(point):
        points.setdefault(point, None)
        if points[point] is None:
            points[point] = rates(point, True)
        return points[point][1]

    last = place
    while max(full(last)) >= rate:
        last += step
    first = last - step
    while min(full(first)) < rate:
        first -= step
    return [row for point in sorted(points) if first <= point <= last for row in points[point][0]], first


def different_units(programs, size):
    """The numbers of units that do not divide blocks like a smaller number does."""
    layout = json.loads(subprocess.run([programs / "morvik", "info", str(size), "--json"], check=True,
                                       capture_output=True).stdout)
    kept = {}
    for division in layout["divisions"]:
        kept.setdefault((division["segments"], tuple(division["window_lengths"])), str(division["num_pu"]))
    return tuple(kept.values())


def rate_of(row):
    return int(row["block_errors"]) / int(row["blocks"])


def hardware_rates(programs, scope, size, algorithm, iterations):
    """Simulates points of `morvik ber`, the same blocks for each number of units."""
    units = different_units(programs, size)

    def rates(place, in_full):
        blocks = max(scope.bits // size // (1 if in_full else 20), 1)
        counted = units if in_full else units[:1]
        with tempfile.TemporaryDirectory(prefix="morvik-needed-") as folder:
            path = pathlib.Path(folder) / "results.csv"
            subprocess.run([programs / "morvik", "ber", "--block-size", str(size), "--algorithm", str(algorithm),
                            "--iterations", str(iterations), "--num-pu", ",".join(counted), "--ebn0", decibels(place),
                            "--frames", f"0:{blocks}", "--threads", "1", "--quiet", "--output", path], check=True)
            rows = read_rows(path)
        return rows, [rate_of(row) for row in rows]

    return rates


def undivided_rates(programs, scope, size, algorithm, iterations):
    """Simulates points of the decoder with the hardware's number formats and neither segments nor windows."""

    def rates(place, in_full):
        blocks = max(scope.bits // size // (1 if in_full else 20), 1)
        done = subprocess.run([programs / "morvik_variants", "--block-size", str(size), "--algorithm", str(algorithm),
                               "--iterations", str(iterations), "--ebn0-millidb", str(place), "--block-errors", str(blocks),
                               "--max-blocks", str(blocks), "--variants", "undivided"],
                              check=True, capture_output=True, text=True)
        rows = [{**row, "algorithm": TYPES[int(row["algorithm"])]} for row in csv.DictReader(done.stdout.splitlines())]
        return rows, [rate_of(row) for row in rows]

    return rates


class Simulation(NamedTuple):
    """One of the two simulations; its results are the points around the rate."""
    rates: Callable
    scope: Scope
    columns: tuple[str, ...]

    def curve_of(self, programs, size, algorithm):
        """The rows of a size and an algorithm, for all iterations."""
        rows, start = [], 0
        for iterations in ITERATIONS:
            found, start = bracketed(start, step_of(size),
                                     self.rates(programs, self.scope, size, algorithm, iterations))
            rows += found
        return rows

    def run(self, programs, target):
        """Writes the results."""
        with concurrent.futures.ThreadPoolExecutor(os.cpu_count()) as pool:
            curves = pool.map(lambda curve: self.curve_of(programs, *curve),
                              [(size, algorithm) for size in self.scope.sizes for algorithm in range(len(TYPES))])
            rows = [row for curve in curves for row in curve]
        with open(target, "w", encoding="utf-8", newline="") as file:
            writer = csv.DictWriter(file, self.columns, extrasaction="ignore", lineterminator="\n")
            writer.writeheader()
            writer.writerows(rows)


COUNTS = ("ebn0_db", "blocks", "block_errors")
SIMULATIONS = {
    "units": Simulation(hardware_rates, UNITS_SCOPE, (*KEYS, "num_pu", *COUNTS)),
    "undivided": Simulation(undivided_rates, UNDIVIDED_SCOPE, (*KEYS, *COUNTS)),
}


def needed(path, *more):
    """The Eb/N0 at the rate, by block size, algorithm, iterations and the values of `more` columns."""
    return {(int(key[0]), key[1], int(key[2]), *key[3:]): crossing(points, RATE)
            for key, points in read_curves(path, *KEYS, *more).items()}


def needed_by_units(results):
    """The Eb/N0 by block size, algorithm, iterations and units. Of units that divide a block alike, the least were
    simulated; blocks that all divide alike have 2 units alone."""
    found = needed(results / "units.csv", "num_pu")
    alike = {(*key[:3], "8"): value for key, value in found.items() if key[3] == "4"}
    return {**alike, **found}


def costs_of_division(results):
    """The dB that the hardware with 2 units needs more than the undivided decoder, by size, algorithm and
    iterations."""
    units = needed_by_units(results)
    return {key: units[*key, "2"] - value for key, value in needed(results / "undivided.csv").items()}


def decibels_of(estimates):
    return {key: value.db for key, value in estimates.items()}


def needed_table(results):
    """The rows of the table: Eb/N0 for 2 units, and the additional dB for 4 and 8."""
    found = needed_by_units(results)
    for size in UNITS_SCOPE.sizes:
        for algorithm in TYPES:
            cells = []
            for iterations in sorted(ITERATIONS):
                two, *others = [found.get((size, algorithm, iterations, units)) for units in UNITS]
                more = [f", {other.db - two.db:+.2f}" for other in others if other]
                cells.append(f"{two.db:.2f}{''.join(more)}".replace("-0.00", "+0.00"))
            yield [str(size), algorithm, *cells]


def division_table(results):
    costs = costs_of_division(results)
    for size in UNDIVIDED_SCOPE.sizes:
        for algorithm in TYPES:
            yield [str(size), algorithm, *(str(costs[size, algorithm, each]) for each in sorted(ITERATIONS))]


def pictures(results):
    """Name and content of each plot of the document."""
    return {"units.svg": draw_units(decibels_of(needed_by_units(results))),
            "undivided.svg": draw_undivided(decibels_of(costs_of_division(results)))}
