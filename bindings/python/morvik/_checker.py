"""The checker: a core's values in lockstep with the model, and every value of the model."""

from __future__ import annotations

import warnings
from collections.abc import Sequence
from typing import Literal, NoReturn

import numpy as np
import numpy.typing as npt

from morvik import _core
from morvik._arguments import (
    DEFAULT_ALGORITHM,
    DEFAULT_ITERATIONS,
    DEFAULT_NUM_PU,
    algorithm_number,
    word,
)
from morvik._decoder import streams_of
from morvik._errors import DecoderWarning, Difference

_ROWS = {"g": 4, "alpha": 8, "beta": 8}
_STANDINGS: tuple[Literal["agrees", "differs"], ...] = ("agrees", "differs")
_WORD = 2**31 - 1


class Checker:
    """Compares the values of a core with the model while a simulation runs, for example in cocotb, and knows every
    value of the model.

    ``num_pu``, ``algorithm``
        As for :class:`morvik.Decoder`.
    ``count_situations``
        Whether :meth:`situations` are counted, which takes longer than observing values.

    Signals are ``"intrinsic"``, ``"g0"`` to ``"g3"``, ``"alpha0"`` to ``"alpha7"``, ``"beta0"`` to ``"beta7"``,
    ``"llr"`` and ``"extrinsic"``. Half-iterations and steps count from 0, steps in the order of the code that is decoded.
    Values are integers in eighths, -2048 to 2047.

    A refusal raises :class:`morvik.Error`.
    """

    def __init__(
        self,
        num_pu: int = DEFAULT_NUM_PU,
        algorithm: str | int = DEFAULT_ALGORITHM,
        *,
        count_situations: bool = False,
    ) -> None:
        self._core = _core.Checker(word("num_pu", num_pu, -1, 99), algorithm_number(algorithm), bool(count_situations))
        self._half_iterations = 0

    def start(
        self, sys: npt.ArrayLike, par1: npt.ArrayLike, par2: npt.ArrayLike, iterations: int = DEFAULT_ITERATIONS
    ) -> None:
        """Begins a block, and forgets the one before. The arguments are those of :meth:`morvik.Decoder.decode`, for one
        block: the streams have the shape (K + 4,)."""
        streams = streams_of(sys, par1, par2)
        if streams[0].ndim != 1:
            raise ValueError(f"sys, par1 and par2 must have the shape (K + 4,), not {streams[0].shape}")
        words = [np.require(stream.astype(np.int32), requirements=("C", "A")) for stream in streams]
        self._half_iterations = 0
        texts = self._core.start(words[0], words[1], words[2], word("iterations", iterations, 0, 99))
        self._half_iterations = 2 * iterations
        for text in texts:
            warnings.warn(text, DecoderWarning, stacklevel=2)

    def observe(
        self, signal: str, half_iteration: int, step: int, value: int | None | Sequence[int | None] | npt.NDArray[np.int_]
    ) -> bool:
        """Takes a value of the core, or None for one with bits that are x or z, and returns whether it agrees. A whole
        row of ``"g"``, ``"alpha"`` or ``"beta"`` is a sequence of four or eight.

        The first difference of a block raises :class:`morvik.Difference`. Its text is what ``morvik compare`` says.
        Where the core computes nothing, such as LLRs in the tail, every value agrees.
        """
        values = [value] if value is None or np.ndim(value) == 0 else list(value)  # type: ignore[arg-type]
        count = _ROWS.get(signal, 1)
        if len(values) != count:
            raise ValueError(f"{signal} takes {count} value{'s' * (count > 1)}, not {len(values)}")
        numbers = [None if each is None else word("value", each, -_WORD, _WORD) for each in values]
        agrees, text = self._core.observe(_number(signal), *_place(half_iteration, step), numbers)
        if text:
            raise Difference(text)
        return agrees

    def value(self, signal: str, half_iteration: int, step: int) -> int | None:
        """A value of the model, or None where the core computes none."""
        return self._core.value(_number(signal), *_place(half_iteration, step))

    def values(self, signal: str) -> npt.NDArray[np.int16]:
        """All values of a signal: int16 of shape (half-iterations, steps), K steps for most signals, K + 1 for forward
        metrics, K + 3 for intrinsic values."""
        return self._core.values(_number(signal), max(self._half_iterations, 1))

    def ratios(self) -> npt.NDArray[np.int16]:
        """The log-likelihood ratios of the last half-iteration, in eighths: int16 of shape (K,)."""
        last: npt.NDArray[np.int16] = self.values("llr")[-1]
        return last

    def seen(self, signal: str) -> tuple[int, int]:
        """How many values of a signal were observed, and how many the core computes."""
        return self._core.seen(_number(signal))

    @property
    def standing(self) -> Literal["agrees", "differs", "incomplete"]:
        """``"agrees"`` if all values of each observed signal were observed and agree, ``"differs"``, or
        ``"incomplete"``."""
        standing = self._core.standing()
        return _STANDINGS[standing] if standing < len(_STANDINGS) else "incomplete"

    def report(self) -> str:
        """Describes how much of the block was observed, and all differences."""
        return self._core.report()

    def situations(self) -> str:
        """How often all blocks so far have met each situation of the arithmetic, at values that were observed and agree:
        the text of a CSV file, which ``morvik coverage`` reads. Only with ``count_situations=True``."""
        return self._core.situations()

    def __reduce__(self) -> NoReturn:
        raise TypeError("a morvik.Checker cannot be copied or pickled")


def _number(signal: str) -> int:
    """The number of a signal, or of the first one of a row."""
    name = f"{signal}0" if signal in _ROWS else signal
    if name not in _core.signals:
        raise ValueError(f"signal must be one of {', '.join(_core.signals)}, g, alpha, beta, not {signal!r}")
    return _core.signals.index(name)


def _place(half_iteration: int, step: int) -> tuple[int, int]:
    return word("half_iteration", half_iteration, -1, _WORD), word("step", step, -1, _WORD)
