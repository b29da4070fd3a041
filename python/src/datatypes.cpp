// kubo.DataType and kubo.promote: sample type descriptors, their labels and numpy dtypes.
#include <cstdint>
#include <iterator>  // std::size
#include <string>
#include <vector>

#include "arrays.h"

namespace kora::kubo::python {
namespace {

struct Predefined {
    const char* label;
    DataType type;
};

// In the order of DataType's constants.
constexpr Predefined kPredefined[] = {
    {"1U", DataType::Type1U},     {"8U", DataType::Type8U},     {"8S", DataType::Type8S},
    {"16U", DataType::Type16U},   {"16S", DataType::Type16S},   {"32U", DataType::Type32U},
    {"32S", DataType::Type32S},   {"32R", DataType::Type32R},   {"64U", DataType::Type64U},
    {"64S", DataType::Type64S},   {"64R", DataType::Type64R},   {"C8U", DataType::TypeC8U},
    {"C8S", DataType::TypeC8S},   {"C16U", DataType::TypeC16U}, {"C16S", DataType::TypeC16S},
    {"C32U", DataType::TypeC32U}, {"C32S", DataType::TypeC32S}, {"C32R", DataType::TypeC32R},
    {"C64U", DataType::TypeC64U}, {"C64S", DataType::TypeC64S}, {"C64R", DataType::TypeC64R},
};

// The real type of one component of a predefined type; 1U and unknown types have none.
std::optional<DataType> RealComponent(const DataType& type) {
    if (type == DataType::Type1U) {
        return std::nullopt;
    }
    DataType real = type;
    real.isComplex = false;
    for (const Predefined& entry : kPredefined) {
        if (entry.type == real) {
            return real;
        }
    }
    return std::nullopt;
}

// numpy's dtype of a real whole-byte type.
py::object RealDtype(const DataType& real) {
    if (real.isFloat) {
        return real.bits == 32 ? py::dtype::of<float>() : py::dtype::of<double>();
    }
    switch (real.bits) {
        case 8:
            return real.isSigned ? py::dtype::of<std::int8_t>() : py::dtype::of<std::uint8_t>();
        case 16:
            return real.isSigned ? py::dtype::of<std::int16_t>() : py::dtype::of<std::uint16_t>();
        case 32:
            return real.isSigned ? py::dtype::of<std::int32_t>() : py::dtype::of<std::uint32_t>();
        default:
            return real.isSigned ? py::dtype::of<std::int64_t>() : py::dtype::of<std::uint64_t>();
    }
}

const char kDataTypeDoc[] =
    R"doc(Describes one sample: width, signedness, floating layout, complex pair.

A DataType is made from a label (``"16S"``, ``"C32R"``, ``"1U"``), from a numpy
dtype (``numpy.int16``, ``"float32"``), from another DataType, or from its six
fields. Two types are equal when all six fields are; a type also compares equal
to any label or dtype that makes it (``DataType("32R") == numpy.float32``).

The 21 predefined types map to numpy as follows: ``8U`` ... ``64S`` are the
integer dtypes of their width, ``32R``/``64R`` float32/float64, ``C32R``/``C64R``
complex64/complex128. Complex integer types (``C8U`` ... ``C64S``) have no numpy
dtype: their arrays hold the component dtype with a last axis of length 2
(real, imaginary), so a 480 x 640 C16S image is an int16 array of shape
(480, 640, 2). ``1U`` is the one-bit type of masks and has no numpy dtype.

Parameters
----------
value : DataType, str or dtype-like, optional
    A label or anything ``numpy.dtype()`` accepts; omitted, the six fields.
bits, is_signed, is_float, mantissa_bits, exponent_bits, is_complex
    The fields, by keyword or in this order (every field of one component for a
    complex type).

Raises
------
ValueError
    For a label or dtype that names no sample type.
)doc";

}  // namespace

int PredefinedIndex(const DataType& type) {
    for (int index = 0; index < static_cast<int>(std::size(kPredefined)); ++index) {
        if (kPredefined[index].type == type) {
            return index;
        }
    }
    return -1;
}

std::string Label(const DataType& type) {
    const int index = PredefinedIndex(type);
    return index < 0 ? std::string() : kPredefined[index].label;
}

std::optional<DataType> FromLabel(const std::string& label) {
    for (const Predefined& entry : kPredefined) {
        if (label == entry.label) {
            return entry.type;
        }
    }
    return std::nullopt;
}

std::vector<DataType> PredefinedTypes() {
    std::vector<DataType> types;
    for (const Predefined& entry : kPredefined) {
        types.push_back(entry.type);
    }
    return types;
}

std::optional<DataType> FromNumpy(const py::dtype& dtype) {
    // numpy spells the native order '=' (or '|' where order does not apply).
    const char order = dtype.byteorder();
    if (order != '=' && order != '|') {
        return std::nullopt;
    }
    const auto size = static_cast<unsigned int>(dtype.itemsize());
    switch (dtype.kind()) {
        case 'i':
        case 'u': {
            const bool isSigned = dtype.kind() == 'i';
            if (size != 1 && size != 2 && size != 4 && size != 8) {
                return std::nullopt;
            }
            return DataType(8 * size, isSigned, false, 8 * size, 0, false);
        }
        case 'f':
        case 'c': {
            const bool complex = dtype.kind() == 'c';
            const unsigned int bits = 8 * size / (complex ? 2 : 1);
            if (bits == 32) {
                return complex ? DataType::TypeC32R : DataType::Type32R;
            }
            if (bits == 64) {
                return complex ? DataType::TypeC64R : DataType::Type64R;
            }
            return std::nullopt;
        }
        default:
            return std::nullopt;
    }
}

py::object SampleDtype(const DataType& type) {
    const std::optional<DataType> real = RealComponent(type);
    if (!real) {
        return py::none();
    }
    if (!type.isComplex) {
        return RealDtype(*real);
    }
    if (!type.isFloat) {
        return py::none();
    }
    return type.bits == 32 ? py::dtype("complex64") : py::dtype("complex128");
}

py::object ComponentDtype(const DataType& type) {
    const std::optional<DataType> real = RealComponent(type);
    return real ? RealDtype(*real) : py::none();
}

DataType ParseDataType(py::handle value, const char* argument) {
    if (py::isinstance<py::str>(value)) {
        // Labels first: numpy reads "8U" as a string type.
        if (const std::optional<DataType> type = FromLabel(value.cast<std::string>())) {
            return *type;
        }
    } else if (py::isinstance<DataType>(value)) {
        return value.cast<DataType>();
    } else if (value.is_none()) {
        throw py::type_error(std::string(argument) + " must name a sample type, not None");
    }
    py::dtype dtype;
    try {
        dtype = py::dtype::from_args(py::reinterpret_borrow<py::object>(value));
    } catch (py::error_already_set&) {
        throw py::value_error(std::string(argument) +
                              " names no sample type: " + py::repr(value).cast<std::string>());
    }
    if (const std::optional<DataType> type = FromNumpy(dtype)) {
        return *type;
    }
    throw py::value_error(std::string(argument) + " names no sample type: dtype " +
                          py::str(py::handle(dtype)).cast<std::string>() +
                          " has no kubo equivalent");
}

std::string Describe(const DataType& type) {
    const std::string label = Label(type);
    if (!label.empty()) {
        return label;
    }
    return "DataType(bits=" + std::to_string(type.bits) +
           ", is_signed=" + (type.isSigned ? "True" : "False") +
           ", is_float=" + (type.isFloat ? "True" : "False") +
           ", mantissa_bits=" + std::to_string(type.mantissaBits) +
           ", exponent_bits=" + std::to_string(type.exponentBits) +
           ", is_complex=" + (type.isComplex ? "True" : "False") + ")";
}

void RegisterDataTypes(py::module_& m) {
    py::class_<DataType>(m, "DataType", kDataTypeDoc)
        .def(py::init([](const py::object& value) { return ParseDataType(value, "value"); }),
             py::arg("value"))
        .def(py::init<unsigned int, bool, bool, unsigned int, unsigned int, bool>(),
             py::arg("bits"), py::arg("is_signed"), py::arg("is_float"), py::arg("mantissa_bits"),
             py::arg("exponent_bits"), py::arg("is_complex"))
        .def_readonly("bits", &DataType::bits, "Bits of one sample (of one component).")
        .def_readonly("is_signed", &DataType::isSigned, "Whether values can be negative.")
        .def_readonly("is_float", &DataType::isFloat, "Whether samples are IEEE floats.")
        .def_readonly("mantissa_bits", &DataType::mantissaBits, "Significant bits.")
        .def_readonly("exponent_bits", &DataType::exponentBits, "Exponent bits (0: integer).")
        .def_readonly("is_complex", &DataType::isComplex, "Whether a sample is a pair.")
        .def_property_readonly(
            "label",
            [](const DataType& type) -> py::object {
                const std::string label = Label(type);
                return label.empty() ? py::object(py::none()) : py::str(label);
            },
            "The label of a predefined type (\"16S\", \"C32R\"), else None.")
        .def_property_readonly("dtype", &SampleDtype,
                               "The numpy dtype of one sample, or None (complex integer, "
                               "1U, packed and other types numpy lacks).")
        .def_property_readonly("component_dtype", &ComponentDtype,
                               "The numpy dtype of one component (int16 for C16S, float32 "
                               "for C32R), or None.")
        .def_static("predefined", &PredefinedTypes, "The 21 predefined types, 1U, 8U, 8S ... C64R.")
        .def(
            "__eq__",
            [](const DataType& self, py::handle other) -> py::object {
                try {
                    return py::bool_(self == ParseDataType(other, "other"));
                } catch (py::error_already_set&) {
                    return py::reinterpret_borrow<py::object>(Py_NotImplemented);
                } catch (py::builtin_exception&) {
                    return py::reinterpret_borrow<py::object>(Py_NotImplemented);
                }
            },
            py::is_operator())
        .def("__hash__",
             [](const DataType& type) {
                 return py::hash(py::make_tuple(type.bits, type.isSigned, type.isFloat,
                                                type.mantissaBits, type.exponentBits,
                                                type.isComplex));
             })
        .def("__repr__",
             [](const DataType& type) {
                 const std::string label = Label(type);
                 return label.empty() ? Describe(type) : "DataType('" + label + "')";
             })
        .def(py::pickle(
            [](const DataType& type) {
                return py::make_tuple(type.bits, type.isSigned, type.isFloat, type.mantissaBits,
                                      type.exponentBits, type.isComplex);
            },
            [](const py::tuple& fields) {
                return DataType(fields[0].cast<unsigned int>(), fields[1].cast<bool>(),
                                fields[2].cast<bool>(), fields[3].cast<unsigned int>(),
                                fields[4].cast<unsigned int>(), fields[5].cast<bool>());
            }));

    m.def(
        "promote",
        [](const py::args& types) {
            std::vector<DataType> list;
            for (const py::handle type : types) {
                list.push_back(ParseDataType(type, "types"));
            }
            return PromoteType(list);
        },
        R"doc(The common type of several sample types, by the library's promotion rule.

Only the widest types take part; a float mixed with an integer of the same
width, or a signed with an unsigned integer, doubles the width; the complex flag
is that of the last type of the group that wins. Results of 128 bits match no
predefined type and are returned as they are.

Parameters
----------
*types : DataType, str or dtype-like
    The types; none at all gives 8U.

Returns
-------
DataType
    The common type, e.g. ``promote("16S", "16U") == DataType("32S")``.

Raises
------
ValueError
    For an argument that names no sample type.
)doc");
}

}  // namespace kora::kubo::python
