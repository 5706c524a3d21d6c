#!/usr/bin/python3
"""Simulations of cores with faults, in lockstep with the model, are stopped at the value that morvik compare names, with
its words; a sound core passes.

    lockstep.py MORVIK FAULT_CORE BLOCKS COMMAND...     in COMMAND, REPLAY stands for the file that is replayed
"""

import re
import subprocess
import sys
import tempfile

FAULTS = ("forward_bits_kept", "backward_uncorrected", "ratio_sign", "extrinsic_stuck_bit")
CORE = ("2", "2", "2")  # units, the algorithm with the table, iterations


def output_of(command, **more):
    done = subprocess.run(command, stdout=subprocess.PIPE, stderr=subprocess.STDOUT, text=True, check=False, **more)
    return done.returncode, done.stdout


def words_of(morvik, fault_core, blocks, fault, folder):
    """What compare says of the first difference: its place and its values, and its verdict."""
    dump = f"{folder}/rtl.csv"
    with open(blocks) as block, open(dump, "w") as rows:
        subprocess.run([fault_core, fault, *CORE], stdin=block, stdout=rows, check=True)
    status, report = output_of([morvik, "compare", "--block", blocks, "--dump", dump, "--num-pu", CORE[0],
                                "--algorithm", CORE[1], "--iterations", CORE[2]])
    assert status == 1, report
    place = re.search(r"  half-iteration  .*?\n\n.*?\n  got [^\n]*", report, re.DOTALL)[0]
    verdict = re.search(r"^.*At fault: [^\n]*", report, re.MULTILINE)[0]
    return place, verdict


def main():
    morvik, fault_core, blocks, *command = sys.argv[1:]
    failures = []
    with tempfile.TemporaryDirectory() as folder:
        replay = f"{folder}/replay.txt"
        for fault in ("none", *FAULTS):
            with open(blocks) as block, open(replay, "w") as values:
                subprocess.run([fault_core, fault, *CORE, "replay"], stdin=block, stdout=values, check=True)
            status, log = output_of([word.replace("REPLAY", replay) for word in command])
            if fault == "none":
                expected = ["all equal to the model", "the core agrees"]
            else:
                expected = [*words_of(morvik, fault_core, blocks, fault, folder), "stopped"]
            lacks = [each for each in expected if each not in log]
            if lacks or (status == 0) != (fault == "none"):
                failures.append(f"{fault}: status {status}, lacks {lacks} in:\n{log}")
    print("\n".join(failures) or f"{len(FAULTS)} faults stop the simulation, none does not")
    return 1 if failures else 0


if __name__ == "__main__":
    sys.exit(main())
