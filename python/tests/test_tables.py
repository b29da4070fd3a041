"""kubo.LUT and kubo.PCT applied to arrays, against numpy interpolation."""

from __future__ import annotations

import numpy as np
import pytest
from conftest import REAL_DTYPES, assert_raises_error

import kubo


@pytest.mark.parametrize("dtype", REAL_DTYPES, ids=lambda t: np.dtype(t).name)
def test_lut_interpolates_and_clamps_over_whole_arrays(rng, dtype):
    inputs = np.array([-50.0, 0.0, 10.0, 120.0, 121.0, 255.0])
    outputs = rng.normal(size=inputs.size) * 100
    lut = kubo.LUT(list(zip(inputs[::-1], outputs[::-1])))  # sorted on construction
    values = rng.integers(0, 127, size=(3, 40)).astype(dtype)[:, ::3]
    expected = np.interp(values.astype(float), inputs, outputs)
    np.testing.assert_allclose(lut(values), expected, rtol=1e-12)
    assert lut(np.float64(5.0)) == pytest.approx(np.interp(5.0, inputs, outputs))
    assert lut.entries[0] == (-50.0, outputs[0]) and len(lut) == 6
    assert lut.input_range == (-50.0, 255.0) and not lut.is_classic


def test_pct_interpolates_each_component_and_truncates(rng):
    pct = kubo.PCT([(0.0, (0, 0, 0)), (10.0, (255, 100, 7)), (20.0, (100, 0, 0))])
    values = np.array([[-1.0, 5.0, 11.0, 15.0, 25.0]])
    colours = pct(values)
    assert colours.shape == (1, 5, 3) and colours.dtype == np.uint8
    assert colours[0].tolist() == [[0, 0, 0], [127, 50, 3], [239, 90, 6], [177, 50, 3],
                                   [100, 0, 0]]
    assert pct(5) == (127, 50, 3) and pct.value_by_index(99) == (100, 0, 0)


def test_classic_tables_and_their_failures():
    assert kubo.LUT.classic(bytes(range(256))).is_classic
    assert kubo.PCT.classic(np.zeros((256, 3), np.uint8)).is_classic
    assert_raises_error(kubo.DataError, lambda: kubo.LUT.classic(b"\0" * 255),
                        "LUT must have 256 entries, 255 given.")
    error = assert_raises_error(kubo.ParameterError, lambda: kubo.PCT([(0.0, (1, 2, 3))]), "desc")
    assert (error.parameter, error.kind, error.received, error.expected) == (
        "PCT", 8, "A 1 PCT entries", "At least 2 PCT entries")
    with pytest.raises(TypeError):
        kubo.LUT([(0, 0), (1, 1)])(np.zeros(2, np.complex64))
