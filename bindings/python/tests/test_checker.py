"""The checker: values of the model, differences, and what is refused."""

import copy

import morvik
import numpy as np
import pytest


@pytest.fixture
def block(soft):
    return [stream[0] for stream in soft]


@pytest.fixture
def checker(block):
    made = morvik.Checker()
    made.start(*block, iterations=2)
    return made


def test_ratios_are_those_of_the_decoder(block, checker):
    decoded = morvik.Decoder().decode(*block, iterations=2, llrs=True)
    assert np.array_equal(16 * checker.ratios(), decoded.llrs)
    assert checker.ratios().dtype == np.int16


def test_values_of_every_pass(checker):
    for signal, steps in (("llr", 40), ("alpha3", 41), ("intrinsic", 43)):
        values = checker.values(signal)
        assert values.shape == (4, steps)
        assert [checker.value(signal, 2, step) for step in range(steps)] == values[2].tolist()
    assert checker.value("llr", 0, 40) is None


def test_agrees_with_the_model(checker):
    for half_iteration in range(4):
        rows = [checker.values(f"beta{state}")[half_iteration] for state in range(8)]
        for step, row in enumerate(np.transpose(rows)):
            assert checker.observe("beta", half_iteration, step, row)
    assert checker.seen("beta7") == (160, 160)
    assert checker.seen("llr") == (0, 160)
    assert checker.standing == "agrees"
    assert checker.report().startswith("block 0: compared 4 of 4 half-iterations, 1280 of 3724 values: all equal")


def test_the_first_difference_is_raised_once(checker):
    right = checker.value("llr", 1, 7)
    with pytest.raises(morvik.Difference) as caught:
        checker.observe("llr", 1, 7, right ^ 1)
    lines = str(caught.value).splitlines()
    assert lines[0] == f"llr of half-iteration 1, step 7: expected {right}, got {right ^ 1}"
    assert "  half-iteration  1, on the natural code" in lines
    assert not checker.observe("llr", 1, 8, checker.value("llr", 1, 8) ^ 1)
    assert checker.observe("llr", 1, 9, checker.value("llr", 1, 9))
    assert checker.standing == "differs"
    assert "2 differences" in checker.report()


def test_none_is_unknown(checker):
    assert checker.observe("llr", 0, 41, None)  # where the core computes nothing
    with pytest.raises(morvik.Difference, match=", got x\n"):
        checker.observe("g", 0, 0, [None, 0, 0, 0])


def test_blocks_and_checkers_are_independent(soft, checker):
    other = morvik.Checker(num_pu=8)
    other.start(*(stream[1] for stream in soft), iterations=1)
    with pytest.raises(morvik.Difference):
        checker.observe("llr", 0, 0, None)
    assert (checker.standing, other.standing) == ("differs", "incomplete")
    checker.start(*(stream[1] for stream in soft), iterations=1)
    assert checker.standing == "incomplete"
    assert np.array_equal(checker.values("alpha2"), other.values("alpha2"))
    assert checker.report() == "block 1: nothing has been observed"


def test_situations_are_those_of_all_blocks(block):
    checker = morvik.Checker(count_situations=True)
    checker.start(*block, iterations=2)

    def counts():
        rows = [line.split(",") for line in checker.situations().splitlines()[1:]]
        return {situation: int(count) for _, _, situation, count in rows}

    assert not any(counts().values())
    for time in (1, 2):
        for step, ratio in enumerate(checker.ratios()):
            assert checker.observe("llr", 3, step, ratio)
        assert counts()["blocks"] == time
        assert counts()["pass.later.natural"] == 40 * time
        assert f"situations: {sum(map(bool, counts().values())) - 1} of 130 met, in {time} block" in checker.report()
        checker.start(*block, iterations=2)


def test_situations_are_counted_only_when_asked_for(checker):
    assert checker.observe("llr", 3, 0, checker.ratios()[0])
    assert "situations" not in checker.report()
    with pytest.raises(morvik.Error, match="counted only if count_situations asks for it"):
        checker.situations()


def test_refusals(block, checker):
    with pytest.raises(morvik.Error, match="C_NUM_PU must be either 2, 4 or 8"):
        morvik.Checker(num_pu=3)
    with pytest.raises(ValueError, match="signal must be one of intrinsic, g0, .*, not 'gamma'"):
        checker.value("gamma", 0, 0)
    with pytest.raises(morvik.Error, match="Half-iteration 4 is not allowed, expected 0 to 3"):
        checker.value("llr", 4, 0)
    with pytest.raises(morvik.Error, match="llr 2048 is not allowed, expected -2048 to 2047: eighths"):
        checker.observe("llr", 0, 0, 2048)
    with pytest.raises(ValueError, match="alpha takes 8 values, not 3"):
        checker.observe("alpha", 0, 0, [1, 2, 3])
    with pytest.raises(TypeError, match="value must be an integer, not 1.5"):
        checker.observe("llr", 0, 0, 1.5)
    with pytest.raises(morvik.Error, match="16 iterations are not allowed, expected 1 to 15"):
        checker.start(*block, iterations=16)
    with pytest.raises(morvik.Error, match="There is no block: start comes before"):
        checker.ratios()
    with pytest.raises(morvik.Error, match="There is no block: start comes before"):
        checker.report()
    with pytest.raises(morvik.Error, match="Block size not supported"):
        checker.start(*(stream[:40] for stream in block))
    with pytest.raises(ValueError, match=r"must have the shape \(K \+ 4,\), not \(2, 44\)"):
        checker.start(*([stream, stream] for stream in block))
    with pytest.raises(TypeError):
        copy.copy(checker)


def test_warnings(block):
    block[0] = block[0].astype(np.int16)
    block[0][3] = 300
    with pytest.warns(morvik.DecoderWarning, match="position 3 saturated positively"):
        morvik.Checker().start(*block)
