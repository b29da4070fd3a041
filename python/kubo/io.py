"""Raster files as dask arrays, and results written back as tiled, compressed GeoTIFFs.

Needs GDAL's Python bindings (Debian: python3-gdal); ``import kubo.io`` says so when they
are missing. Files are opened and read inside the tasks, so the workers of a cluster must
see the same paths (one machine, or a shared file system).

Arrays follow the package's layout: (rows, columns) for one band, (rows, columns, bands)
for several, and complex integer samples with a last axis of 2 (real, imaginary).
"""

from __future__ import annotations

import errno
import os
from dataclasses import dataclass
from typing import Any

import dask.array as da
import numpy as np
from dask.utils import SerializableLock

import kubo

try:
    from osgeo import gdal
except ImportError as error:
    raise ImportError("kubo.io needs GDAL's Python bindings (Debian: python3-gdal)") from error

gdal.UseExceptions()

__all__ = ["RasterFile", "open_raster", "write_geotiff"]

# GDAL's sample types and the library's; GDAL has a type for every predefined one but 1U.
_LABELS = {
    getattr(gdal, name): label
    for name, label in [
        ("GDT_Byte", "8U"), ("GDT_Int8", "8S"), ("GDT_UInt16", "16U"), ("GDT_Int16", "16S"),
        ("GDT_UInt32", "32U"), ("GDT_Int32", "32S"), ("GDT_UInt64", "64U"),
        ("GDT_Int64", "64S"), ("GDT_Float32", "32R"), ("GDT_Float64", "64R"),
        ("GDT_CInt16", "C16S"), ("GDT_CInt32", "C32S"), ("GDT_CFloat32", "C32R"),
        ("GDT_CFloat64", "C64R"),
    ]
    if hasattr(gdal, name)
}
_GDAL_TYPES = {label: code for code, label in _LABELS.items()}


@dataclass(frozen=True)
class RasterFile:
    """A raster file opened as a dask array, with what the file says of its samples.

    Attributes
    ----------
    data : dask.array.Array
        The samples, chunked by whole blocks of the file.
    sample_type : kubo.DataType
        The type of one sample (pass it as ``sample_type`` for complex integers).
    nodata : float, tuple of float or None
        The no-data value: one for every band, one per band when they differ, or None.
    geotransform : tuple of 6 float or None
        Pixel to georeferenced coordinates, as GDAL gives it.
    projection : str
        The coordinate reference system as WKT ("" when the file has none).
    block : (int, int)
        (rows, columns) of the file's own blocks.
    """

    data: da.Array
    sample_type: kubo.DataType
    nodata: float | tuple[float, ...] | None
    geotransform: tuple[float, ...] | None
    projection: str
    block: tuple[int, int]


def _open(path: str, access: int = gdal.GA_ReadOnly) -> gdal.Dataset:
    if not path.startswith("/vsi") and not os.path.exists(path):
        raise FileNotFoundError(errno.ENOENT, "no such raster file", path)
    try:
        dataset = gdal.Open(path, access)
    except RuntimeError as error:
        raise ValueError(f"{path} is not a raster file GDAL can read: {error}") from None
    if dataset is None or dataset.RasterCount == 0:
        raise ValueError(f"{path} holds no raster bands")
    return dataset


def _pixel_layout(label: str, bands: int) -> tuple[np.dtype, tuple[int, ...]]:
    """The numpy dtype of a sample and the axes one pixel takes."""
    sample = kubo.DataType(label)
    if sample.dtype is not None:
        return sample.dtype, ((bands,) if bands > 1 else ())
    return sample.component_dtype, ((bands, 2) if bands > 1 else (2,))


def _read_window(
    path: str, label: str, bands: int, window: tuple[int, int, int, int]
) -> np.ndarray:
    """Reads (x, y, width, height) of every band, pixel-interleaved, through its own handle
    (GDAL handles are not to be shared between threads)."""
    x, y, width, height = window
    dtype, pixel_axes = _pixel_layout(label, bands)
    sample_bytes = gdal.GetDataTypeSize(_GDAL_TYPES[label]) // 8
    samples = np.empty((height, width) + pixel_axes, dtype)
    # Read straight into the array: through a bytes object the read took three times as long.
    _open(path).ReadRaster(
        x, y, width, height,
        buf_type=_GDAL_TYPES[label],
        band_list=list(range(1, bands + 1)),
        buf_pixel_space=bands * sample_bytes,
        buf_line_space=width * bands * sample_bytes,
        buf_band_space=sample_bytes,
        buf_obj=samples,
    )
    return samples


def _read_block(path: str, label: str, bands: int, block_info: dict | None = None) -> np.ndarray:
    (top, bottom), (left, right) = block_info[None]["array-location"][:2]
    return _read_window(path, label, bands, (left, top, right - left, bottom - top))


def _whole_blocks(
    chunks: Any, shape: tuple[int, int], block: tuple[int, int], pixel: np.dtype
) -> tuple[tuple[int, ...], ...]:
    """Chunks of whole blocks: dask's automatic ones, or the sizes asked for rounded to
    whole blocks (the last chunk of an axis takes what is left)."""
    if isinstance(chunks, str) and chunks == "auto":
        return da.core.normalize_chunks(
            "auto", shape, limit=16 << 20, dtype=pixel, previous_chunks=block
        )
    sizes = (chunks, chunks) if np.ndim(chunks) == 0 else tuple(chunks)
    if len(sizes) != 2 or not all(isinstance(n, (int, np.integer)) and n > 0 for n in sizes):
        raise ValueError(f"chunks must be 'auto', an int or (rows, columns), not {chunks!r}")
    return da.core.normalize_chunks(
        tuple(max(b, b * round(n / b)) for n, b in zip(sizes, block)), shape
    )


def open_raster(path: str | os.PathLike, *, chunks: Any = "auto") -> RasterFile:
    """Opens a raster file as a dask array whose chunks are whole blocks of the file.

    Parameters
    ----------
    path : str or os.PathLike
        Any raster file GDAL reads (GDAL's ``/vsi...`` paths too).
    chunks : "auto", int or (int, int)
        "auto" groups the file's blocks into chunks of about 16 MiB; a size (for rows
        and columns, or each) is rounded to whole blocks.

    Returns
    -------
    RasterFile
        The lazy samples with the file's sample type, no-data value, geotransform,
        projection and block size.

    Raises
    ------
    FileNotFoundError
        For a path that does not exist.
    ValueError
        For a file GDAL cannot read as a raster, whose bands differ in type or have a
        type the library lacks, or for chunks of another form.
    """
    path = os.fspath(path)
    dataset = _open(path)
    bands = [dataset.GetRasterBand(index) for index in range(1, dataset.RasterCount + 1)]
    types = {band.DataType for band in bands}
    if len(types) != 1 or next(iter(types)) not in _LABELS:
        names = ", ".join(sorted(gdal.GetDataTypeName(code) for code in types))
        raise ValueError(f"{path} has bands of {names}: one type the library has is needed")
    label = _LABELS[types.pop()]
    dtype, pixel_axes = _pixel_layout(label, len(bands))
    block_columns, block_rows = bands[0].GetBlockSize()
    shape = (dataset.RasterYSize, dataset.RasterXSize)
    image_chunks = _whole_blocks(chunks, shape, (block_rows, block_columns),
                                 np.dtype((dtype, pixel_axes)))
    data = da.map_blocks(
        _read_block,
        path,
        label,
        len(bands),
        chunks=image_chunks + tuple((n,) for n in pixel_axes),
        dtype=dtype,
        meta=np.empty((0,) * (2 + len(pixel_axes)), dtype),
    )
    values = [band.GetNoDataValue() for band in bands]
    nodata = None if values[0] is None else values[0] if len(set(values)) == 1 else tuple(values)
    return RasterFile(
        data=data,
        sample_type=kubo.DataType(label),
        nodata=nodata,
        geotransform=dataset.GetGeoTransform(can_return_null=True),
        projection=dataset.GetProjection(),
        block=(block_rows, block_columns),
    )


class _GeoTiffRegions:
    """Writes regions of an existing GeoTIFF, each through a handle of its own; picklable,
    so the tasks that store the chunks may run in other processes."""

    def __init__(self, path: str, bands: int, label: str) -> None:
        self.path, self.bands, self.label = path, bands, label

    def __setitem__(self, region: tuple[slice, ...], block: np.ndarray) -> None:
        rows, columns = region[:2]
        height, width = block.shape[:2]
        sample_bytes = gdal.GetDataTypeSize(_GDAL_TYPES[self.label]) // 8
        dataset = _open(self.path, gdal.GA_Update)
        dataset.WriteRaster(
            columns.start, rows.start, width, height,
            np.ascontiguousarray(block).tobytes(),
            buf_type=_GDAL_TYPES[self.label],
            band_list=list(range(1, self.bands + 1)),
            buf_pixel_space=self.bands * sample_bytes,
            buf_line_space=width * self.bands * sample_bytes,
            buf_band_space=sample_bytes,
        )
        dataset = None  # closing writes the tiles and the file's directory


def _whole_tiles(chunks: tuple[int, ...], tile: int) -> tuple[int, ...]:
    """Chunks of about the largest of ``chunks``, each a whole number of tiles but the last."""
    size, step = sum(chunks), tile * max(1, round(max(chunks) / tile))
    return tuple(min(step, size - start) for start in range(0, size, step)) or (0,)


def _one_writer_lock(path: str) -> Any:
    """A lock that the tasks writing one file share: across the processes of a cluster
    when a distributed client is running, else across the threads of this process."""
    try:
        from distributed import Lock, default_client

        default_client()
    except (ImportError, ValueError):
        return SerializableLock()
    return Lock(f"kubo.io.write_geotiff:{os.path.abspath(path)}")


def write_geotiff(
    path: str | os.PathLike,
    array: Any,
    *,
    nodata: float | None = None,
    geotransform: tuple[float, ...] | None = None,
    projection: str = "",
    sample_type: Any = None,
    tile: int = 256,
    compress: str = "DEFLATE",
    compute: bool = True,
) -> Any:
    """Writes an array as a tiled, compressed GeoTIFF, chunk by chunk.

    The file is made at once; each chunk is written by the task that computes it,
    one task at a time (a lock shared by the cluster's processes when a distributed
    client runs). Chunks are first aligned to whole tiles, so each tile is written
    exactly once.

    Parameters
    ----------
    path : str or os.PathLike
        The file to write (replaced if it exists).
    array : dask.array.Array or numpy.ndarray
        (rows, columns) or (rows, columns, bands) samples of a type GDAL writes in a
        GeoTIFF; complex integers with a last axis of 2 (give ``sample_type``).
    nodata : float, optional
        The no-data value to record for every band.
    geotransform : tuple of 6 float, optional
        Pixel to georeferenced coordinates.
    projection : str
        The coordinate reference system as WKT.
    sample_type : DataType, str or dtype-like, optional
        The type the array holds when its dtype alone does not say.
    tile : int
        Tile width and height, a multiple of 16.
    compress : str
        GDAL's GeoTIFF compression: "DEFLATE", "LZW", "ZSTD", "NONE", ...
    compute : bool
        Write now, or return a ``dask.delayed.Delayed`` that writes when computed.

    Returns
    -------
    None or dask.delayed.Delayed

    Raises
    ------
    TypeError
        For an array of a type GDAL cannot write.
    ValueError
        For a shape that is no image, or a tile size GeoTIFF does not take.
    """
    path = os.fspath(path)
    from . import dask as kubo_dask

    array = kubo_dask._as_dask(array, "array")
    try:
        sample = kubo_dask._parse_sample_type(sample_type) or kubo.DataType(array.dtype)
    except ValueError:
        sample = None
    if sample is None or sample.label not in _GDAL_TYPES:
        raise TypeError(f"array holds {sample or array.dtype}, which a GeoTIFF cannot hold")
    label = sample.label
    pixel_axes = array.ndim - 2 - (sample.is_complex and array.dtype.kind != "c")
    if array.ndim < 2 or pixel_axes not in (0, 1):
        raise ValueError(f"array must be (rows, columns) or (rows, columns, bands), not {array.shape}")
    if tile < 16 or tile % 16:
        raise ValueError(f"tile must be a positive multiple of 16, not {tile}")
    bands = array.shape[2] if pixel_axes else 1
    dataset = gdal.GetDriverByName("GTiff").Create(
        path, array.shape[1], array.shape[0], bands, _GDAL_TYPES[label],
        options=[
            "TILED=YES", f"BLOCKXSIZE={tile}", f"BLOCKYSIZE={tile}", f"COMPRESS={compress}",
            "INTERLEAVE=PIXEL", "BIGTIFF=IF_SAFER",
            # No tile is written at creation: each is written once, when its chunk is.
            "SPARSE_OK=TRUE",
        ],
    )
    if geotransform is not None:
        dataset.SetGeoTransform(tuple(geotransform))
    if projection:
        dataset.SetProjection(projection)
    if nodata is not None:
        for index in range(1, bands + 1):
            dataset.GetRasterBand(index).SetNoDataValue(float(nodata))
    dataset = None
    array = array.rechunk({
        0: _whole_tiles(array.chunks[0], tile),
        1: _whole_tiles(array.chunks[1], tile),
        **{axis: -1 for axis in range(2, array.ndim)},
    })
    return da.store(
        array,
        _GeoTiffRegions(path, bands, label),
        lock=_one_writer_lock(path),
        compute=compute,
    )
