#!/usr/bin/python3
"""The core of core_from_document.py decides as the model, and has its ratios.

    core_from_document_test.py MORVIK

Sets of `morvik vectors`, with their directed blocks, for each number of units and each algorithm, and all numbers of
iterations from 1 to 9; then blocks of any soft values, and of extreme ones, which `morvik decode` decides.
"""

import itertools
import json
import subprocess
import sys
import tempfile
from collections import Counter
from pathlib import Path

import numpy as np

sys.dont_write_bytecode = True  # the tree stays as it is
import core_from_document as core

MORVIK = sys.argv[1]
CORES = list(itertools.product((2, 4, 8), (0, 1, 2)))
FEWEST_BLOCKS = 1000


def morvik(*arguments, text=None):
    """What the command prints; `text` is what it reads."""
    command = [MORVIK, *map(str, arguments)]
    return subprocess.run(command, input=text, check=True, capture_output=True, text=True).stdout


def interleavers():
    sizes = json.loads(morvik("info", "--json"))["block_sizes"]
    return {size["block_size"]: core.interleaver(**size) for size in sizes}


class Tally:
    """What has been compared, and what agreed."""

    def __init__(self):
        self.blocks, self.values = Counter(), Counter()

    def add(self, what, got, expected):
        """Blocks by their first axis."""
        assert got.shape == expected.shape, f"{what}: {got.shape} values, {expected.shape} expected"
        for block, (one, other) in enumerate(zip(got, expected)):
            same = int(np.sum(one == other))
            self.blocks.update(compared=1, equal=same == one.size)
            self.values.update(compared=one.size, equal=same)
            if same < one.size:
                print(f"{what}, {block}: {one.size - same} values differ, the first at {np.argmax(one != other)}")

    def report(self, what):
        print(f"{self.blocks['equal']} of {self.blocks['compared']} blocks agree, "
              f"{self.values['equal']} of {self.values['compared']} {what}")

    def all_agree(self):
        return self.blocks["equal"] == self.blocks["compared"] > 0 and self.values["equal"] == self.values["compared"]


def blocks_of(folder):
    """The blocks of a set by size: names, soft values and ratios."""
    names = [block["name"] for block in json.loads((folder / "manifest.json").read_text())["blocks"]]
    blocks, stimulus, ratios, bits = (
        np.load(folder / f"{table}.npy") for table in ("blocks", "stimulus", "ratios", "expected"))
    assert len(names) == len(blocks) and ((ratios >= 0) == bits).all()
    by_size = {}
    for name, (size, _, _, _, position, bit) in zip(names, blocks.astype(int)):
        kept = by_size.setdefault(size, ([], [], []))
        for values, value in zip(kept, (name, stimulus[position:position + size + 4], ratios[bit:bit + size])):
            values.append(value)
    return {size: (kept[0], np.stack(kept[1]), np.stack(kept[2])) for size, kept in by_size.items()}


def compare_sets(permutations, tally, clipped):
    """Noisy blocks and directed ones; returns how many there are of each name. `clipped` counts how a core with a
    clipped tail decides the blocks that are made for it."""
    names = Counter()
    for iterations, (units, algorithm) in enumerate(CORES, 1):
        with tempfile.TemporaryDirectory() as scratch:
            folder = Path(scratch, "set")
            morvik("vectors", "--out", folder, "--format", "npy", "--soft",
                   "--block-size", "40,104,512", "--blocks", 25, "--ebn0", "0.5",
                   "--num-pu", units, "--algorithm", algorithm, "--iterations", iterations)
            for size, (kept, soft_values, ratios) in blocks_of(folder).items():
                what = f"{units} units, algorithm {algorithm}, {iterations} iterations, K = {size}, block"
                arguments = (permutations[size], units, algorithm, iterations)
                tally.add(what, core.decode(soft_values, *arguments), ratios)
                names.update(kept)
                tail = [i for i, name in enumerate(kept) if name == "opposed_tail"]
                otherwise = core.decode(soft_values[tail], *arguments, tail_clipped=True)
                alike = ((otherwise >= 0) == (ratios[tail] >= 0)).all(axis=1)
                clipped.update(compared=len(tail), alike=int(np.sum(alike)))
    return names


def compare_decisions(permutations, tally):
    """Blocks that are no code words."""
    rng = np.random.default_rng(1)
    for (units, algorithm), size in itertools.product(CORES, (40, 128, 1280)):
        shape = (6, size + 4, 3)
        soft_values = np.concatenate(
            [rng.integers(-128, 128, shape), rng.choice((-128, 127), shape), rng.integers(-1, 2, shape)])
        lines = ["block,rsc1_sys,rsc1_par,rsc2_par"]
        lines += [f"{block},{','.join(map(str, row))}" for block, rows in enumerate(soft_values) for row in rows]
        decided = morvik("decode", "--num-pu", units, "--algorithm", algorithm, "--iterations", 2,
                         text="\n".join(lines) + "\n")
        bits = np.array([list(map(int, line)) for line in decided.split()])
        decisions = core.decode(soft_values, permutations[size], units, algorithm, 2) >= 0
        tally.add(f"{units} units, algorithm {algorithm}, K = {size}, any values, block", decisions.astype(int), bits)


def main():
    permutations = interleavers()
    ratios, decisions, clipped = Tally(), Tally(), Counter()
    names = compare_sets(permutations, ratios, clipped)
    compare_decisions(permutations, decisions)
    directed = sum(count for name, count in names.items() if name != "random")
    print(f"sets: {names['random']} random blocks, {directed} directed ones of {len(names) - 1} names")
    ratios.report("ratios")
    decisions.report("decisions of any soft values")
    print(f"opposed_tail: {clipped['alike']} of {clipped['compared']} blocks are decided alike with a clipped tail")
    enough = ratios.blocks["compared"] >= FEWEST_BLOCKS and directed > 0 and clipped["compared"] > 0
    if not enough:
        print(f"compared too little: {FEWEST_BLOCKS} blocks of sets have to be, directed ones among them")
    agreed = ratios.all_agree() and decisions.all_agree() and clipped["alike"] == 0
    sys.exit(not (enough and agreed))


main()
