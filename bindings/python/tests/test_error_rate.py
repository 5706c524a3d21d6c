"""Simulated error rates."""

import csv
import json
import os
import signal
import threading
import time
import warnings

import matplotlib
import morvik
import numpy as np
import pandas as pd
import pytest

matplotlib.use("Agg")
import matplotlib.pyplot as plt  # noqa: E402

FEW = {"max_blocks": 70, "block_errors": 50}


def expect_file(rates, file):
    """Expects the rates of a result file, except for the times."""
    with open(file, newline="") as lines:
        rows = list(csv.DictReader(lines))
    assert list(rows[0]) == list(rates.dtype.names)
    assert len(rows) == len(rates)
    for row, rate in zip(rows, rates):
        for name, text in row.items():
            value = rate[name]
            if name in ("failed_frames", "redundancy_versions"):
                assert [int(number) for number in text.split()] == list(value)
            elif isinstance(value, str):
                assert value == text
            elif name != "seconds":
                assert value == type(value)(text) or value == pytest.approx(float(text), rel=1e-6), name


def test_results_are_those_of_the_command(repository):
    rates = morvik.error_rate(
        [40, 512, 6144], [0, 1.5], num_pu=(2, 4, 8), algorithm=[0, "scaled", 2], iterations=3, seed=2**64 - 1, **FEW
    )
    expect_file(rates, repository / "tests/data/ber/sweep.csv")


def test_scales_are_those_of_the_command(repository):
    rates = morvik.error_rate(
        1056,
        np.arange(-0.5, 1.5, 1.0),
        algorithm=2,
        scale=[None, 5, 20.5, 80],
        num_pu=4,
        iterations=[2, 6],
        max_blocks=100,
        bit_errors=10000,
    )
    expect_file(rates, repository / "tests/data/ber/scales.csv")


def test_transport_blocks_are_those_of_the_command(repository):
    rates = morvik.error_rate(
        transport_block_size=[120, 7000],
        code_rate=[0.6, 0.12],
        modulation=["qpsk", "256qam"],
        redundancy_versions=[0, 2, 3, 1],
        channel="rayleigh",
        early_stop="crc",
        esn0_db=[-3, 5, 16],
        iterations=4,
        max_blocks=20,
        seed=7,
    )
    expect_file(rates, repository / "tests/data/ber/link.csv")


def test_modulated_blocks_are_those_of_the_command(repository):
    rates = morvik.error_rate(
        [104, 512], [4, 12], modulation=["bpsk", "64qam"], channel="block-rayleigh", iterations=3, max_blocks=70
    )
    expect_file(rates, repository / "tests/data/ber/modulated.csv")


def test_schemes_and_frames_are_those_of_the_command(repository):
    rates = morvik.error_rate(
        mcs=[27, 5],
        mcs_table="256qam",
        resource_blocks=4,
        resource_elements=138,
        demapper="exact",
        soft_buffer_bits=7,
        soft_buffer_size=9000,
        esn0_db=[3, 26],
        algorithm="table",
        iterations=3,
        each_iteration=True,
        frames=(4294967290, 4294967310),
    )
    kept = (repository / "tests/data/ber/link.json").read_text().replace('"seconds": T', '"seconds": 0')
    rows = json.loads(kept)["rows"]
    assert [list(row) for row in rows] == [list(rates.dtype.names)] * len(rates)
    for row, rate in zip(rows, rates):
        for name in ("mcs", "esn0_db", "frames", "iterations", "bit_errors", "block_errors", "demapper", "throughput"):
            assert rate[name] == pytest.approx(row[name], rel=1e-5) if name == "throughput" else rate[name] == row[name]
    expect_file(
        morvik.error_rate(
            [104, 2048], [0, 0.4, 0.8], num_pu=4, iterations=8, each_iteration=True, frames=(4294967290, 4294967390)
        ),
        repository / "tests/data/ber/each_iteration.csv",
    )


def test_each_iteration_is_counted():
    counted = morvik.error_rate(104, 1.0, iterations=4, each_iteration=True, block_errors=10**6, max_blocks=300)
    for row, iterations in zip(counted, (1, 2, 3, 4), strict=True):
        alone = morvik.error_rate(104, 1.0, iterations=iterations, block_errors=10**6, max_blocks=300)[0]
        assert (row.iterations, row.blocks, row.bit_errors) == (iterations, 300, alone.bit_errors)


def test_threads_and_instruction_sets_change_nothing():
    runs = [
        morvik.error_rate(512, [0.5, 1.0], threads=threads, instruction_set=name, **FEW)
        for threads, name in ((1, None), (3, None), (1, "generic"))
    ]
    for run in runs[1:]:
        assert run.bit_errors.tolist() == runs[0].bit_errors.tolist()


def test_a_curve_ends_where_it_should():
    rates = morvik.error_rate(40, max_blocks=200)
    assert rates.ebn0_db.tolist() == (np.arange(len(rates)) * 0.5).tolist()
    assert rates.bler[-1] < 0.0001 <= rates.bler[-2]
    rates = morvik.error_rate(40, [1, 9, 10], stop_bler=0.5, max_blocks=200)
    assert rates.ebn0_db.tolist() == [1]


def test_time_ends_a_point():
    rates = morvik.error_rate(6144, 1.5, max_seconds=0.05)
    assert 0 < rates.blocks[0] < 1_000_000 and rates.seconds[0] >= 0.05


def test_pandas_takes_the_record():
    rates = morvik.error_rate([40, 104], [0, 1, 2], **FEW)
    frame = pd.DataFrame(rates)
    assert list(frame.columns) == list(rates.dtype.names)
    curves = frame.pivot(index="ebn0_db", columns="block_size", values="bler")
    assert curves.loc[1, 104] == rates.bler[(rates.block_size == 104) & (rates.ebn0_db == 1)][0]
    assert frame.groupby("algorithm").blocks.sum()["scaled"] == rates.blocks.sum()


def test_matplotlib_takes_the_record():
    rates = morvik.error_rate(40, [0, 1, 2], **FEW)
    axes = plt.figure().add_subplot()
    (line,) = axes.semilogy("ebn0_db", "bler", data=rates)
    axes.fill_between("ebn0_db", "bler_low", "bler_high", data=rates)
    assert np.array_equal(line.get_ydata(), rates.bler)
    plt.close()


def test_bounds_lie_around_rates():
    rates = morvik.error_rate(40, [0, 2, 12], **FEW)
    assert np.all(rates.bler_low <= rates.bler) and np.all(rates.bler <= rates.bler_high)
    assert np.all(rates.ber_low <= rates.ber) and np.all(rates.ber <= rates.ber_high)
    assert rates.bler[-1] == 0 < rates.bler_high[-1]


def test_progress_is_told_of_each_point():
    heard = []
    rates = morvik.error_rate(40, [0, 1, 2], progress=heard.append, **FEW)
    assert [point.ebn0_db.tolist() for point in heard] == [[0], [1], [2]]
    assert [int(point.bit_errors[0]) for point in heard] == rates.bit_errors.tolist()


def test_progress_may_end_the_simulation():
    heard = []

    def stop(point):
        heard.append(point)
        raise KeyError("enough")

    with pytest.raises(KeyError, match="enough"):
        morvik.error_rate(40, [0, 1, 2], progress=stop, **FEW)
    assert len(heard) == 1


def test_warns_as_the_command_does():
    frames = {"transport_block_size": 976, "coded_bits": 1000, "max_blocks": 2}
    with pytest.warns(morvik.SimulationWarning) as caught:
        morvik.error_rate(**frames, esn0_db=9)
    assert [str(each.message) for each in caught] == [
        "the code rate with CRCs is 1.000 for A = 976, G = 1000: above 0.931, a terminal may leave out decoding "
        "(3GPP TS 36.213, 7.1.7)"
    ]
    assert caught[0].filename == __file__
    with pytest.warns(morvik.SimulationWarning, match="^a curve ends at a block error rate above 0.01: 1 at Es/N0 .* dB, "
                      "A = 976, G = 1000, .*; esn0_db or ebn0_db sets the range$"):
        morvik.error_rate(**frames, channel="block-rayleigh", iterations=1, stop_bler=1)
    with pytest.warns(morvik.SimulationWarning, match="^soft buffers of 4 bits saturate with the automatic scale"):
        morvik.error_rate(transport_block_size=40, coded_bits=200, esn0_db=9, max_blocks=2, soft_buffer_bits=4)
    with warnings.catch_warnings():
        warnings.simplefilter("error")
        morvik.error_rate(transport_block_size=40, coded_bits=200, esn0_db=-9, max_blocks=2)


def test_an_interrupt_ends_the_simulation():
    def tasks():
        return len(os.listdir("/proc/self/task"))

    def interrupt():
        while tasks() < both + 2:  # the simulation's threads
            time.sleep(0.001)
        os.kill(os.getpid(), signal.SIGINT)

    interrupter = threading.Thread(target=interrupt)
    both = tasks() + 1
    with pytest.raises(KeyboardInterrupt):
        interrupter.start()
        morvik.error_rate(6144, 0.0, block_errors=2**63 - 1, max_blocks=2**63 - 1, threads=2)


def test_nothing_is_printed(capfd):
    morvik.error_rate(40, 0, **FEW)
    assert capfd.readouterr() == ("", "")


@pytest.mark.parametrize(
    ("arguments", "kind", "text"),
    [
        ({"block_size": 41}, morvik.Error, "Block size not supported: K = 41; the nearest block sizes are 40 and 48"),
        ({"block_size": [40, -1]}, morvik.Error, "Block size not supported: K = -1"),
        ({"block_size": []}, ValueError, "block_size must not be empty"),
        ({"block_size": "40"}, TypeError, "block_size must be an integer, not '40'"),
        ({"ebn0_db": [1, 99]}, ValueError, "ebn0_db must be in the range -50 to 50"),
        ({"ebn0_db": float("inf")}, ValueError, "ebn0_db must be a finite number"),
        ({"num_pu": [2, 3]}, morvik.Error, "C_NUM_PU must be either 2, 4 or 8"),
        ({"num_pu": -(2**70)}, morvik.Error, "C_NUM_PU must be either 2, 4 or 8"),
        ({"algorithm": 9}, morvik.Error, "C_ALGORITHM_TYPE must be in range 0 to 2"),
        ({"algorithm": ["scaled", "fast"]}, ValueError, "algorithm must be one of max-log, scaled, table"),
        ({"scale": 0}, ValueError, "scale must be in the range 0.001 to 1000"),
        ({"iterations": 16}, ValueError, "iterations must be in the range 1 to 15, not 16"),
        ({"iterations": [2, 4], "each_iteration": True}, ValueError, "give only the largest"),
        ({"block_errors": 0}, ValueError, "block_errors must be in the range 1 to"),
        ({"bit_errors": -1}, ValueError, "bit_errors must be in the range 1 to"),
        ({"max_blocks": 2**70}, ValueError, "max_blocks must be in the range 1 to"),
        ({"max_seconds": 0}, ValueError, "max_seconds must be in the range"),
        ({"stop_bler": 1.5}, ValueError, "stop_bler must be in the range 0 to 1, not 1.5"),
        ({"seed": -1}, ValueError, "seed must be in the range 0 to 18446744073709551615, not -1"),
        ({"threads": 0}, ValueError, "threads must be in the range 1 to 1024"),
        ({"instruction_set": "mmx"}, morvik.Error, "Instruction set 'mmx' is not one of"),
        ({"progress": 3}, TypeError, "progress must be callable, not 3"),
        ({"block_size": None}, ValueError, "one of block_size, transport_block_size and mcs must be given"),
        ({"ebn0_db": 1, "esn0_db": 1}, ValueError, "only one of them can be given"),
        ({"mcs": 3, "resource_blocks": 6}, morvik.Error, "block_size sends plain code blocks, mcs transport blocks"),
        ({"early_stop": "crc"}, morvik.Error, "early_stop crc needs transport blocks, by transport_block_size or mcs"),
        ({"block_size": None, "transport_block_size": 40}, morvik.Error, "needs either coded_bits or code_rate"),
        ({"modulation": "8psk"}, ValueError, "modulation must be one of bpsk, qpsk, 16qam, 64qam, 256qam, not '8psk'"),
        ({"channel": 3}, ValueError, "channel must be one of awgn, rayleigh, block-rayleigh, not 3"),
        ({"redundancy_versions": []}, ValueError, "redundancy_versions must be 1 to 16 numbers, not 0"),
        ({"frames": (3, 3)}, ValueError, "frames must be .FROM, TO., with FROM below TO, not .3, 3."),
        ({"each_iteration": True, "redundancy_versions": [0, 2]}, ValueError, "counts one transmission"),
    ],
)
def test_refuses(arguments, kind, text):
    with pytest.raises(kind, match=text):
        morvik.error_rate(**{"block_size": 40, **FEW, **arguments})
