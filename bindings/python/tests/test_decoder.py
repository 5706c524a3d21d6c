"""Inputs, results and refusals of a decoder."""

import copy
import inspect
import pickle
import warnings

import morvik
import numpy as np
import pytest
from morvik import _core

LARGE = 2**70


def same(left: morvik.Decoded, right: morvik.Decoded) -> bool:
    return all(np.array_equal(a, b) for a, b in zip(left, right))


# ---- Arrays


@pytest.mark.parametrize("dtype", ["i1", "i2", "i4", "i8", ">i2", ">i4", ">i8"])
def test_takes_signed_integers(decoder, soft, dtype):
    expected = decoder.decode(*soft, llrs=True)
    assert same(decoder.decode(*(stream.astype(dtype) for stream in soft), llrs=True), expected)


def test_takes_streams_of_different_types(decoder, soft):
    mixed = (soft.sys, soft.par1.astype(">i2"), soft.par2.astype(np.int64))
    assert same(decoder.decode(*mixed, llrs=True), decoder.decode(*soft, llrs=True))


def test_takes_lists(decoder, soft):
    expected = decoder.decode(*soft).bits
    assert np.array_equal(decoder.decode(*(stream.tolist() for stream in soft)).bits, expected)


def unaligned(array):
    memory = np.zeros(array.nbytes + 1, np.uint8)
    view = memory[1:].view(array.dtype).reshape(array.shape)
    view[...] = array
    assert not view.flags.aligned
    return view


@pytest.mark.parametrize(
    "layout",
    [
        lambda array: np.asfortranarray(array),
        lambda array: np.repeat(array, 3, axis=0)[::3],
        lambda array: np.repeat(array, 2, axis=1)[:, ::2],
        lambda array: np.ascontiguousarray(array[::-1, ::-1])[::-1, ::-1],
        lambda array: unaligned(array.astype(np.int32)),
    ],
    ids=["fortran", "rows", "columns", "backwards", "unaligned"],
)
def test_takes_every_layout(decoder, soft, layout):
    assert same(decoder.decode(*map(layout, soft), llrs=True), decoder.decode(*soft, llrs=True))


def test_leaves_its_input_alone(decoder, soft):
    before = [stream.copy() for stream in soft]
    for stream in soft:
        stream.setflags(write=False)
    decoder.decode(*soft)
    assert all(np.array_equal(a, b) for a, b in zip(soft, before))


@pytest.mark.parametrize("dtype", [np.int8, np.int16, np.int32])
def test_does_not_copy_plain_arrays(decoder, soft, dtype, monkeypatch):
    given = [stream.astype(dtype) for stream in soft]
    seen = []

    class Spy:
        def decode(self, sys, par1, par2, *rest):
            seen.extend([sys, par1, par2])
            return (0, "", [], None, None, None)

    monkeypatch.setattr(decoder, "_core", Spy())
    decoder.decode(*given)
    assert all(np.shares_memory(a, b) for a, b in zip(seen, given))


# ---- Results


def test_one_block_is_a_batch_without_its_dimension(decoder, soft):
    batch = decoder.decode(*soft, tag=np.arange(100), llrs=True)
    for n in (0, 57, 99):
        one = decoder.decode(*(stream[n] for stream in soft), tag=n, llrs=True)
        assert same(one, morvik.Decoded(*(values[n] for values in batch)))
        assert type(one.tag) is int
    assert batch.bits.shape == batch.llrs.shape == (100, 40)
    assert (batch.bits.dtype, batch.tag.dtype, batch.llrs.dtype) == (np.uint8, np.uint32, np.int16)


def test_ratios_are_those_of_the_components(soft):
    lanes = morvik.Decoder(8, "table").decode(*soft, llrs=True)
    components = morvik.Decoder(8, "table", instruction_set="component").decode(*soft, llrs=True)
    assert same(lanes, components)
    assert np.array_equal(lanes.llrs >= 0, lanes.bits == 1)
    assert np.any(lanes.llrs != 0) and not np.any(lanes.llrs % 16)


def test_ratios_come_on_request(decoder, soft):
    assert decoder.decode(*soft).llrs is None


def test_iterations_matter(decoder, soft):
    assert np.any(decoder.decode(*soft, 1).bits != decoder.decode(*soft, 8).bits)


def test_a_batch_may_be_empty(decoder):
    empty = np.zeros((0, 44), np.int8)
    decoded = decoder.decode(empty, empty, empty, llrs=True)
    assert decoded.bits.shape == decoded.llrs.shape == (0, 40)
    assert decoded.tag.shape == (0,)


def test_tags(soft):
    decoder = morvik.Decoder(tag_width=4)
    assert np.array_equal(decoder.decode(*soft, tag=5).tag, np.full(100, 5))
    assert np.array_equal(decoder.decode(*soft, tag=[i % 16 for i in range(100)]).tag, np.arange(100) % 16)
    with pytest.warns(morvik.DecoderWarning, match="truncated to 4 bits"):
        assert np.array_equal(decoder.decode(*soft, tag=np.arange(100)).tag, np.arange(100) % 16)


# ---- Warnings


def loud(soft, *positions):
    """16-bit streams with one value beyond the range at each of the positions."""
    streams = [stream.astype(np.int16) for stream in soft]
    for stream, *place, value in positions:
        streams[stream][tuple(place)] = value
    return streams


def test_each_kind_of_warning_comes_once(soft):
    decoder = morvik.Decoder(tag_width=2)
    streams = loud(soft, (1, 60, 7, 300), (0, 20, 9, -129))
    with pytest.warns(morvik.DecoderWarning) as caught:
        decoder.decode(*streams, tag=7)
    assert [str(warning.message) for warning in caught] == [
        "Input block tag has been truncated to 2 bits, further truncation will not be reported",
        "RSC1 systematic value in position 9 saturated negatively, further saturation will not be reported",
    ]
    assert {warning.filename for warning in caught} == {__file__}
    decoder.decode(*streams, tag=7)  # warnings are errors here


def test_threads_warn_as_one_does(monkeypatch):
    blocks = 2000  # for each thread, there is enough to do
    rng = np.random.default_rng(2)
    quiet = morvik.awgn(morvik.encode(rng.integers(0, 2, (blocks, 40))), 1.0, rng=rng)
    streams = loud(quiet, (2, 1990, 3, 1000), (1, 700, 5, 1000), (0, 1200, 4, 1000))
    texts = []
    for threads in (1, 4):
        with pytest.warns(morvik.DecoderWarning) as caught:
            morvik.Decoder(2, threads=threads).decode(*streams, iterations=15)
        texts.append([str(warning.message) for warning in caught])
    assert texts[0] == texts[1]
    assert len(texts[0]) == 1 and "RSC1 parity value in position 5" in texts[0][0]


def test_a_warning_may_be_an_error(decoder, soft):
    with warnings.catch_warnings():
        warnings.simplefilter("error", morvik.DecoderWarning)
        with pytest.raises(morvik.DecoderWarning, match="saturated positively"):
            decoder.decode(*loud(soft, (0, 0, 0, 128)))


def test_values_beyond_24_bits_are_cut(decoder, soft):
    streams = [stream.astype(np.int32) + (1 << 24) for stream in soft]
    assert np.array_equal(decoder.decode(*streams).bits, decoder.decode(*soft).bits)


def test_nothing_is_printed(decoder, soft, capfd):
    with pytest.warns(morvik.DecoderWarning):
        decoder.decode(*loud(soft, (0, 0, 0, 128)))
    for refused in (lambda: decoder.decode(*soft, iterations=16), lambda: morvik.Decoder(num_pu=3)):
        with pytest.raises(morvik.Error):
            refused()
    assert capfd.readouterr() == ("", "")


# ---- Refusals


@pytest.mark.parametrize(
    ("generics", "kind", "text"),
    [
        ({"num_pu": 3}, morvik.Error, r"C_NUM_PU must be either 2, 4 or 8 \(num_pu=3, "),
        ({"num_pu": LARGE}, morvik.Error, rf"C_NUM_PU must be either 2, 4 or 8 \(num_pu={LARGE}, "),
        ({"num_pu": -2}, morvik.Error, "C_NUM_PU must be"),
        ({"num_pu": 2.0}, TypeError, "num_pu must be an integer, not 2.0"),
        ({"algorithm": 3}, morvik.Error, "C_ALGORITHM_TYPE must be in range 0 to 2"),
        ({"algorithm": -LARGE}, morvik.Error, "C_ALGORITHM_TYPE must be in range 0 to 2"),
        ({"algorithm": "fast"}, ValueError, "algorithm must be one of max-log, scaled, table"),
        ({"algorithm": None}, TypeError, "algorithm must be an integer, not None"),
        ({"tag_width": 33}, morvik.Error, "C_TAG_WIDTH must be in range 0 to 32"),
        ({"tag_width": -1}, morvik.Error, "C_TAG_WIDTH must be in range 0 to 32"),
        ({"threads": 0}, ValueError, "threads must be in the range 1 to 1024, not 0"),
        ({"threads": LARGE}, ValueError, "threads must be in the range 1 to 1024"),
        ({"instruction_set": "mmx"}, morvik.Error, "Instruction set 'mmx' is not one of .*generic, component$"),
        ({"instruction_set": 1}, TypeError, "instruction_set must be a name, not 1"),
    ],
)
def test_refuses_generics(generics, kind, text):
    with pytest.raises(kind, match=text):
        morvik.Decoder(**generics)


@pytest.mark.parametrize(
    ("arguments", "kind", "text"),
    [
        ({"iterations": 0}, morvik.Error, r"Number of iterations must be in the range 1 to 15 \(iterations=0\)"),
        ({"iterations": 16}, morvik.Error, "Number of iterations"),
        ({"iterations": -1}, morvik.Error, "Number of iterations"),
        ({"iterations": LARGE}, morvik.Error, "Number of iterations"),
        ({"iterations": 2.5}, TypeError, "iterations must be an integer, not 2.5"),
        ({"iterations": "8"}, TypeError, "iterations must be an integer, not '8'"),
        ({"tag": -1}, ValueError, "tag must be in the range 0 to 4294967295, not -1"),
        ({"tag": LARGE}, ValueError, "tag must be in the range 0 to 4294967295"),
        ({"tag": 0.5}, TypeError, "tag must be an integer, not 0.5"),
        ({"tag": np.full(100, 2**32)}, ValueError, "tag must be in the range"),
        ({"tag": np.full(100, -1)}, ValueError, "tag must be in the range"),
        ({"tag": np.full(100, 0.5)}, TypeError, "tag must hold integers, not float64"),
        ({"tag": [1, 2, 3]}, ValueError, r"tag must be an integer or have the shape \(100,\).*; its shape is \(3,\)"),
    ],
)
def test_refuses_numbers(decoder, soft, arguments, kind, text):
    with pytest.raises(kind, match=text):
        decoder.decode(*soft, **arguments)


def test_one_block_has_one_tag(decoder, soft):
    with pytest.raises(ValueError, match=r"tag must be an integer; its shape is \(1,\)"):
        decoder.decode(*(stream[0] for stream in soft), tag=[1])


@pytest.mark.parametrize(
    ("values", "kind", "text"),
    [
        (np.zeros((1, 44)), TypeError, "sys must hold signed integers .* not float64; multiply by the scale"),
        (np.zeros((1, 44), np.uint8), TypeError, "not uint8; a soft value is positive for bit 1"),
        (np.zeros((1, 44), bool), TypeError, "not bool; .* bits are no soft values"),
        (np.zeros((1, 44), complex), TypeError, "not complex128$"),
        ([[LARGE] * 44], TypeError, "not object; a value has more than 64 bits or is no number"),
        ([[2**31] * 44], ValueError, "sys must hold values of 32 bits, not 2147483648 ... 2147483648"),
        ([[-(2**31) - 1] * 44], ValueError, "sys must hold values of 32 bits"),
        ("soft values", TypeError, "sys must hold signed integers"),
        (None, TypeError, "sys must hold signed integers"),
        (np.int8(1), ValueError, r"sys must have the shape \(K \+ 4,\) or \(n, K \+ 4\), not \(\)"),
        (np.zeros((1, 1, 44), np.int8), ValueError, r"sys must have the shape .*, not \(1, 1, 44\)"),
        (np.zeros((1, 40), np.int8), morvik.Error, "40 is a block size itself, so the 4 positions of the tail seem"),
        (np.zeros((1, 45), np.int8), morvik.Error, "K = 41; the nearest block sizes are 40 and 48"),
        (np.zeros((1, 4), np.int8), morvik.Error, "K = 0; the nearest block size is 40"),
        (np.zeros((1, 0), np.int8), morvik.Error, "Block size not supported: sys has 0 positions"),
        (np.zeros((44, 1), np.int8), morvik.Error, "Block size not supported: sys has 1 positions"),
        (np.zeros((1, 10**7), np.int8), morvik.Error, "the nearest block size is 6144"),
        (np.broadcast_to(np.int8(0), (1, 2**33)), morvik.Error, "Block size not supported"),
        (np.broadcast_to(np.int8(0), (2**32, 44)), ValueError, "a batch must have at most 4294967295 blocks"),
    ],
)
def test_refuses_arrays(decoder, values, kind, text):
    with pytest.raises(kind, match=text):
        decoder.decode(values, values, values)


def test_refuses_streams_of_different_shapes(decoder, soft):
    for other in (soft.par2[:99], soft.par2[:, :40], soft.par2[0]):
        with pytest.raises(ValueError, match=r"must have the same shape: sys has \(100, 44\), par2 has"):
            decoder.decode(soft.sys, soft.par1, other)


def test_names_the_bad_stream(decoder, soft):
    with pytest.raises(TypeError, match="^par1 must hold"):
        decoder.decode(soft.sys, soft.par1.astype(float), soft.par2)


def test_error_is_a_value_error():
    assert issubclass(morvik.Error, ValueError)
    assert f"{morvik.Error.__module__}.{morvik.Error.__name__}" == "morvik.Error"


# ---- Life


def test_a_closed_decoder_decodes_no_more(soft):
    with morvik.Decoder() as decoder:
        assert not decoder.closed
        decoder.decode(*soft)
    assert decoder.closed
    for use in (lambda: decoder.decode(*soft), lambda: decoder.instruction_set):
        with pytest.raises(morvik.Error, match="the decoder is closed"):
            use()
    decoder.close()
    assert repr(decoder) == "<closed morvik.Decoder(num_pu=2, algorithm='scaled', tag_width=8)>"


def test_closes_when_the_context_ends_in_an_error():
    with pytest.raises(KeyError), morvik.Decoder() as decoder:
        raise KeyError
    assert decoder.closed


@pytest.mark.parametrize("duplicate", [copy.copy, copy.deepcopy, pickle.dumps])
def test_refuses_to_be_copied(decoder, duplicate):
    with pytest.raises(TypeError, match="a morvik.Decoder cannot be copied or pickled: make another one"):
        duplicate(decoder)


def test_tells_its_generics():
    decoder = morvik.Decoder(8, 2, 32, threads=3, instruction_set="generic")
    assert (decoder.num_pu, decoder.algorithm, decoder.tag_width, decoder.threads) == (8, "table", 32, 3)
    assert decoder.instruction_set == "generic"
    assert repr(decoder) == "morvik.Decoder(num_pu=8, algorithm='table', tag_width=32)"


def test_generics_do_not_change(decoder):
    with pytest.raises(AttributeError):
        decoder.num_pu = 4


def test_masked_arrays_are_refused(decoder, soft):
    masked = np.ma.array(soft.par1, mask=soft.par1 > 0)
    with pytest.raises(TypeError, match="par1 must not be a masked array"):
        decoder.decode(soft.sys, masked, soft.par2)
    with pytest.raises(TypeError, match="tag must not be a masked array"):
        decoder.decode(*soft, tag=np.ma.array(3))


@pytest.mark.parametrize("name", ["iterations", "tag"])
def test_truth_values_are_no_numbers(decoder, soft, name):
    with pytest.raises(TypeError, match=f"{name} must be an integer, not True"):
        decoder.decode(*soft, **{name: True})


@pytest.mark.parametrize("dtype", [float, complex, bool])
def test_soft_values_are_integers(decoder, soft, dtype):
    with pytest.raises(TypeError, match="sys must hold signed integers"):
        decoder.decode(soft.sys.astype(dtype), soft.par1, soft.par2)


def test_decoder_and_simulation_have_the_default_of_the_library():
    core = {
        "num_pu": _core.default_num_pu,
        "algorithm": ("max-log", "scaled", "table")[_core.default_algorithm],
        "tag_width": _core.default_tag_width,
        "iterations": 8,
    }
    assert {name: core[name] for name in ("num_pu", "algorithm", "tag_width")} == {
        "num_pu": 2,
        "algorithm": "scaled",
        "tag_width": 8,
    }
    for function in (morvik.Decoder, morvik.Decoder.decode, morvik.error_rate):
        parameters = inspect.signature(function).parameters
        given = {name: parameters[name].default for name in core if name in parameters}
        assert given == {name: core[name] for name in given}
        assert given
    rates = morvik.error_rate(40, 0, max_blocks=1)
    assert (rates.num_pu[0], rates.algorithm[0], rates.iterations[0]) == (2, "scaled", 8)
