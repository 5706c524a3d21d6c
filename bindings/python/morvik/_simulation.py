"""Error rates, simulated in this process."""

from __future__ import annotations

import re
import warnings
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
    thousandths,
    thread_count,
    word,
)
from morvik._decoder import Decoder
from morvik._errors import Error, SimulationWarning

_COUNT_LIMIT = 2**63 - 1
# The columns of result files; rows of plain code blocks over BPSK have fewer.
_COLUMNS: list[tuple[str, Any]] = [
    ("point", np.int64),
    ("block_size", np.int64),
    ("transport_block_size", np.int64),
    ("code_blocks", np.int64),
    ("coded_bits", np.int64),
    ("mcs", "U9"),
    ("modulation", "U6"),
    ("redundancy_versions", np.object_),
    ("transmissions", np.int64),
    ("soft_buffer_bits", np.int64),
    ("soft_buffer_size", np.int64),
    ("channel", "U14"),
    ("demapper", "U7"),
    ("early_stop", "U4"),
    ("num_pu", np.int64),
    ("algorithm", "U7"),
    ("scale_option", "U8"),
    ("iterations", np.int64),
    ("axis", "U4"),
    ("esn0_db", np.float64),
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
    ("code_block_errors", np.int64),
    ("undetected_errors", np.int64),
    ("sent_transmissions", np.int64),
    ("run_iterations", np.int64),
    ("mean_transmissions", np.float64),
    ("mean_iterations", np.float64),
    ("throughput", np.float64),
    ("clipped_values", np.int64),
    ("clipped_fraction", np.float64),
    ("failed_frames", np.object_),
    ("seconds", np.float64),
    ("seed", np.uint64),
    ("version", "U16"),
]
_MODULATIONS = ("bpsk", "qpsk", "16qam", "64qam", "256qam")
_CHANNELS = ("awgn", "rayleigh", "block-rayleigh")
_DEMAPPERS = ("max-log", "exact")
_MCS_TABLES = ("64qam", "256qam")
_EARLY_STOPS = ("none", "crc")


def error_rate(
    block_size: int | Sequence[int] | None = None,
    ebn0_db: float | Sequence[float] | None = None,
    *,
    esn0_db: float | Sequence[float] | None = None,
    transport_block_size: int | Sequence[int] | None = None,
    coded_bits: int | Sequence[int] | None = None,
    code_rate: float | Sequence[float] | None = None,
    mcs: int | Sequence[int] | None = None,
    mcs_table: str | None = None,
    resource_blocks: int | None = None,
    resource_elements: int | None = None,
    modulation: str | Sequence[str] | None = None,
    redundancy_versions: Sequence[int] | None = None,
    soft_buffer_bits: int | None = None,
    soft_buffer_size: int | None = None,
    channel: str | None = None,
    demapper: str | None = None,
    early_stop: str | None = None,
    num_pu: int | Sequence[int] = DEFAULT_NUM_PU,
    algorithm: str | int | Sequence[str | int] = DEFAULT_ALGORITHM,
    scale: float | None | Sequence[float | None] = None,
    iterations: int | Sequence[int] = DEFAULT_ITERATIONS,
    each_iteration: bool = False,
    block_errors: int | None = None,
    bit_errors: int | None = None,
    max_blocks: int | None = None,
    max_seconds: float | None = None,
    stop_bler: float | None = None,
    frames: tuple[int, int] | None = None,
    seed: int = 1,
    threads: int | None = None,
    instruction_set: str | None = None,
    progress: Callable[[np.recarray[Any, Any]], object] | None = None,
) -> np.recarray[Any, Any]:
    """Simulates bit and block error rates: random bits, encoder, channel, quantiser, decoder.

    The frames, defaults and results are those of the command ``morvik ber``, docs/error_rates.md: the same seed gives
    the same counts on every machine, with any number of threads.

    Every combination of these is a point; each is a value or a sequence of values. One of the first three says what is
    sent:

    ``block_size``
        Plain code blocks of K bits, one of :data:`block_sizes`.
    ``transport_block_size``
        Transport blocks of so many bits, without their CRC, with ``coded_bits``, bits of one transmission, or
        ``code_rate``.
    ``mcs``
        Transport blocks of the modulation and coding schemes of 3GPP TS 36.213, with ``resource_blocks`` (pairs) and
        their ``resource_elements`` (120); from ``mcs_table`` ``"64qam"`` or ``"256qam"``.
    ``ebn0_db``, ``esn0_db``
        One of them: Eb/N0, or Es/N0 of a symbol, in dB, -50 to 50 in steps of 0.001; None chooses the waterfall range.
    ``modulation``
        ``"bpsk"``, ``"qpsk"``, ``"16qam"``, ``"64qam"`` or ``"256qam"``; None is QPSK for transport blocks, BPSK for code
        blocks.
    ``num_pu``, ``algorithm``
        As for :class:`Decoder`, with the same defaults.
    ``scale``
        The soft value for amplitude 1 with plain code blocks over BPSK and Gaussian noise, otherwise for a
        log-likelihood ratio of 1: above 0 up to 1000; None chooses it for algorithm, modulation and code rate.
    ``iterations``
        1 to 15; with ``each_iteration``, errors after each iteration up to the number are counted.

    All points have these in common:

    ``channel``
        ``"awgn"``, ``"rayleigh"``, fading of each symbol, or ``"block-rayleigh"``, of each transmission.
    ``demapper``
        ``"max-log"`` or ``"exact"``.
    ``redundancy_versions``
        Of each transmission of a transport block, such as ``[0, 2, 3, 1]``; the next one is sent only where a CRC failed.
    ``soft_buffer_bits``, ``soft_buffer_size``
        Width of the values that are added up; positions for a transport block (N_IR). None: full width, unlimited.
    ``early_stop``
        ``"crc"``: a code block keeps the decisions of the first iteration whose CRC fits; or ``"none"``.

    A point ends with the first of these that it reaches; the first three depend on the frames alone:

    ``block_errors``
        Wrong blocks; 100 when ``bit_errors`` is None, too.
    ``bit_errors``
        Wrong bits.
    ``max_blocks``
        Blocks; 1000000 when None.
    ``max_seconds``
        Time.

    ``frames`` simulates the frames (FROM, TO), TO excluded, and no others; the rules apply if given.

    ``stop_bler`` ends a curve after its first point with a lower block error rate: None is 0.0001, or 0 when
    ``ebn0_db``, ``esn0_db`` or ``frames`` is given. ``progress`` is called after each point with its rows.

    Returns a NumPy record array with a row for each point (and, with ``each_iteration``, for each number of
    iterations), whose fields are the columns of the command's result files: ``rates.ebn0_db``, ``rates.bler``,
    ``rates.bler_low`` and ``rates.bler_high`` (bounds of 95 %), ``rates.ber``, ``rates.blocks`` ...
    ``pandas.DataFrame(rates)`` and ``matplotlib.pyplot.semilogy("ebn0_db", "bler", data=rates)`` take it as it is.

    A :class:`SimulationWarning` tells code rates above 0.931, at which a terminal may leave out decoding, soft buffers of less
    than six bits with the automatic scale, and curves that are still above a block error rate of 0.01 at the end of the range
    that was chosen for them.

    The interpreter lock is released meanwhile. Ctrl-C ends the simulation with ``KeyboardInterrupt``.
    """
    if progress is not None and not callable(progress):
        raise TypeError(f"progress must be callable, not {progress!r}")
    num_pus = each("num_pu", num_pu, lambda value: word("num_pu", value, -1, 99))
    algorithms = each("algorithm", algorithm, algorithm_number)
    _expect_decoders(num_pus, algorithms, instruction_set)
    sweep = _core.Sweep()
    sweep.block_sizes = [] if block_size is None else each("block_size", block_size, checked_block_size)
    sweep.num_pus = num_pus
    sweep.algorithms = algorithms
    sweep.milli_scales = each("scale", scale, lambda value: None if value is None else scale_thousandths(value))
    sweep.iterations = each("iterations", iterations, lambda value: integer("iterations", value, 1, 15))
    _set_decibels(sweep, ebn0_db, esn0_db)
    link = _link_options(
        transport_block_size, coded_bits, code_rate, mcs, mcs_table, resource_blocks, resource_elements, modulation,
        redundancy_versions, soft_buffer_bits, soft_buffer_size, channel, demapper, early_stop,
    )
    if block_size is None and transport_block_size is None and mcs is None:
        raise ValueError("one of block_size, transport_block_size and mcs must be given")
    if each_iteration:
        _expect_each_iteration(sweep, link)
    is_range = ebn0_db is None and esn0_db is None
    rules = _rules(block_errors, bit_errors, max_blocks, max_seconds, stop_bler, is_range, frames is not None)

    def hand_on(point: list[dict[str, Any]]) -> None:
        if progress is not None:
            progress(_record(point))

    def warn(text: str) -> None:
        warnings.warn(_with_keywords(text), SimulationWarning, stacklevel=3)

    try:
        rows = _core.error_rate(
            sweep,
            link,
            rules,
            _frame_range(frames),
            bool(each_iteration),
            integer("seed", seed, 0, 2**64 - 1),
            thread_count(threads),
            instruction_set or "",
            hand_on,
            warn,
        )
    except Error as error:
        raise Error(_with_keywords(str(error))) from None
    return _record(rows)


def _with_keywords(text: str) -> str:
    """What the command says, with keywords in place of its options."""
    decibels = re.sub(r"--(e[bs]n0)\b", r"\1_db", text)
    return re.sub(r"--([a-z0-9-]+)", lambda option: option[1].replace("-", "_"), decibels)


def _set_decibels(sweep: _core.Sweep, ebn0_db: Any, esn0_db: Any) -> None:
    if ebn0_db is not None and esn0_db is not None:
        raise ValueError("ebn0_db and esn0_db are two axes: only one of them can be given")
    sweep.is_over_esn0 = esn0_db is not None
    if ebn0_db is not None:
        sweep.milli_decibels = each("ebn0_db", ebn0_db, ebn0_thousandths)
    elif esn0_db is not None:
        sweep.milli_decibels = each("esn0_db", esn0_db, lambda value: thousandths("esn0_db", value, -50, 50))


def _link_options(
    transport_block_size: Any,
    coded_bits: Any,
    code_rate: Any,
    mcs: Any,
    mcs_table: Any,
    resource_blocks: Any,
    resource_elements: Any,
    modulation: Any,
    redundancy_versions: Any,
    soft_buffer_bits: Any,
    soft_buffer_size: Any,
    channel: Any,
    demapper: Any,
    early_stop: Any,
) -> _core.LinkOptions:
    """The options, each checked alone; the simulation refuses those that contradict each other."""

    def listed(name: str, values: Any, check: Callable[[Any], int]) -> list[int]:
        return [] if values is None else each(name, values, check)

    def whole(name: str, low: int, high: int) -> Callable[[Any], int]:
        return lambda value: integer(name, value, low, high)

    def optional(name: str, value: Any, low: int, high: int) -> int | None:
        return None if value is None else integer(name, value, low, high)

    options = _core.LinkOptions()
    size = whole("transport_block_size", 1, 2**24)
    options.transport_block_sizes = listed("transport_block_size", transport_block_size, size)
    options.coded_bits = listed("coded_bits", coded_bits, whole("coded_bits", 1, _core.most_coded_bits))
    options.code_rates = listed("code_rate", code_rate, lambda value: thousandths("code_rate", value, 0.001, 1))
    options.mcs_indices = sorted(listed("mcs", mcs, whole("mcs", 0, 28)))
    options.resource_blocks = optional("resource_blocks", resource_blocks, 1, 110)
    options.resource_elements = optional("resource_elements", resource_elements, 1, 168)
    options.soft_buffer_bits = optional("soft_buffer_bits", soft_buffer_bits, 2, 16)
    options.soft_buffer_size = optional("soft_buffer_size", soft_buffer_size, 1, 2**32 - 2)
    options.stops_early = None if early_stop is None else _named("early_stop", early_stop, _EARLY_STOPS) == "crc"
    if redundancy_versions is not None:
        versions = [integer("redundancy_versions", version, 0, 3) for version in redundancy_versions]
        if not 1 <= len(versions) <= 16:
            raise ValueError(f"redundancy_versions must be 1 to 16 numbers, not {len(versions)}")
        options.versions = versions
    options.set_names(
        [] if modulation is None else each("modulation", modulation, lambda name: _named("modulation", name, _MODULATIONS)),
        "" if channel is None else _named("channel", channel, _CHANNELS),
        "" if demapper is None else _named("demapper", demapper, _DEMAPPERS),
        "" if mcs_table is None else _named("mcs_table", mcs_table, _MCS_TABLES),
    )
    return options


def _expect_each_iteration(sweep: _core.Sweep, link: _core.LinkOptions) -> None:
    if len(sweep.iterations) > 1:
        raise ValueError("each_iteration counts up to one number of iterations, give only the largest")
    if len(link.versions) > 1:
        raise ValueError(f"each_iteration counts one transmission, redundancy_versions has {len(link.versions)}")
    if link.stops_early:
        raise ValueError("each_iteration counts after every iteration, early_stop='crc' keeps one: give one of them")


def _rules(
    block_errors: int | None,
    bit_errors: int | None,
    max_blocks: int | None,
    max_seconds: float | None,
    stop_bler: float | None,
    is_range: bool,
    has_frames: bool,
) -> _core.StopRules:
    """The rules with the command's defaults: given frames are all simulated."""
    rules = _core.StopRules()
    rules.block_errors = _count("block_errors", block_errors)
    rules.bit_errors = _count("bit_errors", bit_errors)
    rules.max_blocks = _count("max_blocks", max_blocks)
    rules.max_seconds = None if max_seconds is None else _in_range("max_seconds", max_seconds, 1e-9, 1e9)
    rules.stop_bler = 0 if stop_bler is None else _in_range("stop_bler", stop_bler, 0, 1)
    if not has_frames:
        if block_errors is None and bit_errors is None:
            rules.block_errors = 100
        if max_blocks is None:
            rules.max_blocks = 1_000_000
        if stop_bler is None and is_range:
            rules.stop_bler = 0.0001
    return rules


def _frame_range(frames: Any) -> tuple[int, int] | None:
    if frames is None:
        return None
    ends = [integer("frames", end, 0, 2**64 - 1) for end in frames]
    if len(ends) != 2 or ends[0] >= ends[1]:
        raise ValueError(f"frames must be (FROM, TO), with FROM below TO, not {frames!r}")
    return ends[0], ends[1]


def _named(name: str, value: Any, allowed: tuple[str, ...]) -> str:
    if value not in allowed:
        raise ValueError(f"{name} must be one of {', '.join(allowed)}, not {value!r}")
    return str(value)


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
    columns = np.dtype([column for column in _COLUMNS if column[0] in rows[0]])
    names = columns.names or ()
    return np.array([tuple(row[name] for name in names) for row in rows], columns).view(np.recarray)
