// Arrays read as samples, new result arrays, the piece limit and tiles.
#include "arrays.h"

#include <algorithm>  // std::max, std::min
#include <atomic>
#include <cstring>  // std::memcpy
#include <string>

namespace kora::kubo::python {
namespace {

std::atomic<std::uint64_t> g_pieceLimit{UINT64_MAX};

std::string TypeName(py::handle value) {
    return py::str(py::type::handle_of(value).attr("__name__")).cast<std::string>();
}

std::string DtypeName(const py::dtype& dtype) {
    return py::str(py::handle(dtype)).cast<std::string>();
}

// The dtype of the components of `type` equals `dtype` (kind and size, native order).
bool HoldsComponents(const py::dtype& dtype, const DataType& type) {
    const py::object component = ComponentDtype(type);
    return !component.is_none() && dtype.equal(component);
}

}  // namespace

bool Samples::IsContiguous() const {
    std::uint64_t expected = sampleBytes;
    for (std::size_t axis = shape.size(); axis > 0; --axis) {
        const auto extent = static_cast<std::uint64_t>(shape[axis - 1]);
        if (extent != 1 && static_cast<std::uint64_t>(strides[axis - 1]) != expected) {
            return false;
        }
        expected *= extent;
    }
    return true;
}

bool Samples::IsLastAxisContiguous() const {
    return shape.empty() || shape.back() <= 1 ||
           static_cast<std::size_t>(strides.back()) == sampleBytes;
}

Samples ReadSamples(py::handle value, const char* argument, py::handle sampleType) {
    return ReadSamples(value, argument,
                       sampleType.is_none()
                           ? std::nullopt
                           : std::optional<DataType>(ParseDataType(sampleType, "sample_type")));
}

Samples ReadSamples(py::handle value, const char* argument, const std::optional<DataType>& type) {
    // A numpy scalar is read as the 0-d array of its own dtype.
    static py::object* scalar =
        new py::object(py::module_::import("numpy").attr("generic"));  // NOLINT: kept for good
    if (!py::isinstance<py::array>(value) && py::isinstance(value, *scalar)) {
        return ReadSamples(py::module_::import("numpy").attr("asarray")(value), argument, type);
    }
    if (!py::isinstance<py::array>(value)) {
        throw py::type_error(std::string(argument) + " must be a numpy.ndarray, not " +
                             TypeName(value));
    }
    Samples samples;
    samples.array = py::reinterpret_borrow<py::array>(value);
    const py::dtype dtype = samples.array.dtype();
    const std::optional<DataType> natural = FromNumpy(dtype);
    const auto ndim = static_cast<std::size_t>(samples.array.ndim());
    samples.shape.assign(samples.array.shape(), samples.array.shape() + ndim);
    samples.strides.assign(samples.array.strides(), samples.array.strides() + ndim);
    samples.sampleBytes = static_cast<std::size_t>(dtype.itemsize());
    if (!type) {
        if (!natural) {
            throw py::type_error(std::string(argument) + " has dtype " + DtypeName(dtype) +
                                 ", which holds no kubo sample type");
        }
        samples.type = *natural;
    } else {
        samples.type = *type;
        if (!natural || *natural != samples.type) {
            // A complex sample held as its two components on a last axis of length 2.
            const bool pairs =
                samples.type.isComplex && HoldsComponents(dtype, samples.type) && ndim >= 1 &&
                samples.shape.back() == 2 &&
                static_cast<std::size_t>(samples.strides.back()) == samples.sampleBytes;
            if (!pairs) {
                throw py::type_error(
                    std::string(argument) + " of dtype " + DtypeName(dtype) + " and shape " +
                    py::str(samples.array.attr("shape")).cast<std::string>() + " does not hold " +
                    Describe(samples.type) + " samples (complex integers need a last axis of 2)");
            }
            samples.shape.pop_back();
            samples.strides.pop_back();
            samples.sampleBytes *= 2;
        }
    }
    samples.data = static_cast<unsigned char*>(const_cast<void*>(samples.array.data()));
    samples.count = 1;
    for (const py::ssize_t extent : samples.shape) {
        samples.count *= static_cast<std::uint64_t>(extent);
    }
    return samples;
}

Samples NewSamples(const DataType& type, const std::vector<py::ssize_t>& shape) {
    Samples samples;
    samples.type = type;
    samples.shape = shape;
    py::object dtype = SampleDtype(type);
    std::vector<py::ssize_t> arrayShape = shape;
    if (dtype.is_none()) {
        dtype = ComponentDtype(type);
        arrayShape.push_back(2);
    }
    samples.array = py::array(py::reinterpret_borrow<py::dtype>(dtype), arrayShape);
    samples.sampleBytes = static_cast<std::size_t>(samples.array.itemsize()) *
                          (arrayShape.size() > shape.size() ? 2 : 1);
    samples.strides.assign(samples.array.strides(), samples.array.strides() + shape.size());
    samples.data = static_cast<unsigned char*>(samples.array.mutable_data());
    samples.count = 1;
    for (const py::ssize_t extent : shape) {
        samples.count *= static_cast<std::uint64_t>(extent);
    }
    return samples;
}

Samples ContiguousCopy(const Samples& samples) {
    Samples copy = NewSamples(samples.type, samples.shape);
    {
        py::gil_scoped_release release;
        ForEachRun(samples, copy, UINT64_MAX,
                   [&](const unsigned char* from, unsigned char* to, std::uint64_t count) {
                       std::memcpy(to, from, static_cast<std::size_t>(count) * copy.sampleBytes);
                   });
    }
    return copy;
}

void RequireWriteable(const Samples& samples, const char* argument) {
    if (!samples.array.writeable()) {
        throw py::value_error(std::string(argument) + " is read-only");
    }
}

bool MayOverlap(const Samples& a, const Samples& b) {
    // The byte range each array spans, whatever the signs of its strides.
    const auto span = [](const Samples& s, const unsigned char*& low, const unsigned char*& high) {
        low = high = s.data;
        for (std::size_t axis = 0; axis < s.shape.size(); ++axis) {
            const py::ssize_t reach = (s.shape[axis] - 1) * s.strides[axis];
            (reach < 0 ? low : high) += reach;
        }
        high += s.sampleBytes;
    };
    if (a.count == 0 || b.count == 0) {
        return false;
    }
    const unsigned char *aLow, *aHigh, *bLow, *bHigh;
    span(a, aLow, aHigh);
    span(b, bLow, bHigh);
    return aLow < bHigh && bLow < aHigh;
}

std::uint64_t PieceLimit(std::uint64_t libraryLimit) {
    return std::max<std::uint64_t>(1, std::min(libraryLimit, g_pieceLimit.load()));
}

py::object MakeTile(unsigned int x, unsigned int y, unsigned int width, unsigned int height) {
    // Imported once and kept for the life of the process, like the module itself.
    static py::object* tile =
        new py::object(py::module_::import("kubo._types").attr("Tile"));  // NOLINT
    return (*tile)(x, y, width, height);
}

void ReadWindow(py::handle window, std::uint64_t bounds[4]) {
    if (!py::isinstance<py::sequence>(window) || py::len(window) != 4) {
        throw py::type_error("window must be a sequence (x, y, width, height), not " +
                             TypeName(window));
    }
    const auto items = py::reinterpret_borrow<py::sequence>(window);
    for (std::size_t i = 0; i < 4; ++i) {
        const py::object item = items[i];
        if (!py::isinstance<py::int_>(item) && !py::hasattr(item, "__index__")) {
            throw py::type_error("window must hold integers, not " + TypeName(item));
        }
        const auto value = py::int_(item).cast<long long>();
        if (value < 0) {
            throw py::value_error("window (x, y, width, height) must not be negative");
        }
        bounds[i] = static_cast<std::uint64_t>(value);
    }
}

void RegisterPieceLimit(py::module_& m) {
    m.def(
        "_set_piece_limit",
        [](std::uint64_t limit) { return g_pieceLimit.exchange(limit == 0 ? UINT64_MAX : limit); },
        py::arg("limit"),
        "Caps the count one library call receives (0 restores the library's limits) and "
        "returns the previous cap. For tests of the paths that cut inputs into pieces.");
}

}  // namespace kora::kubo::python
