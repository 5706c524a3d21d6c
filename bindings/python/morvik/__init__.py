"""A bit-accurate model of a hardware turbo decoder for the 3GPP LTE turbo code (3GPP TS 36.212).

>>> import morvik, numpy
>>> rng = numpy.random.default_rng(1)
>>> bits = rng.integers(0, 2, (1000, 512))
>>> soft = morvik.awgn(morvik.encode(bits), ebn0_db=1.5, rng=rng)
>>> with morvik.Decoder(num_pu=4) as decoder:
...     decoded = decoder.decode(*soft, iterations=8)
>>> int((decoded.bits != bits).any(axis=1).sum())  # wrong blocks
0

docs/python.md tells the rest.
"""

from morvik import _core

_core.expect_main_interpreter()  # an import does not check this again for a module that is already loaded

from morvik import lte, units
from morvik._checker import Checker
from morvik._core import __version__
from morvik._decoder import Decoded, Decoder, instruction_sets
from morvik._errors import DecoderWarning, Difference, Error, SimulationWarning
from morvik._link import Streams, awgn, block_sizes, encode, interleaver
from morvik._simulation import error_rate

__all__ = [
    "Checker",
    "Decoded",
    "Decoder",
    "DecoderWarning",
    "Difference",
    "Error",
    "SimulationWarning",
    "Streams",
    "__version__",
    "awgn",
    "block_sizes",
    "encode",
    "error_rate",
    "instruction_sets",
    "interleaver",
    "lte",
    "units",
]
