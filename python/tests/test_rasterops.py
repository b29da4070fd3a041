"""kubo.complex_to_real and kubo.fill_margins against numpy."""

from __future__ import annotations

import numpy as np
import pytest

import kubo

INTERPRETATIONS = {
    "real": np.real, "imaginary": np.imag, "amplitude": np.abs, "phase": np.angle,
    "intensity": lambda z: np.abs(z) ** 2, "db": lambda z: 10 * np.log10(np.abs(z) ** 2)}


@pytest.mark.parametrize("name", INTERPRETATIONS)
@pytest.mark.parametrize("sample_type", ["C64R", "C32R", "C16S", "C8U", "C64U"])
def test_every_interpretation_of_every_kind_of_complex_array(rng, name, sample_type, small_pieces):
    kind = kubo.DataType(sample_type)
    parts = rng.integers(1, 100, size=(2, 3, 5, 2)).astype(kind.component_dtype)
    array = parts if kind.dtype is None else parts.view(kind.dtype)[..., 0]
    values = parts[..., 0].astype(float) + 1j * parts[..., 1].astype(float)
    result = kubo.complex_to_real(array[:, ::2], name, sample_type=sample_type)
    assert result.dtype == np.float32 and result.shape == (2, 2, 5)
    np.testing.assert_allclose(result, INTERPRETATIONS[name](values[:, ::2]), rtol=1e-6)


def test_only_complex_samples_and_known_names_are_taken():
    with pytest.raises(TypeError, match="complex"):
        kubo.complex_to_real(np.zeros(3, np.float32))
    with pytest.raises(ValueError, match="interpretation"):
        kubo.complex_to_real(np.zeros(3, np.complex64), "norm")


@pytest.mark.parametrize("behaviour, mode", [("mirror", "symmetric"), ("wrap", "wrap"),
                                             ("zero", "constant")])
@pytest.mark.parametrize("dtype, channels", [(np.uint8, ()), (np.float64, (3,)),
                                             (np.complex64, ())])
def test_all_bands_pad_like_numpy(rng, behaviour, mode, dtype, channels):
    image = (rng.integers(1, 200, size=(4, 5) + channels)).astype(dtype)
    padding = ((2, 2), (1, 1)) + ((0, 0),) * len(channels)
    padded = np.pad(image, padding, mode="constant", constant_values=99)
    kubo.fill_margins(padded, (1, 2), behaviour)
    np.testing.assert_array_equal(padded, np.pad(image, padding, mode=mode))


def test_some_bands_leave_the_others_alone():
    padded = np.pad(np.arange(6, dtype=np.int16).reshape(2, 3), 1, constant_values=-1)
    kubo.fill_margins(padded, 1, "wrap", ["left", "right"])
    # The side bands run the full height, corners included; the top row stays as it was.
    assert padded[1].tolist() == [2, 0, 1, 2, 0] and (padded[0, 1:4] == -1).all()


@pytest.mark.parametrize("array, margin, error", [
    (np.zeros((4, 4))[:, ::2], 1, ValueError), (np.zeros((4, 4)), 3, ValueError),
    (np.zeros(4), 1, ValueError), (np.zeros((4, 4), bool), 1, TypeError)])
def test_bad_margins_and_arrays_are_refused(array, margin, error):
    with pytest.raises(error):
        kubo.fill_margins(array, margin)


def test_read_only_arrays_and_unknown_names_are_refused():
    array = np.zeros((4, 4))
    array.setflags(write=False)
    with pytest.raises(ValueError, match="read-only"):
        kubo.fill_margins(array, 1)
    with pytest.raises(ValueError, match="behaviour"):
        kubo.fill_margins(np.zeros((4, 4)), 1, "reflect")
    with pytest.raises(ValueError, match="bands"):
        kubo.fill_margins(np.zeros((4, 4)), 1, "zero", ["middle"])
