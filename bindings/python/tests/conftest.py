"""Fixtures shared by the tests."""

from pathlib import Path

import morvik
import numpy as np
import pytest

REPOSITORY = Path(__file__).resolve().parents[3]


@pytest.fixture(scope="session")
def repository() -> Path:
    return REPOSITORY


@pytest.fixture
def soft() -> morvik.Streams:
    """Noisy blocks of 40 bits, some of which keep bit errors: int8 of shape (100, 44)."""
    rng = np.random.default_rng(1)
    return morvik.awgn(morvik.encode(rng.integers(0, 2, (100, 40))), 1.0, rng=rng)


@pytest.fixture
def decoder() -> morvik.Decoder:
    return morvik.Decoder()
