"""Checks that the command writes the same files on every machine, to the byte: results of simulations as tests/data/ber
keeps them; vectors, traces, code words and what commands print as tests/data/same_files.txt has their SHA-256.

same_files.py MORVIK [--renew | SameFiles.test_same_vectors | SameFiles.test_same_results]
"""

import hashlib
import re
import subprocess
import sys
import tempfile
import unittest
from pathlib import Path

MORVIK = Path(sys.argv.pop(1)).absolute()
RENEW = "--renew" in sys.argv and not sys.argv.remove("--renew")
DATA = Path(__file__).resolve().parents[1] / "data"
HASHES = DATA / "same_files.txt"
BLOCKS = DATA / "vectors"
SETS = {
    "blocks": "--num-pu 8 --block-size 40,104 --blocks 2 --no-directed --format memh,csv,npy,c --soft --internal "
              "--no-situations",
    "directed": "--algorithm table --num-pu 4 --block-size 512 --blocks 4 --ebn0 0 --width 16 --streams separate "
                "--no-situations",
    "transport": "--algorithm max-log --transport-block-size 2000 --code-rate 0.7 --modulation 64qam --channel rayleigh "
                 "--redundancy-versions 0,2 --soft-buffer-bits 6 --demapper exact --esn0 12 --blocks 2 --no-directed --soft "
                 "--no-situations",
    "units": "--unit intrinsic,branch,forward,backward,ratio,extrinsic,address,tail,border --cases 100 --format memh,csv,npy,c",
}
PRINTED = {
    "trace.txt": "trace k40.csv --half-iterations 0:1",
    "trace.csv": "trace k104.csv --num-pu 8 --algorithm table --half-iterations 1 --format csv",
    "trace.vcd": "trace k104.csv --num-pu 4 --half-iterations 0:2 --format vcd",
    "encoded.csv": "encode k512.bits --amplitude 9",
    "transport.csv": "encode k2048.bits --transport-block --coded-bits 5000 --redundancy-versions 0,3",
    "doctor.json": "doctor k512.csv --reference k512.bits --json",
    "info.json": "info 6144 --table --json",
}


def run(options, folder, statuses=(0,)):
    """Runs the command on the blocks of tests/data/vectors; returns what it prints."""
    words = [str(BLOCKS / word) if re.fullmatch(r"k\d+\.\w+", word) else word for word in options.split()]
    done = subprocess.run([MORVIK, *words], cwd=folder, capture_output=True, check=False)
    assert done.returncode in statuses, (options, done)
    return done.stdout


def hash_of(content):
    """Of text, whatever the version of the command."""
    return hashlib.sha256(re.sub(rb'"version": "[^"]*"', b'"version": "V"', content)).hexdigest()


def hashes_of(folder):
    """Of all files, by name."""
    found = {}
    for name, options in SETS.items():
        run(f"vectors {options} --out {name}", folder)
        found |= {f"{name}/{file.name}": hash_of(file.read_bytes()) for file in (folder / name).iterdir()}
    for name, options in PRINTED.items():
        found[name] = hash_of(run(options, folder))
    run("trace k40.csv --half-iterations 0 --format npy --output trace.npy", folder)
    found["trace.npy"] = hash_of((folder / "trace.npy").read_bytes())
    return found


class SameFiles(unittest.TestCase):
    maxDiff = None

    def setUp(self):
        scratch = tempfile.TemporaryDirectory()
        self.addCleanup(scratch.cleanup)
        self.folder = Path(scratch.name)

    def test_same_vectors(self):
        found = hashes_of(self.folder)
        expected = dict(reversed(line.split()) for line in HASHES.read_text(encoding="ascii").splitlines())
        self.assertEqual({name for name in expected.keys() | found.keys() if expected.get(name) != found.get(name)}, set())
        self.assertGreater(len(found), 60)

    def test_same_results(self):
        for line in (DATA / "ber" / "commands.txt").read_text(encoding="ascii").splitlines():
            name, options = line.split(maxsplit=1)
            run(f"ber {options} --quiet --output {name}", self.folder)
            found = re.sub(r",\d+\.\d{3},(\d+,[\d.]+)$", r",T,\1", (self.folder / name).read_text(encoding="ascii"), flags=re.M)
            self.assertEqual(re.sub(r'"seconds": [\d.]+', '"seconds": T', found),
                             (DATA / "ber" / name).read_text(encoding="ascii"), name)


if RENEW:
    with tempfile.TemporaryDirectory() as scratch:
        found = hashes_of(Path(scratch))
    HASHES.write_text("".join(f"{found[name]}  {name}\n" for name in sorted(found)), encoding="ascii")
else:
    unittest.main()
