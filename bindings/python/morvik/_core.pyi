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

def expect_main_interpreter() -> None: ...
def interleaver(block_size: int) -> npt.NDArray[np.int64]: ...
def encode(bits: npt.NDArray[np.uint8]) -> tuple[npt.NDArray[np.uint8], ...]: ...
def transmit(
    streams: Sequence[npt.NDArray[np.uint8]], milli_decibels: int, scale: float, seed: int
) -> tuple[npt.NDArray[np.int8], ...]: ...
def default_scale(algorithm: int, block_size: int, milli_decibels: int) -> float: ...

class Sweep:
    def __init__(self) -> None: ...
    block_sizes: list[int]
    num_pus: list[int]
    algorithms: list[int]
    milli_scales: list[int | None]
    iterations: list[int]
    milli_decibels: list[int]

class StopRules:
    def __init__(self) -> None: ...
    block_errors: int | None
    bit_errors: int | None
    max_blocks: int | None
    max_seconds: float | None
    stop_bler: float

def error_rate(
    sweep: Sweep,
    rules: StopRules,
    each_iteration: bool,
    seed: int,
    threads: int,
    instruction_set: str,
    progress: Callable[[list[dict[str, Any]]], object],
) -> list[dict[str, Any]]: ...
