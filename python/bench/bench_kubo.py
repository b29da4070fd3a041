#!/usr/bin/env python3
"""Speed of the kubo module, side by side with the C++ benchmarks and with numpy.

Run from the checkout after a build (it needs build/default/bench/kubo_typeconv_bench):

    PYTHONPATH=build/default/python /usr/bin/python3 python/bench/bench_kubo.py

Prints one table: conversions of 16 Mi samples (the module into a given ``out`` and into a
new array, the C++ benchmark of the same pair, numpy ``clip`` + ``astype`` where the pair
saturates), validity masks of 4096 x 4096 pixels against ``a != nodata`` and
``numpy.packbits``, and the cost of one call on a one-element array. Times are the best of
several runs; the machine should be otherwise idle.
"""

from __future__ import annotations

import argparse
import json
import pathlib
import re
import subprocess
import tempfile
import time
from collections.abc import Callable

import numpy as np

import kubo

SAMPLES = 16 << 20
PAIRS = [("32R", "8U"), ("32R", "16S"), ("64R", "16S"), ("16S", "8U"), ("32S", "8U"),
         ("16U", "8U"), ("8U", "8S"), ("32S", "16U"), ("8U", "32R"), ("16S", "64R"),
         ("16U", "32R"), ("C16S", "C32R")]


def best(run: Callable[[], object], repeat: int) -> float:
    """The shortest of `repeat` timed runs after one warm-up, in seconds."""
    run()
    times = []
    for _ in range(repeat):
        start = time.perf_counter()
        run()
        times.append(time.perf_counter() - start)
    return min(times)


def source(label: str) -> np.ndarray:
    """Small values valid in every type, as the C++ benchmark uses."""
    kind = kubo.DataType(label)
    values = (np.arange(SAMPLES * (2 if kind.is_complex else 1), dtype=np.int64) * 37) % 101
    values = values.astype(kind.component_dtype)
    if kind.is_complex:
        values = values.reshape(SAMPLES, 2)
        return values.view(kind.dtype)[:, 0] if kind.dtype is not None else values
    return values


def saturates(source_label: str, target_label: str) -> bool:
    src, dst = kubo.DataType(source_label).component_dtype, kubo.DataType(target_label).dtype
    if dst is None or not np.issubdtype(dst, np.integer):
        return False
    if np.issubdtype(src, np.floating):
        return True
    return np.iinfo(src).min < np.iinfo(dst).min or np.iinfo(src).max > np.iinfo(dst).max


def cxx_times(program: pathlib.Path, pairs: list[tuple[str, str]],
              repeat: int) -> dict[str, float]:
    """Seconds per conversion of 16 Mi samples, from the C++ benchmark of each pair, in the
    kernel variant the library uses unless forced (the one the module runs)."""
    names = "|".join(f"{a}_to_{b}" for a, b in pairs)
    with tempfile.NamedTemporaryFile(suffix=".json") as out:
        completed = subprocess.run(
            [str(program), f"--benchmark_filter=^convert/({names})/{SAMPLES}/",
             f"--benchmark_out={out.name}", "--benchmark_out_format=json",
             "--benchmark_min_time=0.2", f"--benchmark_repetitions={repeat}"],
            check=True, capture_output=True, text=True)
        report = json.load(open(out.name))
    in_use = re.search(r"in use unless forced: (\S+)", completed.stdout).group(1)
    # The best repetition, as the module's figures are the best of their runs.
    scale = {"ns": 1e-9, "us": 1e-6, "ms": 1e-3, "s": 1.0}
    times: dict[str, float] = {}
    for run in report["benchmarks"]:
        parts = run["name"].split("/")
        if run.get("run_type", "iteration") == "iteration" and parts[-1] == in_use:
            seconds = run["real_time"] * scale[run["time_unit"]]
            times[parts[1]] = min(times.get(parts[1], seconds), seconds)
    return times


def main() -> None:
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--build", default="build/default", type=pathlib.Path)
    parser.add_argument("--repeat", default=7, type=int)
    args = parser.parse_args()
    program = args.build / "bench" / "kubo_typeconv_bench"

    print(f"{'benchmark':<28}{'kubo out=':>11}{'kubo new':>11}{'C++':>10}{'numpy':>10}"
          f"{'kubo/C++':>10}{'numpy/kubo':>11}")
    for a, b in PAIRS:
        # Measured right after the C++ run of the same pair, so that both see the same
        # machine (a shared machine's memory speed drifts over a minute).
        reference = cxx_times(program, [(a, b)], args.repeat).get(f"{a}_to_{b}", float("nan"))
        x = source(a)
        out = kubo.convert(x, b, sample_type=a)
        into = best(lambda: kubo.convert(x, b, out=out, sample_type=a), args.repeat)
        new = best(lambda: kubo.convert(x, b, sample_type=a), args.repeat)
        numpy_time = float("nan")
        if saturates(a, b):
            info = np.iinfo(kubo.DataType(b).dtype)
            numpy_time = best(lambda: x.clip(info.min, info.max).astype(kubo.DataType(b).dtype),
                              args.repeat)
        print(f"{'convert ' + a + ' to ' + b:<28}{into * 1e3:>9.2f}ms{new * 1e3:>9.2f}ms"
              f"{reference * 1e3:>8.2f}ms{numpy_time * 1e3:>8.2f}ms{into / reference:>10.2f}"
              f"{numpy_time / new:>11.2f}")

    rng = np.random.default_rng(1)
    for label, image in [("mask 16U 4096x4096", rng.integers(0, 8, (4096, 4096), np.uint16)),
                         ("mask 8U 4096x4096x3 any", rng.integers(0, 8, (4096, 4096, 3),
                                                                  np.uint8))]:
        rule = "any" if image.ndim == 3 else "all"
        ours = best(lambda: kubo.validity_mask(image, 0, rule), args.repeat)
        if image.ndim == 3:
            theirs = best(lambda: np.packbits((image != 0).all(axis=-1), axis=-1), args.repeat)
        else:
            theirs = best(lambda: np.packbits(image != 0, axis=-1), args.repeat)
        print(f"{label:<28}{ours * 1e3:>9.2f}ms{'':>11}{'':>10}{theirs * 1e3:>8.2f}ms{'':>10}"
              f"{theirs / ours:>11.2f}")

    one = np.zeros(1, np.float32)
    target = np.zeros(1, np.uint8)
    calls = 200_000
    for label, call in [("call convert (1 sample)", lambda: kubo.convert(one, "8U")),
                        ("call convert out= (1)", lambda: kubo.convert(one, "8U", out=target)),
                        ("call numpy astype (1)", lambda: one.astype(np.uint8))]:
        elapsed = best(lambda: [call() for _ in range(calls)], 3) / calls
        print(f"{label:<28}{elapsed * 1e6:>9.2f}us")


if __name__ == "__main__":
    main()
