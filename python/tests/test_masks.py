"""kubo.validity_mask against a numpy expression of the no-data rules."""

from __future__ import annotations

from concurrent.futures import ThreadPoolExecutor

import numpy as np
import pytest
from hypothesis import given, settings
from hypothesis import strategies as st

import kubo


def reference_flags(image: np.ndarray, nodata, rule: str, channels=None) -> np.ndarray:
    """True where valid: the rule over the tested channels, written with numpy."""
    samples = image if image.ndim == 3 else image[..., None]
    if np.iscomplexobj(samples):
        samples = np.stack([samples.real, samples.imag], axis=-1).reshape(*samples.shape[:2], -1)
        values = np.repeat(np.broadcast_to(nodata, samples.shape[2] // 2).astype(float), 2)
        values[1::2] = 0
        rule = "pairs" if rule == "any" else rule
    else:
        values = np.broadcast_to(np.asarray(nodata, float), samples.shape[2])
    equal = samples == values.astype(samples.dtype)
    tested = list(range(samples.shape[2])) if channels is None else channels
    if rule == "all":
        return ~equal[..., tested].all(axis=-1)
    if rule == "any":
        return ~equal[..., tested].any(axis=-1)
    pairs = equal[..., 0::2] & equal[..., 1::2]
    return ~pairs.any(axis=-1)


@settings(max_examples=60, deadline=None)
@given(rows=st.integers(1, 12), columns=st.integers(1, 40), channels=st.integers(1, 4),
       rule=st.sampled_from(["all", "any", "pairs"]),
       dtype=st.sampled_from([np.uint8, np.int16, np.uint32, np.float32, np.float64, np.int64]),
       seed=st.integers(0, 2**32 - 1))
def test_packed_and_boolean_masks_follow_the_rule(rows, columns, channels, rule, dtype, seed):
    rng = np.random.default_rng(seed)
    channels = channels + (channels % 2 if rule == "pairs" else 0)  # pairs of channels
    image = rng.integers(0, 3, size=(rows, columns, channels)).astype(dtype)
    flags = reference_flags(image, 1, rule)
    packed = kubo.validity_mask(image, 1, rule)
    assert packed.dtype == np.uint8 and packed.shape == (rows, (columns + 7) // 8)
    np.testing.assert_array_equal(packed, np.packbits(flags, axis=-1))
    np.testing.assert_array_equal(kubo.validity_mask(image, 1, rule, packed=False), flags)


@pytest.mark.parametrize("view", [
    lambda a: a, lambda a: a[1:-1, 3:-2], lambda a: a[::2], lambda a: a[:, ::3],
    lambda a: a[::-1], lambda a: np.asfortranarray(a)])
def test_views_bands_and_row_pieces_match_the_contiguous_mask(rng, small_pieces, view):
    image = view(rng.integers(0, 2, size=(9, 37, 3)).astype(np.uint16))
    for rule in ("all", "any"):
        flags = reference_flags(image, 0, rule)
        np.testing.assert_array_equal(kubo.validity_mask(image, 0, rule),
                                      np.packbits(flags, axis=-1))
        np.testing.assert_array_equal(kubo.validity_mask(image, 0, rule, packed=False), flags)


def test_wide_rows_are_packed_in_pieces_that_start_on_bytes(rng):
    image = rng.integers(0, 2, size=(2, 70001)).astype(np.uint8)
    np.testing.assert_array_equal(kubo.validity_mask(image, 0), np.packbits(image != 0, axis=-1))


def test_channel_lists_values_and_conversions_of_nodata():
    image = np.array([[[1, 9, 1], [1, 8, 1], [0, 0, 0], [0, 5, 7]]], np.uint8)
    assert kubo.validity_mask(image, 9, "all", channels=[1], packed=False).tolist() == [
        [False, True, True, True]]
    assert kubo.validity_mask(image, [0, 0, 0], "all", packed=False).tolist() == [
        [True, True, False, True]]
    assert kubo.validity_mask(image, 0, "any", packed=False).tolist() == [
        [True, True, False, False]]
    assert kubo.validity_mask(image, 0, channels=[], packed=False).all()
    assert not kubo.validity_mask(np.full((2, 2), 255, np.uint8), -1.0, packed=False).any()
    assert kubo.validity_mask(np.full((1, 3), np.nan), np.nan, packed=False).all()


def test_complex_channels_test_the_imaginary_part_against_zero():
    image = np.array([[3 + 0j, 3 + 1j, 0 + 0j]], np.complex64)
    expected = [[False, True, True]]
    assert kubo.validity_mask(image, 3.0, "any", packed=False).tolist() == expected
    pairs = np.stack([image.real, image.imag], -1).astype(np.int16)
    assert kubo.validity_mask(pairs, 3, "any", packed=False,
                              sample_type="C16S").tolist() == expected


def test_odd_pairs_in_a_strided_view_pair_as_in_a_contiguous_copy():
    image = np.zeros((4, 6, 3), np.uint8)
    image[1, 1] = [7, 7, 7]
    view = image[:, :5]
    np.testing.assert_array_equal(kubo.validity_mask(view, 0, "pairs"),
                                  kubo.validity_mask(view.copy(), 0, "pairs"))


@pytest.mark.parametrize("call, error, text", [
    (lambda: kubo.validity_mask(np.zeros(5), 0), ValueError, "dimensions"),
    (lambda: kubo.validity_mask(np.zeros((2, 2)), 0, "some"), ValueError, "rule"),
    (lambda: kubo.validity_mask(np.zeros((2, 2, 3)), [0, 1]), ValueError, "per channel"),
    (lambda: kubo.validity_mask(np.zeros((2, 2, 3)), 0, channels=[3]), ValueError, "channel 3"),
    (lambda: kubo.validity_mask(np.zeros((2, 2)), "0"), TypeError, "nodata"),
    (lambda: kubo.validity_mask(np.zeros((2, 2), "U1"), 0), TypeError, "array"),
])
def test_bad_arguments_name_what_is_wrong(call, error, text):
    with pytest.raises(error, match=text):
        call()


@pytest.mark.large
def test_a_mask_of_more_than_4294967295_pixels_is_built_in_bands():
    image = np.ones((65600, 65600), np.uint8)
    image[-1, -1] = 0
    mask = kubo.validity_mask(image, 0)
    assert mask.shape == (65600, 8200) and mask[-1, -1] == 0xFE and mask[0, 0] == 0xFF


def test_masks_built_from_several_threads_at_once_are_each_right(rng):
    images = [rng.integers(0, 2, size=(300, 301)).astype(np.int32) for _ in range(8)]

    def work(image):
        return np.array_equal(kubo.validity_mask(image, 0), np.packbits(image != 0, axis=-1))

    with ThreadPoolExecutor(4) as pool:
        assert all(pool.map(work, images * 4))
