// kubo.LUT and kubo.PCT: lookup and pseudocolour tables applied to whole arrays in C++.
#include <cstdint>
#include <string>
#include <utility>  // std::pair
#include <vector>

#include "arrays.h"
#include "vrkframework/basic/kubo/luts/lut.h"
#include "vrkframework/basic/kubo/luts/pct.h"

namespace kora::kubo::python {
namespace {

using Colour = PCT::Colour;

double ReadNumber(const py::object& value) {
    try {
        return value.cast<double>();
    } catch (py::cast_error&) {
        throw py::type_error("values must be a real number or a numpy array of them");
    }
}

// Calls fn(T()) with the element type of a real whole-byte type.
template <class Fn>
void VisitReal(const DataType& type, Fn fn) {
    if (type.isFloat) {
        type.bits == 32 ? fn(float()) : fn(double());
        return;
    }
    switch (type.bits) {
        case 8:
            type.isSigned ? fn(std::int8_t()) : fn(std::uint8_t());
            return;
        case 16:
            type.isSigned ? fn(std::int16_t()) : fn(std::uint16_t());
            return;
        case 32:
            type.isSigned ? fn(std::int32_t()) : fn(std::uint32_t());
            return;
        default:
            type.isSigned ? fn(std::int64_t()) : fn(std::uint64_t());
    }
}

// Applies `lookup` (double -> Out::Value) to every value of a real array, into a new array
// of Out::Component of the array's shape plus `extra`.
template <class Out, class Lookup>
py::object Map(const py::object& values, const std::vector<py::ssize_t>& extra, Lookup lookup) {
    Samples src = ReadSamples(values, "values", py::none());
    if (src.type.isComplex) {
        throw py::type_error("values must be real, not " + Describe(src.type));
    }
    if (!src.IsLastAxisContiguous()) {
        src = ContiguousCopy(src);
    }
    std::vector<py::ssize_t> shape = src.shape;
    shape.insert(shape.end(), extra.begin(), extra.end());
    Samples dst;
    dst.array = py::array(py::dtype::of<typename Out::Component>(), shape);
    dst.shape = src.shape;
    dst.sampleBytes = sizeof(typename Out::Value);
    dst.strides.assign(dst.array.strides(), dst.array.strides() + src.shape.size());
    dst.data = static_cast<unsigned char*>(dst.array.mutable_data());
    py::gil_scoped_release release;
    VisitReal(src.type, [&](auto zero) {
        using T = decltype(zero);
        ForEachRun(src, dst, UINT64_MAX,
                   [&](const unsigned char* from, unsigned char* to, std::uint64_t count) {
                       const auto* in = reinterpret_cast<const T*>(from);
                       auto* out = reinterpret_cast<typename Out::Value*>(to);
                       for (std::uint64_t i = 0; i < count; ++i) {
                           out[i] = lookup(static_cast<double>(in[i]));
                       }
                   });
    });
    return std::move(dst.array);
}

struct RealOut {
    using Component = double;
    using Value = double;
};
struct ColourOut {
    using Component = std::uint8_t;
    using Value = Colour;
};

std::vector<unsigned char> ReadBytes(const py::object& values) {
    if (py::isinstance<py::bytes>(values) || py::isinstance<py::bytearray>(values)) {
        const std::string text = values.cast<std::string>();
        return {text.begin(), text.end()};
    }
    std::vector<unsigned char> bytes;
    for (const py::handle value : values) {
        const auto v = value.cast<long long>();
        if (v < 0 || v > 255) {
            throw py::value_error("values must be bytes (0 to 255), not " + std::to_string(v));
        }
        bytes.push_back(static_cast<unsigned char>(v));
    }
    return bytes;
}

Colour ReadColour(py::handle colour) {
    const std::vector<unsigned char> rgb = ReadBytes(py::reinterpret_borrow<py::object>(colour));
    if (rgb.size() != 3) {
        throw py::value_error("a colour is (red, green, blue)");
    }
    return {rgb[0], rgb[1], rgb[2]};
}

PCT ReadPct(const py::object& entries) {
    std::vector<PCT::Entry> table;
    for (const py::handle entry : entries) {
        const auto pair = py::reinterpret_borrow<py::sequence>(entry);
        if (py::len(pair) != 2) {
            throw py::value_error("an entry is (input, (red, green, blue))");
        }
        table.emplace_back(pair[0].cast<double>(), ReadColour(pair[1]));
    }
    return PCT(table);
}

py::tuple ColourTuple(const Colour& colour) { return py::make_tuple(colour.r, colour.g, colour.b); }

py::object ToPython(double value) { return py::float_(value); }
py::object ToPython(const Colour& colour) { return ColourTuple(colour); }

// What both tables offer beyond construction and lookup.
template <class Table, class Class>
void AddTableMembers(Class& cls, bool (*isClassic)(const Table&), const char* classicDoc) {
    cls.def_property_readonly(
           "entries",
           [](const Table& table) {
               py::list entries;
               for (const auto& entry : table.GetEntries()) {
                   entries.append(py::make_tuple(entry.first, ToPython(entry.second)));
               }
               return entries;
           },
           "The breakpoints (input, output) in ascending order of input.")
        .def_property_readonly(
            "input_range",
            [](const Table& table) {
                double low = 0;
                double high = 0;
                table.GetInputValueRange(low, high);
                return py::make_tuple(low, high);
            },
            "Inputs of the first and the last breakpoint.")
        .def_property_readonly("is_classic", isClassic, classicDoc)
        .def("__len__", &Table::GetEntryCount)
        .def(
            "value_by_index",
            [](const Table& table, unsigned long long index) {
                return ToPython(table.GetValueByIndex(index));
            },
            py::arg("index"),
            "Output of breakpoint ``index``; an index past the end reads the last.");
}

const char kLookupDoc[] = R"doc(

Parameters
----------
values : float or numpy.ndarray
    A number, or an array of any real dtype and shape (a view whose last axis
    is not contiguous is copied first).

Returns
-------
%s

Raises
------
TypeError
    For values that are not real numbers.
)doc";

std::string LookupDoc(const char* head, const char* returns) {
    std::string doc = std::string(head) + kLookupDoc;
    doc.replace(doc.find("%s"), 2, returns);
    return doc;
}

}  // namespace

void RegisterTables(py::module_& m) {
    py::class_<LUT> lutClass(m, "LUT",
                             R"doc(A lookup table: real values mapped through sorted breakpoints.

An input between two breakpoints is interpolated linearly; one at or beyond
either end takes the output of that end; a whole input whose truncation indexes
a breakpoint of that input answers directly. Safe to share between threads.

Parameters
----------
entries : sequence of (float, float)
    At least two (input, output) breakpoints, e.g. a list of pairs or an
    (n, 2) array; sorted by input unless already in order.

Raises
------
kubo.ParameterError
    For fewer than two entries.
)doc");
    lutClass
        .def(py::init([](const py::object& entries) {
                 return LUT(entries.cast<std::vector<std::pair<double, double>>>());
             }),
             py::arg("entries"))
        .def_static(
            "classic", [](const py::object& values) { return LUT(ReadBytes(values)); },
            py::arg("values"),
            "The classic 8-bit table: breakpoint i is (i, values[i]).\n\nParameters\n"
            "----------\nvalues : bytes-like or sequence of int\n    Exactly 256 bytes.\n\n"
            "Raises\n------\nkubo.DataError\n    For another number of values.")
        .def(
            "__call__",
            [](const LUT& lut, const py::object& values) -> py::object {
                const auto lookup = [&lut](double x) { return lut.GetValue(x); };
                if (!py::isinstance<py::array>(values)) {
                    return py::float_(lookup(ReadNumber(values)));
                }
                return Map<RealOut>(values, {}, lookup);
            },
            py::arg("values"),
            LookupDoc("The outputs for values, computed in C++ over the whole array.",
                      "float or numpy.ndarray\n    A float, or a new float64 array of the "
                      "values' shape.")
                .c_str());
    lutClass.def(py::pickle(
        [](const LUT& lut) { return lut.GetEntries(); },
        [](const std::vector<std::pair<double, double>>& entries) { return LUT(entries); }));
    AddTableMembers<LUT>(
        lutClass, &IsClassicLUT,
        "Whether the table has the inputs 0 to 255 and whole outputs from 0 to 255.");

    py::class_<PCT> pctClass(m, "PCT",
                             R"doc(A pseudocolour table: real values mapped to (r, g, b) colours.

The rules of :class:`LUT`; between breakpoints each component is interpolated on
its own and truncated toward zero. Safe to share between threads.

Parameters
----------
entries : sequence of (float, (int, int, int))
    At least two (input, colour) breakpoints; sorted by input unless already
    in order.

Raises
------
kubo.ParameterError
    For fewer than two entries.
)doc");
    pctClass.def(py::init(&ReadPct), py::arg("entries"))
        .def_static(
            "classic",
            [](const py::object& colours) {
                std::vector<Colour> table;
                for (const py::handle colour : colours) {
                    table.push_back(ReadColour(colour));
                }
                return PCT(table);
            },
            py::arg("colours"),
            "The classic 8-bit table: breakpoint i is (i, colours[i]).\n\nParameters\n"
            "----------\ncolours : sequence of (int, int, int)\n    Exactly 256 colours, "
            "e.g. a (256, 3) uint8 array.\n\nRaises\n------\nkubo.DataError\n"
            "    For another number of colours.")
        .def(
            "__call__",
            [](const PCT& pct, const py::object& values) -> py::object {
                const auto lookup = [&pct](double x) { return pct.GetValue(x); };
                if (!py::isinstance<py::array>(values)) {
                    return ColourTuple(lookup(ReadNumber(values)));
                }
                return Map<ColourOut>(values, {3}, lookup);
            },
            py::arg("values"),
            LookupDoc("The colours for values, computed in C++ over the whole array.",
                      "tuple or numpy.ndarray\n    An (r, g, b) tuple, or a new uint8 array of "
                      "the values' shape plus a last axis of 3.")
                .c_str());
    pctClass.def(py::pickle(
        [](const PCT& pct) {
            py::list entries;
            for (const auto& entry : pct.GetEntries()) {
                entries.append(py::make_tuple(entry.first, ColourTuple(entry.second)));
            }
            return entries;
        },
        [](const py::list& entries) { return ReadPct(entries); }));
    AddTableMembers<PCT>(pctClass, &IsClassicPCT,
                         "Whether the table has 256 breakpoints with the inputs 0 to 255.");
}

}  // namespace kora::kubo::python
