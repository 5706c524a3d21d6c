"""Encoder, interleaver and channel."""

import csv
import hashlib

import morvik
import numpy as np
import pytest


def plain_rsc(bits):
    """The constituent encoder of TS 36.212, figure 5.1.3-2: parities, and the six tail bits x z x z x z."""
    first = second = third = 0
    parities, tail = [], []
    for step in range(len(bits) + 3):
        ends = step >= len(bits)
        bit = second ^ third if ends else int(bits[step])
        fed = bit ^ second ^ third
        parity = fed ^ first ^ third
        first, second, third = fed, first, second
        tail += [bit, parity] if ends else []
        parities += [] if ends else [parity]
    assert (first, second, third) == (0, 0, 0)
    return parities, tail


@pytest.mark.parametrize("size", [40, 64, 104, 6144])
def test_encodes_as_the_standard_says(size):
    bits = np.random.default_rng(size).integers(0, 2, (70, size))
    streams = morvik.encode(bits)
    for n in (0, 63, 64, 69):
        parity1, tail1 = plain_rsc(bits[n])
        parity2, tail2 = plain_rsc(bits[n][morvik.interleaver(size)])
        tail = np.reshape(tail1 + tail2, (4, 3)).T.tolist()
        assert streams.sys[n].tolist() == bits[n].tolist() + tail[0]
        assert streams.par1[n].tolist() == parity1 + tail[1]
        assert streams.par2[n].tolist() == parity2 + tail[2]


def test_what_is_encoded_is_decoded():
    for size in morvik.block_sizes:
        bits = np.random.default_rng(size).integers(0, 2, (3, size))
        soft = morvik.awgn(morvik.encode(bits), 10.0, rng=size)
        assert np.array_equal(morvik.Decoder(8).decode(*soft, 2).bits, bits)


@pytest.mark.parametrize("name", ["k40", "k512", "k6144"])
def test_decodes_the_example_blocks(repository, name):
    folder = repository / "tests/data/vectors"
    with open(folder / f"{name}.csv", newline="") as file:
        rows = [[int(field) for field in row] for row in list(csv.reader(file))[1:]]
    sent = [[int(bit) for bit in line] for line in (folder / f"{name}.bits").read_text().split()]
    values = np.array(rows)[:, 1:].reshape(len(sent), -1, 3)
    decoded = morvik.Decoder(4).decode(*np.moveaxis(values, 2, 0))
    assert np.array_equal(decoded.bits, sent)


def test_one_block_is_encoded_like_several():
    bits = np.random.default_rng(4).integers(0, 2, (5, 104))
    several = morvik.encode(bits)
    one = morvik.encode(bits[3])
    assert all(np.array_equal(a, b[3]) for a, b in zip(one, several))
    assert one.sys.shape == (108,) and one.sys.dtype == np.uint8
    for same in (bits[3].tolist(), bits[3].astype(bool), np.repeat(bits, 2, axis=1)[3, ::2]):
        assert all(np.array_equal(a, b) for a, b in zip(morvik.encode(same), one))
    assert morvik.encode(bits[:0]).par2.shape == (0, 108)


def test_block_sizes():
    assert len(morvik.block_sizes) == 188
    assert morvik.block_sizes[:3] == (40, 48, 56) and morvik.block_sizes[-1] == 6144


def test_interleaver():
    assert morvik.interleaver(40)[:5].tolist() == [0, 13, 6, 19, 12]  # 3 i + 10 i^2 modulo 40
    for size in morvik.block_sizes:
        assert np.array_equal(np.sort(morvik.interleaver(size)), np.arange(size))


@pytest.mark.parametrize("size", [0, -40, 41, 6145, 2**70])
def test_refuses_sizes(size):
    with pytest.raises(morvik.Error, match=f"Block size not supported: K = {size}; the nearest block size"):
        morvik.interleaver(size)
    with pytest.raises(TypeError, match="block_size must be an integer, not 40.0"):
        morvik.interleaver(40.0)


@pytest.mark.parametrize(
    ("bits", "kind", "text"),
    [
        (np.zeros(44, int), morvik.Error, "K = 44; the nearest block sizes are 40 and 48"),
        (np.full(40, 2), ValueError, "bits must hold bits, 0 or 1, not 2 ... 2"),
        (np.full(40, -1), ValueError, "bits must hold bits, 0 or 1"),
        (np.full(40, 256), ValueError, "bits must hold bits, 0 or 1"),
        (np.zeros(40), TypeError, "bits must hold bits, as integers or booleans, not float64"),
        (np.zeros((1, 1, 40), int), ValueError, "bits must have one or two dimensions, not 3"),
        (1, ValueError, "bits must have one or two dimensions, not 0"),
    ],
)
def test_refuses_to_encode(bits, kind, text):
    with pytest.raises(kind, match=text):
        morvik.encode(bits)


@pytest.mark.parametrize(("ebn0_db", "scale"), [(0.0, 8), (2.5, 20.5)])
def test_channel_has_the_noise_that_it_should(ebn0_db, scale):
    streams = morvik.encode(np.random.default_rng(5).integers(0, 2, (200, 1024)))
    soft = morvik.awgn(streams, ebn0_db, scale=scale, rng=6)
    sent = 2.0 * np.concatenate(streams) - 1
    received = np.concatenate(soft) / scale
    variance = (3 * 1024 + 12) / (2 * 1024) / 10 ** (ebn0_db / 10)
    rounding = 1 / 12 / scale**2
    noise = received - sent
    assert np.concatenate(soft).dtype == np.int8
    assert abs(noise.mean()) < 5 * np.sqrt(variance / noise.size)
    assert abs(noise.var() / (variance + rounding) - 1) < 5 * np.sqrt(2 / noise.size)


def test_channel_clips():
    streams = morvik.encode(np.random.default_rng(7).integers(0, 2, (20, 1024)))
    soft = np.concatenate(morvik.awgn(streams, 0, scale=100, rng=8))
    assert soft.min() == -128 and soft.max() == 127
    assert np.mean(soft == 127) > 0.2 and np.mean(soft == -128) > 0.2


def test_scale_suits_the_algorithm():
    streams = morvik.encode(np.zeros((200, 1024), int))
    means = {name: -np.mean(morvik.awgn(streams, 2.0, algorithm=name, rng=9).sys) for name in ("scaled", 0, "table")}
    variance = 3 * 1028 / 2 / 1024 / 10**0.2
    assert means["scaled"] == pytest.approx(8, abs=0.1) and means[0] == means["scaled"]
    assert means["table"] == pytest.approx(8 / variance, abs=0.1)


def test_noise_is_the_same_on_every_machine():
    received = np.concatenate(morvik.awgn(morvik.encode(np.zeros((3, 512), int)), 1.0, rng=1), axis=None)
    assert hashlib.sha256(received).hexdigest()[:16] == "d2e677b90c109298"


def test_seed_repeats_the_noise():
    streams = morvik.encode(np.zeros(40, int))
    first = morvik.awgn(streams, 0, rng=1)
    assert all(np.array_equal(a, b) for a, b in zip(first, morvik.awgn(streams, 0, rng=np.random.default_rng(1))))
    assert not np.array_equal(first.sys, morvik.awgn(streams, 0, rng=2).sys)
    assert not np.array_equal(first.sys, first.par1)


@pytest.mark.parametrize(
    ("arguments", "kind", "text"),
    [
        ({"ebn0_db": float("nan")}, ValueError, "ebn0_db must be a finite number"),
        ({"ebn0_db": 51}, ValueError, "ebn0_db must be in the range -50 to 50"),
        ({"ebn0_db": 0.0005}, ValueError, "ebn0_db must be .* in steps of 0.001, not 0.0005"),
        ({"ebn0_db": "loud"}, TypeError, "ebn0_db must be a number, not 'loud'"),
        ({"scale": 0}, ValueError, "scale must be in the range 0.001 to 1000"),
        ({"scale": -8}, ValueError, "scale must be"),
        ({"algorithm": 3}, ValueError, "algorithm must be in the range 0 to 2"),
        ({"streams": (np.zeros(44, int), np.zeros(44, int))}, ValueError, "streams must be three arrays of one shape"),
        ({"streams": np.full((3, 44), -1)}, ValueError, "sys must hold bits, 0 or 1"),
        ({"streams": np.zeros((3, 40), int)}, morvik.Error, "the 4 positions of the tail seem to be missing"),
    ],
)
def test_channel_refuses(arguments, kind, text):
    with pytest.raises(kind, match=text):
        morvik.awgn(**{"streams": morvik.encode(np.zeros(40, int)), "ebn0_db": 1.0, **arguments})


BITS = np.zeros(40, np.uint8)
CODED = tuple(np.zeros(44, np.uint8) for _ in range(3))


@pytest.mark.parametrize("value", ["1", b"1", True, np.True_, 1j, np.complex128(1), np.array("1"), np.ma.array(1.0), None])
@pytest.mark.parametrize("name", ["ebn0_db", "scale"])
def test_what_is_no_number_is_refused(name, value):
    if (name, value) == ("scale", None):
        return  # means the default
    with pytest.raises(TypeError, match=f"{name} must"):
        morvik.awgn(CODED, **{"ebn0_db": 1, name: value})


@pytest.mark.parametrize("value", [np.nan, np.inf])
def test_a_number_must_be_finite(value):
    with pytest.raises(ValueError, match="ebn0_db must be a finite number"):
        morvik.awgn(CODED, value)


def test_masked_arrays_are_refused():
    with pytest.raises(TypeError, match="bits must not be a masked array"):
        morvik.encode(np.ma.array(BITS, mask=BITS == 1))
    with pytest.raises(TypeError, match="bits must not be a masked array"):
        morvik.encode([np.ma.array(BITS), np.ma.array(BITS)])
    with pytest.raises(TypeError, match="streams must not be a masked array"):
        morvik.awgn(tuple(np.ma.array(stream) for stream in CODED), 1)
    with pytest.raises(TypeError, match="ebn0_db must not be a masked array"):
        morvik.error_rate(40, np.ma.array([1.0, 2.0], mask=[True, False]), max_blocks=1)


@pytest.mark.parametrize("bits", [[0.0] * 40, [0j] * 40, [np.nan] * 40, ["0"] * 40])
def test_bits_are_integers_or_booleans(bits):
    with pytest.raises(TypeError, match="bits must hold bits"):
        morvik.encode(bits)
