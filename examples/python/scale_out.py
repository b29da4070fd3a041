#!/usr/bin/env python3
"""Processes a 16U terrain GeoTIFF on a dask cluster without ever holding it whole.

Writes, next to each other in the output folder: the heights stretched to 8 bits and
coloured (``coloured.tif``), the validity mask (``mask.tif``, 255 where valid) and the
row-compressed mask (``mask-runs.npz``: ``columns``, ``row_sizes`` and ``runs``, which
``kubo.LineRLECompressedBitMask.from_runs`` turns back into the mask). Without ``--input``
it first makes a terrain with no-data holes of ``--size`` pixels a side, tiled and
compressed, the same for every run. Progress is dask's progress bar; throughput and each
worker's peak memory are printed at the end.

The workers read the input and write the outputs themselves, so on a real cluster
(``--scheduler``) both paths must lie on a file system every worker sees.
"""

from __future__ import annotations

import argparse
import contextlib
import pathlib
import resource
import time
from collections.abc import Iterator

import dask
import dask.array as da
import distributed
import numpy as np

import kubo
import kubo.dask as kd
import kubo.io as kio

LOWEST, HIGHEST = 200, 3800  # the heights the generated terrain spans, in metres
NODATA = 0

# Hypsometric colours for the stretched heights 1..255; 0 (no data) stays black.
COLOURS = kubo.PCT([
    (0, (0, 0, 0)), (1, (40, 110, 60)), (60, (110, 160, 80)), (120, (220, 200, 120)),
    (180, (160, 110, 70)), (230, (140, 130, 125)), (255, (250, 250, 250)),
])


def terrain_block(block_info: dict | None = None) -> np.ndarray:
    """One chunk of the generated terrain: waves of heights and round no-data holes, a
    function of the pixel's position alone, so any chunking makes the same image."""
    (top, bottom), (left, right) = block_info[None]["array-location"]
    size = block_info[None]["shape"][0]
    y, x = np.ogrid[top:bottom, left:right]
    u, v = x / size, y / size
    heights = 0.5 + 0.25 * np.sin(9.0 * u + 2.0 * np.cos(7.0 * v)) * np.cos(11.0 * v - u)
    heights += 0.05 * np.sin(157.0 * u) * np.sin(211.0 * v)
    image = (LOWEST + (HIGHEST - LOWEST) * np.clip(heights, 0.0, 1.0)).astype(np.uint16)
    # Holes of radius 40 to 139 pixels on a 1024-pixel lattice, where a hash picks them.
    cell = 1024
    for cy in range(top // cell, (bottom - 1) // cell + 1):
        for cx in range(left // cell, (right - 1) // cell + 1):
            seed = (cx * 73856093 ^ cy * 19349663) % 1000
            if seed % 3 == 0:
                radius = 40 + seed % 100
                centre_y, centre_x = cy * cell + cell // 2, cx * cell + cell // 2
                image[(y - centre_y) ** 2 + (x - centre_x) ** 2 < radius**2] = NODATA
    image[:, : max(0, 16 - left)] = NODATA  # a no-data band along the left edge
    return image


def make_terrain(path: pathlib.Path, size: int, client: distributed.Client) -> None:
    """Writes the generated terrain, computed and written chunk by chunk on the workers."""
    terrain = da.map_blocks(
        terrain_block, chunks=da.core.normalize_chunks(2048, (size, size)), dtype=np.uint16
    )
    write = kio.write_geotiff(
        path, terrain, nodata=NODATA, geotransform=(500000.0, 10.0, 0.0, 4700000.0, 0.0, -10.0),
        compute=False,
    )
    run(client, [write], f"making the {size} x {size} terrain {path}")


def stretched_and_mask(raster: kio.RasterFile, low: float, high: float):
    """The mask + convert pipeline: validity flags and the heights stretched to 8 bits."""
    nodata = NODATA if raster.nodata is None else raster.nodata
    stretch = kubo.LUT([(nodata, 0), (low, 1), (high, 255)])
    flags = kd.validity_mask(raster.data, nodata, packed=False)
    stretched = kd.convert(kd.lookup(raster.data, stretch), "8U")
    return flags, stretched


def run(client: distributed.Client, tasks: list, what: str) -> list:
    print(what)
    futures = client.compute(tasks)
    distributed.progress(futures)
    print()
    return client.gather(futures)


def peak_memory(client: distributed.Client) -> dict:
    """Each worker's peak resident memory in MiB (Linux counts ru_maxrss in KiB)."""
    peaks = client.run(lambda: resource.getrusage(resource.RUSAGE_SELF).ru_maxrss / 1024)
    return {worker: round(peak) for worker, peak in peaks.items()}


@contextlib.contextmanager
def local_cluster(workers: int, threads: int) -> Iterator[distributed.Client]:
    """A client of a cluster of local worker processes.

    dask starts its workers with glibc's MALLOC_TRIM_THRESHOLD_ set, under which GDAL's
    reads of a tiled, compressed GeoTIFF ran ten times slower here; these workers go
    without it."""
    environ = dict(dask.config.get("distributed.nanny.pre-spawn-environ"))
    environ.pop("MALLOC_TRIM_THRESHOLD_", None)
    with dask.config.set({"distributed.nanny.pre-spawn-environ": environ}), \
            distributed.LocalCluster(n_workers=workers, threads_per_worker=threads,
                                     processes=True, dashboard_address=None) as cluster, \
            distributed.Client(cluster) as client:
        yield client


@contextlib.contextmanager
def connect(args: argparse.Namespace) -> Iterator[distributed.Client]:
    """A client of the cluster at --scheduler, or of a local cluster started for the run."""
    if args.scheduler:
        with distributed.Client(args.scheduler) as client:
            yield client
    else:
        with local_cluster(args.workers, args.threads) as client:
            yield client


def process(args: argparse.Namespace, client: distributed.Client) -> None:
    source = args.input
    if source is None:
        source = args.out / f"terrain-{args.size}.tif"
        if not source.exists():
            make_terrain(source, args.size, client)
    raster = kio.open_raster(source)
    flags, stretched = stretched_and_mask(raster, *args.range)
    georeference = dict(geotransform=raster.geotransform, projection=raster.projection)
    start = time.perf_counter()
    _, _, runs = run(client, [
        kio.write_geotiff(args.out / "coloured.tif", kd.lookup(stretched, COLOURS),
                          compute=False, **georeference),
        kio.write_geotiff(args.out / "mask.tif", flags.astype(np.uint8) * np.uint8(255),
                          compute=False, **georeference),
        kd.line_rle_mask(flags),
    ], f"processing {source} ({raster.data.shape[1]} x {raster.data.shape[0]}, "
       f"{raster.data.npartitions} chunks)")
    elapsed = time.perf_counter() - start
    np.savez(args.out / "mask-runs.npz", columns=runs.shape[1], row_sizes=runs.row_sizes,
             runs=np.frombuffer(bytes(runs), np.uint8))

    pixels = raster.data.shape[0] * raster.data.shape[1]
    print(f"{pixels / 1e6:.0f} Mpixel in {elapsed:.1f} s: {pixels / elapsed / 1e6:.1f} "
          f"Mpixel/s, {raster.data.nbytes / elapsed / 2**20:.0f} MiB/s of input")
    print(f"compressed mask: {len(bytes(runs)) / 2**20:.1f} MiB of runs")
    print(f"peak memory of each worker (MiB): {peak_memory(client)}")
    print(f"wrote {args.out}/coloured.tif, mask.tif, mask-runs.npz")


def main() -> None:
    parser = argparse.ArgumentParser(description=__doc__.split("\n\n")[0])
    parser.add_argument("--input", type=pathlib.Path, help="a 16U GeoTIFF (default: generated)")
    parser.add_argument("--size", type=int, default=30000,
                        help="side of the generated terrain in pixels (default 30000)")
    parser.add_argument("--out", type=pathlib.Path, default=pathlib.Path("scale-out"),
                        help="output folder (default scale-out/)")
    parser.add_argument("--workers", type=int, default=2, help="local worker processes")
    parser.add_argument("--threads", type=int, default=1, help="threads of each local worker")
    parser.add_argument("--scheduler", help="a running cluster's scheduler address "
                        "(tcp://host:8786) instead of a local cluster")
    parser.add_argument("--range", type=float, nargs=2, metavar=("LOW", "HIGH"),
                        default=(LOWEST, HIGHEST), help="heights stretched onto 1..255")
    args = parser.parse_args()
    args.out.mkdir(parents=True, exist_ok=True)
    with connect(args) as client:
        print(f"cluster: {len(client.scheduler_info()['workers'])} workers, "
              f"{sum(client.nthreads().values())} threads")
        process(args, client)


if __name__ == "__main__":
    main()
