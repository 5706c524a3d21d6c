"""The extension module that the package is written on. It checks types alone; the package checks the rest."""

from collections.abc import Callable, Sequence
from typing import Any, TypeVar

import numpy as np
import numpy.typing as npt

_Soft = TypeVar("_Soft", np.int8, np.int16, np.int32)

__version__: str
block_sizes: tuple[int, ...]
instruction_sets: tuple[str, ...]
default_num_pu: int
most_coded_bits: int
default_algorithm: int
default_tag_width: int

class Error(ValueError): ...

class Decoder:
    def __init__(self, num_pu: int, algorithm: int, tag_width: int, instruction_set: str) -> None: ...
    def decode(
        self,
        sys: npt.NDArray[_Soft],
        par1: npt.NDArray[_Soft],
        par2: npt.NDArray[_Soft],
        iterations: int,
        tags: npt.NDArray[np.uint32],
        wants_ratios: bool,
        threads: int,
    ) -> tuple[
        int, str, list[str], npt.NDArray[np.uint8], npt.NDArray[np.uint32], npt.NDArray[np.int16] | None
    ]: ...
    def close(self) -> None: ...
    @property
    def closed(self) -> bool: ...
    @property
    def instruction_set(self) -> str: ...

signals: tuple[str, ...]

class Checker:
    def __init__(self, num_pu: int, algorithm: int, count_situations: bool) -> None: ...
    def start(
        self, sys: npt.NDArray[np.int32], par1: npt.NDArray[np.int32], par2: npt.NDArray[np.int32], iterations: int
    ) -> list[str]: ...
    def observe(
        self, signal: int, half_iteration: int, step: int, values: Sequence[int | None]
    ) -> tuple[bool, str]: ...
    def value(self, signal: int, half_iteration: int, step: int) -> int | None: ...
    def values(self, signal: int, half_iterations: int) -> npt.NDArray[np.int16]: ...
    def seen(self, signal: int) -> tuple[int, int]: ...
    def standing(self) -> int: ...
    def report(self) -> str: ...
    def situations(self) -> str: ...

def unit(name: str, algorithm: int, inputs: npt.NDArray[np.int32]) -> npt.NDArray[np.int16]: ...
def expect_main_interpreter() -> None: ...
def interleaver(block_size: int) -> npt.NDArray[np.int64]: ...
def encode(bits: npt.NDArray[np.uint8]) -> tuple[npt.NDArray[np.uint8], ...]: ...
def transmit(
    streams: Sequence[npt.NDArray[np.uint8]], milli_decibels: int, scale: float, seed: int
) -> tuple[npt.NDArray[np.int8], ...]: ...
def default_scale(algorithm: int, block_size: int, milli_decibels: int) -> float: ...

def crc(bits: npt.NDArray[np.uint8], is_of_code_block: bool) -> npt.NDArray[np.uint8]: ...
def segment(transport_block_size: int) -> tuple[int, ...]: ...
def rate_match(
    matching: Sequence[int], version: int, streams: Sequence[npt.NDArray[np.uint8]], count: int
) -> npt.NDArray[np.uint8]: ...
def soft_buffer_size(matching: Sequence[int]) -> int: ...
def rate_recover(
    matching: Sequence[int], version: int, ratios: npt.NDArray[np.float32], buffers: npt.NDArray[np.float32]
) -> None: ...
def rate_recover_integers(
    matching: Sequence[int],
    version: int,
    ratios: npt.NDArray[np.int16],
    width: int,
    buffers: npt.NDArray[np.int16],
) -> None: ...
def deinterleave(
    matching: Sequence[int], buffers: npt.NDArray[np.float32], filler: float
) -> list[npt.NDArray[Any]]: ...
def deinterleave_integers(
    matching: Sequence[int], buffers: npt.NDArray[np.int8], filler: int
) -> list[npt.NDArray[Any]]: ...
def soft_values(ratios: npt.NDArray[np.float32], scale: float) -> npt.NDArray[np.int8]: ...
def soft_integers(ratios: npt.NDArray[np.float32], scale: float, width: int) -> npt.NDArray[np.int16]: ...
def ratio_scale(algorithm: int, bits_per_symbol: int, code_rate: float) -> float: ...
def map(bits_per_symbol: int, bits: npt.NDArray[np.uint8]) -> npt.NDArray[np.float32]: ...
def demap(
    bits_per_symbol: int,
    demapper: int,
    symbols: npt.NDArray[np.float32],
    gains: npt.NDArray[np.float32] | None,
    noise_variance: float,
) -> npt.NDArray[np.float32]: ...

def transmit_symbols(
    bits: npt.NDArray[np.uint8], bits_per_symbol: int, channel: str, demapper: str, milli_decibels: int, seed: int
) -> npt.NDArray[np.float32]: ...

class Transport:
    def __init__(
        self, size: int, coded_bits: int, bits_per_symbol: int, layers: int, soft_buffer_size: int
    ) -> None: ...
    @property
    def buffer_size(self) -> int: ...
    def code_block(self, r: int) -> tuple[int, ...]: ...
    def encode(self, version: int, bits: npt.NDArray[np.uint8]) -> npt.NDArray[np.uint8]: ...
    def recover(
        self, version: int, ratios: npt.NDArray[np.float32], buffers: npt.NDArray[np.float32]
    ) -> None: ...
    def recover_integers(
        self, version: int, ratios: npt.NDArray[np.int16], width: int, buffers: npt.NDArray[np.int16]
    ) -> None: ...
    def soft_values(
        self, r: int, buffers: npt.NDArray[np.float32], scale: float
    ) -> list[npt.NDArray[Any]]: ...
    def soft_values_of_integers(self, r: int, buffers: npt.NDArray[np.int16]) -> list[npt.NDArray[Any]]: ...
    def join(
        self, r: int, decisions: npt.NDArray[np.uint8], bits: npt.NDArray[np.uint8]
    ) -> npt.NDArray[np.uint8]: ...
    def check(self, bits: npt.NDArray[np.uint8]) -> npt.NDArray[np.uint8]: ...

class Sweep:
    def __init__(self) -> None: ...
    block_sizes: list[int]
    num_pus: list[int]
    algorithms: list[int]
    milli_scales: list[int | None]
    iterations: list[int]
    milli_decibels: list[int]
    is_over_esn0: bool

class LinkOptions:
    def __init__(self) -> None: ...
    transport_block_sizes: list[int]
    coded_bits: list[int]
    code_rates: list[int]
    mcs_indices: list[int]
    resource_blocks: int | None
    resource_elements: int | None
    versions: list[int]
    soft_buffer_bits: int | None
    soft_buffer_size: int | None
    stops_early: bool | None
    def set_names(self, modulations: list[str], channel: str, demapper: str, mcs_table: str) -> None: ...

class StopRules:
    def __init__(self) -> None: ...
    block_errors: int | None
    bit_errors: int | None
    max_blocks: int | None
    max_seconds: float | None
    stop_bler: float

def error_rate(
    sweep: Sweep,
    link: LinkOptions,
    rules: StopRules,
    frames: tuple[int, int] | None,
    each_iteration: bool,
    seed: int,
    threads: int,
    instruction_set: str,
    progress: Callable[[list[dict[str, Any]]], object],
    warn: Callable[[str], object],
) -> list[dict[str, Any]]: ...
