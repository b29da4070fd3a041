"""kubo.io: GeoTIFF round trips of sample type, no-data and geotransform, and clear errors."""

from __future__ import annotations

import numpy as np
import pytest

import kubo

da = pytest.importorskip("dask.array")
kio = pytest.importorskip("kubo.io")
gdal = pytest.importorskip("osgeo.gdal")

GEOTRANSFORM = (500000.0, 2.5, 0.0, 4650000.0, 0.0, -2.5)


@pytest.mark.parametrize(
    "shape, dtype, sample_type",
    [((150, 203), np.uint16, None), ((150, 203), np.float32, None),
     ((150, 203, 2), np.int16, "C16S"), ((150, 203, 3), np.uint8, None)],
)
def test_round_trip_of_samples_nodata_and_geotransform(tmp_path, rng, shape, dtype, sample_type):
    samples = rng.integers(0, 120, shape).astype(dtype)
    path = tmp_path / "image.tif"
    projection = gdal.osr.SpatialReference()
    projection.ImportFromEPSG(32631)
    kio.write_geotiff(path, da.from_array(samples, (60, 70) + shape[2:]), nodata=0,
                      geotransform=GEOTRANSFORM, projection=projection.ExportToWkt(),
                      sample_type=sample_type, tile=64)
    raster = kio.open_raster(path)
    assert raster.sample_type == kubo.DataType(sample_type or dtype)
    assert raster.nodata == 0.0 and raster.geotransform == GEOTRANSFORM
    assert "32631" in raster.projection and raster.block == (64, 64)
    assert raster.data.dtype == samples.dtype
    np.testing.assert_array_equal(raster.data.compute(scheduler="threads"), samples)
    structure = gdal.Open(str(path)).GetMetadata("IMAGE_STRUCTURE")
    assert structure["COMPRESSION"] == "DEFLATE"


def test_chunks_are_whole_blocks_of_the_file(tmp_path, rng):
    path = tmp_path / "image.tif"
    kio.write_geotiff(path, rng.integers(0, 9, (300, 250)).astype(np.int32), tile=32)
    chunks = kio.open_raster(path, chunks=(70, 100)).data.chunks
    assert all(n % 32 == 0 for n in chunks[0][:-1] + chunks[1][:-1])
    assert sum(chunks[0]) == 300 and sum(chunks[1]) == 250


def test_missing_and_unreadable_files_and_unwritable_samples(tmp_path):
    with pytest.raises(FileNotFoundError, match="no such raster file"):
        kio.open_raster(tmp_path / "missing.tif")
    text = tmp_path / "notes.txt"
    text.write_text("no pixels here\n")
    with pytest.raises(ValueError, match="not a raster file GDAL can read"):
        kio.open_raster(text)
    with pytest.raises(TypeError, match="GeoTIFF cannot hold"):
        kio.write_geotiff(tmp_path / "bool.tif", np.zeros((4, 4), bool))
    with pytest.raises(ValueError, match="tile"):
        kio.write_geotiff(tmp_path / "odd.tif", np.zeros((4, 4), np.uint8), tile=20)
