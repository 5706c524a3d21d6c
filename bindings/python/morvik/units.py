"""The units of the core as functions on NumPy arrays, so that a unit of the hardware is tested before there is a whole core.

>>> from morvik import units
>>> twice = units.intrinsic(apriori=10, systematic=[-24, 0, 24])  # three cases at once
>>> units.branch(twice, parity=16).tolist()
[[-3, -35, -35, -3], [21, -11, -11, 21], [45, 13, 13, 45]]

All values are integers in eighths, as the core's registers hold them. Arguments are integers or arrays of them, which are
broadcast; rows, such as the eight metrics of a column, are the last axis. Results are int16. A value that its register
cannot hold raises :class:`morvik.Error`; nothing is clipped or wrapped on the way in.
"""

from __future__ import annotations

from typing import NamedTuple

import numpy as np
import numpy.typing as npt

from morvik import _core
from morvik._arguments import DEFAULT_ALGORITHM, algorithm_number, plain_array

__all__ = ["Column", "address", "backward", "border", "branch", "extrinsic", "forward", "intrinsic", "ratio", "tail"]

_STATES = 8
_BRANCHES = 4
_TAIL_STEPS = 3
_WORD = 2**31 - 1
_Numbers = npt.NDArray[np.int16]


class Column(NamedTuple):
    """A column of a recursion: arrays of shape (..., 8)."""

    metrics: _Numbers
    pending: _Numbers
    """The corrections that are added one decision later: zeros, unless the algorithm is ``"table"``."""


def intrinsic(apriori: npt.ArrayLike, systematic: npt.ArrayLike) -> _Numbers:
    """Twice the intrinsic value, -192 to 190. The signal ``intrinsic`` of traces is its half, rounded down."""
    return _scalar("intrinsic", 0, _single("apriori", apriori), _single("systematic", systematic))


def branch(twice_intrinsic: npt.ArrayLike, parity: npt.ArrayLike) -> _Numbers:
    """The four branch metrics, clipped to -128 ... 127: shape (..., 4)."""
    return _computed("branch", 0, _single("twice_intrinsic", twice_intrinsic), _single("parity", parity))


def forward(
    alpha: npt.ArrayLike, g: npt.ArrayLike, pending: npt.ArrayLike | None = None, *, algorithm: str | int = DEFAULT_ALGORITHM
) -> Column:
    """A step of the forward recursion: the column behind it from the one before it and the branch metrics."""
    return _step("forward", _row("alpha", alpha, _STATES), g, pending, algorithm)


def backward(
    beta: npt.ArrayLike, g: npt.ArrayLike, pending: npt.ArrayLike | None = None, *, algorithm: str | int = DEFAULT_ALGORITHM
) -> Column:
    """A step of the backward recursion: the column before it from the one behind it and the branch metrics."""
    return _step("backward", _row("beta", beta, _STATES), g, pending, algorithm)


def ratio(
    alpha: npt.ArrayLike, beta: npt.ArrayLike, g: npt.ArrayLike, *, algorithm: str | int = DEFAULT_ALGORITHM
) -> _Numbers:
    """The log-likelihood ratio of a step, from the forward metrics before it and the backward metrics behind it."""
    rows = _row("alpha", alpha, _STATES), _row("beta", beta, _STATES), _row("g", g, _BRANCHES)
    return _scalar("ratio", algorithm_number(algorithm), *rows)


def extrinsic(
    ratio: npt.ArrayLike, twice_intrinsic: npt.ArrayLike, *, algorithm: str | int = DEFAULT_ALGORITHM
) -> _Numbers:
    """The extrinsic value, clipped to -128 ... 127."""
    inputs = _single("ratio", ratio), _single("twice_intrinsic", twice_intrinsic)
    return _scalar("extrinsic", algorithm_number(algorithm), *inputs)


def address(block_size: npt.ArrayLike, step: npt.ArrayLike) -> _Numbers:
    """The interleaver's address of a step of the interleaved code. :func:`morvik.interleaver` has all of a block size."""
    return _scalar("address", 0, _single("block_size", block_size), _single("step", step))


def tail(systematic: npt.ArrayLike, parity: npt.ArrayLike) -> _Numbers:
    """The backward metrics before the tail, shape (..., 8), from the three values of each stream, shape (..., 3)."""
    return _computed("tail", 0, _row("systematic", systematic, _TAIL_STEPS), _row("parity", parity, _TAIL_STEPS))


def border(column: npt.ArrayLike) -> _Numbers:
    """A column as a border between segments or windows keeps it."""
    return _computed("border", 0, _row("column", column, _STATES))


def _step(
    unit: str, column: npt.NDArray[np.int32], g: npt.ArrayLike, pending: npt.ArrayLike | None, algorithm: str | int
) -> Column:
    carried = _row("pending", np.zeros(_STATES, np.int8) if pending is None else pending, _STATES)
    reached = _computed(unit, algorithm_number(algorithm), column, carried, _row("g", g, _BRANCHES))
    return Column(reached[..., :_STATES], reached[..., _STATES:])


def _integers(name: str, values: npt.ArrayLike) -> npt.NDArray[np.int32]:
    """The values as words; one beyond them becomes the nearest, which is refused as well."""
    array = plain_array(name, values)
    if array.dtype.kind not in "iu":
        raise TypeError(f"{name} must hold integers, not {array.dtype}")
    return np.clip(array, -_WORD, _WORD).astype(np.int32)


def _single(name: str, values: npt.ArrayLike) -> npt.NDArray[np.int32]:
    return _integers(name, values)[..., np.newaxis]


def _row(name: str, values: npt.ArrayLike, count: int) -> npt.NDArray[np.int32]:
    array = _integers(name, values)
    if array.ndim == 0 or array.shape[-1] != count:
        raise ValueError(f"{name} must have {count} values in its last axis, not the shape {array.shape}")
    return array


def _computed(unit: str, algorithm: int, *inputs: npt.NDArray[np.int32]) -> _Numbers:
    shape = np.broadcast_shapes(*(each.shape[:-1] for each in inputs))
    rows = np.concatenate([np.broadcast_to(each, (*shape, each.shape[-1])) for each in inputs], axis=-1)
    results = _core.unit(unit, algorithm, np.ascontiguousarray(rows.reshape(-1, rows.shape[-1])))
    return results.reshape(*shape, results.shape[-1])


def _scalar(unit: str, algorithm: int, *inputs: npt.NDArray[np.int32]) -> _Numbers:
    results: _Numbers = _computed(unit, algorithm, *inputs)[..., 0]
    return results
