// The library's exception kinds as Python exceptions that keep their details.
#include <exception>
#include <string>

#include "arrays.h"
#include "vrkframework/platform/exception.h"

namespace kora::kubo::python {
namespace {

// The classes live as long as the process (the module holds them too).
PyObject* g_error = nullptr;
PyObject* g_dataError = nullptr;
PyObject* g_parameterError = nullptr;
PyObject* g_outOfBoundsError = nullptr;

PyObject* NewClass(const char* name, const char* doc, py::handle bases, py::dict attributes) {
    PyObject* type = PyErr_NewExceptionWithDoc(name, doc, bases.ptr(), attributes.ptr());
    if (type == nullptr) {
        throw py::error_already_set();
    }
    return type;
}

// Raises `type` with the library's message, and its source, function and line attached.
void Raise(PyObject* type, const kora::Exception& failure, const py::dict& extra) {
    py::object error = py::reinterpret_borrow<py::object>(type)(failure.GetMessage());
    error.attr("message") = failure.GetMessage();
    error.attr("source") = failure.GetSourceFile();
    error.attr("function") = failure.GetFunction();
    error.attr("line") = failure.GetLine();
    for (const auto item : extra) {
        py::setattr(error, item.first, item.second);
    }
    PyErr_SetObject(type, error.ptr());
}

void Translate(std::exception_ptr failure) {
    try {
        if (failure) {
            std::rethrow_exception(failure);
        }
    } catch (const kora::ParameterException& e) {
        py::dict extra;
        extra["parameter"] = e.GetParameterName();
        extra["kind"] = static_cast<int>(e.GetType());
        extra["received"] = e.GetReceived();
        extra["expected"] = e.GetExpected();
        Raise(g_parameterError, e, extra);
    } catch (const kora::OutOfBoundsException& e) {
        py::dict extra;
        extra["values"] = py::tuple(py::cast(e.GetValues()));
        Raise(g_outOfBoundsError, e, extra);
    } catch (const kora::DataException& e) {
        Raise(g_dataError, e, py::dict());
    } catch (const kora::Exception& e) {
        Raise(g_error, e, py::dict());
    }
}

py::dict Attributes(std::initializer_list<const char*> names) {
    py::dict attributes;
    for (const char* name : names) {
        attributes[name] = py::none();
    }
    return attributes;
}

}  // namespace

void RegisterErrors(py::module_& m) {
    g_error = NewClass("kubo.Error",
                       "A failure reported by the kubo library.\n\n"
                       "Attributes\n----------\n"
                       "message : str\n    The library's message (also ``str(error)``).\n"
                       "source : str\n    The source path that reported it, e.g.\n"
                       "    ``vrkframework/basic/kubo/raster/tileiterator``.\n"
                       "function : str\n    The full signature text of the function.\n"
                       "line : int\n    The source line (0 for failures kubo adds).\n",
                       PyExc_Exception, Attributes({"message", "source", "function", "line"}));
    g_dataError = NewClass("kubo.DataError", "The data handed to an operation cannot be processed.",
                           g_error, py::dict());
    g_parameterError = NewClass(
        "kubo.ParameterError",
        "One named parameter has an unacceptable value.\n\n"
        "Attributes\n----------\n"
        "parameter : str\n    The parameter's name.\n"
        "kind : int\n    The library's code of the fault (1 invalid value, 8 too few items).\n"
        "received, expected : str\n    What was given and what is required.\n",
        py::make_tuple(py::handle(g_error), py::handle(PyExc_ValueError)),
        Attributes({"parameter", "kind", "received", "expected"}));
    py::dict noValues;
    noValues["values"] = py::tuple();
    g_outOfBoundsError =
        NewClass("kubo.OutOfBoundsError",
                 "An index or a window lies outside its container.\n\n"
                 "Attributes\n----------\n"
                 "values : tuple of int\n    The offending or bounding values.\n",
                 py::make_tuple(py::handle(g_error), py::handle(PyExc_IndexError)), noValues);
    m.attr("Error") = py::handle(g_error);
    m.attr("DataError") = py::handle(g_dataError);
    m.attr("ParameterError") = py::handle(g_parameterError);
    m.attr("OutOfBoundsError") = py::handle(g_outOfBoundsError);
    py::register_exception_translator(&Translate);
}

}  // namespace kora::kubo::python
