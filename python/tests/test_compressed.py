"""The three compressed forms: round trips, windows that are slices, the library's raw windows."""

from __future__ import annotations

import gc

import numpy as np
import pytest
from hypothesis import given, settings
from hypothesis import strategies as st

import kubo

IMAGE_FORMS = [kubo.RLECompressedData, kubo.BitwiseRLECompressedData]


def mask_like(rng: np.random.Generator, shape: tuple[int, ...], dtype=np.uint8) -> np.ndarray:
    """Long runs with a few holes, and a last block of rows that is all one value."""
    image = np.repeat(rng.integers(0, 3, size=(shape[0], 1) + shape[2:]), shape[1], axis=1)
    image[rng.random(shape) < 0.1] = 7
    image[-2:] = 0
    return image.astype(dtype)


@pytest.mark.parametrize("form", IMAGE_FORMS)
@pytest.mark.parametrize("dtype, shape, sample_type", [
    (np.uint8, (13, 300), None), (np.int16, (5, 7, 3), None), (np.float64, (4, 9), None),
    (np.complex64, (6, 5), None), (np.int32, (4, 5, 2), "C32S")])
def test_images_round_trip_whole_and_by_window(rng, form, dtype, shape, sample_type):
    image = mask_like(rng, shape, dtype)
    data = form(image, sample_type)
    assert data.shape == image.shape and data.dtype == image.dtype
    np.testing.assert_array_equal(data.decode(), image)
    for window in [(0, 0, shape[1], shape[0]), (1, 1, 2, 3), (shape[1] - 1, 2, 1, 2),
                   kubo.Tile(2, 0, 3, 1), (0, shape[0] - 1, shape[1], 1), (3, 2, 0, 0)]:
        x, y, w, h = window
        np.testing.assert_array_equal(data.decode(window), image[y:y + h, x:x + w])
    assert bytes(data) == bytes(memoryview(data)) and len(bytes(data)) == data.compressed_size


@settings(max_examples=80, deadline=None)
@given(seed=st.integers(0, 2**32 - 1), rows=st.integers(1, 9), columns=st.integers(1, 300),
       form=st.sampled_from(["rle", "bits", "lines"]), data=st.data())
def test_random_windows_are_slices(seed, rows, columns, form, data):
    image = mask_like(np.random.default_rng(seed), (rows, columns))
    x = data.draw(st.integers(0, columns - 1))
    y = data.draw(st.integers(0, rows - 1))
    w = data.draw(st.integers(1, columns - x))
    h = data.draw(st.integers(1, rows - y))
    if form == "lines":
        compressed, expected = kubo.LineRLECompressedBitMask(image), image != 0
    else:
        cls = kubo.RLECompressedData if form == "rle" else kubo.BitwiseRLECompressedData
        compressed, expected = cls(image), image
    np.testing.assert_array_equal(compressed.decode((x, y, w, h)), expected[y:y + h, x:x + w])


def running_total_window(pairs: bytes, line: int, x: int, y: int, w: int, h: int) -> list[int]:
    """The byte form's documented window rule, step by step."""
    counts, values = pairs[0::2], pairs[1::2]
    p, total, start, out = 0, 0, y * line + x, []
    for _ in range(h):
        while total <= start:
            total += counts[p]
            p += 1
        p -= 1
        remaining, value = total - start, values[p]
        total -= counts[p]
        for _ in range(w):
            if remaining == 0:
                p += 1
                remaining, value = counts[p], values[p]
                total += counts[p]
            out.append(value)
            remaining -= 1
        start += line
    return out


def test_rle_pairs_and_its_raw_window_rule():
    image = np.array([[1, 1, 2, 2, 2, 3], [3, 3, 3, 3, 4, 4], [4, 5, 5, 5, 5, 5]], np.uint8)
    data = kubo.RLECompressedData(image)
    assert bytes(data) == bytes([2, 1, 3, 2, 5, 3, 3, 4, 5, 5])
    shifted = 0
    for x, y, w, h in [(1, 0, 5, 2), (0, 0, 6, 2), (0, 1, 3, 1), (1, 1, 4, 1), (4, 0, 2, 2)]:
        raw = data.decode_window_raw(x, y, w, h).tolist()
        assert raw == running_total_window(bytes(data), 6, x, y, w, h)
        shifted += raw != image[y:y + h, x:x + w].ravel().tolist()
        np.testing.assert_array_equal(data.decode((x, y, w, h)), image[y:y + h, x:x + w])
    assert shifted >= 1  # the rule really differs from a slice


def test_rle_windows_read_in_pieces(rng, small_pieces):
    image = mask_like(rng, (5, 11, 3), np.uint16)
    data = kubo.RLECompressedData(image)
    np.testing.assert_array_equal(data.decode((2, 1, 7, 3)), image[1:4, 2:9])


def test_bit_runs_raw_windows_fail_in_the_last_run_where_the_module_fills():
    image = np.zeros((4, 3), np.uint8)
    image[0] = 0xFF
    data = kubo.BitwiseRLECompressedData(image)
    assert bytes(data) == bytes([0, 24, 72])
    with pytest.raises(kubo.DataError, match="Uncompressed index not found"):
        data.decode_window_raw(0, 2, 1, 1)
    np.testing.assert_array_equal(data.decode((0, 1, 3, 3)), image[1:])
    with pytest.raises(kubo.OutOfBoundsError) as caught:
        data.decode_window_raw(1, 0, 3, 1)
    assert caught.value.values == (1, 0, 3, 3)


def test_bit_runs_raw_windows_count_bytes_for_wider_pixels():
    image = np.arange(12, dtype=np.uint16).reshape(2, 6)
    data = kubo.BitwiseRLECompressedData(image)
    raw = data.decode_window_raw(1, 1, 2, 1)  # bytes 1 and 2 of row 1
    assert raw.tobytes() == image[1].tobytes()[1:3]
    np.testing.assert_array_equal(data.decode((1, 1, 2, 1)), image[1:, 1:3])


def test_row_masks_decode_replace_and_read_rows_unchecked():
    image = np.array([[0, 0, 7, 7, 0], [9, 9, 9, 9, 9]], np.uint8)
    mask = kubo.LineRLECompressedBitMask(image[:, ::1])
    assert mask.compressed_row(0) == bytes([2, 2, 1]) and mask.row_sizes.tolist() == [3, 2]
    assert bytes(mask) == bytes([2, 2, 1, 0, 5]) and mask.shape == (2, 5)
    mask.replace_row(1, np.array([True, False, False, False, True]))
    np.testing.assert_array_equal(mask.decode_row(1), [1, 0, 0, 0, 1])
    # Pixels past a row's runs, and rows past the last, read as clear.
    assert mask.decode_window_raw(3, 0, 4, 1).tolist() == [1, 0, 0, 0]
    assert mask.decode_window_raw(0, 1, 6, 2).tolist() == [1, 0, 0, 0, 1, 0] + [0] * 6
    with pytest.raises(kubo.DataError, match="Uncompressed index not found"):
        mask.decode_window_raw(6, 0, 1, 1)
    with pytest.raises(IndexError):
        mask.decode_row(2)
    strided = kubo.LineRLECompressedBitMask(np.zeros((3, 8), bool)[:, ::2])
    assert not strided.decode().any()


@pytest.mark.parametrize("call, error", [
    (lambda: kubo.RLECompressedData(np.zeros((2, 2)), None).decode((1, 1, 2, 1)), ValueError),
    (lambda: kubo.RLECompressedData(np.zeros(4)), ValueError),
    (lambda: kubo.BitwiseRLECompressedData(np.zeros((2, 2))).decode((0, 0, 1)), TypeError),
    (lambda: kubo.BitwiseRLECompressedData(np.zeros((2, 2))).decode((-1, 0, 1, 1)), ValueError),
    (lambda: kubo.LineRLECompressedBitMask(np.zeros((2, 2), np.int16)), TypeError),
    (lambda: kubo.LineRLECompressedBitMask(np.zeros((2, 2), bool)).replace_row(0, [1]), TypeError),
    (lambda: kubo.RLECompressedData(np.zeros((2, 2))).decode_window_raw(0, 0, -1, 1), ValueError),
])
def test_bad_windows_and_arrays_are_refused(call, error):
    with pytest.raises(error):
        call()


def test_the_exported_stream_outlives_its_object(rng):
    data = kubo.BitwiseRLECompressedData(mask_like(rng, (8, 8)))
    expected = bytes(data)
    view = memoryview(data)
    del data
    gc.collect()
    assert view.readonly and bytes(view) == expected


@pytest.mark.parametrize("shape", [(0, 5), (3, 0), (0, 0, 2)])
def test_empty_images_compress_and_decode_to_empty_arrays(shape):
    image = np.zeros(shape, np.uint8)
    for form in IMAGE_FORMS:
        np.testing.assert_array_equal(form(image).decode(), image)
    if len(shape) == 2:
        assert kubo.LineRLECompressedBitMask(image).decode().shape == shape
        assert kubo.validity_mask(image, 0).shape == (shape[0], (shape[1] + 7) // 8)
