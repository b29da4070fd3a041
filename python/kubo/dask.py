"""kubo's array functions on dask arrays: lazy, chunk by chunk, each chunk through the library.

Each function takes a ``dask.array.Array`` (a numpy array is wrapped as one chunk) and
returns a lazy result whose computed value equals, bit for bit, what the function of the
same name in :mod:`kubo` gives for the whole array in memory, whatever the chunking. The
axes a call needs whole (channels, the (real, imaginary) pair axis of complex integers) are
merged into one chunk first; the image axes keep their chunks.

Arguments are checked when the call is made, by the in-memory function on a one-pixel
array, so mistakes raise the same ``TypeError`` or ``ValueError`` at once instead of inside
a task. Chunks run through the C++ kernels with the interpreter lock released, so the
threads of a worker run chunks in parallel; every chunk makes its own library objects (no
no-data decision, interpretation or compressed form is shared between tasks).

Packed masks: the library packs a row's pixels eight to a byte, so a byte must not straddle
two chunks. Column chunk boundaries are therefore moved back to the previous multiple of 8
pixels (at most 7 columns change chunk) before masking; every result chunk is then a
whole run of bytes of its rows, and the chunks join into exactly the in-memory mask.

Under the pair rule with an odd number of samples a pixel, the library pairs a pixel's
last sample with the next pixel's first, across rows too: such an image is masked in
chunks of whole rows, each with the row after it.
"""

from __future__ import annotations

import functools
from collections.abc import Callable
from typing import Any

import dask
import dask.array as da
import numpy as np

import kubo

__all__ = [
    "complex_to_real",
    "convert",
    "fill_margins",
    "line_rle_mask",
    "lookup",
    "validity_mask",
]


class _InMemory:
    """A picklable call of one of kubo's in-memory functions (the extension's own function
    objects cannot be pickled, and tasks travel to worker processes pickled)."""

    def __init__(self, name: str) -> None:
        self.name = name

    def __call__(self, block: np.ndarray, **kwargs: Any) -> Any:
        return getattr(kubo, self.name)(block, **kwargs)

    def __repr__(self) -> str:
        return f"kubo.{self.name}"


def _as_dask(array: Any, argument: str) -> da.Array:
    if isinstance(array, da.Array):
        return array
    if isinstance(array, np.ndarray):
        return da.from_array(array, chunks=array.shape or ())
    raise TypeError(f"{argument} must be a dask or numpy array, not {type(array).__name__}")


def _parse_sample_type(sample_type: Any) -> kubo.DataType | None:
    if sample_type is None:
        return None
    try:
        return kubo.DataType(sample_type)
    except (TypeError, ValueError) as error:
        raise type(error)(f"sample_type: {error}") from None


def _pair_axes(array: da.Array, sample_type: Any) -> int:
    """1 when the array holds complex samples as (real, imaginary) pairs on its last axis."""
    parsed = _parse_sample_type(sample_type)
    return int(parsed is not None and parsed.is_complex and array.dtype.kind != "c")


def _probe(function: Callable[..., Any], array: da.Array, image_axes: int, **kwargs: Any) -> Any:
    """The function on one pixel of the array's type: checks the arguments and shows the
    result's type and trailing axes."""
    pixel = np.zeros((1,) * image_axes + array.shape[image_axes:], array.dtype)
    return function(pixel, **kwargs)


def _per_chunk(
    function: Callable[..., Any],
    array: da.Array,
    image_axes: int,
    adjust_columns: Callable[[int], int] | None = None,
    **kwargs: Any,
) -> da.Array:
    """Calls ``function`` on each chunk, the axes after ``image_axes`` in one chunk; the
    result keeps the image axes' chunks (the last one's through ``adjust_columns``) and ends
    with the trailing axes the function gives."""
    result = _probe(function, array, image_axes, **kwargs)
    array = array.rechunk({axis: -1 for axis in range(image_axes, array.ndim)})
    image = tuple(f"i{axis}" for axis in range(image_axes))
    inner = tuple(f"s{axis}" for axis in range(array.ndim - image_axes))
    outer = tuple(f"r{axis}" for axis in range(result.ndim - image_axes))
    adjust = {image[-1]: adjust_columns} if adjust_columns else None
    return da.blockwise(
        functools.partial(function, **kwargs),  # blockwise keeps some keywords (dtype) itself
        image + outer,
        array,
        image + inner,
        new_axes=dict(zip(outer, result.shape[image_axes:])),
        adjust_chunks=adjust,
        concatenate=True,
        dtype=result.dtype,
        meta=np.empty((0,) * result.ndim, result.dtype),
    )


def _per_sample(name: str, array: Any, sample_type: Any, **kwargs: Any) -> da.Array:
    """kubo's function ``name`` on each chunk of samples, the pair axis of complex integers
    whole."""
    array = _as_dask(array, "array")
    image_axes = array.ndim - _pair_axes(array, sample_type)
    return _per_chunk(_InMemory(name), array, image_axes, sample_type=sample_type, **kwargs)


def convert(array: Any, dtype: Any, *, sample_type: Any = None) -> da.Array:
    """Lazily converts samples as :func:`kubo.convert` does, chunk by chunk.

    Parameters
    ----------
    array : dask.array.Array or numpy.ndarray
        The samples, any shape; complex integers with a last axis of 2 (give
        ``sample_type``).
    dtype : DataType, str or dtype-like
        One of the 20 whole-byte predefined types.
    sample_type : DataType, str or dtype-like, optional
        The type ``array`` holds when its dtype alone does not say.

    Returns
    -------
    dask.array.Array
        The converted samples, chunked as ``array`` (a complex integer result gains a
        last axis of 2).

    Raises
    ------
    TypeError, ValueError
        As :func:`kubo.convert`, when called.
    """
    return _per_sample("convert", array, sample_type, dtype=dtype)


def complex_to_real(
    array: Any, interpretation: str = "amplitude", *, sample_type: Any = None
) -> da.Array:
    """Lazily turns complex samples into float32 ones as :func:`kubo.complex_to_real` does.

    Parameters
    ----------
    array : dask.array.Array or numpy.ndarray
        Complex samples of any shape: complex64 or complex128, or complex integers with
        a last axis of 2 (give ``sample_type``).
    interpretation : str
        ``"amplitude"``, ``"phase"``, ``"real"``, ``"imaginary"``, ``"intensity"`` or ``"db"``.
    sample_type : DataType, str or dtype-like, optional
        The complex type the array holds (e.g. ``"C16S"``).

    Returns
    -------
    dask.array.Array
        float32, of the array's shape without the pair axis.

    Raises
    ------
    TypeError, ValueError
        As :func:`kubo.complex_to_real`, when called.
    """
    return _per_sample("complex_to_real", array, sample_type, interpretation=interpretation)


def lookup(values: Any, table: kubo.LUT | kubo.PCT) -> da.Array:
    """Lazily maps real values through a lookup or colour table, as ``table(values)``.

    Parameters
    ----------
    values : dask.array.Array or numpy.ndarray
        Real values of any dtype and shape.
    table : kubo.LUT or kubo.PCT
        The table; it travels to the workers pickled (tables are safe to share).

    Returns
    -------
    dask.array.Array
        float64 of the values' shape for a LUT; uint8 with a last axis of 3 for a PCT.

    Raises
    ------
    TypeError
        For a table that is no LUT or PCT, or values that are not real.
    """
    if not isinstance(table, (kubo.LUT, kubo.PCT)):
        raise TypeError(f"table must be a kubo.LUT or kubo.PCT, not {type(table).__name__}")
    values = _as_dask(values, "values")
    return _per_chunk(table, values, values.ndim)


def _aligned(chunks: tuple[int, ...], step: int) -> tuple[int, ...]:
    """Chunks whose inner boundaries are moved back to multiples of ``step``."""
    inner = {bound - bound % step for bound in np.cumsum(chunks[:-1]).tolist()} - {0}
    return tuple(np.diff([0, *sorted(inner), sum(chunks)]).tolist())


def _rows_inside(block: np.ndarray, function: Callable[..., Any], block_info: dict) -> Any:
    """The function of a chunk grown by a row above and below, without those rows' results."""
    row, rows = block_info[0]["chunk-location"][0], block_info[0]["num-chunks"][0]
    result = function(block)
    return result[int(row > 0) : len(result) - int(row < rows - 1)]


def _mask_with_next_pixel(array: da.Array, kwargs: dict) -> da.Array:
    """The mask under the pair rule with an odd number of samples a pixel, whose last sample
    the library pairs with the next pixel's first, across rows too: each chunk holds whole
    rows and is masked with the row after it (and the one before), their flags dropped."""
    function = functools.partial(_InMemory("validity_mask"), **kwargs)
    result = _probe(function, array, 2)
    array = array.rechunk({axis: -1 for axis in range(1, array.ndim)})
    grown = da.overlap.overlap(array, {axis: int(axis == 0) for axis in range(array.ndim)}, "none")
    return grown.map_blocks(
        _rows_inside,
        function=function,
        chunks=(array.chunks[0], (result.shape[1],)),
        drop_axis=list(range(2, array.ndim)),
        dtype=result.dtype,
        meta=np.empty((0, 0), result.dtype),
    )


def validity_mask(
    array: Any,
    nodata: Any,
    rule: str = "all",
    channels: Any = None,
    packed: bool = True,
    sample_type: Any = None,
) -> da.Array:
    """Lazily builds the validity mask of an image as :func:`kubo.validity_mask` does.

    Parameters
    ----------
    array : dask.array.Array or numpy.ndarray
        The image, (rows, columns) or (rows, columns, channels), chunked freely along
        rows and columns.
    nodata, rule, channels, packed, sample_type
        As :func:`kubo.validity_mask`.

    Returns
    -------
    dask.array.Array
        bool (rows, columns), chunked as the image; or, packed, uint8
        (rows, (columns + 7) // 8) whose column chunks are those of the image moved to
        multiples of 8 pixels and counted in bytes (see the module's notes).

    Raises
    ------
    TypeError, ValueError
        As :func:`kubo.validity_mask`, when called.
    """
    array = _as_dask(array, "array")
    kwargs = dict(nodata=nodata, rule=rule, channels=channels, packed=packed,
                  sample_type=sample_type)
    image_axes = min(array.ndim, 2)
    if image_axes < 2:
        return _per_chunk(_InMemory("validity_mask"), array, image_axes, **kwargs)
    pairs = _pair_axes(array, sample_type)
    samples = int(np.prod(array.shape[2 : array.ndim - pairs]))
    samples *= 2 if pairs or array.dtype.kind == "c" else 1
    if rule == "pairs" and samples % 2 and samples > 1:
        return _mask_with_next_pixel(array, kwargs)
    if not packed:
        return _per_chunk(_InMemory("validity_mask"), array, 2, **kwargs)
    array = array.rechunk({1: _aligned(array.chunks[1], 8)})
    return _per_chunk(
        _InMemory("validity_mask"), array, 2, adjust_columns=lambda n: (n + 7) // 8, **kwargs
    )


def _read_margin(margin: Any) -> tuple[int, int]:
    if isinstance(margin, (tuple, list)) and len(margin) == 2:
        return int(margin[0]), int(margin[1])
    try:
        return int(margin), int(margin)
    except (TypeError, ValueError):
        raise TypeError("margin must be an int or an (x, y) pair of ints") from None


def _fill_outer_margins(
    block: np.ndarray,
    margin: tuple[int, int],
    behaviour: str,
    sample_type: Any,
    block_info: dict | None = None,
) -> np.ndarray:
    """A chunk grown by its interior overlaps, grown on its outer sides by the library.

    The library fills all four margins of the chunk; on the outer sides they equal the
    whole image's (its mirror and zero rules read only pixels near the same edge, and a
    chunk is at least a margin wide), and on the inner sides they are dropped, the
    neighbours' overlap standing there instead.
    """
    x, y = margin
    (row, column), (rows, columns) = (
        block_info[0]["chunk-location"][:2],
        block_info[0]["num-chunks"][:2],
    )
    top, bottom, left, right = row == 0, row == rows - 1, column == 0, column == columns - 1
    if not (y and (top or bottom)) and not (x and (left or right)):
        return block
    height, width = block.shape[:2]
    padded = np.zeros((height + 2 * y, width + 2 * x) + block.shape[2:], block.dtype)
    padded[y : y + height, x : x + width] = block
    kubo.fill_margins(padded, (x, y), behaviour, sample_type=sample_type)
    return padded[
        0 if top else y : y + height + (y if bottom else 0),
        0 if left else x : x + width + (x if right else 0),
    ]


def fill_margins(
    array: Any, margin: Any, behaviour: str = "mirror", *, sample_type: Any = None
) -> da.Array:
    """Lazily grows every chunk by a margin: from its neighbours inside the image and by
    the library's rule at the image's outer edges (dask's ``overlap``).

    Chunk (i, j) of the result equals the window of the whole padded image that holds
    chunk (i, j) of ``array`` and ``margin`` pixels around it, where the padded image is
    ``array`` with its margins filled in memory by :func:`kubo.fill_margins` (all bands).
    After a ``map_blocks`` over the result, ``dask.array.overlap.trim_internal(result,
    {0: y, 1: x}, boundary="reflect")`` takes the margins off again (any boundary but
    "none", which would keep the outer margins). Chunks narrower than the margin are
    merged with a neighbour first.

    Parameters
    ----------
    array : dask.array.Array or numpy.ndarray
        The image without margins, (rows, columns) or (rows, columns, channels).
    margin : int or (int, int)
        The margin on every side, or (x, y); at most the image's columns and rows.
    behaviour : {"zero", "mirror", "wrap"}
        How the outer margins are made. Mirror and zero run the library on the chunks
        at the edges; wrap's outer margins are the opposite side of the image, which
        dask's periodic overlap brings (the same pixels the library copies).
    sample_type : DataType, str or dtype-like, optional
        The type the array holds when its dtype alone does not say.

    Returns
    -------
    dask.array.Array
        The image's chunks each grown by 2 x and 2 y pixels.

    Raises
    ------
    TypeError, ValueError
        As :func:`kubo.fill_margins`, when called, and for a margin larger than the image.
    """
    array = _as_dask(array, "array")
    x, y = _read_margin(margin)
    if array.ndim >= 2:
        probe = np.zeros((2 * max(y, 0) + 1, 2 * max(x, 0) + 1) + array.shape[2:], array.dtype)
    else:
        probe = np.zeros(array.shape, array.dtype)
    kubo.fill_margins(probe, (x, y), behaviour, sample_type=sample_type)
    if x > array.shape[1] or y > array.shape[0]:
        raise ValueError(
            f"margin ({x}, {y}) exceeds the image of {array.shape[1]} x {array.shape[0]} pixels"
        )
    array = array.rechunk({axis: -1 for axis in range(2, array.ndim)})
    depth = {0: y, 1: x, **{axis: 0 for axis in range(2, array.ndim)}}
    if behaviour == "wrap":
        boundary = {0: "periodic", 1: "periodic", **{axis: "none" for axis in range(2, array.ndim)}}
        return da.overlap.overlap(array, depth, boundary)
    inner = da.overlap.overlap(array, depth, "none")
    chunks = [
        tuple(n + 2 * d - d * (i > 0) - d * (i < len(axis) - 1) for i, n in enumerate(axis))
        for axis, d in zip(inner.chunks[:2], (y, x))
    ]
    return inner.map_blocks(
        _fill_outer_margins,
        margin=(x, y),
        behaviour=behaviour,
        sample_type=sample_type,
        chunks=(*chunks, *inner.chunks[2:]),
        dtype=array.dtype,
        meta=np.empty((0,) * array.ndim, array.dtype),
    )


def _row_runs(flags: np.ndarray) -> tuple[np.ndarray, np.ndarray]:
    mask = kubo.LineRLECompressedBitMask(flags)
    return np.frombuffer(bytes(mask), np.uint8), mask.row_sizes


def _join_row_runs(
    parts: list[tuple[np.ndarray, np.ndarray]], columns: int
) -> kubo.LineRLECompressedBitMask:
    runs = np.concatenate([part[0] for part in parts])
    sizes = np.concatenate([part[1] for part in parts])
    return kubo.LineRLECompressedBitMask.from_runs(columns, runs, sizes)


def line_rle_mask(flags: Any, *, rows_per_part: int | None = None) -> Any:
    """The row-compressed mask of a flag image too large to hold, built in parts of rows.

    Each part (full rows) is compressed on a worker into its rows' runs; a row's runs
    depend on that row alone, so the parts' runs one after another are the runs of the
    whole mask, joined into one :class:`kubo.LineRLECompressedBitMask`. Only runs travel,
    never flags.

    Parameters
    ----------
    flags : dask.array.Array or numpy.ndarray
        A (rows, columns) mask, one byte a pixel (bool, uint8 or int8), zero for clear,
        e.g. ``validity_mask(image, nodata, packed=False)``.
    rows_per_part : int, optional
        Rows compressed by one task; by default as many as make about 32 MiB of flags.

    Returns
    -------
    dask.delayed.Delayed
        Computes to a ``kubo.LineRLECompressedBitMask`` whose ``bytes()`` and
        ``row_sizes`` equal those of ``kubo.LineRLECompressedBitMask(flags)`` in memory,
        and which decodes by window to the same flags.

    Raises
    ------
    TypeError, ValueError
        As ``kubo.LineRLECompressedBitMask``, when called, and for ``rows_per_part`` < 1.
    """
    flags = _as_dask(flags, "flags")
    _probe(kubo.LineRLECompressedBitMask, flags, flags.ndim)
    columns = flags.shape[1]
    if rows_per_part is None:
        rows_per_part = max(1, (32 << 20) // max(1, columns * flags.dtype.itemsize))
    elif rows_per_part < 1:
        raise ValueError(f"rows_per_part must be at least 1, not {rows_per_part}")
    parts = flags.rechunk({0: rows_per_part, 1: -1}).to_delayed().ravel()
    row_runs = dask.delayed(_row_runs, pure=True)
    return dask.delayed(_join_row_runs, pure=True)([row_runs(part) for part in parts], columns)
