"""Argument checks of the LTE chain."""

from __future__ import annotations

import math
from typing import Any

import numpy as np
import numpy.typing as npt

from morvik import _core
from morvik._arguments import (
    block_size as checked_block_size,
    expect_unmasked,
    integer,
    plain_array,
    real,
)
from morvik._errors import Error

_MOST = 2**32 - 1


def checked_transport_block_size(value: Any) -> int:
    return integer("transport_block_size", value, 1, 2**24)


def checked_matching(block_size: Any, fillers: Any, buffer_size: Any) -> tuple[int, int, int]:
    size = checked_block_size(block_size)
    positions = 0 if buffer_size is None else integer("buffer_size", buffer_size, 1, _MOST)
    matching = (size, integer("fillers", fillers, 0, size - 1), positions)
    try:
        _core.soft_buffer_size(matching)
    except Error as error:
        raise Error(f"{error} (block_size={size}, fillers={fillers!r}, buffer_size={buffer_size!r})") from None
    return matching


def checked_version(value: Any) -> int:
    return integer("version", value, 0, 3)


def checked_width(value: Any) -> int:
    return integer("width", value, 2, 16)


def positive(name: str, value: Any) -> float:
    number = real(name, value)
    if number <= 0 or float32_of(number) in (0, np.inf):
        raise ValueError(f"{name} must be a positive number that float32 holds, not {value!r}")
    return number


def single(name: str, value: Any) -> float:
    """A number that float32 holds."""
    number = real(name, value)
    if np.isinf(float32_of(number)):
        raise ValueError(f"{name} must be a number that float32 holds, not {value!r}")
    return number


def float32_of(number: float) -> np.float32:
    with np.errstate(over="ignore", under="ignore"):
        return np.float32(number)


def finite(name: str, array: npt.NDArray[Any], dtype: Any) -> npt.NDArray[Any]:
    """The numbers as a type of single precision, in C order. What is not finite there is refused with its place."""
    with np.errstate(over="ignore", under="ignore"):
        numbers = np.ascontiguousarray(array, dtype)
    wrong = np.argwhere(~np.isfinite(numbers))
    if len(wrong) > 0:
        place = ", ".join(str(index) for index in wrong[0])
        number = array[tuple(wrong[0])]
        bound = " in float32" if np.isfinite(number) else ""
        raise ValueError(f"{name} must be finite{bound}, but [{place}] is {number}")
    return numbers


def checked_ratios(values: npt.ArrayLike, name: str = "llrs") -> npt.NDArray[np.float32]:
    """The values as float32 in C order, finite."""
    array = plain_array(name, values)
    if array.dtype.kind not in "fiu":
        raise TypeError(f"{name} must hold real numbers, not {array.dtype}")
    if array.ndim == 0:
        raise ValueError(f"{name} must be an array, not a number")
    return finite(name, array, np.float32)


def checked_integers(name: str, values: npt.ArrayLike) -> npt.NDArray[np.int16]:
    array = plain_array(name, values)
    if array.dtype not in (np.int8, np.int16):
        raise TypeError(f"{name} must hold integers, as int8 or int16, with a width, not {array.dtype}")
    if array.ndim == 0:
        raise ValueError(f"{name} must be an array, not a number")
    return np.ascontiguousarray(array, np.int16)


def checked_received(llrs: npt.ArrayLike, width: int | None) -> npt.NDArray[Any]:
    if width is None:
        return checked_ratios(llrs)
    return checked_integers("llrs", llrs)


def counted(count: int, noun: str) -> str:
    return f"{count} {noun}" if count == 1 else f"{count} {noun}s"


def rows_of(array: npt.NDArray[Any]) -> npt.NDArray[Any]:
    if array.ndim > 2:
        raise ValueError(f"arrays must have one or two dimensions, not {array.ndim}")
    return array.reshape(math.prod(array.shape[:-1]), array.shape[-1])  # -1 would need a value in a row


def sums_of(buffers: Any, shape: tuple[int, ...], dtype: Any) -> npt.NDArray[Any]:
    """A copy of the soft buffers as rows, or zeros."""
    if buffers is None:
        return np.zeros(shape, dtype).reshape(-1, shape[-1])
    expect_unmasked("buffers", buffers)
    array = np.asarray(buffers)
    if array.shape != shape or array.dtype != dtype:
        raise ValueError(f"buffers must be {dtype} of shape {shape}, not {array.dtype} of shape {array.shape}")
    return np.array(array, order="C").reshape(-1, shape[-1])


def checked_gains(gains: npt.ArrayLike, shape: tuple[int, ...]) -> npt.NDArray[np.float32]:
    array = checked_ratios(gains, "gains")
    if array.shape != shape:
        raise ValueError(f"gains must have the shape of symbols, {shape}, not {array.shape}")
    if array.size > 0 and array.min() < 0:
        raise ValueError("gains must be at least 0: the phase of symbols is turned back before")
    return array.reshape(-1)
