"""Ownership, reference counts, leaks and sharing between threads."""

from __future__ import annotations

import gc
import os
import sys
from concurrent.futures import ThreadPoolExecutor

import numpy as np
import pytest

import kubo

IMAGE = (np.arange(64, dtype=np.uint8).reshape(8, 8) // 9) % 2
BITS = kubo.BitwiseRLECompressedData(IMAGE)
IMAGE_RLE = kubo.RLECompressedData(IMAGE)
LUT = kubo.LUT([(0, 0), (1, 10)])


def raise_and_catch(array: np.ndarray) -> None:
    try:
        kubo.TileIterator(int(array[0, 0]), 0)
    except kubo.DataError:
        pass


CALLS = {
    "convert": lambda a: kubo.convert(a, "32R"),
    "validity_mask": lambda a: kubo.validity_mask(a, 0),
    "decode_window": lambda a: BITS.decode((1, 2, 3, 4)),
    "compress": lambda a: kubo.RLECompressedData(a).decode(),
    "lut": lambda a: LUT(a),
    "error": raise_and_catch,
}


def resident_bytes() -> int:
    with open("/proc/self/statm") as statm:
        return int(statm.read().split()[1]) * os.sysconf("SC_PAGE_SIZE")


@pytest.mark.parametrize("name", CALLS)
def test_100000_calls_leak_neither_references_nor_memory(name):
    call, array = CALLS[name], IMAGE.copy()
    for _ in range(2000):
        call(array)
    gc.collect()
    references, resident = sys.getrefcount(array), resident_bytes()
    for _ in range(100_000):
        call(array)
    gc.collect()
    assert sys.getrefcount(array) == references
    assert resident_bytes() - resident < 2 << 20


@pytest.mark.parametrize("make", [
    lambda: kubo.convert(IMAGE, "16S"), lambda: kubo.validity_mask(IMAGE, 0, packed=False),
    lambda: BITS.decode(), lambda: kubo.complex_to_real(IMAGE.astype(np.complex64)),
    lambda: LUT(IMAGE), lambda: kubo.unpack(b"\xff", 4, 2, "8U"),
    lambda: IMAGE_RLE.decode((0, 0, 2, 2))])
def test_results_own_their_memory(make):
    result = make()
    assert result.base is None and result.flags.owndata and result.flags.writeable



def test_objects_shared_between_threads_give_each_caller_its_own_answer():
    rng = np.random.default_rng(7)
    image = (rng.random((64, 200)) < 0.05).astype(np.uint8)
    image[-8:] = 0
    shared = kubo.BitwiseRLECompressedData(image)
    rows = kubo.LineRLECompressedBitMask(image)
    windows = [(int(x), int(y), 17, 9) for x, y in rng.integers(0, 50, size=(400, 2))]

    def work(window):
        x, y, w, h = window
        rows.replace_row(y, image[y])
        assert (rows.decode(window) == (image[y:y + h, x:x + w] != 0)).all()
        return np.array_equal(shared.decode(window), image[y:y + h, x:x + w])

    with ThreadPoolExecutor(4) as pool:
        assert all(pool.map(work, windows))
