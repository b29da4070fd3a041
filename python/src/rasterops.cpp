// kubo.complex_to_real and kubo.fill_margins: whole-raster operations on numpy arrays.
#include <cstdint>
#include <string>
#include <utility>  // std::pair
#include <vector>

#include "arrays.h"
#include "vrkframework/basic/kubo/raster/complexrasterinterpretation.h"
#include "vrkframework/basic/kubo/raster/marginfiller.h"
#include "vrkframework/basic/kubo/raster/raster.h"

namespace kora::kubo::python {
namespace {

constexpr std::pair<const char*, kora::core::KORAInterpretationTypes> kInterpretations[] = {
    {"real", kora::core::INTERPRETATION_REAL},
    {"imaginary", kora::core::INTERPRETATION_IMAGINARY},
    {"amplitude", kora::core::INTERPRETATION_AMPLITUDE},
    {"phase", kora::core::INTERPRETATION_PHASE},
    {"intensity", kora::core::INTERPRETATION_INTENSITY},
    {"db", kora::core::INTERPRETATION_DB},
};

constexpr std::pair<const char*, unsigned int> kBands[] = {
    {"right", MARGIN_RIGHT},   {"left", MARGIN_LEFT}, {"top", MARGIN_TOP},
    {"bottom", MARGIN_BOTTOM}, {"all", MARGIN_ALL},
};

py::array ComplexToReal(const py::object& array, const std::string& interpretation,
                        const py::object& sampleType) {
    const kora::core::KORAInterpretationTypes* code = nullptr;
    for (const auto& entry : kInterpretations) {
        if (interpretation == entry.first) {
            code = &entry.second;
        }
    }
    if (code == nullptr) {
        throw py::value_error(
            "interpretation must be 'amplitude', 'phase', 'real', "
            "'imaginary', 'intensity' or 'db', not '" +
            interpretation + "'");
    }
    Samples src = ReadSamples(array, "array", sampleType);
    if (!src.type.isComplex) {
        throw py::type_error("array must hold complex samples, not " + Describe(src.type) +
                             " (complex integers: pass sample_type)");
    }
    if (!src.IsContiguous()) {
        src = ContiguousCopy(src);
    }
    Samples out = NewSamples(DataType::Type32R, src.shape);
    {
        py::gil_scoped_release release;
        // A fresh interpretation per call: its cached worker is never shared between threads.
        const ComplexInterpretation interpret;
        // The operation runs over samples one after another whatever the raster's shape, so
        // the array is handed over as rows of samples, each within the 32-bit width.
        const std::uint64_t piece = PieceLimit(UINT32_MAX);
        for (std::uint64_t done = 0; done < src.count; done += piece) {
            const auto n = static_cast<unsigned int>(std::min(piece, src.count - done));
            const Raster in = WrapRaster(src.data + done * src.sampleBytes,
                                         RasterInfo(n, 1, 1, src.type), RasterContext());
            Raster result = WrapRaster(out.data + done * out.sampleBytes,
                                       RasterInfo(n, 1, 1, DataType::Type32R), RasterContext());
            interpret.InterpretRaster(&in, &result, *code);
        }
    }
    return out.array;
}

unsigned int ParseBands(const py::object& bands) {
    const auto one = [](const std::string& name) {
        for (const auto& entry : kBands) {
            if (name == entry.first) {
                return entry.second;
            }
        }
        throw py::value_error("bands must name 'left', 'top', 'right', 'bottom' or 'all', not '" +
                              name + "'");
    };
    if (py::isinstance<py::str>(bands)) {
        return one(bands.cast<std::string>());
    }
    unsigned int set = 0;
    for (const py::handle band : bands) {
        set |= one(py::str(band).cast<std::string>());
    }
    return set;
}

void FillMargins(const py::object& array, const py::object& margin, const std::string& behaviour,
                 const py::object& bands, const py::object& sampleType) {
    eMarginBehaviour rule = MARGIN_ZERO;
    if (behaviour == "mirror") {
        rule = MARGIN_MIRROR;
    } else if (behaviour == "wrap") {
        rule = MARGIN_WRAP;
    } else if (behaviour != "zero") {
        throw py::value_error("behaviour must be 'zero', 'mirror' or 'wrap', not '" + behaviour +
                              "'");
    }
    const unsigned int bandSet = ParseBands(bands);
    const Samples samples = ReadSamples(array, "array", sampleType);
    if (samples.shape.size() != 2 && samples.shape.size() != 3) {
        throw py::value_error(
            "array must have the shape (rows, columns) or (rows, columns, "
            "channels), not " +
            std::to_string(samples.shape.size()) + " dimensions");
    }
    RequireWriteable(samples, "array");
    if (!samples.IsContiguous()) {
        throw py::value_error("array must be C-contiguous: its margins are filled in place");
    }
    long long xMargin = 0;
    long long yMargin = 0;
    if (py::isinstance<py::sequence>(margin)) {
        const auto pair = margin.cast<std::pair<long long, long long>>();
        xMargin = pair.first;
        yMargin = pair.second;
    } else {
        xMargin = yMargin = margin.cast<long long>();
    }
    const long long rows = samples.shape[0];
    const long long columns = samples.shape[1];
    if (xMargin < 0 || yMargin < 0 || 2 * xMargin > columns || 2 * yMargin > rows ||
        columns > UINT32_MAX || rows > UINT32_MAX) {
        throw py::value_error(
            "margin must be one or two (x, y) non-negative counts that fit "
            "twice in the array's columns and rows");
    }
    const std::uint64_t channels =
        samples.shape.size() == 3 ? static_cast<std::uint64_t>(samples.shape[2]) : 1;
    py::gil_scoped_release release;
    Raster raster = WrapRaster(samples.data,
                               RasterInfo(static_cast<unsigned int>(columns - 2 * xMargin),
                                          static_cast<unsigned int>(rows - 2 * yMargin),
                                          static_cast<unsigned int>(channels), samples.type),
                               RasterContext(static_cast<unsigned int>(xMargin),
                                             static_cast<unsigned int>(yMargin), 0, 0));
    FillRasterMargins(&raster, rule, bandSet);
}

}  // namespace

void RegisterRasterOps(py::module_& m) {
    m.def("complex_to_real", &ComplexToReal, py::arg("array"),
          py::arg("interpretation") = "amplitude", py::kw_only(),
          py::arg("sample_type") = py::none(),
          R"doc(Turns complex samples into real ones by an interpretation.

For each sample (re, im), read as double: ``"real"`` re, ``"imaginary"`` im,
``"amplitude"`` sqrt(re^2 + im^2), ``"phase"`` atan2(im, re), ``"intensity"``
re^2 + im^2, ``"db"`` 10 log10(re^2 + im^2); the result is rounded to float32.

Parameters
----------
array : numpy.ndarray
    Complex samples of any shape: complex64 or complex128, or a complex integer
    type held with a last axis of 2 (give ``sample_type``).
interpretation : str
    One of the six names above.
sample_type : DataType, str or dtype-like, optional
    The complex type the array holds (e.g. ``"C16S"``).

Returns
-------
numpy.ndarray
    A new float32 array of the array's shape (without the pair axis).

Raises
------
TypeError
    For an array that does not hold complex samples.
ValueError
    For an unknown interpretation.

Notes
-----
A view that is not C-contiguous is copied first. Each call uses its own
interpretation object, so calls from several threads never share its cached
worker; the interpreter lock is released while converting.
)doc");
    m.def("fill_margins", &FillMargins, py::arg("array"), py::arg("margin"),
          py::arg("behaviour") = "mirror", py::arg("bands") = "all", py::kw_only(),
          py::arg("sample_type") = py::none(),
          R"doc(Fills the margins of a padded image in place, from its own pixels.

The image proper is ``array[ym:rows - ym, xm:columns - xm]``; the bands are
filled in the order left, top, right, bottom, each finished before the next
(corners belong to two bands). ``"zero"`` sets every byte to 0, ``"mirror"``
reflects about the image edge (the edge pixel repeated first), ``"wrap"``
continues the image periodically. With only some bands, mirror and wrap read
margin pixels as they stand, as the library defines.

Parameters
----------
array : numpy.ndarray
    A writeable, C-contiguous image with its margins, of shape (rows, columns)
    or (rows, columns, channels).
margin : int or (int, int)
    The margin on every side, or (x, y): columns left and right, rows above
    and below; at most half the array's columns and rows.
behaviour : {"zero", "mirror", "wrap"}
    How margin pixels are made.
bands : str or iterable of str
    ``"all"``, or some of ``"left"``, ``"top"``, ``"right"``, ``"bottom"``.
sample_type : DataType, str or dtype-like, optional
    The type the array holds when its dtype alone does not say.

Returns
-------
None

Raises
------
TypeError
    For an array that is no numpy array of samples.
ValueError
    For a read-only or non-contiguous array, margins that do not fit, or an
    unknown behaviour or band.
)doc");
}

}  // namespace kora::kubo::python
