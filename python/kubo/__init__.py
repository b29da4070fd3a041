"""kubo: raster building blocks over numpy arrays.

Sample types and their promotion (:class:`DataType`, :func:`promote`); conversion
with the library's saturation and rounding (:func:`convert`, :func:`pack`,
:func:`unpack`); validity masks from no-data values (:func:`validity_mask`); three
run-length compressed forms decodable by window (:class:`RLECompressedData`,
:class:`BitwiseRLECompressedData`, :class:`LineRLECompressedBitMask`);
:func:`complex_to_real` and :func:`fill_margins`; lookup and colour tables
(:class:`LUT`, :class:`PCT`); tiles (:class:`TileIterator`); and ground control
points (:class:`ControlPointContainer`). Failures of the library raise
:class:`Error` and its subclasses.

Complex integer samples (C8U to C64S) have no numpy dtype: they are held in
integer arrays with a last axis of length 2 (real, imaginary).

Two submodules are imported on their own: :mod:`kubo.dask` (the functions on dask
arrays, chunk by chunk) and :mod:`kubo.io` (raster files as dask arrays, through GDAL).
"""

from ._kubo import (
    LUT,
    PCT,
    BitwiseRLECompressedData,
    ControlPoint,
    ControlPointContainer,
    DataError,
    DataType,
    Error,
    GroundLocation,
    HistoryEvent,
    ImageLocation,
    LineRLECompressedBitMask,
    OutOfBoundsError,
    ParameterError,
    RLECompressedData,
    TileIterator,
    complex_to_real,
    convert,
    fill_margins,
    pack,
    promote,
    unpack,
    validity_mask,
)
from ._types import ControlPointType, Metadata, PopulatedAxes, Tile

__all__ = [
    "BitwiseRLECompressedData",
    "ControlPoint",
    "ControlPointContainer",
    "ControlPointType",
    "DataError",
    "DataType",
    "Error",
    "GroundLocation",
    "HistoryEvent",
    "ImageLocation",
    "LUT",
    "LineRLECompressedBitMask",
    "Metadata",
    "OutOfBoundsError",
    "PCT",
    "ParameterError",
    "PopulatedAxes",
    "RLECompressedData",
    "Tile",
    "TileIterator",
    "complex_to_real",
    "convert",
    "fill_margins",
    "pack",
    "promote",
    "unpack",
    "validity_mask",
]
