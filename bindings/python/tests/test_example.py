"""The example runs and writes its picture."""

import os
import subprocess
import sys

import matplotlib.image
import numpy as np


def test_waterfall(repository, tmp_path):
    script = repository / "bindings/python/example/waterfall.py"
    run = subprocess.run(
        [sys.executable, script],
        cwd=tmp_path,
        env={**os.environ, "MPLBACKEND": "Agg"},
        capture_output=True,
        text=True,
    )
    assert run.stderr == ""
    lines = run.stdout.splitlines()
    wrong = int(lines[0].split()[0])
    assert lines[0] == f"{wrong} of 2000 blocks are wrong at 1 dB"
    rates = {float(line.split()[0]): line.split()[1:] for line in lines[3:]}
    assert 0.5 < wrong / 2000 / float(rates[1.0][1]) < 2  # "scaled", as simulated

    picture = matplotlib.image.imread(tmp_path / "waterfall.png")[..., :3]
    assert picture.shape == (675, 1650, 3)
    for color in ("#1f77b4", "#ff7f0e", "#2ca02c"):  # the lines of three algorithms, and of three Eb/N0
        drawn = np.all(np.abs(picture - matplotlib.colors.to_rgb(color)) < 0.02, axis=2)
        for half in (drawn[:, :825], drawn[:, 825:]):
            assert half.sum() > 500
