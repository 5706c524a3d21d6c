"""Compares the model's block error rates with those of floating-point decoders: simulates, writes tables and a plot.

    validate.py PROGRAMS [NAME...]    PROGRAMS is the folder of morvik and morvik_variants; NAME, such as k40_i8, repeats
                                      that simulation alone
    validate.py --tables              only writes tables and plot anew, from the results that are there
"""

import concurrent.futures
import csv
import os
import pathlib
import re
import subprocess
import sys
import tempfile

sys.dont_write_bytecode = True  # writes no bytecode into the tree
from distances import crossing, paired_step, read_curves, read_reference, read_rows
import loss
import needed
from needed import ITERATIONS, division_table, needed_table
from plot import draw
import scales

ROOT = pathlib.Path(__file__).resolve().parent.parent
RESULTS = ROOT / "validation" / "results"
REFERENCES = ROOT / "validation" / "error_rates"
DOCUMENT = ROOT / "docs" / "validation.md"
PLOT = ROOT / "docs" / "validation.svg"

RATES = (0.1, 0.01)
UNITS = ("2", "4", "8")
TYPES = ("max-log", "scaled", "table")
KEPT = ("block_size", "num_pu", "algorithm", "scale", "iterations", "ebn0_db", "blocks", "block_errors")

# Each at the Eb/N0 of the reference, so that linear interpolation has the same error in both curves.
SWEEP = ["ber", "--num-pu", "2,4,8", "--algorithm", "0,1,2", "--stop-bler", "0.01", "--threads", "1", "--quiet"]
MODEL_RUNS = {
    "k40_i8": ["--block-size", "40", "--iterations", "8", "--ebn0", "0:0.5:5", "--block-errors", "4000"],
    "k512_i8": ["--block-size", "512", "--iterations", "8", "--ebn0", "0:0.2:2", "--block-errors", "1000"],
    "k6144_i6": ["--block-size", "6144", "--iterations", "6", "--ebn0", "0:0.1:1", "--block-errors", "1000"],
    "k6144_i8": ["--block-size", "6144", "--iterations", "8", "--ebn0", "0:0.1:1", "--block-errors", "1000"],
}
VARIANT_RUNS = {
    f"variants_k{size}_type{algorithm}":
        ["--block-size", size, "--algorithm", algorithm, "--iterations", "8", "--ebn0-millidb", points, *stop]
    for size, stop, by_algorithm in (
        ("40", ["--block-errors", "500"], ["1000,1500,2000,2500,3000"] * 3),
        ("512", ["--block-errors", "300", "--max-blocks", "20000"],
         ["800,1000,1200,1400", "600,800,1000,1200", "400,600,800,1000"]),
        ("6144", ["--block-errors", "100", "--max-blocks", "1000"],
         ["600,650,700,750", "400,450,500", "300,350,400,450"]))
    for algorithm, points in zip(("0", "1", "2"), by_algorithm)
}
SIMULATIONS = {**needed.SIMULATIONS, **loss.SIMULATIONS, **scales.SIMULATIONS}
ALL_RUNS = [*MODEL_RUNS, *VARIANT_RUNS, *SIMULATIONS]

# Results, the reference with the same number of iterations, its name in the document, and the types compared with it.
COMPARISONS = (
    ("k40_i8", "local_aff3ct302_k40_i8_maxlog075.csv", "scaled", TYPES),
    ("k512_i8", "local_aff3ct302_k512_i8_maxlog.csv", "max-log", TYPES[:1]),
    ("k512_i8", "local_aff3ct302_k512_i8_maxlog075.csv", "scaled", TYPES),
    ("k6144_i8", "local_aff3ct302_k6144_i8_maxlog075.csv", "scaled", TYPES),
    ("k6144_i6", "aff3ct_lte_k6144_i6_float32.csv", "scaled", TYPES),
    ("k6144_i6", "aff3ct_lte_k6144_i6_q16_6b3f.csv", "scaled, 6 bits", TYPES),
)
CHAIN_HEADER = ["A, G", "reference", "needs", "our reference", "2 units"]
LOSS_HEADER = ["modulation", "code rate", "reference needs", "2 units", "8 bits", "formats", "segments and windows"]
MCS_HEADER = ["table", "MCS", "modulation", "bits", "code rate", "reference needs", "2 units"]
# References with the algorithm of the fine decoder, by simulation.
LIKE_FINE = {
    "variants_k40_type1": "local_aff3ct302_k40_i8_maxlog075.csv",
    "variants_k512_type0": "local_aff3ct302_k512_i8_maxlog.csv",
    "variants_k512_type1": "local_aff3ct302_k512_i8_maxlog075.csv",
    "variants_k6144_type1": "local_aff3ct302_k6144_i8_maxlog075.csv",
}
STEPS = (("clipped", "fine"), ("undivided", "clipped"), ("windows", "undivided"),
         ("hardware_2", "windows"), ("hardware_4", "windows"), ("hardware_8", "windows"))


def simulate(programs, name):
    """Runs a simulation and keeps its results; of the model, only the columns that do not depend on the machine."""
    print(f"{name} ...", file=sys.stderr, flush=True)
    target = RESULTS / f"{name}.csv"
    if name in VARIANT_RUNS:
        done = subprocess.run([programs / "morvik_variants", *VARIANT_RUNS[name]], check=True, capture_output=True)
        target.write_bytes(done.stdout)
        return
    with tempfile.TemporaryDirectory(prefix="morvik-validation-") as folder:
        path = pathlib.Path(folder) / "results.csv"
        subprocess.run([programs / "morvik", *SWEEP, *MODEL_RUNS[name], "--output", path], check=True)
        with open(target, "w", encoding="utf-8", newline="") as file:
            writer = csv.DictWriter(file, KEPT, extrasaction="ignore", lineterminator="\n")
            writer.writeheader()
            writer.writerows(read_rows(path))


def table(header, rows, texts):
    """The first columns hold text, the others numbers."""
    lines = [header, ["---"] * texts + ["--:"] * (len(header) - texts), *rows]
    return "".join("| " + " | ".join(line) + " |\n" for line in lines)


def shown(estimate):
    return "-" if estimate is None else str(estimate)


def distances():
    """For each comparison and type: the distances, by rate and number of units."""
    for results, reference, kind, types in COMPARISONS:
        curves = read_curves(RESULTS / f"{results}.csv", "algorithm", "num_pu")
        right_of = {rate: crossing(read_reference(REFERENCES / reference), rate) for rate in RATES}
        for algorithm in types:
            yield results, kind, algorithm, {
                (rate, units): crossing(curves[algorithm, units], rate) - right_of[rate]
                for rate in RATES for units in UNITS}


def parts_of(results):
    """The block size and the iterations, parsed from the name of results."""
    return re.fullmatch(r"k(\d+)_i(\d+)", results).groups()


def name_of(results):
    return ", ".join(parts_of(results))


def distance_table():
    header = ["K, iterations", "reference", "type"] + [f"{rate}: {units}" for rate in RATES for units in UNITS]
    return table(header, [[name_of(results), kind, algorithm, *(shown(found[key]) for key in found)]
                          for results, kind, algorithm, found in distances()], 3)


def reference_table():
    rows = []
    for results, reference, kind, _ in COMPARISONS:
        points = read_reference(REFERENCES / reference)
        rows.append([name_of(results), kind, f"`{reference}`", *(shown(crossing(points, rate)) for rate in RATES)])
    return table(["K, iterations", "reference", "file", *map(str, RATES)], rows, 3)


def steps_at(name, rate):
    """The distance of the fine decoder from the reference, if there is one, and the cost of each step from there."""
    path = RESULTS / f"{name}.csv"
    curves = {key[0]: points for key, points in read_curves(path, "variant").items()}
    differing = {}
    for row in read_rows(path):
        differing.setdefault(row["variant"], {})[float(row["ebn0_db"])] = int(row["disagreements"])
    fine = crossing(curves["fine"], rate) if "fine" in curves else None
    reference = crossing(read_reference(REFERENCES / LIKE_FINE[name]), rate) if name in LIKE_FINE else None
    return [fine - reference if fine and reference else None,
            *(paired_step(curves[before], curves[after], differing[after], rate) if before in curves else None
              for after, before in STEPS)]


def step_table():
    """The cost of each step from the reference to the hardware, where the simulated points suffice."""
    rows = []
    for name in VARIANT_RUNS:
        size, algorithm = re.fullmatch(r"variants_k(\d+)_type(\d)", name).groups()
        for rate in RATES:
            steps = steps_at(name, rate)
            if any(steps):
                rows.append([size, TYPES[int(algorithm)], str(rate), *map(shown, steps)])
    header = ["K", "type", "at", "fine", *(after.replace("hardware_", "units: ") for after, _ in STEPS)]
    return table(header, rows, 2)


def with_tables(text):
    """The document with updated tables, each between two comments with its name."""
    by_iterations = ["K", "type", *map(str, sorted(ITERATIONS))]
    for name, content in (("references", reference_table()), ("distances", distance_table()), ("steps", step_table()),
                          ("units", table(by_iterations, needed_table(RESULTS), 2)),
                          ("undivided", table(by_iterations, division_table(RESULTS), 2)),
                          ("chain", table(CHAIN_HEADER, loss.chain_table(RESULTS, REFERENCES), 2)),
                          ("loss", table(LOSS_HEADER, loss.loss_table(RESULTS), 1)),
                          ("mcs", table(MCS_HEADER, loss.mcs_table(RESULTS), 3))):
        begin, end = f"<!-- {name} -->\n", f"<!-- end of {name} -->"
        before, rest = text.split(begin)
        text = before + begin + content + end + rest.split(end)[1]
    return text


def pictures(results):
    """Name and content of each plot but that of distances."""
    return {**needed.pictures(results), "loss.svg": loss.draw_loss(results)}


def main(arguments):
    if arguments != ["--tables"]:
        programs, names = pathlib.Path(arguments[0]), arguments[1:] or ALL_RUNS
        for name in names:
            if name not in ALL_RUNS:
                sys.exit(f"validate: no simulation '{name}'; there are {', '.join(ALL_RUNS)}")
        RESULTS.mkdir(exist_ok=True)
        with concurrent.futures.ThreadPoolExecutor(os.cpu_count()) as pool:
            try:
                list(pool.map(lambda name: simulate(programs, name), [name for name in names if name not in SIMULATIONS]))
                for name in SIMULATIONS.keys() & names:
                    SIMULATIONS[name].run(programs, RESULTS / f"{name}.csv")
            except subprocess.CalledProcessError as error:
                pool.shutdown(cancel_futures=True)
                sys.exit(f"validate: {error}")
    DOCUMENT.write_text(with_tables(DOCUMENT.read_text(encoding="utf-8")), encoding="utf-8")
    scale_text = scales.DOCUMENT.read_text(encoding="utf-8")
    scales.DOCUMENT.write_text(scales.with_table(scale_text, RESULTS / "scales.csv"), encoding="utf-8")
    PLOT.write_bytes(draw([("K = {}\\n{} iterations".format(*parts_of(results)), kind, algorithm, found)
                           for results, kind, algorithm, found in distances()]))
    for name, picture in pictures(RESULTS).items():
        (PLOT.parent / name).write_bytes(picture)
    print(f"Tables: {DOCUMENT}, {scales.DOCUMENT}\nPlots:  {PLOT}, {', '.join(pictures(RESULTS))}")


if __name__ == "__main__":
    main(sys.argv[1:])
