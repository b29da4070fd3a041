"""The scale-out example's mask + convert pipeline on 1 and 2 worker processes, against the
C++ library on one thread doing the same work after GDAL's reads.

    PYTHONPATH=build/default/python /usr/bin/python3 python/bench/bench_scale_out.py \\
        [--size 20000] [--folder build/bench-scale-out] [--pipeline build/default/examples/kubo-gdal-pipeline]

Makes the example's terrain GeoTIFF once (16U, tiled, compressed), then reads it, masks it
and stretches it to 8 bits chunk by chunk; the results are summed on the workers, so only
the work is timed. Prints a Markdown table: seconds, Mpixel/s, the speed-up over one worker,
and each worker's peak resident memory.
"""

from __future__ import annotations

import argparse
import pathlib
import re
import subprocess
import sys
import time


sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[2] / "examples" / "python"))
import scale_out  # noqa: E402

import kubo.io as kio  # noqa: E402


def pipeline_seconds(client: distributed.Client, path: pathlib.Path) -> float:
    """One run of the mask + convert pipeline over the whole file, after a warm-up on a
    corner. Each chunk's results are reduced to their first pixel, so that neither a
    transfer nor a sum is timed."""
    raster = kio.open_raster(path)
    flags, stretched = scale_out.stretched_and_mask(raster, scale_out.LOWEST, scale_out.HIGHEST)
    client.gather(client.compute([flags[:100, :100].sum(), stretched[:100, :100].sum()]))
    steps = tuple(slice(None, None, max(chunks)) for chunks in raster.data.chunks)
    firsts = [flags[steps].sum(), stretched[steps].sum()]
    start = time.perf_counter()
    client.gather(client.compute(firsts))
    return time.perf_counter() - start


def main() -> None:
    parser = argparse.ArgumentParser()
    parser.add_argument("--size", type=int, default=20000)
    parser.add_argument("--folder", type=pathlib.Path, default=pathlib.Path("build/bench-scale-out"))
    parser.add_argument("--pipeline", type=pathlib.Path,
                        default=pathlib.Path("build/default/examples/kubo-gdal-pipeline"))
    args = parser.parse_args()
    args.folder.mkdir(parents=True, exist_ok=True)
    path = args.folder / f"terrain-{args.size}.tif"
    pixels = args.size**2

    rows = []
    for workers in (1, 2):
        with scale_out.local_cluster(workers, 1) as client:
            if not path.exists():
                scale_out.make_terrain(path, args.size, client)
            seconds = pipeline_seconds(client, path)
            peaks = sorted(scale_out.peak_memory(client).values())
        rows.append((f"dask, {workers} worker process{'es' * (workers > 1)}", seconds, peaks))

    output = subprocess.run([str(args.pipeline), str(path), str(scale_out.LOWEST),
                             str(scale_out.HIGHEST)], check=True, capture_output=True,
                            text=True).stdout
    read, work = (float(n) for n in re.findall(r"([\d.]+) s", output)[:2])
    print(f"{args.size} x {args.size} 16U GeoTIFF ({path}); C++ on one thread: {output.strip()}")
    print()
    print("| run | seconds | Mpixel/s | speed-up | peak memory per worker (MiB) |")
    print("|---|---|---|---|---|")
    one = rows[0][1]
    for name, seconds, peaks in rows:
        print(f"| {name} | {seconds:.1f} | {pixels / seconds / 1e6:.0f} | {one / seconds:.2f} | "
              f"{', '.join(map(str, peaks))} |")
    print(f"| C++, one thread: GDAL's reads {read:.1f} s + mask and convert {work:.1f} s | "
          f"{read + work:.1f} | {pixels / (read + work) / 1e6:.0f} | {one / (read + work):.2f} | |")


if __name__ == "__main__":
    main()
