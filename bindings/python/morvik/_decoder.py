"""The decoder: soft values in, decisions out."""

from __future__ import annotations

import warnings
from types import TracebackType
from typing import Any, NamedTuple, NoReturn

import numpy as np
import numpy.typing as npt

from morvik import _core
from morvik._arguments import (
    DEFAULT_ALGORITHM,
    DEFAULT_ITERATIONS,
    DEFAULT_NUM_PU,
    DEFAULT_TAG_WIDTH,
    algorithm_number,
    any_integer,
    expect_block,
    integer,
    plain_array,
    thread_count,
    word,
)
from morvik._errors import DecoderWarning, Error

instruction_sets: tuple[str, ...] = _core.instruction_sets
"""The names of all instruction sets, the best one first, whether this machine has them or not; the last one is the model's
components one by one."""

_TAG_LIMIT = 2**32 - 1
_OUT_OF_MEMORY = 99  # a status of the C interface


class Decoded(NamedTuple):
    """The result of :meth:`Decoder.decode`. For ``n`` blocks, arrays have a leading dimension ``n``."""

    bits: npt.NDArray[np.uint8]
    """Decisions, each 0 or 1: uint8 of shape (K,) or (n, K)."""

    tag: int | npt.NDArray[np.uint32]
    """The tag, truncated to ``tag_width`` bits: an int, or uint32 of shape (n,)."""

    llrs: npt.NDArray[np.int16] | None
    """Log-likelihood ratios of the last half-iteration, or None if not requested: int16 of the shape of ``bits``.
    In units of 1/128; a ratio of 0 or more decides for bit 1. They wrap like the hardware's 12-bit metrics."""


class Decoder:
    """A turbo decoder, bit-accurate to the hardware core with these generics.

    ``num_pu``
        Parallel processing units: 2, 4 or 8. The defaults of this and the next two are the library's: 2,
        ``"scaled"``, 8.
    ``algorithm``
        ``"max-log"``, ``"scaled"`` (extrinsic values times 0.75) or ``"table"`` (correction table); or 0, 1, 2.
    ``tag_width``
        Bits of a block's tag, 0 to 32. As in the hardware, 32 keeps no bit of the tag.
    ``threads``
        Threads among which the blocks of a call are divided; as many as processors when None.
    ``instruction_set``
        One of :data:`morvik.instruction_sets` that the machine has, such as ``"generic"``; the fastest when None. All
        give the same bits.

    A refusal raises :class:`morvik.Error`, a ``ValueError``, with the decoder's reason.

    Close a decoder, by :meth:`close` or as a context manager, to release its memory early. Give each thread its own
    decoder: threads that share one wait for each other.
    """

    def __init__(
        self,
        num_pu: int = DEFAULT_NUM_PU,
        algorithm: str | int = DEFAULT_ALGORITHM,
        tag_width: int = DEFAULT_TAG_WIDTH,
        *,
        threads: int | None = None,
        instruction_set: str | None = None,
    ) -> None:
        if not isinstance(instruction_set, (str, type(None))):
            raise TypeError(f"instruction_set must be a name, not {instruction_set!r}")
        self._threads = thread_count(threads)
        self._num_pu = word("num_pu", num_pu, -1, 99)
        self._algorithm = algorithm_number(algorithm)
        self._tag_width = word("tag_width", tag_width, -1, 99)
        try:
            self._core = _core.Decoder(self._num_pu, self._algorithm, self._tag_width, instruction_set or "")
        except Error as error:
            given = f" (num_pu={num_pu!r}, algorithm={algorithm!r}, tag_width={tag_width!r})"
            raise Error(f"{error}{given if str(error).startswith('C_') else ''}") from None

    def decode(
        self,
        sys: npt.ArrayLike,
        par1: npt.ArrayLike,
        par2: npt.ArrayLike,
        iterations: int = DEFAULT_ITERATIONS,
        tag: npt.ArrayLike = 0,
        *,
        llrs: bool = False,
    ) -> Decoded:
        """Decodes a block, or a batch of blocks of one size.

        ``sys``, ``par1``, ``par2``
            Soft values: the systematic bits and the parities of the first and the second encoder, each of shape
            (K + 4,) for a block or (n, K + 4) for a batch. The last four positions hold the twelve tail values in the
            order of :func:`encode`, that of the standard. They are in eighths; a positive value favours bit 1. The core
            takes the low 24 bits of a value and clips them to -128 ... 127.

            int8, int16 and int32 in C order are read in place; other signed integers, orders and strides are copied.
            Anything but signed integers raises ``TypeError``.
        ``iterations``
            Full turbo iterations, 1 to 15; all of them are run.
        ``tag``
            One number for all blocks, or n of them, 0 to 2**32 - 1.
        ``llrs``
            Whether to return log-likelihood ratios, too.

        The interpreter lock is released meanwhile. No other thread may write to the arrays.
        """
        streams = streams_of(sys, par1, par2)
        is_single = streams[0].ndim == 1
        rows = [np.require(stream.reshape(-1, stream.shape[-1]), requirements=("C", "A")) for stream in streams]
        tags = _tags(tag, 1 if is_single else len(streams[0]), is_single)
        number = word("iterations", iterations, 0, 99)
        status, error, texts, bits, kept, ratios = self._core.decode(
            rows[0], rows[1], rows[2], number, tags, bool(llrs), self._threads
        )
        for text in texts:
            warnings.warn(text, DecoderWarning, stacklevel=2)
        if status == _OUT_OF_MEMORY:
            raise MemoryError(error)
        if status != 0:
            raise Error(f"{error} (iterations={iterations!r})")
        if is_single:
            return Decoded(bits[0], int(kept[0]), None if ratios is None else ratios[0])
        return Decoded(bits, kept, ratios)

    def close(self) -> None:
        """Releases the decoder's memory; it cannot decode afterwards. Closing it again does nothing."""
        self._core.close()

    @property
    def closed(self) -> bool:
        """Whether the decoder has been closed."""
        return self._core.closed

    @property
    def num_pu(self) -> int:
        """Parallel processing units."""
        return self._num_pu

    @property
    def algorithm(self) -> str:
        """``"max-log"``, ``"scaled"`` or ``"table"``."""
        return ("max-log", "scaled", "table")[self._algorithm]

    @property
    def tag_width(self) -> int:
        """Bits of a block's tag."""
        return self._tag_width

    @property
    def threads(self) -> int:
        """The maximum number of threads of a call."""
        return self._threads

    @property
    def instruction_set(self) -> str:
        """The name of the instruction set in use."""
        return self._core.instruction_set

    def __enter__(self) -> Decoder:
        return self

    def __exit__(
        self, kind: type[BaseException] | None, value: BaseException | None, trace: TracebackType | None
    ) -> None:
        self.close()

    def __repr__(self) -> str:
        text = f"morvik.Decoder(num_pu={self.num_pu}, algorithm={self.algorithm!r}, tag_width={self.tag_width})"
        return f"<closed {text}>" if self.closed else text

    def __reduce__(self) -> NoReturn:
        raise TypeError("a morvik.Decoder cannot be copied or pickled: make another one, in the process that uses it")


def streams_of(*values: npt.ArrayLike) -> list[npt.NDArray[Any]]:
    """The three streams, with a common shape and type."""
    names = ("sys", "par1", "par2")
    arrays = [_soft_values(name, value) for name, value in zip(names, values)]
    for name, array in zip(names[1:], arrays[1:]):
        if array.shape != arrays[0].shape:
            raise ValueError(
                f"sys, par1 and par2 must have the same shape: sys has {arrays[0].shape}, {name} has {array.shape}"
            )
    expect_block("sys", arrays[0].shape[-1])
    if arrays[0].ndim == 2 and len(arrays[0]) > _TAG_LIMIT:
        raise ValueError(f"a batch must have at most {_TAG_LIMIT} blocks, not {len(arrays[0])}")
    widest = np.result_type(*arrays).newbyteorder("=")
    return [array.astype(widest, copy=False) for array in arrays]


def _soft_values(name: str, values: npt.ArrayLike) -> npt.NDArray[Any]:
    """The values as an array of int8, int16 or int32."""
    array = plain_array(name, values)
    if array.dtype.kind != "i":
        hint = {
            "f": "; multiply by the scale, round, then astype(numpy.int8)",
            "u": "; a soft value is positive for bit 1 and negative for bit 0, bits are no soft values",
            "b": "; a soft value is positive for bit 1 and negative for bit 0, bits are no soft values",
            "O": "; a value has more than 64 bits or is no number",
        }.get(array.dtype.kind, "")
        raise TypeError(f"{name} must hold signed integers (int8, int16 or int32), not {array.dtype}{hint}")
    if array.ndim not in (1, 2):
        raise ValueError(f"{name} must have the shape (K + 4,) or (n, K + 4), not {array.shape}")
    if array.dtype.itemsize <= 4:
        return array
    limits = np.iinfo(np.int32)
    if array.size > 0 and (array.min() < limits.min or array.max() > limits.max):
        raise ValueError(f"{name} must hold values of 32 bits, not {array.min()} ... {array.max()}")
    return array.astype(np.int32)


def _tags(tag: npt.ArrayLike, blocks: int, is_single: bool) -> npt.NDArray[np.uint32]:
    """A tag for each block."""
    tags = plain_array("tag", tag)
    if tags.ndim == 0:
        return np.full(blocks, integer("tag", tag, 0, _TAG_LIMIT), np.uint32)
    if is_single or tags.shape != (blocks,):
        expected = "an integer" if is_single else f"an integer or have the shape ({blocks},), one for each block"
        raise ValueError(f"tag must be {expected}; its shape is {tags.shape}")
    if blocks > 0:
        if tags.dtype.kind not in "iu":
            raise TypeError(f"tag must hold integers, not {tags.dtype}")
        for bound in (tags.min(), tags.max()):
            integer("tag", any_integer("tag", bound), 0, _TAG_LIMIT)
    return tags.astype(np.uint32)
