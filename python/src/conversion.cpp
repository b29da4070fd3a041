// kubo.convert, kubo.pack and kubo.unpack: the library's converters over numpy arrays.
#include <cstdint>
#include <cstring>  // std::memcpy
#include <memory>
#include <mutex>  // std::call_once
#include <string>
#include <vector>

#include "arrays.h"
#include "vrkframework/basic/core/typeconv/ipromote.h"
#include "vrkframework/basic/kubo/raster/promotefactory.h"

namespace kora::kubo::python {
namespace {

// One conversion call takes at most this many samples: the count is 32-bit, complex
// kernels index components with 32 bits and packed kernels refuse 2^31 samples or more.
// A multiple of 8, so that every piece of a packed stream starts on a byte.
constexpr std::uint64_t kLibraryPiece = std::uint64_t{1} << 30;

std::uint64_t PackedPiece() { return std::max<std::uint64_t>(8, PieceLimit(kLibraryPiece) & ~7u); }

// The factory's converter between two predefined types, made on first use and kept for the
// life of the process: converters hold no state and serve any number of threads at once,
// and choosing one costs more than converting a few samples. Null for equal types.
typeconv::IPromote* Converter(const DataType& from, const DataType& to) {
    constexpr std::size_t kTypes = 21;
    static std::once_flag made[kTypes][kTypes];
    static std::unique_ptr<typeconv::IPromote> converters[kTypes][kTypes];
    const auto i = static_cast<std::size_t>(PredefinedIndex(from));
    const auto j = static_cast<std::size_t>(PredefinedIndex(to));
    std::call_once(made[i][j], [&] { converters[i][j].reset(PromoteFactory().Create(from, to)); });
    return converters[i][j].get();
}

bool IsWholeType(const DataType& type) { return !Label(type).empty() && type != DataType::Type1U; }

// A packed bit count the factory serves: 1 to 31, except the whole-byte 8, 16 and 24.
unsigned int PackedBits(int bits) {
    if (bits < 1 || bits > 31 || bits % 8 == 0) {
        throw py::value_error("bits must be 1 to 31 except 8, 16 and 24, not " +
                              std::to_string(bits));
    }
    return static_cast<unsigned int>(bits);
}

DataType IntegerType(py::handle dtype, const char* argument) {
    const DataType type = ParseDataType(dtype, argument);
    if (type.isFloat || type.isComplex || !IsWholeType(type)) {
        throw py::type_error(std::string(argument) + " must be an integer type, not " +
                             Describe(type));
    }
    return type;
}

py::array Convert(const py::object& array, const py::object& dtype, const py::object& out,
                  const py::object& sampleType) {
    Samples src = ReadSamples(array, "array", sampleType);
    const DataType to = ParseDataType(dtype, "dtype");
    if (!IsWholeType(to)) {
        throw py::value_error("dtype must be a whole-byte predefined type, not " + Describe(to) +
                              " (packed samples go through kubo.pack)");
    }
    Samples dst;
    bool throughTemporary = false;
    if (out.is_none()) {
        dst = NewSamples(to, src.shape);
    } else {
        dst = ReadSamples(out, "out", std::optional<DataType>(to));
        if (dst.shape != src.shape) {
            std::vector<py::ssize_t> needed = src.shape;
            if (SampleDtype(to).is_none()) {
                needed.push_back(2);
            }
            throw py::value_error(
                "out has the shape " + py::str(dst.array.attr("shape")).cast<std::string>() +
                ", the result the shape " +
                py::str(py::handle(py::tuple(py::cast(needed)))).cast<std::string>());
        }
        RequireWriteable(dst, "out");
        // Kernels read and write in one pass: overlapping memory is read from a copy.
        if (MayOverlap(src, dst)) {
            src = ContiguousCopy(src);
        }
        throughTemporary = !dst.IsLastAxisContiguous();
    }
    if (!src.IsLastAxisContiguous()) {
        src = ContiguousCopy(src);
    }
    Samples target = throughTemporary ? NewSamples(to, src.shape) : dst;
    typeconv::IPromote* kernel = Converter(src.type, to);
    {
        py::gil_scoped_release release;
        ForEachRun(src, target, PieceLimit(kLibraryPiece),
                   [&](const unsigned char* from, unsigned char* into, std::uint64_t count) {
                       if (kernel) {
                           kernel->Promote(from, into, static_cast<unsigned int>(count));
                       } else {
                           // Equal types: the factory has nothing to do; the result is a copy.
                           std::memcpy(into, from,
                                       static_cast<std::size_t>(count) * target.sampleBytes);
                       }
                   });
    }
    if (throughTemporary) {
        dst.array.attr("__setitem__")(py::ellipsis(), target.array);
    }
    return dst.array;
}

py::array Unpack(const py::buffer& data, int bitsArgument, long long count,
                 const py::object& dtype) {
    const unsigned int bits = PackedBits(bitsArgument);
    const DataType to = IntegerType(dtype, "dtype");
    if (count < 0) {
        throw py::value_error("count must not be negative");
    }
    const py::buffer_info stream = data.request();
    py::ssize_t expected = 1;
    bool contiguous = stream.itemsize == 1;
    for (std::size_t axis = stream.shape.size(); contiguous && axis > 0; --axis) {
        contiguous = stream.shape[axis - 1] <= 1 || stream.strides[axis - 1] == expected;
        expected *= stream.shape[axis - 1];
    }
    if (!contiguous) {
        throw py::type_error("data must be contiguous bytes (bytes, bytearray or uint8 array)");
    }
    const auto samples = static_cast<std::uint64_t>(count);
    const std::uint64_t needed = (samples * bits + 7) / 8;
    if (static_cast<std::uint64_t>(stream.size) < needed) {
        throw py::value_error("data holds " + std::to_string(stream.size) + " bytes, " +
                              std::to_string(count) + " samples of " + std::to_string(bits) +
                              " bits need " + std::to_string(needed));
    }
    Samples result = NewSamples(to, {static_cast<py::ssize_t>(count)});
    const std::unique_ptr<typeconv::IPromote> kernel(
        PromoteFactory().Create(DataType(bits, false, false, bits, 0, false), to));
    const auto* packed = static_cast<const unsigned char*>(stream.ptr);
    const std::uint64_t piece = PackedPiece();
    {
        py::gil_scoped_release release;
        for (std::uint64_t done = 0; done < samples; done += piece) {
            const std::uint64_t n = std::min(piece, samples - done);
            kernel->Promote(packed + done * bits / 8, result.data + done * result.sampleBytes,
                            static_cast<unsigned int>(n));
        }
    }
    return result.array;
}

py::array Pack(const py::object& array, int bitsArgument) {
    const unsigned int bits = PackedBits(bitsArgument);
    Samples src = ReadSamples(array, "array", py::none());
    if (src.type.isFloat || src.type.isComplex) {
        throw py::type_error("array must hold integers, not " + Describe(src.type));
    }
    if (!src.IsContiguous()) {
        src = ContiguousCopy(src);
    }
    const std::uint64_t bytes = (src.count * bits + 7) / 8;
    py::array_t<std::uint8_t> stream(static_cast<py::ssize_t>(bytes));
    unsigned char* packed = stream.mutable_data();
    const std::unique_ptr<typeconv::IPromote> kernel(
        PromoteFactory().Create(src.type, DataType(bits, false, false, bits, 0, false)));
    const std::uint64_t piece = PackedPiece();
    py::gil_scoped_release release;
    for (std::uint64_t done = 0; done < src.count; done += piece) {
        const std::uint64_t n = std::min(piece, src.count - done);
        kernel->Promote(src.data + done * src.sampleBytes, packed + done * bits / 8,
                        static_cast<unsigned int>(n));
    }
    return std::move(stream);
}

}  // namespace

void RegisterConversion(py::module_& m) {
    m.def("convert", &Convert, py::arg("array"), py::arg("dtype"), py::kw_only(),
          py::arg("out") = py::none(), py::arg("sample_type") = py::none(),
          R"doc(Converts samples to another type with the library's saturation and rounding.

Every pair of the ten component types converts by its own rule: integers
saturate (never wrap, unlike ``numpy.astype``); floats round half away from zero
into signed integers and half up into unsigned ones, and saturate; NaN becomes
0 in 8- and 16-bit integers; a few pairs keep deliberate quirks of the library
(a negative 32-bit integer into a 64-bit one gives 0, a negative 64-bit integer
into a narrower type wraps). Real to complex sets the imaginary part to 0;
complex to real keeps the real part.

Parameters
----------
array : numpy.ndarray
    The samples, any shape (a numpy scalar is read as a 0-d array). A complex integer array (e.g. C16S) is an integer
    array with a last axis of length 2; pass ``sample_type`` to read it so.
dtype : DataType, str or dtype-like
    The type to convert to, one of the 20 whole-byte predefined types.
out : numpy.ndarray, optional
    A writeable array of the result's shape and dtype to fill; it may be strided
    (a last axis that is not contiguous is filled through a temporary).
sample_type : DataType, str or dtype-like, optional
    The type ``array`` holds, when its dtype alone does not say (complex integers,
    or a complex float type held as pairs of floats).

Returns
-------
numpy.ndarray
    ``out``, or a new C-contiguous array that owns its memory: of the dtype of
    ``dtype``, or of its component dtype with a last axis of 2 for complex integers.
    Converting to the same type gives a copy.

Raises
------
TypeError
    When ``array`` or ``out`` is no numpy array of suitable samples.
ValueError
    For a type that is no whole-byte type, a shape mismatch or a read-only ``out``.

Notes
-----
C-contiguous input is converted in place, without a copy; rows of a strided
view are handed to the kernel one contiguous run at a time; a view whose last
axis is not contiguous is copied first, as is input that overlaps ``out``. Any
number of samples converts (the library takes at most 2^30 a call, so large
arrays go in pieces). The interpreter lock is released while converting.
)doc");
    m.def("unpack", &Unpack, py::arg("data"), py::arg("bits"), py::arg("count"), py::arg("dtype"),
          R"doc(Unpacks a stream of packed ``bits``-bit unsigned samples.

Sample i occupies stream bits ``bits * i`` to ``bits * i + bits - 1``, most
significant first; stream bit k is bit ``7 - k % 8`` of byte ``k // 8``.
Values are zero-extended whatever the sign of ``dtype``.

Parameters
----------
data : bytes-like
    The stream: bytes, bytearray, memoryview or a contiguous uint8 array holding
    at least ``(count * bits + 7) // 8`` bytes.
bits : int
    Bits of one sample, 1 to 31 except 8, 16 and 24.
count : int
    Number of samples.
dtype : DataType, str or dtype-like
    An integer type to unpack into.

Returns
-------
numpy.ndarray
    A new 1-D array of ``count`` samples.

Raises
------
TypeError
    For a non-integer ``dtype`` or data that is not contiguous bytes.
ValueError
    For an unsupported ``bits``, a negative ``count`` or too short ``data``.
kubo.Error
    When ``bits`` exceeds the width of ``dtype``.
)doc");
    m.def("pack", &Pack, py::arg("array"), py::arg("bits"),
          R"doc(Packs integer samples into a stream of ``bits``-bit samples.

The layout is that of :func:`unpack`; the bits after the last sample are 0.
Values are not clamped: each must fit in ``bits`` bits (a larger one loses its
high bits within one byte, or spills them into the previous sample).

Parameters
----------
array : numpy.ndarray
    Integer samples, any shape, taken in C order (a non-contiguous view is
    copied first).
bits : int
    Bits of one sample, 1 to 31 except 8, 16 and 24.

Returns
-------
numpy.ndarray
    A new 1-D uint8 array of ``(array.size * bits + 7) // 8`` bytes.

Raises
------
TypeError
    For an array that does not hold integers.
ValueError
    For an unsupported ``bits``.
kubo.Error
    When ``bits`` exceeds the width of the array's integers.
)doc");
}

}  // namespace kora::kubo::python
