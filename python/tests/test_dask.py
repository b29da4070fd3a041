"""kubo.dask: every function, on chunkings that do not divide the image, equals the in-memory call."""

from __future__ import annotations

import pickle

import numpy as np
import pytest

import kubo

da = pytest.importorskip("dask.array")
kd = pytest.importorskip("kubo.dask")

# Row and column chunks that divide nothing evenly; column widths that are no multiple of 8.
SHAPE = (37, 45)
CHUNKINGS = [((10, 20, 7), (13, 13, 19)), ((37,), (3, 1, 40, 1)), ((1, 36), (45,))]


def assert_same(lazy, expected):
    computed = lazy.compute(scheduler="threads")
    assert computed.dtype == expected.dtype and computed.shape == expected.shape
    assert computed.tobytes() == expected.tobytes()


@pytest.fixture
def terrain(rng):
    image = rng.integers(0, 4000, SHAPE).astype(np.uint16)
    image[rng.random(SHAPE) < 0.2] = 0
    return image


@pytest.mark.parametrize("chunks", CHUNKINGS)
@pytest.mark.parametrize("dtype", ["8S", "32R", "C16S", "16U"])
def test_convert(terrain, chunks, dtype):
    assert_same(kd.convert(da.from_array(terrain, chunks), dtype), kubo.convert(terrain, dtype))


def test_complex_integers_keep_their_pair_axis_whole(rng):
    pairs = rng.integers(-300, 300, (20, 30, 2)).astype(np.int16)
    lazy = da.from_array(pairs, chunks=(7, 11, 1))
    assert_same(kd.convert(lazy, "C32R", sample_type="C16S"),
                kubo.convert(pairs, "C32R", sample_type="C16S"))
    for interpretation in ("amplitude", "phase", "db"):
        assert_same(kd.complex_to_real(lazy, interpretation, sample_type="C16S"),
                    kubo.complex_to_real(pairs, interpretation, sample_type="C16S"))
    samples = (pairs[..., 0] + 1j * pairs[..., 1]).astype(np.complex64)
    assert_same(kd.complex_to_real(da.from_array(samples, (9, 4)), "intensity"),
                kubo.complex_to_real(samples, "intensity"))


@pytest.mark.parametrize("chunks", CHUNKINGS)
def test_validity_mask_boolean_and_packed(terrain, chunks):
    lazy = da.from_array(terrain, chunks)
    assert_same(kd.validity_mask(lazy, 0, packed=False), kubo.validity_mask(terrain, 0, packed=False))
    assert_same(kd.validity_mask(lazy, 0), kubo.validity_mask(terrain, 0))


def test_packed_chunks_start_on_bytes(terrain):
    # Column chunks 13, 13, 19: the boundaries at 13 and 26 move back to 8 and 24, so the
    # packed chunks are 1, 2 and 3 bytes wide, each the packbits of its own columns.
    mask = kd.validity_mask(da.from_array(terrain, (37, (13, 13, 19))), 0)
    assert mask.chunks[1] == (1, 2, 3)
    flags = terrain != 0
    for j, columns in enumerate([(0, 8), (8, 24), (24, 45)]):
        expected = np.packbits(flags[:, slice(*columns)], axis=-1)
        np.testing.assert_array_equal(mask.blocks[0, j].compute(), expected)


@pytest.mark.parametrize("channels", [3, 2, 1])
def test_validity_mask_of_channels_split_across_chunks(rng, channels):
    # Under the pair rule a pixel of 3 channels pairs its last sample with the next pixel's first.
    image = rng.integers(0, 2, (23, 19, channels)).astype(np.uint8)
    lazy = da.from_array(image, chunks=(5, 9, 1))
    for rule in ("all", "any", "pairs"):
        assert_same(kd.validity_mask(lazy, 0, rule), kubo.validity_mask(image, 0, rule))
    flat = image[..., 0]
    assert_same(kd.validity_mask(da.from_array(flat, (5, 9)), 0, "pairs", packed=False),
                kubo.validity_mask(flat, 0, "pairs", packed=False))
    if channels == 3:
        assert_same(kd.validity_mask(lazy, [1, 0], channels=[0, 2], packed=False),
                    kubo.validity_mask(image, [1, 0], channels=[0, 2], packed=False))


def test_lookup_through_lut_and_pct(terrain):
    lut = kubo.LUT([(0, 0), (200, 1), (3800, 255)])
    pct = kubo.PCT([(0, (0, 0, 0)), (128, (40, 200, 9)), (255, (255, 255, 255))])
    lazy = da.from_array(terrain, CHUNKINGS[0])
    assert_same(kd.lookup(lazy, lut), lut(terrain))
    stretched = kd.convert(kd.lookup(lazy, lut), "8U")
    assert_same(kd.lookup(stretched, pct), pct(kubo.convert(lut(terrain), "8U")))


def padded_reference(image, margin, behaviour):
    x, y = margin
    padded = np.zeros((image.shape[0] + 2 * y, image.shape[1] + 2 * x) + image.shape[2:],
                      image.dtype)
    padded[y : y + image.shape[0], x : x + image.shape[1]] = image
    kubo.fill_margins(padded, margin, behaviour)
    return padded


@pytest.mark.parametrize("behaviour", ["mirror", "wrap", "zero"])
@pytest.mark.parametrize("margin", [(3, 3), (2, 5), (0, 4)])
@pytest.mark.parametrize("chunks", CHUNKINGS)
def test_fill_margins_grows_each_chunk_as_the_whole_padded_image(terrain, behaviour, margin,
                                                                   chunks):
    grown = kd.fill_margins(da.from_array(terrain, chunks), margin, behaviour)
    padded = padded_reference(terrain, margin, behaviour)
    x, y = margin
    top = 0
    for i, height in enumerate(grown.chunks[0]):
        left = 0
        for j, width in enumerate(grown.chunks[1]):
            window = padded[top : top + height, left : left + width]
            np.testing.assert_array_equal(grown.blocks[i, j].compute(), window)
            left += width - 2 * x
        top += height - 2 * y
    assert top == terrain.shape[0] and left == terrain.shape[1]


def test_fill_margins_with_channels_then_trimmed(rng):
    image = rng.random((17, 21, 2)).astype(np.float32)
    grown = kd.fill_margins(da.from_array(image, (6, 8, 1)), 2, "mirror")
    assert grown.blocks[0, 0].compute().tobytes() == padded_reference(image, (2, 2), "mirror")[
        :10, :12].tobytes()
    trimmed = da.overlap.trim_internal(grown.map_blocks(np.negative), {0: 2, 1: 2},
                                       boundary="reflect")
    np.testing.assert_array_equal(trimmed.compute(), -image)


@pytest.mark.parametrize("rows_per_part", [None, 1, 10])
def test_line_rle_mask_in_parts_is_the_whole_mask(terrain, rows_per_part):
    flags = kubo.validity_mask(terrain, 0, packed=False)
    lazy = kd.validity_mask(da.from_array(terrain, CHUNKINGS[0]), 0, packed=False)
    joined = kd.line_rle_mask(lazy, rows_per_part=rows_per_part).compute(scheduler="threads")
    whole = kubo.LineRLECompressedBitMask(flags)
    assert bytes(joined) == bytes(whole)
    np.testing.assert_array_equal(joined.row_sizes, whole.row_sizes)
    np.testing.assert_array_equal(joined.decode((5, 9, 30, 20)), flags[9:29, 5:35])


def test_masks_rebuilt_from_runs_and_pickled(terrain):
    mask = kubo.LineRLECompressedBitMask(terrain != 0)
    again = kubo.LineRLECompressedBitMask.from_runs(SHAPE[1], bytes(mask), mask.row_sizes)
    copied = pickle.loads(pickle.dumps(mask))
    for other in (again, copied):
        assert bytes(other) == bytes(mask) and other.shape == mask.shape
        np.testing.assert_array_equal(other.decode(), terrain != 0)
    with pytest.raises(ValueError, match="add up to"):
        kubo.LineRLECompressedBitMask.from_runs(45, b"\x00\x2d", [1])
    with pytest.raises(ValueError, match="row 0"):
        kubo.LineRLECompressedBitMask.from_runs(45, b"\x00\x2c", [2])
    lut = kubo.LUT([(0, 3), (10, 5)])
    pct = kubo.PCT([(0, (1, 2, 3)), (10, (4, 5, 6))])
    assert pickle.loads(pickle.dumps(lut)).entries == lut.entries
    assert pickle.loads(pickle.dumps(pct)).entries == pct.entries


def test_arguments_are_checked_when_called(terrain):
    lazy = da.from_array(terrain, CHUNKINGS[0])
    with pytest.raises(ValueError, match="dtype"):
        kd.convert(lazy, "bogus")
    with pytest.raises(ValueError, match="sample_type"):
        kd.convert(lazy, "8U", sample_type="bogus")
    with pytest.raises(ValueError, match="rule"):
        kd.validity_mask(lazy, 0, "most")
    with pytest.raises(TypeError, match="complex"):
        kd.complex_to_real(lazy)
    with pytest.raises(TypeError, match="table"):
        kd.lookup(lazy, {0: 1})
    with pytest.raises(TypeError, match="array"):
        kd.convert([1, 2], "8U")
    with pytest.raises(ValueError, match="behaviour"):
        kd.fill_margins(lazy, 2, "smear")
    with pytest.raises(ValueError, match="exceeds"):
        kd.fill_margins(lazy, 46, "wrap")
    with pytest.raises(ValueError, match="rows_per_part"):
        kd.line_rle_mask(lazy != 0, rows_per_part=0)
