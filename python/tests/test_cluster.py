"""kubo.dask and kubo.io on a real cluster: two worker processes of four threads each, so
tasks travel pickled and several chunks of one call run at once in one process."""

from __future__ import annotations

import numpy as np
import pytest

import kubo

da = pytest.importorskip("dask.array")
distributed = pytest.importorskip("distributed")
kd = pytest.importorskip("kubo.dask")


@pytest.fixture(scope="module")
def client():
    with distributed.LocalCluster(n_workers=2, threads_per_worker=4, processes=True,
                                  dashboard_address=None) as cluster:
        with distributed.Client(cluster) as client:
            yield client


def test_every_function_on_four_threads_of_two_processes(client, rng):
    image = rng.integers(0, 3000, (130, 171)).astype(np.uint16)
    image[rng.random(image.shape) < 0.3] = 0
    lazy = da.from_array(image, (17, 23))  # 8 x 8 chunks
    lut = kubo.LUT([(0, 0), (100, 1), (2900, 255)])
    padded = np.zeros((136, 175), np.uint16)
    padded[3:133, 2:173] = image
    kubo.fill_margins(padded, (2, 3), "mirror")
    results = client.compute([
        kd.convert(lazy, "32R"),
        kd.validity_mask(lazy, 0),
        kd.lookup(lazy, lut),
        kd.complex_to_real(kd.convert(lazy, "C16S"), sample_type="C16S"),
        kd.line_rle_mask(kd.validity_mask(lazy, 0, packed=False), rows_per_part=9),
        kd.fill_margins(lazy, (2, 3), "mirror").blocks[-1, -1],
    ], sync=True)
    converted, packed, stretched, amplitude, compressed, corner = results
    np.testing.assert_array_equal(converted, kubo.convert(image, "32R"))
    np.testing.assert_array_equal(packed, kubo.validity_mask(image, 0))
    np.testing.assert_array_equal(stretched, lut(image))
    np.testing.assert_array_equal(amplitude, image.astype(np.float32))
    assert bytes(compressed) == bytes(kubo.LineRLECompressedBitMask(image != 0))
    np.testing.assert_array_equal(corner, padded[-(11 + 2 * 3):, -(10 + 2 * 2):])  # last chunk
    assert len(client.scheduler_info()["workers"]) == 2


def test_geotiff_written_by_both_processes(client, rng, tmp_path):
    kio = pytest.importorskip("kubo.io")
    image = rng.integers(0, 255, (200, 300)).astype(np.uint8)
    path = tmp_path / "written.tif"
    kio.write_geotiff(path, da.from_array(image, (64, 64)), nodata=0, tile=64)
    raster = kio.open_raster(path)
    np.testing.assert_array_equal(raster.data.compute(), image)
