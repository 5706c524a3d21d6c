#!/usr/bin/python3
"""Simulations of cores with faults, in lockstep with the model, are stopped at the value that morvik compare names, with
its words; a sound core passes.

    lockstep.py MORVIK FAULT_CORE BLOCKS COMMAND...     in COMMAND, REPLAY stands for the file that is replayed

BLOCKS is a folder of soft values. With MORVIK_LOCKSTEP_FAULTS=all in the environment, every fault that there is, each on
the first of some blocks and cores that show it.
"""

import functools
import itertools
import os
import pathlib
import random
import re
import subprocess
import sys
import tempfile
from typing import NamedTuple


class Run(NamedTuple):
    """A block and a core: units, algorithm, iterations."""
    block: str
    core: tuple


SHORT = Run("k512.csv", ("2", "2", "2"))  # the algorithm with the table
QUICK = ("forward_bits_kept", "backward_uncorrected", "ratio_sign", "extrinsic_stuck_bit")
RUNS = (SHORT, Run("k512.csv", ("2", "1", "2")), Run("k2048.csv", ("4", "1", "2")), Run("any.csv", ("2", "1", "2")),
        Run("any.csv", ("8", "0", "3")), Run("k2048.csv", ("8", "2", "3")))


class Cores:
    """Makes dumps and replays of cores with faults."""

    def __init__(self, program, blocks, folder):
        self.program = program
        self.blocks = pathlib.Path(blocks)
        self.any = pathlib.Path(folder) / "any.csv"
        draw = random.Random(1)
        rows = [",".join(["0", *(str(draw.randint(-128, 127)) for _ in range(3))]) for _ in range(1092)]
        self.any.write_text("block,rsc1_sys,rsc1_par,rsc2_par\n" + "\n".join(rows) + "\n")

    def path(self, run):
        return self.any if run.block == self.any.name else self.blocks / run.block

    def output(self, fault, run, *more):
        with open(self.path(run)) as block:
            return subprocess.run([self.program, fault, *run.core, *more], stdin=block, stdout=subprocess.PIPE,
                                  check=True).stdout

    @functools.lru_cache(maxsize=None)
    def sound(self, run):
        return self.output("none", run)

    def shown(self, fault):
        """The first of RUNS in which the fault changes a value, and the dump of this run; None and None without one."""
        for run in RUNS:
            dump = self.output(fault, run)
            if dump != self.sound(run):
                return run, dump
        return None, None

    def faults(self):
        """Each fault with what `shown` tells of it."""
        if os.environ.get("MORVIK_LOCKSTEP_FAULTS") != "all":
            return ((fault, SHORT, self.output(fault, SHORT)) for fault in QUICK)
        names = subprocess.run([self.program, "list"], stdout=subprocess.PIPE, text=True, check=True).stdout.split()
        return ((name, *self.shown(name)) for name in names)


def output_of(command):
    done = subprocess.run(command, stdout=subprocess.PIPE, stderr=subprocess.STDOUT, text=True, check=False)
    return done.returncode, done.stdout


def words_of(morvik, block, run, dump, folder):
    """What compare says of a dump's first difference: its place and its values, and its verdict."""
    rtl = pathlib.Path(folder) / "rtl.csv"
    rtl.write_bytes(dump)
    units, algorithm, iterations = run.core
    status, report = output_of([morvik, "compare", "--block", block, "--dump", rtl, "--num-pu", units, "--algorithm",
                                algorithm, "--iterations", iterations])
    assert status == 1, report
    place = re.search(r"  half-iteration  .*?\n\n.*?\n  got [^\n]*", report, re.DOTALL)[0]
    verdict = re.search(r"^.*At fault: [^\n]*", report, re.MULTILINE)[0]
    return place, verdict


def main():
    morvik, fault_core, blocks, *command = sys.argv[1:]
    failures = []
    hidden = []
    stopped = 0
    with tempfile.TemporaryDirectory() as folder:
        cores = Cores(fault_core, blocks, folder)
        replay = pathlib.Path(folder) / "replay.txt"
        for fault, run, dump in itertools.chain([("none", SHORT, None)], cores.faults()):
            if run is None:
                hidden.append(fault)
                continue
            replay.write_bytes(cores.output(fault, run, "replay"))
            status, log = output_of([word.replace("REPLAY", str(replay)) for word in command])
            if dump is None:
                expected = ["all equal to the model", "the core agrees"]
            else:
                expected = [*words_of(morvik, cores.path(run), run, dump, folder), "stopped"]
                stopped += 1
            lacks = [each for each in expected if each not in log]
            if lacks or (status == 0) != (dump is None):
                failures.append(f"{fault}: status {status}, lacks {lacks} in:\n{log}")
    if hidden:
        print(f"changes no value: {', '.join(hidden)}")
    print("\n".join(failures) or f"{stopped} faults stop the simulation, none does not")
    return 1 if failures else 0


if __name__ == "__main__":
    sys.exit(main())
