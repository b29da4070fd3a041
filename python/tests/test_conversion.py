"""kubo.convert, kubo.pack and kubo.unpack against numpy expressions of the rules."""

from __future__ import annotations

import numpy as np
import pytest
from conftest import REAL_DTYPES, random_samples
from hypothesis import given, settings
from hypothesis import strategies as st

import kubo

NARROW_SIGNED = (np.int8, np.int16, np.int32)


def reference(x: np.ndarray, to: type) -> np.ndarray:
    """The library's rule for one pair, written independently with numpy."""
    src, dst = x.dtype.type, np.dtype(to).type
    if src == dst:
        return x.copy()
    if np.issubdtype(dst, np.floating):
        return x.astype(dst)
    hi = np.iinfo(dst).max
    if np.issubdtype(src, np.floating):
        return float_to_integer(x, dst)
    if src in NARROW_SIGNED:
        signed_target = dst in NARROW_SIGNED
        lo = np.iinfo(dst).min if signed_target else 0
        return np.clip(x.astype(np.int64), lo, hi).astype(dst)
    if src == np.int64 and dst != np.uint64:
        # Only an upper clamp; the low bits of everything else, negative values wrapping.
        return np.where(x >= hi, hi, x).astype(dst)
    if src == np.int64:
        return x.astype(dst)
    return np.minimum(x.astype(np.uint64), np.uint64(hi)).astype(dst)


def float_to_integer(x: np.ndarray, dst: type) -> np.ndarray:
    info = np.iinfo(dst)
    t = x.dtype.type
    nan = np.isnan(x)
    safe = np.where(nan, t(0), x)
    if info.bits == 64:
        y = np.trunc(safe)
        top = 2.0 ** (63 if dst == np.int64 else 64)
        big = y >= top
        fits = np.where(big | (y <= 0), 0, y)
        if dst == np.uint64:
            values = fits.astype(np.float64)
            high = values >= 2.0**63
            out = np.where(high, (values - 2.0**63).astype(np.uint64) + np.uint64(2**63),
                           values.astype(np.uint64))
        else:
            out = fits.astype(np.float64).astype(np.int64)
        out = np.where(big, info.max, out).astype(dst)
        return np.where(nan, np.array(1 << 63).astype(dst), out)
    # Rounding in the source precision: half away from zero (signed), half up (unsigned).
    half = t(0.5)
    y = np.where(safe >= 0, safe + half, safe - half) if info.min < 0 else safe + half
    low = y < t(info.min) if info.min < 0 else y <= 0
    out = np.where(y >= t(info.max), info.max,
                   np.where(low, info.min, np.trunc(np.where(low | (y >= t(info.max)), 0, y))))
    nan_value = info.min if info.bits == 32 and info.min < 0 else 0
    return np.where(nan, nan_value, out).astype(dst)


def edge_values(dtype: type) -> np.ndarray:
    if np.issubdtype(dtype, np.integer):
        info = np.iinfo(dtype)
        values = [info.min, info.min + 1, -200, -1, 0, 1, 127, 128, 255, 256, 32767, 65535,
                  65536, 2**31 - 1, 2**31, 2**32 - 1, 2**32, 2**63 - 1, info.max - 1, info.max]
        return np.array([v for v in values if info.min <= v <= info.max], dtype=dtype)
    return np.array([np.nan, np.inf, -np.inf, -0.6, -0.5, -0.4, 0.0, 0.49999997, 0.5, 2.5,
                     -2.5, 126.6, 254.5, 255.5, -300.0, 2147483647.0, 2147483648.0, -2147483649.0,
                     4294967295.0, 4294967296.0, 2.0**63, 2.0**64, 1e300 if dtype == np.float64
                     else 3e38], dtype=dtype)


@pytest.mark.parametrize("source", REAL_DTYPES, ids=lambda t: np.dtype(t).name)
@pytest.mark.parametrize("target", REAL_DTYPES, ids=lambda t: np.dtype(t).name)
def test_every_real_pair_saturates_and_rounds_as_the_library_defines(rng, source, target):
    x = np.concatenate([edge_values(source), random_samples(rng, source, (1003,))])
    with np.errstate(all="ignore"):
        expected = reference(x, target)
    result = kubo.convert(x, target)
    assert result.dtype == target and result.flags.owndata
    np.testing.assert_array_equal(result, expected)


@pytest.mark.parametrize("source, target", [
    ("C16S", "C32R"), ("C32R", "C16S"), ("C64R", "C8U"), ("16U", "C32S"), ("C32R", "8U"),
    ("C32S", "64R"), ("C64U", "C16S")])
def test_complex_families_convert_each_component_by_the_real_rule(rng, source, target):
    src, dst = kubo.DataType(source), kubo.DataType(target)
    parts = [random_samples(rng, src.component_dtype.type, (2, 3, 2)) for _ in range(2)]
    if src.is_complex:
        pairs = np.stack([parts[0], parts[1]], axis=-1)
        array = pairs.view(src.dtype)[..., 0] if src.dtype is not None else pairs
    else:
        array = parts[0]
    with np.errstate(all="ignore"):
        real = reference(parts[0], dst.component_dtype.type)
        imaginary = reference(parts[1], dst.component_dtype.type) if src.is_complex else 0 * real
    result = kubo.convert(array, target, sample_type=source)
    if not dst.is_complex:
        np.testing.assert_array_equal(result, real)
        return
    pairs = result if dst.dtype is None else result[..., None].view(dst.component_dtype)
    assert pairs.shape == (2, 3, 2, 2) and pairs.dtype == dst.component_dtype
    np.testing.assert_array_equal(pairs[..., 0], real)
    np.testing.assert_array_equal(pairs[..., 1], imaginary)


def test_strided_views_out_and_overlap_give_the_contiguous_result(rng, small_pieces):
    base = random_samples(rng, np.float64, (6, 40))
    expected = reference(base, np.int16)
    for view in (base[1:5, 3:37], base[::2, ::3], base.T, base[::-1]):
        np.testing.assert_array_equal(kubo.convert(view, np.int16), reference(view, np.int16))
    out = np.zeros((6, 40, 2), np.int16)[..., 0]  # strided last axis: filled through a copy
    assert kubo.convert(base, "16S", out=out) is out
    np.testing.assert_array_equal(out, expected)
    inplace = base.copy()
    kubo.convert(inplace, "64R", out=inplace)  # same memory: read from a copy
    np.testing.assert_array_equal(inplace, base)
    same = kubo.convert(base, np.float64)
    assert not np.shares_memory(same, base)


@pytest.mark.parametrize("call, error", [
    (lambda: kubo.convert([1, 2], "8U"), TypeError),
    (lambda: kubo.convert(np.zeros(3, bool), "8U"), TypeError),
    (lambda: kubo.convert(np.zeros(3, ">i4"), "8U"), TypeError),
    (lambda: kubo.convert(np.zeros(3), "1U"), ValueError),
    (lambda: kubo.convert(np.zeros(3), "bogus"), ValueError),
    (lambda: kubo.convert(np.zeros((3, 3), np.int16), "8U", sample_type="C16S"), TypeError),
    (lambda: kubo.convert(np.zeros(3), "8U", out=np.zeros(4, np.uint8)), ValueError),
    (lambda: kubo.convert(np.zeros(3), "8U", out=np.zeros(3, np.int8)), TypeError),
    (lambda: kubo.convert(np.zeros(3), "8U", out=np.zeros(3, np.uint8)[:0:1]), ValueError),
])
def test_bad_arguments_are_refused_before_any_work(call, error):
    with pytest.raises(error):
        call()


def test_read_only_out_is_refused_untouched():
    out = np.zeros(3, np.uint8)
    out.setflags(write=False)
    with pytest.raises(ValueError, match="out is read-only"):
        kubo.convert(np.ones(3), "8U", out=out)
    assert not out.any()


@given(bits=st.sampled_from([1, 2, 3, 5, 7, 9, 12, 15, 17, 20, 23, 25, 31]),
       count=st.integers(0, 80), seed=st.integers(0, 2**32 - 1))
def test_packing_round_trips_and_matches_the_bit_layout(bits, count, seed):
    rng = np.random.default_rng(seed)
    values = rng.integers(0, 2**bits, size=count, dtype=np.uint32)
    stream = kubo.pack(values, bits)
    flat = "".join(format(int(v), f"0{bits}b") for v in values)
    expected = np.packbits(np.array([c == "1" for c in flat], bool))
    np.testing.assert_array_equal(stream, expected)
    np.testing.assert_array_equal(kubo.unpack(bytes(stream), bits, count, np.uint32), values)


def test_packing_in_pieces_and_its_documented_cases(small_pieces):
    samples = np.array([1, 0, 1, 1, 0, 0, 0, 1, 1] * 5, np.uint8)
    stream = kubo.pack(samples, 1)
    np.testing.assert_array_equal(stream[:2], [0xB1, 0xD8])
    np.testing.assert_array_equal(kubo.unpack(stream, 1, samples.size, "8U"), samples)
    assert kubo.unpack(b"\xe0", 3, 1, np.int8)[0] == 7  # zero-extended, not -1
    with pytest.raises(kubo.Error, match="number of bit is bigger"):
        kubo.unpack(b"\xff\xff", 12, 1, np.uint8)
    with pytest.raises(ValueError, match="bits"):
        kubo.pack(samples, 16)
    with pytest.raises(ValueError, match="need 2"):
        kubo.unpack(b"\x00", 12, 1, np.uint16)


@pytest.mark.large
def test_more_than_4294967295_samples_convert():
    x = np.full(2**32 + 17, -5, np.int8)
    x[:16] = np.arange(-8, 8)
    result = kubo.convert(x, np.uint8)
    np.testing.assert_array_equal(result[:16], np.clip(np.arange(-8, 8), 0, None))
    assert result[-1] == 0 and not result[2**32:].any()


@settings(max_examples=60)
@given(source=st.sampled_from(REAL_DTYPES), target=st.sampled_from(REAL_DTYPES),
       shape=st.lists(st.integers(0, 6), min_size=0, max_size=3),
       steps=st.lists(st.sampled_from([1, 2, -1, -3]), min_size=3, max_size=3),
       seed=st.integers(0, 2**32 - 1))
def test_any_view_of_any_shape_converts_like_its_contiguous_copy(source, target, shape, steps,
                                                                 seed):
    base = random_samples(np.random.default_rng(seed), source, tuple(s * 3 for s in shape))
    view = base[tuple(slice(None, None, step) for step in steps[:base.ndim])]
    with np.errstate(all="ignore"):
        expected = reference(np.ascontiguousarray(view).ravel(), target).reshape(view.shape)
    result = kubo.convert(view, target)
    assert result.shape == view.shape and result.flags.c_contiguous
    np.testing.assert_array_equal(result, expected)


def test_complex_floats_held_as_pairs_and_scalars_convert():
    pairs = np.array([[1.6, -2.5], [300.0, np.nan]], np.float32)
    result = kubo.convert(pairs, "C8S", sample_type="C32R")
    assert result.tolist() == [[2, -3], [127, 0]]
    assert kubo.convert(np.float64(-0.5), "8S").shape == () and kubo.convert(
        np.float64(-0.5), "8S") == -1
    np.testing.assert_array_equal(kubo.convert(np.zeros((0, 3), np.uint16), "C16S"),
                                  np.zeros((0, 3, 2), np.int16))


@pytest.mark.parametrize("data", [b"\xab\xc1\x23", bytearray(b"\xab\xc1\x23"),
                                  memoryview(b"\xab\xc1\x23"), np.array([0xAB, 0xC1, 0x23],
                                                                        np.uint8)])
def test_unpack_reads_any_contiguous_bytes(data):
    assert kubo.unpack(data, 12, 2, np.uint16).tolist() == [0xABC, 0x123]


def test_unpack_refuses_strided_or_wide_buffers():
    with pytest.raises(TypeError, match="contiguous bytes"):
        kubo.unpack(np.zeros(8, np.uint8)[::2], 4, 2, "8U")
    with pytest.raises(TypeError, match="contiguous bytes"):
        kubo.unpack(np.zeros(4, np.uint16), 4, 2, "8U")
