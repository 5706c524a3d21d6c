"""The LTE chain: against coded bits of another program, and by its properties."""

import csv

import morvik
import numpy as np
import pytest
from morvik import _core, lte

MODULATIONS = {1: "bpsk", 2: "qpsk", 4: "16qam", 6: "64qam", 8: "256qam"}


def bits_of_hexadecimal(text, count):
    padded = text.ljust((count + 3) // 4, "0")
    return np.unpackbits(np.frombuffer(bytes.fromhex(padded + "0" * (len(padded) % 2)), np.uint8))[:count]


@pytest.fixture(scope="session")
def vectors(repository):
    """The rows of the vectors: A, G, Qm, rv, C, K+ blocks, K+, K- blocks, K-, F, transport block, coded bits."""
    with open(repository / "tests/data/link/transport_blocks.csv", newline="") as file:
        rows = [row for row in csv.reader(file) if not row[0].startswith("#")]
    return [([int(field) for field in row[:10]], row[10], row[11]) for row in rows if row[0].isdigit()]


def test_coded_bits_are_those_of_another_program(vectors):
    assert len(vectors) > 10
    for (size, coded_bits, symbol, version, count, plus, k_plus, minus, k_minus, fillers), sent, coded in vectors:
        chain = lte.Transport(size, coded_bits, MODULATIONS[symbol])
        blocks = chain.code_blocks
        assert (blocks.number, blocks.count_plus, blocks.size_plus, blocks.count_minus) == (count, plus, k_plus, minus)
        assert (blocks.size_minus, blocks.fillers) == (k_minus, fillers)
        bits = bits_of_hexadecimal(sent, size)
        assert np.array_equal(chain.encode(bits, version), bits_of_hexadecimal(coded, coded_bits))


def test_steps_make_the_coded_bits_of_a_code_block(vectors):
    for (size, coded_bits, symbol, version, count, *_, fillers), sent, coded in vectors:
        if count > 1:
            continue
        bits = bits_of_hexadecimal(sent, size)
        block = np.concatenate([np.zeros(fillers, np.uint8), bits, lte.crc24a(bits)])
        matched = lte.rate_match(morvik.encode(block), coded_bits, version, fillers=fillers)
        assert np.array_equal(matched, bits_of_hexadecimal(coded, coded_bits))


@pytest.mark.parametrize("modulation", MODULATIONS.values())
@pytest.mark.parametrize(("size", "rate"), [(40, 0.3), (1001, 0.5), (9000, 0.6)])
def test_what_is_sent_is_received(size, rate, modulation):
    symbol = lte.bits_per_symbol(modulation)
    chain = lte.Transport(size, int(size / rate) // symbol * symbol, modulation)
    rng = np.random.default_rng(size)
    bits = rng.integers(0, 2, (3, size))
    llrs = lte.demap(lte.map(chain.encode(bits), modulation), modulation, 0.01)
    assert llrs.shape == (3, chain.coded_bits) and llrs.dtype == np.float32
    received = chain.decode(morvik.Decoder(), chain.recover(llrs))
    assert np.array_equal(received.bits, bits) and received.fits.all() and received.code_blocks_fit.all()
    assert received.code_blocks_fit.shape == (3, chain.code_blocks.number)
    one = chain.decode(morvik.Decoder(), chain.recover(llrs[1]))
    assert np.array_equal(one.bits, bits[1]) and one.fits.shape == () and one.fits


def test_a_retransmission_helps():
    chain = lte.Transport(6000, 7200, "64qam")
    rng = np.random.default_rng(1)
    bits = rng.integers(0, 2, (20, 6000))
    decoder = morvik.Decoder()

    def received(version):
        symbols = lte.map(chain.encode(bits, version), "64qam")
        noise = rng.normal(0, 0.2, (2, *symbols.shape))
        return lte.demap(symbols + noise[0] + 1j * noise[1], "64qam", 0.08)

    first, second = received(0), received(2)
    once = chain.recover(first)
    assert not chain.decode(decoder, once).fits.any()
    both = chain.recover(second, 2, once)
    assert chain.decode(decoder, both).fits.all()
    assert np.array_equal(once, chain.recover(first))  # not changed
    narrow = chain.recover(lte.soft_values(first, 4, width=6), width=6)
    narrow = chain.recover(lte.soft_values(second, 4, width=6), 2, narrow, width=6)
    assert narrow.dtype == np.int16 and narrow.min() >= -32 and narrow.max() <= 31
    assert chain.decode(decoder, narrow).fits.all()


def weighted(values):
    return int(values.reshape(-1).astype(int) @ np.arange(1, values.size + 1))


def test_soft_buffers_of_six_bits_hold_the_same_numbers_as_in_c_and_octave():
    chain = lte.Transport(7000, 9000, "16qam", soft_buffer_size=16000)
    buffers = None
    for t, version in enumerate((0, 2, 0)):
        llrs = ((7919 * np.arange(9000) + 31 * t) % 1021 - 510) / 16
        buffers = chain.recover(lte.soft_values(llrs, 1, width=6), version, buffers, width=6)
    assert (buffers.size, buffers.min(), buffers.max(), weighted(buffers)) == (15817, -32, 31, -14906593)
    streams = [[weighted(stream) for stream in block] for block in chain.soft_values(buffers)]
    assert streams == [[-1142900, -603343, -15771], [-3348177, 776852, -132104]]
    assert chain.code_block(1) == (3584, 0, 3560, 3464, 4500, 4500, 7936, 7881)


def test_noise_of_a_seed_is_that_of_octave():
    bits = (np.arange(4800) % 3 == 0).astype(np.uint8).reshape(2, 2400)
    llrs = _core.transmit_symbols(bits, 4, "rayleigh", "max-log", 8000, 36212)
    assert weighted(lte.soft_values(llrs, 4)) == -87950402


@pytest.mark.parametrize(("block_size", "fillers", "buffer_size"), [(40, 0, None), (1024, 17, 2000), (6144, 0, None)])
@pytest.mark.parametrize("version", range(4))
def test_recovered_bits_are_those_of_the_streams(block_size, fillers, buffer_size, version):
    rng = np.random.default_rng(version)
    bits = rng.integers(0, 2, (2, block_size))
    bits[:, :fillers] = 0
    streams = morvik.encode(bits)
    keys = {"fillers": fillers, "buffer_size": buffer_size}
    sent = lte.rate_match(streams, 5 * block_size, version, **keys)
    buffers = lte.rate_recover(2.0 * sent - 1, block_size, version, **keys)
    found = lte.deinterleave(buffers, block_size, filler=-9.0, **keys)
    places = 0
    for stream, coded in zip(found, streams):
        assert np.all((stream == 0) | ((stream > 0) == coded))
        places += np.count_nonzero(stream[0])
    assert places == buffers.shape[1] + 2 * fillers
    soft = lte.deinterleave(lte.soft_values(buffers, 8), block_size, **keys)
    assert soft.sys.dtype == np.int8 and np.all(soft.sys[:, :fillers] == -128)


def test_crcs():
    assert "".join(map(str, lte.crc24a([1] + [0] * 23))) == f"{crc_of_a_one(23, 0x864CFB):024b}"
    assert "".join(map(str, lte.crc24b([1] + [0] * 23))) == f"{crc_of_a_one(23, 0x800063):024b}"
    bits = np.random.default_rng(3).integers(0, 2, (4, 77))
    for crc in (lte.crc24a, lte.crc24b):
        assert not crc(np.concatenate([bits, crc(bits)], axis=1)).any()
        assert np.array_equal(crc(bits)[2], crc(bits[2]))


def crc_of_a_one(zeros, generator):
    """The remainder of D^(zeros + 24)."""
    remainder = 1
    for _ in range(zeros + 24):
        remainder <<= 1
        remainder ^= (0x1000000 | generator) if remainder >> 24 else 0
    return remainder


@pytest.mark.parametrize("modulation", MODULATIONS.values())
def test_symbols_have_mean_energy_one(modulation):
    bits = np.random.default_rng(4).integers(0, 2, (3, 4800))
    symbols = lte.map(bits, modulation)
    assert symbols.shape == (3, 4800 // lte.bits_per_symbol(modulation))
    assert symbols.dtype == (np.float32 if modulation == "bpsk" else np.complex64)
    assert np.mean(np.abs(symbols) ** 2) == pytest.approx(1, abs=0.05)


@pytest.mark.parametrize("demapper", ["max-log", "exact"])
@pytest.mark.parametrize("modulation", list(MODULATIONS.values())[1:])
def test_ratios_are_those_of_all_points(modulation, demapper):
    count = lte.bits_per_symbol(modulation)
    labels = np.unpackbits(np.arange(2**count, dtype=np.uint8)[:, None], axis=1)[:, 8 - count :]
    points = lte.map(labels, modulation)[:, 0]
    rng = np.random.default_rng(count)
    symbols = (rng.normal(0, 0.8, (50, 2)) @ [1, 1j]).astype(np.complex64)
    gains = rng.uniform(0, 2, 50).astype(np.float32)
    metrics = -(np.abs(symbols[:, None] - gains[:, None] * points) ** 2) / 0.3
    llrs = lte.demap(symbols, modulation, 0.3, gains=gains, demapper=demapper).reshape(50, count)
    reduce = np.maximum.reduce if demapper == "max-log" else np.logaddexp.reduce
    for bit in range(count):
        ones = labels[:, bit] == 1
        expected = reduce(metrics[:, ones], axis=1) - reduce(metrics[:, ~ones], axis=1)
        assert llrs[:, bit] == pytest.approx(expected, rel=1e-3, abs=1e-4)


@pytest.mark.parametrize("modulation", MODULATIONS.values())
def test_noise_of_the_chain_is_that_of_the_channel(modulation):
    bits = np.random.default_rng(5).integers(0, 2, (4, 24000))
    llrs = lte.transmit(bits, modulation, 3.0, rng=6)
    assert llrs.shape == bits.shape and llrs.dtype == np.float32
    symbols = lte.map(bits, modulation)
    deviation = np.sqrt(10**-0.3 / 2)
    rng = np.random.default_rng(7)
    noise = rng.normal(0, deviation, symbols.shape)
    noise = noise if modulation == "bpsk" else noise + 1j * rng.normal(0, deviation, symbols.shape)
    plain = lte.demap(symbols + noise, modulation, 10**-0.3)
    sign = 2 * bits - 1
    for power in (1, 2):
        assert np.mean((llrs * sign) ** power) == pytest.approx(np.mean((plain * sign) ** power), rel=0.03)
    assert np.array_equal(lte.transmit(bits, modulation, 3.0, rng=6), llrs)
    assert not np.array_equal(llrs[0] * sign[0], llrs[1] * sign[1])


def test_fading_of_a_transmission_is_one():
    bits = np.zeros((200, 600), np.uint8)
    strengths = -lte.transmit(bits, "qpsk", 20.0, channel="block-rayleigh", rng=1).mean(axis=1)
    assert strengths.min() < 0.1 * strengths.mean() and strengths.max() > 3 * strengths.mean()
    every = -lte.transmit(bits, "qpsk", 20.0, channel="rayleigh", rng=1).mean(axis=1)
    assert every.mean() == pytest.approx(strengths.mean(), rel=0.3) and every.std() < 0.1 * every.mean()


def test_soft_values_are_rounded_and_clipped():
    llrs = [[0.0, 0.0625, -0.0625, 0.06], [15.9, 16.0, -16.0, -99.0]]
    assert lte.soft_values(llrs, 8).tolist() == [[0, 1, -1, 0], [127, 127, -128, -128]]
    wide = lte.soft_values(llrs, 2, width=6)
    assert wide.dtype == np.int16 and wide.tolist() == [[0, 0, 0, 0], [31, 31, -32, -32]]


def test_the_scale_is_that_of_error_rates():
    chain = lte.Transport(2024, 3056, "256qam")
    for algorithm in ("scaled", "table"):
        (rate,) = morvik.error_rate(
            transport_block_size=2024, coded_bits=3056, modulation="256qam", esn0_db=19, algorithm=algorithm, max_blocks=1
        )
        scale = lte.scale_of("256qam", 2024 / 3056, algorithm=algorithm)
        assert scale == pytest.approx(rate.scale, abs=0.001)
        llrs = np.random.default_rng(1).normal(0, 20, 3056)
        buffers = chain.recover(llrs)
        assert np.array_equal(
            chain.soft_values(buffers, algorithm=algorithm)[0].par2, chain.soft_values(buffers, scale)[0].par2
        )


CHAIN = lte.Transport(1000, 2400)
BITS = np.zeros(1000, np.uint8)
LLRS = np.ones(2400)


@pytest.mark.parametrize(
    ("call", "kind", "text"),
    [
        (lambda: lte.Transport(0, 100), ValueError, "transport_block_size must be in the range 1 to 16777216, not 0"),
        (lambda: lte.Transport(1000, 2401), ValueError, "multiple of the 2 bits of a symbol.* 2400 would fit"),
        (lambda: lte.Transport(20000, 4), ValueError, "at least 8 for 4 code blocks, not 4; 8 would fit"),
        (lambda: lte.Transport(100, 1), ValueError, "at least 2 for 1 code block, not 1; 2 would fit"),
        (lambda: lte.Transport(1000, 2400, "8psk"), ValueError, "modulation must be one of bpsk, qpsk, 16qam"),
        (lambda: lte.Transport(6000, 9000, soft_buffer_size=1), morvik.Error, "soft buffer.*soft_buffer_size=1"),
        (lambda: lte.Transport(1000, 2400, layers=5), ValueError, "layers must be in the range 1 to 4"),
        (lambda: CHAIN.encode(BITS[1:]), ValueError, "bits must have 1000 values for each block, not 999"),
        (lambda: CHAIN.encode(BITS, 4), ValueError, "version must be in the range 0 to 3, not 4"),
        (lambda: CHAIN.recover(LLRS[1:]), ValueError, "llrs must have 2400 values for each block, not 2399"),
        (lambda: CHAIN.recover([[1.0, np.nan]]), ValueError, r"llrs must be finite, but \[0, 1\] is nan"),
        (lambda: CHAIN.recover(LLRS, buffers=BITS), ValueError, "buffers must be float32 of shape"),
        (lambda: CHAIN.recover(LLRS, width=6), TypeError, "llrs must hold integers, as int8 or int16"),
        (lambda: CHAIN.recover(LLRS.astype(int)[None, None]), ValueError, "one or two dimensions, not 3"),
        (lambda: CHAIN.soft_values(LLRS), ValueError, "buffers must have 3084 values for each block, not 2400"),
        (lambda: CHAIN.soft_values(np.zeros(3084), 0), ValueError, "scale must be a positive number"),
        (lambda: CHAIN.soft_values(np.zeros(3084, np.int16), 8), ValueError, "scale must be None for buffers of integers"),
        (lambda: CHAIN.join([BITS, BITS]), ValueError, "decisions must have 1 code block, not 2"),
        (lambda: CHAIN.code_block(1), ValueError, "r must be in the range 0 to 0, not 1"),
        (lambda: lte.segment(2**24 + 1), ValueError, "transport_block_size must be in the range"),
        (lambda: lte.rate_match(np.zeros((3, 40), int), 9), morvik.Error, "the tail seem to be missing"),
        (lambda: lte.rate_recover(LLRS, 41), morvik.Error, "Block size not supported: K = 41"),
        (lambda: lte.rate_recover(LLRS, 40, fillers=40), ValueError, "fillers must be in the range 0 to 39"),
        (lambda: lte.rate_recover(LLRS, 40, buffer_size=1), morvik.Error, "soft buffer.*buffer_size=1"),
        (lambda: lte.deinterleave(LLRS, 40), ValueError, "buffers must have 132 values for each block, not 2400"),
        (lambda: lte.soft_values(1.0, 4), ValueError, "llrs must be an array, not a number"),
        (lambda: lte.soft_values([1j], 4), TypeError, "llrs must hold real numbers, not complex128"),
        (lambda: lte.soft_values([1, -1e300], 4), ValueError, r"llrs must be finite in float32, but \[1\] is -1e\+300"),
        (lambda: lte.deinterleave(np.zeros(132), 40, filler=1e300), ValueError, "filler must be a number that float32"),
        (lambda: lte.demap([[1, 1e300j]], "qpsk", 1), ValueError, r"symbols must be finite in float32, but \[0, 1\] is"),
        (lambda: lte.demap([1], "qpsk", 1, gains=[1e39]), ValueError, r"gains must be finite in float32, but \[0\] is"),
        (lambda: lte.demap(1j, "qpsk", 1), ValueError, "symbols must be an array, not a number"),
        (lambda: lte.demap([1], "qpsk", 1e39), ValueError, "noise_variance must be a positive number that float32 holds"),
        (lambda: lte.demap([1], "qpsk", 1e-50), ValueError, "noise_variance must be a positive number that float32 holds"),
        (lambda: CHAIN.encode([]), ValueError, "bits must have .* values for each block, not 0"),
        (lambda: CHAIN.recover([], width=6), ValueError, "llrs must have .* values for each block, not 0"),
        (lambda: lte.soft_values([1.0], 4, width=17), ValueError, "width must be in the range 2 to 16"),
        (lambda: lte.scale_of("qpsk", 0), ValueError, "code_rate must be a positive number"),
        (lambda: lte.map([0, 1, 1]), ValueError, "bits must be a multiple of the 2 of a qpsk symbol, not 3"),
        (lambda: lte.transmit([0, 1, 1], "qpsk", 3), ValueError, "bits must be a multiple of the 2 of a qpsk symbol"),
        (lambda: lte.transmit([0, 1], "qpsk", 99), ValueError, "esn0_db must be in the range -50 to 50"),
        (lambda: lte.transmit([0, 1], "qpsk", 9, channel="fog"), ValueError, "channel must be one of awgn, rayleigh"),
        (lambda: lte.demap([1j], "bpsk", 1), TypeError, "symbols must be an array of real numbers"),
        (lambda: lte.demap([1j], "qpsk", 0), ValueError, "noise_variance must be a positive number"),
        (lambda: lte.demap([np.inf], "qpsk", 1), ValueError, r"symbols must be finite, but \[0\] is"),
        (lambda: lte.demap([1j], "qpsk", 1, gains=[-1.0]), ValueError, "gains must be at least 0"),
        (lambda: lte.demap([1j], "qpsk", 1, gains=[1, 1]), ValueError, "gains must have the shape of symbols"),
        (lambda: lte.demap([1j], "qpsk", 1, demapper="best"), ValueError, "demapper must be one of max-log, exact"),
    ],
)
def test_refuses(call, kind, text):
    with pytest.raises(kind, match=text):
        call()


def test_nothing_is_an_empty_array():
    assert lte.map([], "16qam").shape == (0,) and lte.demap([], "16qam", 1).shape == (0,)
    assert lte.soft_values([], 4).shape == (0,) and lte.transmit([], "qpsk", 3).shape == (0,)
    assert lte.crc24a([]).tolist() == [0] * 24
    assert lte.crc24a(np.zeros((0, 40), int)).shape == (0, 24)


@pytest.mark.parametrize("modulation", MODULATIONS.values())
@pytest.mark.parametrize("demapper", ["max-log", "exact"])
def test_llrs_are_finite_for_any_noise(modulation, demapper):
    symbols = np.array([0, 0.3, -1e19, 3e38], np.float32)
    for variance in (1e-45, 1e-38, 1):
        assert np.isfinite(lte.demap(symbols, modulation, variance, demapper=demapper)).all()
        assert np.isfinite(lte.demap(symbols, modulation, variance, demapper=demapper, gains=[0, 1, 1e19, 3e38])).all()
