"""The transmit side: encoder, interleaver and channel."""

from __future__ import annotations

from typing import Any, NamedTuple

import numpy as np
import numpy.typing as npt

from morvik import _core
from morvik._arguments import (
    TAIL,
    algorithm_number,
    block_size,
    ebn0_thousandths,
    expect_block,
    expect_unmasked,
    integer,
    plain_array,
    scale_thousandths,
)

block_sizes: tuple[int, ...] = _core.block_sizes
"""The 188 block sizes K of 3GPP TS 36.212, Table 5.1.3-3, ascending."""


class Streams(NamedTuple):
    """The three streams of a block, or of n blocks: arrays of shape (K + 4,) or (n, K + 4).

    The last four positions hold the twelve tail values in the order of 3GPP TS 36.212, clause 5.1.3.2.2, with x and z
    the systematic and parity bits of the first encoder, x' and z' those of the second:

    ========  ========  ========  ========
    position  sys       par1      par2
    ========  ========  ========  ========
    K         x(K)      z(K)      x(K+1)
    K + 1     z(K+1)    x(K+2)    z(K+2)
    K + 2     x'(K)     z'(K)     x'(K+1)
    K + 3     z'(K+1)   x'(K+2)   z'(K+2)
    ========  ========  ========  ========
    """

    sys: npt.NDArray[Any]
    par1: npt.NDArray[Any]
    par2: npt.NDArray[Any]


def interleaver(block_size: int) -> npt.NDArray[np.int64]:
    """The interleaver of blocks of K bits: int64 of shape (K,), to be used as an index. The second encoder reads
    ``bits[interleaver(K)]``."""
    return _core.interleaver(_block_size(block_size))


def encode(bits: npt.ArrayLike) -> Streams:
    """Encodes a block of K bits, or n blocks of shape (n, K), by the turbo code of 3GPP TS 36.212.

    The bits are integers 0 and 1 or booleans. The streams are uint8 of shape (K + 4,) or (n, K + 4), each element 0
    or 1.
    """
    array = bits_of("bits", bits)
    _block_size(array.shape[-1])
    streams = _core.encode(np.ascontiguousarray(array.reshape(-1, array.shape[-1])))
    return Streams(*(stream.reshape(*array.shape[:-1], stream.shape[-1]) for stream in streams))


def awgn(
    streams: Streams | tuple[npt.ArrayLike, npt.ArrayLike, npt.ArrayLike],
    ebn0_db: float,
    *,
    algorithm: str | int = "scaled",
    scale: float | None = None,
    rng: np.random.Generator | int | None = None,
) -> Streams:
    """Sends encoded bits over BPSK with white Gaussian noise, and quantises the received values.

    ``streams``
        What :func:`encode` returns.
    ``ebn0_db``
        Eb/N0 in dB, -50 to 50 in steps of 0.001; it counts the energy of the tail, at a rate of K / (3 K + 12).
    ``algorithm``
        The decoder's algorithm, for which the scale is chosen.
    ``scale``
        The soft value for amplitude 1: above 0, up to 1000. None chooses it for the algorithm: 8 for
        ``"max-log"`` and ``"scaled"``, 8 / variance of the noise for ``"table"``.
    ``rng``
        A NumPy generator, or the seed of a new one.

    Returns int8 of the same shapes, rounded and clipped to -128 ... 127: what :meth:`Decoder.decode` takes. All noise of
    a call follows from 64 bits that it takes from the generator, and is the same on every machine; as in
    :func:`error_rate`, soft values are drawn from their exact distribution.
    """
    arrays = [bits_of(name, stream) for name, stream in zip(Streams._fields, three_streams(streams))]
    positions = arrays[0].shape[-1]
    expect_block("sys", positions)
    milli_decibels = ebn0_thousandths(ebn0_db)
    number = integer("algorithm", algorithm_number(algorithm), 0, 2)
    if scale is None:
        factor = _core.default_scale(number, positions - TAIL, milli_decibels)
    else:
        factor = scale_thousandths(scale) / 1000
    seed = int.from_bytes(np.random.default_rng(rng).bytes(8), "little")
    rows = [np.ascontiguousarray(array.reshape(-1, positions)) for array in arrays]
    received = _core.transmit(rows, milli_decibels, factor, seed)
    return Streams(*(stream.reshape(arrays[0].shape) for stream in received))


_block_size = block_size  # under a name that no parameter shadows


def three_streams(streams: Any) -> tuple[Any, ...]:
    expect_unmasked("streams", streams)
    three = tuple(streams)
    if len(three) != 3 or len({np.shape(stream) for stream in three}) != 1:
        raise ValueError("streams must be three arrays of one shape: sys, par1, par2")
    return three


def bits_of(name: str, values: npt.ArrayLike) -> npt.NDArray[np.uint8]:
    """The values as an array of 0 and 1."""
    array = plain_array(name, values)
    if array.dtype.kind not in "iub":
        raise TypeError(f"{name} must hold bits, as integers or booleans, not {array.dtype}")
    if array.ndim not in (1, 2):
        raise ValueError(f"{name} must have one or two dimensions, not {array.ndim}")
    if array.size > 0 and not (0 <= array.min() and array.max() <= 1):
        raise ValueError(f"{name} must hold bits, 0 or 1, not {array.min()} ... {array.max()}")
    return array.astype(np.uint8, copy=False)
