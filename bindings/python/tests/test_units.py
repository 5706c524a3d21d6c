"""The units on arrays: their values, their shapes, and what is refused."""

import morvik
import numpy as np
import pytest
from morvik import units

ALPHA = 12 * np.arange(8) - 40
BETA = 20 - 9 * np.arange(8)
PENDING = [0, 1, 2, 3, 4, 6, 6, 6]
G = [-3, -35, -35, -3]


def test_values_that_the_tests_of_all_bindings_have():
    assert units.branch(units.intrinsic(10, -24), 16).tolist() == G
    column = units.forward(ALPHA, G, PENDING, algorithm="table")
    assert column.metrics.tolist() == [-30, 34, 47, 53, -24, 21, 61, 47]
    assert column.pending.tolist() == [4, 0, 0, 1, 1, 0, 0, 4]
    assert units.backward(BETA, G, PENDING, algorithm="table").metrics.tolist() == [23, 17, 16, 47, 39, 7, -7, -1]
    assert units.ratio(ALPHA, BETA, G, algorithm="table") == -33
    assert units.extrinsic(-101, -19) == -48
    assert units.extrinsic(-101, -19, algorithm="table") == -63
    assert units.address(40, 7) == 31
    assert units.tail([1, -20, 30], [-100, 50, -6]).tolist() == [40, -160, 104, -96, -152, 48, -8, 192]
    assert units.border(ALPHA).tolist() == [-40, -32, -16, -8, 8, 16, 32, 40]


def test_arguments_are_broadcast():
    sums = units.intrinsic(np.arange(-128, 128)[:, np.newaxis], np.arange(-128, 128))
    assert sums.shape == (256, 256) and sums.dtype == np.int16
    assert np.array_equal(sums, np.arange(-128, 128)[:, np.newaxis] // 2 + np.arange(-128, 128))
    columns = units.forward(np.stack([ALPHA, BETA]), G)
    assert columns.metrics.shape == columns.pending.shape == (2, 8)
    assert np.array_equal(columns.metrics[1], units.forward(BETA, G).metrics)
    assert units.border(np.zeros((0, 8), np.int8)).shape == (0, 8)


@pytest.mark.parametrize("algorithm", ["max-log", "scaled", "table"])
def test_every_value_of_a_block(soft, algorithm):
    checker = morvik.Checker(algorithm=algorithm)
    checker.start(*(stream[0] for stream in soft), iterations=1)
    alpha, beta, g = (
        np.stack([checker.values(f"{name}{i}")[1][:40] for i in range(count)], axis=-1)
        for name, count in (("alpha", 8), ("beta", 8), ("g", 4))
    )
    llrs = units.ratio(alpha, beta, g, algorithm=algorithm)
    assert np.array_equal(llrs, checker.values("llr")[1])
    apriori = np.empty(40, int)
    apriori[units.address(40, np.arange(40))] = checker.values("extrinsic")[0]
    twice = units.intrinsic(apriori, soft[0][0][:40])
    assert np.array_equal(twice >> 1, checker.values("intrinsic")[1][:40])
    assert np.array_equal(units.branch(twice, soft[1][0][:40]), g)
    assert np.array_equal(units.extrinsic(llrs, twice, algorithm=algorithm), checker.values("extrinsic")[1])


def test_addresses_are_those_of_the_interleaver():
    assert np.array_equal(units.address(6144, np.arange(6144)), morvik.interleaver(6144))


def test_refusals():
    with pytest.raises(morvik.Error, match="^alpha3 2048 is not allowed, expected -2048 to 2047"):
        units.forward(np.where(np.arange(8) == 3, 2048, 0), G)
    with pytest.raises(morvik.Error, match="^case 2: parity 128 is not allowed, expected -128 to 127"):
        units.branch(0, [0, 1, 128])
    with pytest.raises(morvik.Error, match="parity 2147483647 is not allowed"):
        units.branch(0, 2**40)
    with pytest.raises(morvik.Error, match="pending7 6 is not allowed, expected 0: only the algorithm with a table"):
        units.backward(BETA, G, [0] * 7 + [6])
    with pytest.raises(morvik.Error, match="block_size 41 is no block size"):
        units.address(41, 0)
    with pytest.raises(morvik.Error, match="algorithm 3 is not allowed, expected 0 to 2"):
        units.extrinsic(0, 0, algorithm=3)
    with pytest.raises(ValueError, match=r"alpha must have 8 values in its last axis, not the shape \(4,\)"):
        units.forward(G, G)
    with pytest.raises(TypeError, match="apriori must hold integers, not float64"):
        units.intrinsic(0.5, 0)
    with pytest.raises(TypeError, match="parity must hold integers, not bool"):
        units.branch(0, True)
