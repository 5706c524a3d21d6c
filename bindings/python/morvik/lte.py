"""The LTE chain around the core: transport blocks, rate matching, modulation, and their reverse.

>>> import numpy as np
>>> from morvik import Decoder, lte
>>> rng = np.random.default_rng(1)
>>> chain = lte.Transport(1000, 2400, "16qam")          # 1000 bits, sent as 2400
>>> bits = rng.integers(0, 2, (100, 1000))              # 100 transport blocks
>>> symbols = lte.map(chain.encode(bits), "16qam")      # complex64 of shape (100, 600), with mean energy 1
>>> noise = rng.normal(0, 0.35 / 2**0.5, (*symbols.shape, 2)).astype("f4").view("c8")[..., 0]
>>> llrs = lte.demap(symbols + noise, "16qam", 0.35**2)
>>> received = chain.decode(Decoder(), chain.recover(llrs))
>>> bool(received.fits.all()), bool((received.bits == bits).all())
(True, True)

The chain is that of 3GPP TS 36.212, clauses 5.1.1 to 5.1.5, and TS 36.211, clauses 7.1.2 to 7.1.5. Log-likelihood
ratios are ln(P(1) / P(0)), as float32: positive where a 1 is likelier. Every array has one dimension for one block, or
a leading one for n blocks.
"""

from __future__ import annotations

import math
from typing import Any, NamedTuple

import numpy as np
import numpy.typing as npt

from morvik import _core
from morvik._arguments import (
    DEFAULT_ITERATIONS,
    algorithm_number,
    expect_block,
    integer,
    plain_array,
    thousandths,
)
from morvik._decoder import Decoder
from morvik._errors import Error
from morvik._link import Streams, bits_of, three_streams
from morvik._lte_arguments import (
    checked_gains,
    checked_matching,
    checked_ratios,
    checked_received,
    checked_transport_block_size,
    checked_version,
    checked_width,
    counted,
    finite,
    positive,
    rows_of,
    single,
    sums_of,
)

__all__ = [
    "CodeBlock",
    "CodeBlocks",
    "Received",
    "Transport",
    "crc24a",
    "crc24b",
    "deinterleave",
    "demap",
    "map",
    "rate_match",
    "rate_recover",
    "scale_of",
    "segment",
    "soft_values",
    "transmit",
]

_BITS_PER_SYMBOL = {"bpsk": 1, "qpsk": 2, "16qam": 4, "64qam": 6, "256qam": 8}
_DEMAPPERS = ("max-log", "exact")
_CHANNELS = ("awgn", "rayleigh", "block-rayleigh")
_CRC_BITS = 24
_FILLER = -128  # the core's strongest 0
_MOST = 2**32 - 1


class CodeBlocks(NamedTuple):
    """How a transport block is divided: 3GPP TS 36.212, clause 5.1.2. The first ``count_minus`` code blocks have
    ``size_minus`` bits, the others ``size_plus``."""

    number: int
    """Code blocks (C)."""
    fillers: int
    """Filler bits at the start of the first one (F)."""
    size_plus: int
    """Bits of a larger code block (K+)."""
    count_plus: int
    """How many there are (C+)."""
    size_minus: int
    """Bits of a smaller one (K-), or 0."""
    count_minus: int
    """How many there are (C-)."""


class CodeBlock(NamedTuple):
    """Where a code block of a transport block lies."""

    size: int
    """Its bits (K)."""
    fillers: int
    """Filler bits at its start."""
    payload: int
    """Bits of the transport block and its CRC that it carries."""
    payload_at: int
    """The first of them."""
    coded_bits: int
    """Its bits in a transmission (E)."""
    coded_at: int
    """The first of them."""
    buffer_size: int
    """Its values in the soft buffer."""
    buffer_at: int
    """The first of them."""


class Received(NamedTuple):
    """The result of :meth:`Transport.decode`. For n transport blocks, arrays have a leading dimension n."""

    bits: npt.NDArray[np.uint8]
    """Decisions on the transport block, each 0 or 1: uint8 of shape (A,) or (n, A)."""

    fits: npt.NDArray[np.bool_]
    """Whether all CRCs fit, of the transport block and its code blocks: bool of shape () or (n,)."""

    code_blocks_fit: npt.NDArray[np.bool_]
    """Whether the CRC of each code block fits: bool of shape (C,) or (n, C). A single one has that of the transport
    block."""


# ---- Single stages


def crc24a(bits: npt.ArrayLike) -> npt.NDArray[np.uint8]:
    """The 24 parity bits of transport blocks, gCRC24A of TS 36.212, clause 5.1.1: bits of shape (A,) or (n, A) give
    uint8 of shape (24,) or (n, 24). Over bits with their parity behind them, all are 0."""
    return _crc(bits, False)


def crc24b(bits: npt.ArrayLike) -> npt.NDArray[np.uint8]:
    """The same with gCRC24B, for the code blocks of a transport block that has several."""
    return _crc(bits, True)


def segment(transport_block_size: int) -> CodeBlocks:
    """How a transport block of so many bits, without their CRC, is divided into code blocks."""
    return CodeBlocks(*_core.segment(checked_transport_block_size(transport_block_size)))


def rate_match(
    streams: Streams | tuple[npt.ArrayLike, npt.ArrayLike, npt.ArrayLike],
    coded_bits: int,
    version: int = 0,
    *,
    fillers: int = 0,
    buffer_size: int | None = None,
) -> npt.NDArray[np.uint8]:
    """Rate matching of code blocks: 3GPP TS 36.212, clause 5.1.4.1.

    ``streams``
        What :func:`morvik.encode` returns.
    ``coded_bits``
        Bits to send of each block (E).
    ``version``
        Redundancy version, 0 to 3.
    ``fillers``
        Filler bits at the start of each block (F); they are not sent.
    ``buffer_size``
        Positions of the circular buffer (N_cb), its dummy and filler bits included; None for all.

    Returns uint8 of shape (E,) or (n, E).
    """
    arrays = [bits_of(name, stream) for name, stream in zip(Streams._fields, three_streams(streams))]
    positions = arrays[0].shape[-1]
    expect_block("streams", positions)
    matching = checked_matching(positions - 4, fillers, buffer_size)
    rows = [np.ascontiguousarray(array.reshape(-1, positions)) for array in arrays]
    count = integer("coded_bits", coded_bits, 0, _MOST)
    return _core.rate_match(matching, checked_version(version), rows, count).reshape(*arrays[0].shape[:-1], count)


def rate_recover(
    llrs: npt.ArrayLike,
    block_size: int,
    version: int = 0,
    *,
    fillers: int = 0,
    buffer_size: int | None = None,
    buffers: npt.NDArray[Any] | None = None,
    width: int | None = None,
) -> npt.NDArray[Any]:
    """Rate recovery of code blocks: adds the ratios of a transmission to soft buffers.

    ``llrs``
        Ratios of shape (E,) or (n, E); with ``width``, integers as :func:`soft_values` gives them.
    ``block_size``
        K.
    ``version``, ``fillers``, ``buffer_size``
        As for :func:`rate_match`.
    ``buffers``
        What earlier transmissions left; None before the first one. It is not changed.
    ``width``
        Bits of a soft buffer's values, 2 to 16: each sum is clipped to them. None adds in floating point.

    Returns the soft buffers, in the order of the circular buffer, without its dummy and filler bits: float32, or int16
    with ``width``.
    """
    matching = checked_matching(block_size, fillers, buffer_size)
    array = checked_received(llrs, width)
    received = rows_of(array)
    sums = sums_of(buffers, (*array.shape[:-1], _core.soft_buffer_size(matching)), array.dtype)
    if width is None:
        _core.rate_recover(matching, checked_version(version), received, sums)
    else:
        _core.rate_recover_integers(matching, checked_version(version), received, checked_width(width), sums)
    return sums.reshape(*array.shape[:-1], -1)


def deinterleave(
    buffers: npt.ArrayLike,
    block_size: int,
    *,
    fillers: int = 0,
    buffer_size: int | None = None,
    filler: float = _FILLER,
) -> Streams:
    """Puts the values of soft buffers into the three streams of a decoder.

    ``buffers``
        Soft values, int8, or ratios; of shape (S,) or (n, S), as from :func:`rate_recover`.
    ``filler``
        The value of filler bits in ``sys`` and ``par1``. Both sides know that they are 0.

    What was not sent and lies outside of the buffer becomes 0. Returns int8 or float32 of shape (K + 4,) or (n, K + 4).
    """
    matching = checked_matching(block_size, fillers, buffer_size)
    size = _core.soft_buffer_size(matching)
    array = plain_array("buffers", buffers)
    if array.dtype != np.int8:
        array = checked_ratios(array, "buffers")
    if array.shape[-1] != size:
        raise ValueError(f"buffers must have {size} values for each block, not {array.shape[-1]}")
    streams: list[npt.NDArray[Any]]
    if array.dtype == np.int8:
        streams = _core.deinterleave_integers(matching, rows_of(array), integer("filler", filler, -128, 127))
    else:
        streams = _core.deinterleave(matching, rows_of(array), single("filler", filler))
    return Streams(*(stream.reshape(*array.shape[:-1], -1) for stream in streams))


def scale_of(modulation: str, code_rate: float, *, algorithm: str | int = "scaled") -> float:
    """The scale of :func:`soft_values` that suits a modulation and a code rate, as measured (docs/scale.md). It is that of
    :func:`morvik.error_rate`.

    ``code_rate``
        Bits of a transport block for each coded bit that was sent, in all transmissions: above 0.
    ``algorithm``
        The decoder's algorithm.
    """
    number = integer("algorithm", algorithm_number(algorithm), 0, 2)
    return _core.ratio_scale(number, bits_per_symbol(modulation), positive("code_rate", code_rate))


def soft_values(llrs: npt.ArrayLike, scale: float, width: int = 8) -> npt.NDArray[Any]:
    """Turns log-likelihood ratios into soft values: scaled, rounded with halves away from 0, and clipped.

    ``llrs``
        Of any shape, finite.
    ``scale``
        The soft value for a ratio of 1, such as :func:`scale_of` returns.
    ``width``
        Bits of a soft value. 8 gives int8, what :meth:`morvik.Decoder.decode` takes; other widths, 2 to 16, give int16,
        for soft buffers of this width.
    """
    array = checked_ratios(llrs)
    factor = positive("scale", scale)
    flat = np.ascontiguousarray(array.reshape(-1))
    values: npt.NDArray[Any]
    if checked_width(width) == 8:
        values = _core.soft_values(flat, factor)
    else:
        values = _core.soft_integers(flat, factor, width)
    return values.reshape(array.shape)


# ---- Modulation


def map(bits: npt.ArrayLike, modulation: str = "qpsk") -> npt.NDArray[Any]:
    """Maps bits to symbols of mean energy 1: 3GPP TS 36.211, clauses 7.1.2 to 7.1.5.

    ``modulation``
        ``"qpsk"``, ``"16qam"``, ``"64qam"`` or ``"256qam"``, which give complex64; or ``"bpsk"`` of one dimension, which
        sends 1 as +1 and 0 as -1 and gives float32.
    """
    count = bits_per_symbol(modulation)
    array = bits_of("bits", bits)
    if array.shape[-1] % count != 0:
        raise ValueError(f"bits must be a multiple of the {count} of a {modulation} symbol, not {array.shape[-1]}")
    symbols = _core.map(count, np.ascontiguousarray(array.reshape(-1)))
    shape = (*array.shape[:-1], array.shape[-1] // count)
    return (symbols if count == 1 else symbols.view(np.complex64)).reshape(shape)


def demap(
    symbols: npt.ArrayLike,
    modulation: str,
    noise_variance: float,
    *,
    gains: npt.ArrayLike | None = None,
    demapper: str = "max-log",
) -> npt.NDArray[np.float32]:
    """The log-likelihood ratios of the bits of received symbols, gain * symbol + noise.

    ``symbols``
        Of any shape; complex, their phase already turned back, or real for ``"bpsk"``.
    ``modulation``
        As for :func:`map`.
    ``noise_variance``
        Of I and Q together (N0), above 0; the one dimension of BPSK has half of it. Where it differs, divide each
        symbol and its gain by the noise's deviation, and give 1.
    ``gains``
        The channel's amplitude at each symbol, at least 0, of the same shape; None: all are 1.
    ``demapper``
        ``"max-log"``, by the nearest points alone, or ``"exact"``, by all points.

    Returns float32, finite: the last dimension is longer by the bits of a symbol.
    """
    count = bits_per_symbol(modulation)
    array = plain_array("symbols", symbols)
    if array.dtype.kind not in ("iuf" if count == 1 else "iufc"):
        raise TypeError(f"symbols must be an array of {'real' if count == 1 else 'complex'} numbers, not {array.dtype}")
    if array.ndim == 0:
        raise ValueError("symbols must be an array, not a number")
    flat = finite("symbols", array, np.float32 if count == 1 else np.complex64).reshape(-1)
    if demapper not in _DEMAPPERS:
        raise ValueError(f"demapper must be one of {', '.join(_DEMAPPERS)}, not {demapper!r}")
    amplitudes = None if gains is None else checked_gains(gains, array.shape)
    llrs = _core.demap(
        count, _DEMAPPERS.index(demapper), flat.view(np.float32), amplitudes, positive("noise_variance", noise_variance)
    )
    return llrs.reshape(*array.shape[:-1], array.shape[-1] * count)


def transmit(
    bits: npt.ArrayLike,
    modulation: str,
    esn0_db: float,
    *,
    channel: str = "awgn",
    demapper: str = "max-log",
    rng: np.random.Generator | int | None = None,
) -> npt.NDArray[np.float32]:
    """Sends bits over a channel: :func:`map`, noise and fading, and :func:`demap`, in a fraction of the time that noise
    of NumPy takes.

    ``bits``
        Coded bits of shape (G,) or (n, G), as many transmissions.
    ``modulation``, ``demapper``
        As for :func:`map` and :func:`demap`.
    ``esn0_db``
        Es/N0 in dB, -50 to 50 in steps of 0.001.
    ``channel``
        White Gaussian noise, ``"awgn"``; with Rayleigh fading of each symbol, ``"rayleigh"``, or of each transmission,
        ``"block-rayleigh"``, which the receiver knows.
    ``rng``
        A NumPy generator, or the seed of a new one. All noise of a call follows from 64 bits that it takes from the
        generator, and is the same on every machine.

    Returns the log-likelihood ratios of the bits: float32 of the same shape.
    """
    count = bits_per_symbol(modulation)
    array = bits_of("bits", bits)
    if array.shape[-1] % count != 0:
        raise ValueError(f"bits must be a multiple of the {count} of a {modulation} symbol, not {array.shape[-1]}")
    for name, value, allowed in (("channel", channel, _CHANNELS), ("demapper", demapper, _DEMAPPERS)):
        if value not in allowed:
            raise ValueError(f"{name} must be one of {', '.join(allowed)}, not {value!r}")
    decibels = thousandths("esn0_db", esn0_db, -50, 50)
    seed = int.from_bytes(np.random.default_rng(rng).bytes(8), "little")
    rows = np.ascontiguousarray(rows_of(array))
    return _core.transmit_symbols(rows, count, channel, demapper, decibels, seed).reshape(array.shape)


def bits_per_symbol(modulation: str) -> int:
    """The bits of a symbol (Q_m)."""
    if modulation not in _BITS_PER_SYMBOL:
        raise ValueError(f"modulation must be one of {', '.join(_BITS_PER_SYMBOL)}, not {modulation!r}")
    return _BITS_PER_SYMBOL[modulation]


# ---- Transport blocks


class Transport:
    """A transmitter and receiver of transport blocks of one format.

    ``transport_block_size``
        Bits of a transport block, without its CRC (A).
    ``coded_bits``
        Bits of one transmission (G).
    ``modulation``
        As for :func:`map`.
    ``layers``
        1 to 4 (N_L).
    ``soft_buffer_size``
        Positions of the soft buffer for a transport block (N_IR); None for all.
    """

    def __init__(
        self,
        transport_block_size: int,
        coded_bits: int,
        modulation: str = "qpsk",
        *,
        layers: int = 1,
        soft_buffer_size: int | None = None,
    ) -> None:
        self._size = checked_transport_block_size(transport_block_size)
        self._coded_bits = integer("coded_bits", coded_bits, 1, _MOST)
        self._modulation = modulation
        self._code_blocks = segment(self._size)
        self._layers = integer("layers", layers, 1, 4)
        self._expect_symbols()
        positions = 0 if soft_buffer_size is None else integer("soft_buffer_size", soft_buffer_size, 1, _MOST)
        try:
            self._core = _core.Transport(
                self._size, self._coded_bits, bits_per_symbol(modulation), self._layers, positions
            )
        except Error as error:
            raise Error(
                f"{error} (transport_block_size={transport_block_size!r}, soft_buffer_size={soft_buffer_size!r})"
            ) from None

    def encode(self, bits: npt.ArrayLike, version: int = 0) -> npt.NDArray[np.uint8]:
        """The coded bits of one transmission with a redundancy version, 0 to 3: bits of shape (A,) or (n, A) give uint8
        of shape (G,) or (n, G)."""
        array = bits_of("bits", bits)
        self._expect_columns("bits", array, self._size)
        coded = self._core.encode(checked_version(version), np.ascontiguousarray(array.reshape(-1, self._size)))
        return coded.reshape(*array.shape[:-1], self._coded_bits)

    def recover(
        self,
        llrs: npt.ArrayLike,
        version: int = 0,
        buffers: npt.NDArray[Any] | None = None,
        *,
        width: int | None = None,
    ) -> npt.NDArray[Any]:
        """Adds the ratios of a transmission, of shape (G,) or (n, G), to soft buffers.

        ``buffers``
            What earlier transmissions left; None before the first one. It is not changed.
        ``width``
            Bits of a soft buffer's values, 2 to 16: ``llrs`` are then integers, as :func:`soft_values` gives them
            with this width, and each sum is clipped to it. None adds in floating point.

        Returns the soft buffers: float32, or int16 with ``width``.
        """
        array = checked_received(llrs, width)
        self._expect_columns("llrs", array, self._coded_bits)
        received = rows_of(array)
        sums = sums_of(buffers, (*array.shape[:-1], self._core.buffer_size), array.dtype)
        if width is None:
            self._core.recover(checked_version(version), received, sums)
        else:
            self._core.recover_integers(checked_version(version), received, checked_width(width), sums)
        return sums.reshape(*array.shape[:-1], -1)

    def soft_values(
        self, buffers: npt.ArrayLike, scale: float | None = None, *, algorithm: str | int = "scaled"
    ) -> list[Streams]:
        """The soft values of each code block, for :meth:`morvik.Decoder.decode`: int8 of shape (K + 4,) or (n, K + 4).

        ``buffers``
            What :meth:`recover` returns. Integers are only clipped.
        ``scale``
            The soft value for a ratio of 1; None is :func:`scale_of` one transmission and the algorithm.
        ``algorithm``
            The decoder's algorithm.
        """
        array = plain_array("buffers", buffers)
        are_integers = array.dtype == np.int16
        if are_integers and scale is not None:
            raise ValueError("scale must be None for buffers of integers, which were scaled before")
        if not are_integers:
            array = checked_ratios(array, "buffers")
        self._expect_columns("buffers", array, self._core.buffer_size)
        rows = rows_of(array)
        if scale is None:
            scale = scale_of(self._modulation, self._size / self._coded_bits, algorithm=algorithm)
        factor = positive("scale", scale)
        blocks = (
            self._core.soft_values_of_integers(r, rows) if are_integers else self._core.soft_values(r, rows, factor)
            for r in range(self._code_blocks.number)
        )
        return [Streams(*(stream.reshape(*array.shape[:-1], -1) for stream in streams)) for streams in blocks]

    def join(self, decisions: list[npt.NDArray[np.uint8]]) -> Received:
        """Puts the decisions on all code blocks together, each of shape (K,) or (n, K), and checks their CRCs."""
        if len(decisions) != self._code_blocks.number:
            raise ValueError(f"decisions must have {counted(self._code_blocks.number, 'code block')}, not {len(decisions)}")
        arrays = [bits_of("decisions", array) for array in decisions]
        shape = arrays[0].shape[:-1]
        bits = np.zeros((math.prod(shape), self._size + _CRC_BITS), np.uint8)
        fits = np.empty((self._code_blocks.number, len(bits)), np.uint8)
        for r, array in enumerate(arrays):
            self._expect_columns("decisions", array, self.code_block(r).size)
            if array.shape[:-1] != shape:
                raise ValueError("decisions must have as many blocks for each code block")
            fits[r] = self._core.join(r, np.ascontiguousarray(array.reshape(-1, array.shape[-1])), bits)
        every = self._core.check(bits) & fits.min(axis=0)
        return Received(
            bits[:, : self._size].reshape(*shape, self._size),
            every.astype(np.bool_).reshape(shape),
            fits.T.astype(np.bool_).reshape(*shape, -1),
        )

    def decode(
        self,
        decoder: Decoder,
        buffers: npt.ArrayLike,
        iterations: int = DEFAULT_ITERATIONS,
        *,
        scale: float | None = None,
    ) -> Received:
        """Decodes soft buffers: :meth:`soft_values`, the decoder for all code blocks of one size at once, and
        :meth:`join`."""
        blocks = self.soft_values(buffers, scale, algorithm=decoder.algorithm)
        shape = blocks[0].sys.shape[:-1]
        decisions: list[npt.NDArray[np.uint8]] = []
        sizes = (self._code_blocks.size_minus, self._code_blocks.size_plus)
        for size, count in zip(sizes, (self._code_blocks.count_minus, self._code_blocks.count_plus)):
            alike = [block for block in blocks if block.sys.shape[-1] == size + 4]
            if count > 0:
                sys, par1, par2 = (np.concatenate([block[s].reshape(-1, size + 4) for block in alike]) for s in range(3))
                bits = decoder.decode(sys, par1, par2, iterations).bits
                decisions += list(bits.reshape(count, *shape, size))
        return self.join(decisions)

    @property
    def transport_block_size(self) -> int:
        """Bits of a transport block, without its CRC (A)."""
        return self._size

    @property
    def coded_bits(self) -> int:
        """Bits of one transmission (G)."""
        return self._coded_bits

    @property
    def modulation(self) -> str:
        """The modulation."""
        return self._modulation

    @property
    def code_blocks(self) -> CodeBlocks:
        """How a transport block is divided."""
        return self._code_blocks

    def code_block(self, r: int) -> CodeBlock:
        """Where code block r lies, 0 and up."""
        return CodeBlock(*self._core.code_block(integer("r", r, 0, self._code_blocks.number - 1)))

    def __repr__(self) -> str:
        return f"morvik.lte.Transport({self._size}, {self._coded_bits}, {self._modulation!r})"

    def _expect_symbols(self) -> None:
        symbol = bits_per_symbol(self._modulation) * self._layers
        least = symbol * self._code_blocks.number
        if self._coded_bits % symbol != 0 or self._coded_bits < least:
            below = max(self._coded_bits // symbol * symbol, least)
            raise ValueError(
                f"coded_bits must be a multiple of the {symbol} bits of a symbol, at least {least} for "
                f"{counted(self._code_blocks.number, 'code block')}, not {self._coded_bits}; {below} would fit"
            )

    @staticmethod
    def _expect_columns(name: str, array: npt.NDArray[Any], columns: int) -> None:
        if array.shape[-1] != columns:
            raise ValueError(f"{name} must have {columns} values for each block, not {array.shape[-1]}")


def _crc(bits: npt.ArrayLike, is_of_code_block: bool) -> npt.NDArray[np.uint8]:
    array = bits_of("bits", bits)
    parity = _core.crc(np.ascontiguousarray(rows_of(array)), is_of_code_block)
    return parity.reshape(*array.shape[:-1], _CRC_BITS)
