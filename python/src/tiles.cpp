// kubo.TileIterator: an area cut into a row-major list of tiles, walked as a Python iterator.
#include <cstdint>  // UINT32_MAX

#include "arrays.h"
#include "vrkframework/basic/kubo/raster/tileiterator.h"

namespace kora::kubo::python {
namespace {

py::object ToTile(const Tile& tile) {
    return MakeTile(tile.xOffset, tile.yOffset, tile.xSize, tile.ySize);
}

// The number of tiles: the library gives the count less one, which wraps for an empty cut.
long long TileCount(const TileIterator& tiles) {
    return tiles.GetTileRange() == UINT32_MAX ? 0 : tiles.GetTileRange() + 1ll;
}

TileIterator MakeIterator(unsigned int width, unsigned int height, const py::object& x,
                          const py::object& y) {
    if (x.is_none() && y.is_none()) {
        return TileIterator(width, height);
    }
    return TileIterator(x.is_none() ? 0 : x.cast<unsigned int>(),
                        y.is_none() ? 0 : y.cast<unsigned int>(), width, height);
}

}  // namespace

void RegisterTiles(py::module_& m) {
    // Every method runs under the interpreter lock (none releases it), so an iterator shared
    // between threads hands each tile out once.
    py::class_<TileIterator>(m, "TileIterator",
                             R"doc(An area cut into tiles, walked left to right, top to bottom.

Iterating yields :class:`kubo.Tile` (x, y, width, height) windows; only the last
column and row of tiles can be narrower. A new iterator cuts tiles of a quarter
of the area each way (a quarter of 0 spans the area); recut it with :meth:`set_tile_size`,
:meth:`set_tile_count` or :meth:`set_tile_pixels`. Walking moves its position:
``first()`` starts the walk again (returning the first tile). ``len()`` and
indexing reach every tile without moving. Safe to share between threads (each
tile of a walk is handed out once).

Parameters
----------
width, height : int
    The size of the area, at least 1 each.
x, y : int, optional
    The area's first column and row (0). With an offset, the sizing rules work
    from the area's end (x + width, y + height), as the library defines.

Raises
------
kubo.DataError
    For a size of 0.
kubo.OutOfBoundsError
    For an area that ends past 4294967295.
)doc")
        .def(py::init(&MakeIterator), py::arg("width"), py::arg("height"),
             py::arg("x") = py::none(), py::arg("y") = py::none())
        .def("__iter__", [](py::object self) { return self; })
        .def("__next__",
             [](TileIterator& tiles) {
                 if (tiles.IsDone()) {
                     throw py::stop_iteration();
                 }
                 return ToTile(tiles.GetNextTile());
             })
        .def("__len__", &TileCount)
        .def(
            "__getitem__",
            [](TileIterator& tiles, long long index) {
                // Negative indices count from the end, as in any Python sequence.
                const long long at = index < 0 ? index + TileCount(tiles) : index;
                if (at < 0 || at > UINT32_MAX) {
                    throw py::index_error("tile index out of range");
                }
                return ToTile(tiles.GetTile(static_cast<unsigned int>(at)));
            },
            py::arg("index"),
            "The tile at ``index`` (negative indices count from the end).\n\nRaises\n------\n"
            "kubo.OutOfBoundsError\n    (an IndexError) for an index past the last tile.")
        .def(
            "first", [](TileIterator& tiles) { return ToTile(tiles.GetFirstTile()); },
            "Starts the walk again: returns the first tile; iteration goes on from the second.")
        .def("seek", &TileIterator::SetCurrentTile, py::arg("index"),
             "Moves the walk to ``index``, unless the walk is already done.")
        .def_property_readonly("done", &TileIterator::IsDone, "Whether the walk is done.")
        .def("set_tile_size",
             py::overload_cast<unsigned int, unsigned int>(&TileIterator::SetChunkSize),
             py::arg("width"), py::arg("height"),
             "Recuts into tiles of width x height (0 spans the area); returns the tile count.")
        .def("set_tile_count", &TileIterator::SetNumberOfTiles, py::arg("count"),
             "Recuts into about ``count`` tiles; returns the tile count, or 0 (keeping the cut) "
             "for 0.")
        .def(
            "set_tile_pixels",
            [](TileIterator& tiles, unsigned long pixels) { return tiles.SetChunkSize(pixels); },
            py::arg("pixels"),
            "Recuts into tiles of about ``pixels`` pixels; returns the tile count, or 0 "
            "(keeping the cut) when that makes no tile.")
        .def("tile_index", &TileIterator::GetTileIndex, py::arg("x"), py::arg("y"),
             "Index of the first tile holding pixel (x, y), or ``len(self)`` when none does.")
        .def("check", &TileIterator::Check, py::arg("width"), py::arg("height"),
             "The library's check that the area fits an image: x + (x + width) <= width and "
             "likewise for rows.");
}

}  // namespace kora::kubo::python
