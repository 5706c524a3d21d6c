"""The blocks in flowgraphs, without a display."""

import os
import re
import subprocess
import sys
from pathlib import Path

import morvik
import morvik_gnuradio
import numpy as np
import pytest
from gnuradio import blocks, gr
from morvik import lte

ROOT = Path(__file__).resolve().parents[3]
BITS = np.random.default_rng(1).integers(0, 2, (30, 5000), dtype=np.uint8)


def run(source, *chain):
    """What comes out of the ports of the last block."""
    top = gr.top_block()
    top.connect(source, *chain)
    outputs = chain[-1].output_signature().min_streams()
    sinks = [blocks.vector_sink_c() if isinstance(chain[-1], morvik_gnuradio.mapper) else
             blocks.vector_sink_f() if isinstance(chain[-1], morvik_gnuradio.demapper) else
             blocks.vector_sink_b() for _ in range(outputs)]
    for port, sink in enumerate(sinks):
        top.connect((chain[-1], port), sink)
    top.run()
    return [np.array(sink.data()) for sink in sinks]


def test_blocks_give_what_the_package_gives():
    chain = lte.Transport(5000, 9600, "64qam")
    coded = chain.encode(BITS, 2)
    symbols = lte.map(coded, "64qam")
    rng = np.random.default_rng(2)
    noise = rng.normal(0, 0.18, (*symbols.shape, 2)).astype(np.float32).view(np.complex64)[..., 0]
    llrs = lte.demap(symbols + noise, "64qam", 0.0648, demapper="exact")
    received = chain.decode(morvik.Decoder(4), chain.recover(llrs, 2), 6)
    assert 0 < received.fits.sum() < len(BITS)

    bits = blocks.vector_source_b(BITS.reshape(-1).tolist())
    (given,) = run(bits, morvik_gnuradio.encoder(5000, 9600, "64qam", 2))
    assert np.array_equal(given, coded.reshape(-1))
    (given,) = run(blocks.vector_source_b(coded.reshape(-1).tolist()), morvik_gnuradio.mapper("64qam"))
    assert np.array_equal(given.astype(np.complex64), symbols.reshape(-1))
    received_symbols = blocks.vector_source_c((symbols + noise).reshape(-1).tolist())
    demapper = morvik_gnuradio.demapper("64qam", 1.0, "exact")
    demapper.set_noise_variance(0.0648)
    (given,) = run(received_symbols, demapper)
    assert np.array_equal(given.astype(np.float32), llrs.reshape(-1))
    ratios = blocks.vector_source_f(llrs.reshape(-1).tolist())
    decided, fits = run(ratios, morvik_gnuradio.decoder(5000, 9600, "64qam", 2, num_pu=4, iterations=6))
    assert np.array_equal(decided.reshape(BITS.shape), received.bits)
    assert np.array_equal(fits, received.fits)


def test_wrong_arguments_are_refused_when_a_block_is_made():
    with pytest.raises(ValueError, match="coded_bits must be a multiple of the 2 bits of a symbol"):
        morvik_gnuradio.encoder(1000, 2401)
    with pytest.raises(ValueError, match="modulation must be one of"):
        morvik_gnuradio.mapper("8psk")
    with pytest.raises(morvik.Error, match="C_NUM_PU"):
        morvik_gnuradio.decoder(1000, 2400, num_pu=3)


def test_the_example_runs(tmp_path):
    environment = {**os.environ, "GRC_BLOCKS_PATH": str(ROOT / "bindings/gnuradio"), "HOME": str(tmp_path)}
    flowgraph = ROOT / "examples/gnuradio_chain.grc"
    compiled = subprocess.run(["grcc", "--output", tmp_path, flowgraph], env=environment, capture_output=True, text=True)
    assert compiled.returncode == 0, compiled.stdout + compiled.stderr
    told = subprocess.run(
        [sys.executable, tmp_path / "gnuradio_chain.py"], env=environment, capture_output=True, text=True, timeout=120
    )
    fit, wrong = map(int, re.fullmatch(r"(\d+) of 200 transport blocks fit, (\d+) bits are wrong\n", told.stdout).groups())
    assert 140 < fit < 200 and 100 < wrong < 5000
