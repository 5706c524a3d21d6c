#!/usr/bin/env python3
"""Draws the pictures of docs/compare.md: compare_steps.svg and compare_passes.svg, beside this file.

They show the dump of a core with a fault beside the model. Needs both built:
scripts/build x86_64 morvik fault_core
"""

import csv
import subprocess

from pictures import FOLDER, svg, text

BUILD = FOLDER.parent / "build/x86_64"
BLOCK = FOLDER.parent / "tests/data/vectors/k512.csv"
K, SEGMENT, PASSES = 512, 64, 16
SIGNALS = ["intrinsic", *(f"g{i}" for i in range(4)), *(f"alpha{i}" for i in range(8)),
           *(f"beta{i}" for i in range(8)), "llr", "extrinsic"]
WRONG, RIGHT, LINE = "#f4b183", "#eef3f8", "#777"


def output_of(*command, stdin=None):
    return subprocess.run(command, stdin=stdin, check=True, capture_output=True, text=True).stdout.splitlines()


def model():
    """The value of each (half-iteration, step, signal)."""
    rows = csv.DictReader(output_of(BUILD / "bin/morvik", "trace", BLOCK, "--format", "csv"))
    return {(int(row["half_iteration"]), int(row["step"]), signal): int(row[signal]) for row in rows for signal in SIGNALS}


def dump():
    """The same of forward border columns that keep their low bits, as far as it goes."""
    with open(BLOCK) as block:
        rows = csv.DictReader(output_of(BUILD / "tests/faults/fault_core", "forward_bits_kept", "2", "1", "8", stdin=block))
        return {(int(row["half_iteration"]), int(row["step"]), row["signal"]): int(row["value"]) for row in rows}


def steps(expected, got, half_iteration, first, count, signals):
    """Values as a viewer of waveforms shows them, those of the model above those of the dump."""
    left, top, width, height, gap = 140, 56, 58, 26, 14
    right = left + width * count
    elements = [text(left, 24, f"half-iteration {half_iteration}", "start"), text(left - 12, top - 6, "step", "end", "small")]
    for i in range(count):
        elements.append(text(left + width * (i + 0.5), top - 6, first + i, kind="small"))
    y = top
    for signal in signals:
        for source, values in (("model", expected), ("dump", got)):
            elements.append(text(left - 12, y + 18, f"{signal}, {source}", "end", "small"))
            for i in range(count):
                place = (half_iteration, first + i, signal)
                fill = RIGHT if source == "model" or expected[place] == got[place] else WRONG
                x = left + width * i
                elements.append(f'<path d="M{x + 4} {y} H{x + width - 4} l4 {height // 2} l-4 {height // 2} H{x + 4} '
                                f'l-4 -{height // 2} z" fill="{fill}" stroke="{LINE}"/>')
                elements.append(text(x + width / 2, y + 18, values[place], kind="small"))
            y += height + 2
        y += gap
    border = left + width * (SEGMENT - first)
    elements.append(f'<path d="M{border} 12 V{y}" stroke="#222" stroke-dasharray="5 4"/>')
    elements.append(text(border - 8, 24, "segment 0", "end", "small"))
    elements.append(text(border + 8, 24, "segment 1", "start", "small"))
    return svg(right + 20, y + 4, elements)


def passes(expected, got):
    """How many signals of each step of each half-iteration differ."""
    left, top, scale, height = 120, 50, 1.5, 18
    elements = [text(left, 20, "signals of a trellis step that differ", "start", "small")]
    shades = ((1, 8, "#fbd9bd"), (9, 16, "#f4b183"), (17, len(SIGNALS), "#c55a11"))
    for i, (low, high, shade) in enumerate(shades):
        x = left + 250 + 110 * i
        elements.append(f'<rect x="{x}" y="8" width="16" height="16" fill="{shade}"/>')
        elements.append(text(x + 22, 20, f"{low} to {high}", "start", "small"))
    for half_iteration in range(PASSES):
        y = top + height * half_iteration
        elements.append(f'<rect x="{left}" y="{y}" width="{K * scale}" height="{height - 2}" fill="{RIGHT}"/>')
        elements.append(text(left - 12, y + 13, half_iteration, "end", "small"))
        wrong = [sum(expected[half_iteration, step, signal] != got[half_iteration, step, signal] for signal in SIGNALS)
                 for step in range(K)]
        for low, high, shade in shades:
            bars = "".join(f"M{left + step * scale} {y}v{height - 2}h{scale}v{2 - height}z"
                           for step in range(K) if low <= wrong[step] <= high)
            elements.append(f'<path d="{bars}" fill="{shade}"/>')
    bottom = top + height * PASSES
    for segment in range(K // SEGMENT):
        x = left + segment * SEGMENT * scale
        elements.append(f'<path d="M{x} {top - 6} V{bottom}" stroke="{LINE}" stroke-width="0.7"/>')
        elements.append(text(x + 3, top - 8, f"segment {segment}", "start", "small"))
        elements.append(text(x, bottom + 16, segment * SEGMENT, kind="small"))
    elements.append(text(left - 12, top - 8, "half-iteration", "end", "small"))
    elements.append(text(left + K * scale, bottom + 16, "step", "end", "small"))
    return svg(int(left + K * scale + 20), bottom + 26, elements)


expected, got = model(), dump()
first = min(place for place in got if got[place] != expected[place])
(FOLDER / "compare_steps.svg").write_text(
    steps(expected, got, first[0], first[1] - 4, 11, ["g0", "alpha0", "alpha1", "beta0", "llr"]))
(FOLDER / "compare_passes.svg").write_text(passes(expected, got))
