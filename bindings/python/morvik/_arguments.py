"""Argument checks: every message names the argument, what was given and what is allowed."""

from __future__ import annotations

import math
import operator
import os
from collections.abc import Callable, Iterable
from typing import Any, TypeVar

import numpy as np
import numpy.typing as npt

from morvik import _core
from morvik._errors import Error

Value = TypeVar("Value")

ALGORITHMS = {"max-log": 0, "scaled": 1, "table": 2}
DEFAULT_NUM_PU = _core.default_num_pu
DEFAULT_ALGORITHM = list(ALGORITHMS)[_core.default_algorithm]
DEFAULT_TAG_WIDTH = _core.default_tag_width
DEFAULT_ITERATIONS = 8
TAIL = 4  # extra positions of a block after its K
_SIZES = frozenset(_core.block_sizes)


def integer(name: str, value: Any, low: int, high: int) -> int:
    """The value as an int within the bounds."""
    number = any_integer(name, value)
    if not low <= number <= high:
        raise ValueError(f"{name} must be in the range {low} to {high}, not {value!r}")
    return number


def any_integer(name: str, value: Any) -> int:
    """The value as an int; booleans are refused."""
    try:
        if isinstance(value, bool):
            raise TypeError
        return operator.index(value)
    except TypeError:
        raise TypeError(f"{name} must be an integer, not {value!r}") from None


def word(name: str, value: Any, low: int, high: int) -> int:
    """The value as an int that fits a word of the C interface. A value beyond it becomes the nearest end of the
    range, which the decoder refuses as well: it says what it allows."""
    return min(max(any_integer(name, value), low), high)


def algorithm_number(algorithm: str | int) -> int:
    """The number of an algorithm; the decoder checks whether it exists."""
    if not isinstance(algorithm, str):
        return word("algorithm", algorithm, -1, 3)
    if algorithm not in ALGORITHMS:
        raise ValueError(f"algorithm must be one of {', '.join(ALGORITHMS)}, or 0, 1, 2, not {algorithm!r}")
    return ALGORITHMS[algorithm]


def block_size(value: Any) -> int:
    """The value as one of the 188 block sizes."""
    size = any_integer("block_size", value)
    if size not in _SIZES:
        raise Error(f"Block size not supported: K = {size}{_nearest(size)}")
    return size


def expect_block(name: str, positions: int) -> None:
    """Refuses rows that are not a block of soft values."""
    if positions - TAIL in _SIZES:
        return
    size = positions - TAIL
    hint = _nearest(size)
    if positions in _SIZES:
        hint = f"; {positions} is a block size itself, so the {TAIL} positions of the tail seem to be missing"
    raise Error(
        f"Block size not supported: {name} has {positions} positions for each block, so that K + {TAIL} = {positions} "
        f"and K = {size}{hint}"
    )


def _nearest(size: int) -> str:
    below = [each for each in _core.block_sizes if each < size]
    above = [each for each in _core.block_sizes if each > size]
    nearest = [str(each) for each in below[-1:] + above[:1]]
    return f"; the nearest block {'sizes are' if len(nearest) == 2 else 'size is'} {' and '.join(nearest)}"


def thousandths(name: str, value: Any, low: float, high: float) -> int:
    """A decimal number within the bounds, with at most three decimals, times 1000."""
    number = real(name, value)
    rounded = round(number * 1000) if low <= number <= high else None
    if rounded is None or abs(number * 1000 - rounded) > 1e-6 * max(1.0, abs(rounded)):
        raise ValueError(f"{name} must be in the range {low:g} to {high:g}, in steps of 0.001, not {value!r}")
    return rounded


def real(name: str, value: Any) -> float:
    """The value as a finite float. Strings, booleans and complex numbers are refused, though Python converts them."""
    expect_unmasked(name, value)
    kind = getattr(getattr(value, "dtype", None), "kind", "f")
    try:
        if isinstance(value, (str, bytes, bytearray, bool)) or kind not in "iufO":
            raise TypeError
        number = float(value)
    except (TypeError, ValueError):
        raise TypeError(f"{name} must be a number, not {value!r}") from None
    if not math.isfinite(number):
        raise ValueError(f"{name} must be a finite number, not {value!r}")
    return number


def scale_thousandths(value: Any) -> int:
    """A scale, in thousandths."""
    return thousandths("scale", value, 0.001, 1000)


def ebn0_thousandths(value: Any) -> int:
    """An Eb/N0, in thousandths of a decibel."""
    return thousandths("ebn0_db", value, -50, 50)


def expect_unmasked(name: str, values: Any) -> None:
    """Refuses masked arrays, alone or in a list: masked elements would count like the others."""
    listed = values if isinstance(values, (list, tuple)) else ()
    if any(isinstance(value, np.ma.MaskedArray) for value in (values, *listed)):
        raise TypeError(f"{name} must not be a masked array, whose mask would be lost; take its .compressed() or .filled()")


def plain_array(name: str, values: npt.ArrayLike) -> npt.NDArray[Any]:
    """The values as an array. An empty list has no type: its array has the least that is a number."""
    expect_unmasked(name, values)
    array = np.asarray(values)
    return array.astype(np.int8) if array.size == 0 and isinstance(values, (list, tuple)) else array


def each(name: str, values: Any, check: Callable[[Any], Value]) -> list[Value]:
    """Checks a single value or each of several, and returns a list without duplicates."""
    expect_unmasked(name, values)
    if isinstance(values, Iterable) and not isinstance(values, (str, bytes)) and getattr(values, "ndim", 1) > 0:
        several = list(dict.fromkeys(check(value) for value in values))
        if not several:
            raise ValueError(f"{name} must not be empty")
        return several
    return [check(values)]


def thread_count(threads: int | None) -> int:
    """The requested number of threads, or the number of processors that this process may use."""
    return len(os.sched_getaffinity(0)) if threads is None else integer("threads", threads, 1, 1024)
