"""Distances between BLER curves in dB, and their uncertainty."""

import csv
import math
from typing import NamedTuple

CONFIDENCE = 1.96  # standard deviations on either side, for a 95 % interval


class Point(NamedTuple):
    db: float  # Eb/N0 or Es/N0
    blocks: int
    errors: int

    @property
    def rate(self):
        return self.errors / self.blocks

    @property
    def log_deviation(self):
        """The standard deviation of the rate's logarithm; errors are binomial."""
        return math.sqrt((1 - self.rate) / self.errors)


class Estimate(NamedTuple):
    """A value in dB and its standard deviation."""
    db: float
    deviation: float

    def __sub__(self, other):
        """The difference of two independent estimates."""
        return Estimate(self.db - other.db, math.hypot(self.deviation, other.deviation))

    def __str__(self):
        rounded = round(self.db, 3) + 0.0  # turns -0 into 0
        return f"{rounded:.3f} ± {CONFIDENCE * self.deviation:.3f}"


def bracket(points, rate):
    """The two neighbours between which a curve falls below a rate, and how much of the way it goes: 0 to 1.

    Between them the logarithm of the rate is taken as linear in dB. None when the points do not reach the rate.
    """
    points = sorted(points)
    for left, right in zip(points, points[1:]):
        if left.rate >= rate > right.rate > 0:
            return left, right, math.log(left.rate / rate) / math.log(left.rate / right.rate)
    return None


def slope(left, right):
    """The slope of the rate's logarithm per dB; negative."""
    return math.log(right.rate / left.rate) / (right.db - left.db)


def interpolated(left_deviation, right_deviation, way):
    """The deviation of a value interpolated between two independent ones."""
    return math.hypot((1 - way) * left_deviation, way * right_deviation)


def crossing(points, rate):
    """The Eb/N0 at which a curve reaches a rate; None if the points do not reach it."""
    found = bracket(points, rate)
    if found is None:
        return None
    left, right, way = found
    deviation = interpolated(left.log_deviation, right.log_deviation, way) / -slope(left, right)
    return Estimate(left.db + way * (right.db - left.db), deviation)


def paired_step(before, after, disagreements, rate):
    """How many dB a curve lies to the right of another that was measured on the same blocks.

    `disagreements` tells for each Eb/N0 how many blocks just one of the two failed on. Blocks on which both fail or
    none does say nothing about the difference, so that its deviation follows from the others alone.
    """
    first, second = crossing(before, rate), crossing(after, rate)
    if first is None or second is None:
        return None
    left, right, way = bracket(after, rate)
    deviations = [math.sqrt(disagreements[point.db]) / point.errors for point in (left, right)]
    return Estimate(second.db - first.db, interpolated(*deviations, way) / -slope(left, right))


def read_rows(path):
    """The rows of a CSV file after its comment lines, keyed by column name."""
    with open(path, encoding="utf-8", newline="") as file:
        return list(csv.DictReader(line for line in file if not line.startswith("#")))


def db_of(row):
    """The place of a row's point: Eb/N0, or Es/N0 where there is nothing else."""
    return float(row["ebn0_db"] if "ebn0_db" in row else row["esn0_db"])


def read_reference(path):
    """The curve of a file of validation/error_rates."""
    return [Point(db_of(row), int(row["frames"]), int(row["frame_errors"])) if "frames" in row else
            Point(db_of(row), int(row["blocks"]), int(row["block_errors"])) for row in read_rows(path)]


def read_curves(path, *keys):
    """The curves of a result file, keyed by the values of the columns in `keys`."""
    curves = {}
    for row in read_rows(path):
        point = Point(db_of(row), int(row["blocks"]), int(row["block_errors"]))
        curves.setdefault(tuple(row[key] for key in keys), []).append(point)
    return curves
