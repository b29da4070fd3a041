"""Shared fixtures of the kubo module's tests."""

from __future__ import annotations

from collections.abc import Iterator

import numpy as np
import pytest
from hypothesis import settings

import kubo
from kubo import _kubo

REAL_DTYPES = [np.int8, np.uint8, np.int16, np.uint16, np.int32, np.uint32,
               np.float32, np.float64, np.int64, np.uint64]


# No example database: runs leave nothing behind in the checkout.
settings.register_profile("kubo", database=None, deadline=None)
settings.load_profile("kubo")


def pytest_configure(config: pytest.Config) -> None:
    config.addinivalue_line("markers", "large: needs about 9 GiB of memory")


@pytest.fixture
def rng() -> np.random.Generator:
    return np.random.default_rng(20261121)


@pytest.fixture
def small_pieces() -> Iterator[None]:
    """Lets every library call take only a few samples, to test the cutting into pieces."""
    previous = _kubo._set_piece_limit(7)
    yield
    _kubo._set_piece_limit(previous)


def random_samples(rng: np.random.Generator, dtype: type, shape: tuple[int, ...]) -> np.ndarray:
    """Values over the whole range of an integer dtype, or wide floats with specials."""
    if np.issubdtype(dtype, np.integer):
        info = np.iinfo(dtype)
        return rng.integers(info.min, info.max, size=shape, dtype=dtype, endpoint=True)
    values = rng.normal(0, 1, size=shape) * 10.0 ** rng.integers(-2, 21, size=shape)
    return values.astype(dtype)


def assert_raises_error(kind: type, call, message: str) -> kubo.Error:
    """Checks that a library failure carries its details."""
    with pytest.raises(kind) as caught:
        call()
    error = caught.value
    assert error.message == message == str(error)
    assert error.source.startswith("vrkframework/")
    assert "__cdecl" in error.function
    assert isinstance(error.line, int)
    return error
