// What every part of the Python binding shares: sample types of numpy arrays, arrays read as
// samples of a library type, new result arrays, and the walk over runs of contiguous samples.
#ifndef KUBO_PYTHON_SRC_ARRAYS_H
#define KUBO_PYTHON_SRC_ARRAYS_H

#include <pybind11/numpy.h>
#include <pybind11/pybind11.h>
#include <pybind11/stl.h>

#include <cstddef>  // std::size_t
#include <cstdint>  // std::uint64_t
#include <optional>
#include <string>
#include <vector>

#include "vrkframework/basic/kubo/raster/datatype.h"

namespace kora::kubo::python {

namespace py = pybind11;

/// The registration function of each part of the module (one per source file).
void RegisterErrors(py::module_& m);
void RegisterDataTypes(py::module_& m);
void RegisterConversion(py::module_& m);
void RegisterMasks(py::module_& m);
void RegisterCompressed(py::module_& m);
void RegisterRasterOps(py::module_& m);
void RegisterTables(py::module_& m);
void RegisterTiles(py::module_& m);
void RegisterControlPoints(py::module_& m);
void RegisterPieceLimit(py::module_& m);

/// The label of a predefined type ("16S", "C32R"), or an empty string.
std::string Label(const DataType& type);
/// The position of a predefined type among the 21 (PredefinedTypes), or -1.
int PredefinedIndex(const DataType& type);
/// The predefined type of a label, if there is one.
std::optional<DataType> FromLabel(const std::string& label);
/// The 21 predefined types in the order of DataType's constants.
std::vector<DataType> PredefinedTypes();
/// The type of one sample of a numpy dtype: integers, floats and complex floats of native
/// byte order; none for anything else (bool, float16, strings, swapped byte order).
std::optional<DataType> FromNumpy(const py::dtype& dtype);
/// The numpy dtype of one sample, or None (complex integers, packed and unknown types).
py::object SampleDtype(const DataType& type);
/// The numpy dtype of one component of a sample (int16 for C16S), or None.
py::object ComponentDtype(const DataType& type);
/// A type from a DataType, a label or anything numpy.dtype() accepts.
/// @throws TypeError or ValueError naming `argument`.
DataType ParseDataType(py::handle value, const char* argument);
/// `label` of a type, or its six fields when it is no predefined type.
std::string Describe(const DataType& type);

/// A numpy array read as samples of a library type. A complex integer sample (C16S) is held
/// in an integer array as a last axis of length 2 (real, imaginary); that axis is part of
/// the sample, not of the logical shape.
struct Samples {
    py::array array;                   ///< keeps the memory alive
    DataType type;                     ///< the library type of one sample
    std::vector<py::ssize_t> shape;    ///< logical shape: without the pair axis
    std::vector<py::ssize_t> strides;  ///< bytes between samples along each logical axis
    std::size_t sampleBytes = 0;       ///< bytes of one sample, both components
    unsigned char* data = nullptr;
    std::uint64_t count = 0;  ///< number of samples

    /// Whether the samples lie one after the other in C order.
    bool IsContiguous() const;
    /// Whether the samples along the last logical axis lie one after the other.
    bool IsLastAxisContiguous() const;
};

/// Reads `value` as samples: of its dtype's type, or of `sampleType` when that is not None
/// (a complex type may then be read from an array of its components with a last axis of
/// length 2). Never copies.
/// @throws TypeError naming `argument` for anything but a numpy array of such samples.
Samples ReadSamples(py::handle value, const char* argument, py::handle sampleType);
/// The same with the sample type already parsed (none: the dtype's).
Samples ReadSamples(py::handle value, const char* argument, const std::optional<DataType>& type);
/// The same samples in a new C-contiguous array (for layouts the kernels cannot walk).
Samples ContiguousCopy(const Samples& samples);
/// A new C-contiguous array of `shape` samples of `type`: of its numpy dtype, or of its
/// component dtype with a last axis of 2 for complex integers.
Samples NewSamples(const DataType& type, const std::vector<py::ssize_t>& shape);
/// @throws ValueError naming `argument` when the array cannot be written.
void RequireWriteable(const Samples& samples, const char* argument);
/// Whether the memory of two arrays may overlap (their byte ranges intersect).
bool MayOverlap(const Samples& a, const Samples& b);

/// The largest count that one call of a library kernel takes from the binding: the
/// library's own limit, or less when a test has lowered it (`_set_piece_limit`), so that
/// the paths that cut large inputs into pieces are tested on small ones.
std::uint64_t PieceLimit(std::uint64_t libraryLimit);

/// Calls fn(src, dst, count) for runs of samples that lie one after the other in both
/// arrays (of equal logical shape), at most `limit` samples a run. Call without the GIL.
template <class Fn>
void ForEachRun(const Samples& src, const Samples& dst, std::uint64_t limit, Fn fn) {
    const std::size_t ndim = src.shape.size();
    // Merge trailing axes while both arrays hold them contiguously.
    std::uint64_t run = 1;
    std::size_t outer = ndim;
    while (outer > 0) {
        const std::size_t axis = outer - 1;
        const auto extent = static_cast<std::uint64_t>(src.shape[axis]);
        const bool packed =
            extent == 1 ||
            (static_cast<std::uint64_t>(src.strides[axis]) == run * src.sampleBytes &&
             static_cast<std::uint64_t>(dst.strides[axis]) == run * dst.sampleBytes);
        if (!packed) {
            break;
        }
        run *= extent;
        outer = axis;
    }
    if (src.count == 0) {
        return;
    }
    std::vector<py::ssize_t> index(outer, 0);
    while (true) {
        const unsigned char* from = src.data;
        unsigned char* to = dst.data;
        for (std::size_t axis = 0; axis < outer; ++axis) {
            from += index[axis] * src.strides[axis];
            to += index[axis] * dst.strides[axis];
        }
        for (std::uint64_t done = 0; done < run;) {
            const std::uint64_t piece = std::min(run - done, limit);
            fn(from + done * src.sampleBytes, to + done * dst.sampleBytes, piece);
            done += piece;
        }
        std::size_t axis = outer;
        while (axis > 0 && ++index[axis - 1] == src.shape[axis - 1]) {
            index[--axis] = 0;
        }
        if (axis == 0) {
            return;
        }
    }
}

/// A new Python object of `kubo._types.Tile` (x, y, width, height).
py::object MakeTile(unsigned int x, unsigned int y, unsigned int width, unsigned int height);
/// Reads a window (x, y, width, height) of non-negative integers.
/// @throws TypeError or ValueError naming `window`.
void ReadWindow(py::handle window, std::uint64_t bounds[4]);

}  // namespace kora::kubo::python

#endif  // KUBO_PYTHON_SRC_ARRAYS_H
