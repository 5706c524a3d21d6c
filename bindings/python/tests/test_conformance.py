"""The decisions of the conformance file that the tests of all bindings read."""

from collections.abc import Iterator
from pathlib import Path
from typing import NamedTuple

import morvik
import numpy as np
import pytest



def is_available(instruction_set: str) -> bool:
    try:
        morvik.Decoder(threads=1, instruction_set=instruction_set).close()
    except morvik.Error:
        return False
    return True


INSTRUCTION_SETS = [None, *filter(is_available, morvik.instruction_sets)]


class Case(NamedTuple):
    num_pu: int
    algorithm: int
    iterations: int
    streams: tuple[np.ndarray, np.ndarray, np.ndarray]
    decisions: np.ndarray


def read(file: Path) -> Iterator[Case]:
    numbers = np.array(file.read_text().split(), np.int32)
    start = 1
    for _ in range(numbers[0]):
        size, num_pu, algorithm, iterations = numbers[start : start + 4].tolist()
        start += 4
        rows = numbers[start : start + 3 * (size + 4)].reshape(-1, 3)
        start += rows.size
        yield Case(num_pu, algorithm, iterations, tuple(rows.T), numbers[start : start + size])
        start += size
    assert start == len(numbers)


@pytest.fixture(scope="module")
def cases(repository: Path) -> list[Case]:
    return list(read(repository / "tests/conformance/blocks.txt"))


def test_file_has_every_configuration(cases: list[Case]) -> None:
    assert {(case.num_pu, case.algorithm) for case in cases} == {(n, a) for n in (2, 4, 8) for a in (0, 1, 2)}


@pytest.mark.parametrize("dtype", [np.int8, np.int16, np.int32])
@pytest.mark.parametrize("instruction_set", INSTRUCTION_SETS)
def test_decides_as_every_binding_does(cases: list[Case], instruction_set: str | None, dtype: type) -> None:
    for case in cases:
        with morvik.Decoder(case.num_pu, case.algorithm, instruction_set=instruction_set) as decoder:
            streams = (stream.astype(dtype) for stream in case.streams)
            bits = decoder.decode(*streams, case.iterations).bits
        np.testing.assert_array_equal(bits, case.decisions)
