"""Error rates, simulated in this process."""

from __future__ import annotations

from collections.abc import Callable, Sequence
from typing import Any

import numpy as np

from morvik import _core
from morvik._arguments import (
    DEFAULT_ALGORITHM,
    DEFAULT_ITERATIONS,
    DEFAULT_NUM_PU,
    algorithm_number,
    block_size as checked_block_size,
    each,
    ebn0_thousandths,
    integer,
    real,
    scale_thousandths,
    thread_count,
    word,
)
from morvik._decoder import Decoder

_COUNT_LIMIT = 2**63 - 1
_DTYPE = np.dtype(
    [
        ("point", np.int64),
        ("block_size", np.int64),
        ("num_pu", np.int64),
        ("algorithm", "U7"),
        ("scale_option", "U8"),
        ("iterations", np.int64),
        ("ebn0_db", np.float64),
        ("scale", np.float64),
        ("frames", "U41"),
        ("blocks", np.int64),
        ("bit_errors", np.int64),
        ("block_errors", np.int64),
        ("bit_error_squares", np.int64),
        ("ber", np.float64),
        ("ber_low", np.float64),
        ("ber_high", np.float64),
        ("bler", np.float64),
        ("bler_low", np.float64),
        ("bler_high", np.float64),
        ("clipped_values", np.int64),
        ("clipped_fraction", np.float64),
        ("failed_frames", np.object_),
        ("seconds", np.float64),
        ("seed", np.uint64),
        ("version", "U16"),
    ]
)


def error_rate(
    block_size: int | Sequence[int],
    ebn0_db: float | Sequence[float] | None = None,
    *,
    num_pu: int | Sequence[int] = DEFAULT_NUM_PU,
    algorithm: str | int | Sequence[str | int] = DEFAULT_ALGORITHM,
    scale: float | None | Sequence[float | None] = None,
    iterations: int | Sequence[int] = DEFAULT_ITERATIONS,
    each_iteration: bool = False,
    block_errors: int | None = None,
    bit_errors: int | None = None,
    max_blocks: int = 1_000_000,
    max_seconds: float | None = None,
    stop_bler: float | None = None,
    seed: int = 1,
    threads: int | None = None,
    instruction_set: str | None = None,
    progress: Callable[[np.recarray[Any, Any]], object] | None = None,
) -> np.recarray[Any, Any]:
    """Simulates bit and block error rates: random bits, encoder, BPSK over white Gaussian noise, quantiser, decoder.

    The frames, defaults and results are those of the command ``morvik ber``, docs/error_rates.md: the same seed gives
    the same counts on every machine, with any number of threads.

    Every combination of these is a point; each is a value or a sequence of values:

    ``block_size``
        K, one of :data:`block_sizes`.
    ``ebn0_db``
        Eb/N0 in dB, -50 to 50 in steps of 0.001; None chooses the waterfall range of the size.
    ``num_pu``, ``algorithm``
        As for :class:`Decoder`, with the same defaults.
    ``scale``
        Steps of a soft value for amplitude 1, above 0 up to 1000; None chooses it for the algorithm.
    ``iterations``
        1 to 15; with ``each_iteration``, errors after each iteration up to the number are counted.

    A point ends with the first of these that it reaches; the first three depend on the frames alone:

    ``block_errors``
        Wrong blocks; 100 when ``bit_errors`` is None, too.
    ``bit_errors``
        Wrong bits.
    ``max_blocks``
        Blocks.
    ``max_seconds``
        Time.

    ``stop_bler`` ends a curve after its first point with a lower block error rate: None is 0.0001, or 0 when
    ``ebn0_db`` is given. ``progress`` is called after each point with its rows.

    Returns a NumPy record array with a row for each point (and, with ``each_iteration``, for each number of
    iterations), whose fields are the columns of the command's result files: ``rates.ebn0_db``, ``rates.bler``,
    ``rates.bler_low`` and ``rates.bler_high`` (bounds of 95 %), ``rates.ber``, ``rates.blocks`` ...
    ``pandas.DataFrame(rates)`` and ``matplotlib.pyplot.semilogy("ebn0_db", "bler", data=rates)`` take it as it is.

    The interpreter lock is released meanwhile. Ctrl-C ends the simulation with ``KeyboardInterrupt``.
    """
    if progress is not None and not callable(progress):
        raise TypeError(f"progress must be callable, not {progress!r}")
    num_pus = each("num_pu", num_pu, lambda value: word("num_pu", value, -1, 99))
    algorithms = each("algorithm", algorithm, algorithm_number)
    _expect_decoders(num_pus, algorithms, instruction_set)
    sweep = _core.Sweep()
    sweep.block_sizes = each("block_size", block_size, checked_block_size)
    sweep.num_pus = num_pus
    sweep.algorithms = algorithms
    sweep.milli_scales = each("scale", scale, lambda value: None if value is None else scale_thousandths(value))
    sweep.iterations = each("iterations", iterations, lambda value: integer("iterations", value, 1, 15))
    sweep.milli_decibels = [] if ebn0_db is None else each("ebn0_db", ebn0_db, ebn0_thousandths)
    if each_iteration and len(sweep.iterations) > 1:
        raise ValueError("each_iteration counts up to one number of iterations, give only the largest")

    rules = _core.StopRules()
    rules.block_errors = _count("block_errors", block_errors)
    rules.bit_errors = _count("bit_errors", bit_errors)
    if block_errors is None and bit_errors is None:
        rules.block_errors = 100
    rules.max_blocks = _count("max_blocks", max_blocks)
    rules.max_seconds = None if max_seconds is None else _in_range("max_seconds", max_seconds, 1e-9, 1e9)
    if stop_bler is None:
        rules.stop_bler = 0.0001 if ebn0_db is None else 0
    else:
        rules.stop_bler = _in_range("stop_bler", stop_bler, 0, 1)

    def hand_on(point: list[dict[str, Any]]) -> None:
        if progress is not None:
            progress(_record(point))

    rows = _core.error_rate(
        sweep,
        rules,
        bool(each_iteration),
        integer("seed", seed, 0, 2**64 - 1),
        thread_count(threads),
        instruction_set or "",
        hand_on,
    )
    return _record(rows)


def _expect_decoders(num_pus: list[int], algorithms: list[int], instruction_set: str | None) -> None:
    """Lets the decoder refuse unknown values."""
    for num_pu in num_pus:
        for algorithm in algorithms:
            Decoder(num_pu, algorithm, threads=1, instruction_set=instruction_set).close()


def _count(name: str, value: int | None) -> int | None:
    return None if value is None else integer(name, value, 1, _COUNT_LIMIT)


def _in_range(name: str, value: float, low: float, high: float) -> float:
    number = real(name, value)
    if not low <= number <= high:
        raise ValueError(f"{name} must be in the range {low:g} to {high:g}, not {value!r}")
    return number


def _record(rows: list[dict[str, Any]]) -> np.recarray[Any, Any]:
    names = _DTYPE.names or ()
    return np.array([tuple(row[name] for name in names) for row in rows], _DTYPE).view(np.recarray)
