"""kubo.TileIterator as a Python iterator of windows."""

from __future__ import annotations

import numpy as np
import pytest

import kubo


@pytest.mark.parametrize("width, height, x, y, size", [
    (10, 7, None, None, None), (10, 10, None, None, (4, 4)), (300, 70, 5, 3, (64, 32))])
def test_tiles_cover_the_area_once_in_row_major_order(width, height, x, y, size):
    tiles = kubo.TileIterator(width, height, x, y)
    if size:
        tiles.set_tile_size(*size)
    x0, y0 = x or 0, y or 0
    cover = np.zeros((y0 + height, x0 + width), int)
    walked = list(tiles)
    for tile in walked:
        cover[tile.slices] += 1
    assert (cover[y0:, x0:] == 1).all() and cover.sum() == width * height
    assert walked == sorted(walked, key=lambda t: (t.y, t.x))
    assert walked == [tiles[i] for i in range(len(tiles))]
    assert tiles.done and next(tiles, None) is None
    assert tiles.first() == walked[0] and list(tiles) == walked[1:]


def test_recutting_finding_and_failing():
    tiles = kubo.TileIterator(100, 50)
    assert tiles.set_tile_count(4) == 4 and tiles[3] == kubo.Tile(50, 25, 50, 25)
    assert tiles.set_tile_count(0) == 0 and len(tiles) == 4
    assert tiles.tile_index(60, 10) == 1 and tiles.tile_index(100, 0) == 4
    assert tiles.set_tile_pixels(1250) == len(tiles)
    with pytest.raises(IndexError):
        tiles[len(tiles)]
    with pytest.raises(kubo.OutOfBoundsError) as caught:
        tiles[1000]
    assert caught.value.values == (0, len(tiles))
    with pytest.raises(kubo.DataError, match="Invalid windows size"):
        kubo.TileIterator(0, 5, x=1)


def test_seeking_and_checking_follow_the_library():
    tiles = kubo.TileIterator(8, 8)
    tiles.set_tile_size(4, 4)
    tiles.seek(2)
    assert next(tiles) == kubo.Tile(0, 4, 4, 4) and not tiles.done
    list(tiles)
    tiles.seek(0)  # a finished walk is not rewound by seeking
    assert tiles.done and tiles.first() == kubo.Tile(0, 0, 4, 4)
    assert tiles[-1] == kubo.Tile(4, 4, 4, 4)
    with pytest.raises(IndexError):
        tiles[-5]
    assert tiles.check(8, 8) and not kubo.TileIterator(8, 8, x=1, y=0).check(9, 8)
    assert kubo.TileIterator(3, 3)[0] == kubo.Tile(0, 0, 3, 3)
