// Ground control points, their locations and their container, as Python classes.
#include <pybind11/operators.h>

#include <string>
#include <vector>

#include "arrays.h"
#include "vrkframework/basic/kubo/controlpoints/controlpoint.h"
#include "vrkframework/basic/kubo/controlpoints/controlpointcontainer.h"
#include "vrkframework/basic/kubo/controlpoints/historyevent.h"
#include "vrkframework/platform/crs.h"

namespace kora::kubo::python {
namespace {

/// A reference system known by its dimension alone: what the container asks of one.
class DimensionCRS : public kora::ogc::cs::ICRS {
public:
    explicit DimensionCRS(unsigned int dimension) : m_dimension(dimension) {}
    unsigned int GetDimension() const override { return m_dimension; }
    ICRS* Clone() const override { return new DimensionCRS(*this); }

private:
    unsigned int m_dimension;
};

template <class Location>
py::array GetMatrix(const Location& location, std::size_t n) {
    py::array_t<double> matrix({n, n});
    auto* out = matrix.mutable_data();
    for (std::size_t row = 0; row < n; ++row) {
        for (std::size_t column = 0; column < n; ++column) {
            out[row * n + column] = location.GetMatrix()[row][column];
        }
    }
    return std::move(matrix);
}

template <class Location>
void SetMatrix(Location& location, const py::object& value, std::size_t n) {
    const auto rows = value.cast<std::vector<std::vector<double>>>();
    if (rows.size() != n) {
        throw py::value_error("matrix must be " + std::to_string(n) + " x " + std::to_string(n));
    }
    for (std::size_t row = 0; row < n; ++row) {
        if (rows[row].size() != n) {
            throw py::value_error("matrix must be " + std::to_string(n) + " x " +
                                  std::to_string(n));
        }
        for (std::size_t column = 0; column < n; ++column) {
            location.GetMatrix()[row][column] = rows[row][column];
        }
    }
}

// Copying through copy.copy and copy.deepcopy, and equality, as the C++ class defines them.
template <class T, class Class>
void AddValueMethods(Class& cls) {
    cls.def("__copy__", [](const T& self) { return T(self); })
        .def(
            "__deepcopy__", [](const T& self, const py::dict&) { return T(self); }, py::arg("memo"))
        .def(py::self == py::self)   // NOLINT(misc-redundant-expression)
        .def(py::self != py::self);  // NOLINT(misc-redundant-expression)
}

std::string Quote(const std::string& text) { return py::repr(py::str(text)).cast<std::string>(); }

}  // namespace

void RegisterControlPoints(py::module_& m) {
    py::class_<GroundLocation> ground(m, "GroundLocation",
                                      R"doc(A ground position: x, y, z with a 3 x 3 matrix.

Two locations are equal when their coordinates and matrices are, exactly (a NaN
makes them unequal); the populated-axes code takes no part.

Parameters
----------
x, y, z : float
    The coordinates (0).
matrix : 3 x 3 array-like, optional
    For instance their covariance (zeros).
populated_axes : int
    Which axes hold measured values: 0 none, 1 x and y, 2 z, 3 all
    (``kubo.PopulatedAxes``); other values are kept as they are.
)doc");
    ground
        .def(py::init([](double x, double y, double z, const py::object& matrix, int axes) {
                 GroundLocation location;
                 location.SetCoords(x, y, z);
                 if (!matrix.is_none()) {
                     SetMatrix(location, matrix, 3);
                 }
                 location.SetPopulatedAxesCode(static_cast<PopulatedAxesCode>(axes));
                 return location;
             }),
             py::arg("x") = 0.0, py::arg("y") = 0.0, py::arg("z") = 0.0, py::kw_only(),
             py::arg("matrix") = py::none(), py::arg("populated_axes") = 0)
        .def_property(
            "x", &GroundLocation::GetX,
            [](GroundLocation& location, double value) { location.GetCoordinates()[0] = value; })
        .def_property(
            "y", &GroundLocation::GetY,
            [](GroundLocation& location, double value) { location.GetCoordinates()[1] = value; })
        .def_property(
            "z", &GroundLocation::GetZ,
            [](GroundLocation& location, double value) { location.GetCoordinates()[2] = value; })
        .def_property(
            "matrix", [](const GroundLocation& location) { return GetMatrix(location, 3); },
            [](GroundLocation& location, const py::object& value) {
                SetMatrix(location, value, 3);
            },
            "A copy of the 3 x 3 matrix (assign to change it).")
        .def_property(
            "populated_axes",
            [](const GroundLocation& location) {
                return static_cast<int>(location.GetPopulatedAxesCode());
            },
            [](GroundLocation& location, int code) {
                location.SetPopulatedAxesCode(static_cast<PopulatedAxesCode>(code));
            })
        .def("__repr__", [](const GroundLocation& location) {
            return "GroundLocation(" + py::repr(py::float_(location.GetX())).cast<std::string>() +
                   ", " + py::repr(py::float_(location.GetY())).cast<std::string>() + ", " +
                   py::repr(py::float_(location.GetZ())).cast<std::string>() + ")";
        });
    AddValueMethods<GroundLocation>(ground);

    py::class_<ImageLocation> image(m, "ImageLocation",
                                    R"doc(An image position: column and row with a 2 x 2 matrix.

Parameters
----------
column, row : float
    The position (0).
matrix : 2 x 2 array-like, optional
    For instance its covariance (zeros).
)doc");
    image
        .def(py::init([](double column, double row, const py::object& matrix) {
                 ImageLocation location;
                 location.SetCoords(column, row);
                 if (!matrix.is_none()) {
                     SetMatrix(location, matrix, 2);
                 }
                 return location;
             }),
             py::arg("column") = 0.0, py::arg("row") = 0.0, py::kw_only(),
             py::arg("matrix") = py::none())
        .def_property("column", &ImageLocation::GetColumn, &ImageLocation::SetColumn)
        .def_property("row", &ImageLocation::GetRow, &ImageLocation::SetRow)
        .def_property(
            "matrix", [](const ImageLocation& location) { return GetMatrix(location, 2); },
            [](ImageLocation& location, const py::object& value) { SetMatrix(location, value, 2); },
            "A copy of the 2 x 2 matrix (assign to change it).")
        .def("__repr__", [](const ImageLocation& location) {
            return "ImageLocation(" +
                   py::repr(py::float_(location.GetColumn())).cast<std::string>() + ", " +
                   py::repr(py::float_(location.GetRow())).cast<std::string>() + ")";
        });
    AddValueMethods<ImageLocation>(image);

    py::class_<ControlPoint> point(m, "ControlPoint", R"doc(A numbered, named ground control point.

One ground location tied to any number of image locations, with a type and a
used flag. Points are equal when names, ids, ground locations, types and image
locations (in order) are; the used flag takes no part. ``ground`` and ``images``
return copies: assign to change them.

Parameters
----------
id : int
    Fixed for the point's life (0).
name : str
    ("").
ground : GroundLocation, optional
    (at 0, 0, 0).
images : sequence of ImageLocation, optional
    (none).
type : int
    0 undefined, 1 ground, 2 check, 3 tie (``kubo.ControlPointType``); other
    values are kept as they are.
used : bool
    (False).
)doc");
    point
        .def(py::init([](unsigned int id, const std::string& name, const py::object& groundLocation,
                         const py::object& images, int type, bool used) {
                 ControlPoint created(id);
                 created.SetName(name);
                 if (!groundLocation.is_none()) {
                     created.SetGroundLocation(groundLocation.cast<GroundLocation>());
                 }
                 if (!images.is_none()) {
                     created.SetImageLocations(images.cast<std::vector<ImageLocation>>());
                 }
                 created.SetType(static_cast<ControlPointType>(type));
                 created.SetUsed(used);
                 return created;
             }),
             py::arg("id") = 0, py::arg("name") = "", py::kw_only(), py::arg("ground") = py::none(),
             py::arg("images") = py::none(), py::arg("type") = 0, py::arg("used") = false)
        .def_property_readonly("id", &ControlPoint::GetId)
        .def_property("name", &ControlPoint::GetName, &ControlPoint::SetName)
        .def_property(
            "type", [](const ControlPoint& p) { return static_cast<int>(p.GetType()); },
            [](ControlPoint& p, int type) { p.SetType(static_cast<ControlPointType>(type)); })
        .def_property("used", &ControlPoint::IsUsed, &ControlPoint::SetUsed)
        .def_property(
            "ground", [](const ControlPoint& p) { return p.GetGroundLocation(); },
            &ControlPoint::SetGroundLocation)
        .def_property(
            "images", [](const ControlPoint& p) { return p.GetImageLocations(); },
            &ControlPoint::SetImageLocations)
        .def("__repr__", [](const ControlPoint& p) {
            return "ControlPoint(" + std::to_string(p.GetId()) + ", " + Quote(p.GetName()) + ")";
        });
    AddValueMethods<ControlPoint>(point);

    py::class_<HistoryEvent> event(m, "HistoryEvent",
                                   R"doc(A time-stamped message of a container's history.

Events are equal when their messages are, ignoring letter case; ids and
timestamps take no part. A message keeps its first 64 characters, a
timestamp its first 16.

Parameters
----------
id : int
message : str
timestamp : str, optional
    Omitted, the current local time ("YYYY-MM-DD HH:MM").
)doc");
    event
        .def(py::init([](unsigned int id, const std::string& message, const py::object& timestamp) {
                 return timestamp.is_none()
                            ? HistoryEvent(id, message)
                            : HistoryEvent(id, timestamp.cast<std::string>(), message);
             }),
             py::arg("id"), py::arg("message"), py::arg("timestamp") = py::none())
        .def_property_readonly("id", &HistoryEvent::GetId)
        .def_property("message", &HistoryEvent::GetMessage, &HistoryEvent::SetMessage)
        .def_property_readonly("timestamp", &HistoryEvent::GetTimestamp)
        .def("__repr__", [](const HistoryEvent& e) {
            return "HistoryEvent(" + std::to_string(e.GetId()) + ", " + Quote(e.GetMessage()) +
                   ", timestamp=" + Quote(e.GetTimestamp()) + ")";
        });
    AddValueMethods<HistoryEvent>(event);

    using Container = ControlPointContainer;
    py::class_<Container>(
        m, "ControlPointContainer",
        R"doc(Control points with their reference system, description, metadata and history.

``points`` and ``history`` return lists of copies: assign a list to change
them. ``metadata`` is a live mapping of str to str whose keys match without
regard to the case of ASCII letters. ``copy.copy`` copies as the library does: the copy's
history starts empty.
)doc")
        .def(py::init<>())
        .def_property(
            "points", [](const Container& c) { return c.GetControlPoints(); },
            &Container::SetControlPoints)
        .def_property(
            "history", [](const Container& c) { return c.GetHistory(); }, &Container::SetHistory)
        .def_property("description", &Container::GetDescription, &Container::SetDescription)
        .def_property_readonly(
            "crs_dimension",
            [](const Container& c) -> py::object {
                return c.GetCRS() == nullptr ? py::object(py::none())
                                             : py::int_(c.GetCRS()->GetDimension());
            },
            "The dimension of the held reference system, or None.")
        .def(
            "set_crs",
            [](Container& c, unsigned int dimension) { c.SetCRS(DimensionCRS(dimension)); },
            py::arg("dimension"),
            "Holds a reference system of ``dimension`` dimensions.\n\nRaises\n------\n"
            "kubo.ParameterError\n    For 2 dimensions; the container then holds none.")
        .def_property_readonly(
            "metadata",
            [](const py::object& self) {
                return py::module_::import("kubo._types").attr("Metadata")(self);
            },
            "The key/value metadata, a live mutable mapping; keys ignore letter case.")
        .def("_metadata_get",
             [](const Container& c, const std::string& key) {
                 const auto found = c.GetKVPMetadata().find(key);
                 if (found == c.GetKVPMetadata().end()) {
                     throw py::key_error(key);
                 }
                 return found->second;
             })
        .def("_metadata_set",
             [](Container& c, const std::string& key, const std::string& value) {
                 // Replace the value but keep the key as first written, as the map does.
                 c.GetKVPMetadata()[key] = value;
             })
        .def("_metadata_delete",
             [](Container& c, const std::string& key) {
                 if (c.GetKVPMetadata().erase(key) == 0) {
                     throw py::key_error(key);
                 }
             })
        .def("_metadata_keys",
             [](const Container& c) {
                 std::vector<std::string> keys;
                 for (const auto& entry : c.GetKVPMetadata()) {
                     keys.push_back(entry.first);
                 }
                 return keys;
             })
        .def("__copy__", [](const Container& c) { return Container(c); })
        .def(
            "__deepcopy__", [](const Container& c, const py::dict&) { return Container(c); },
            py::arg("memo"));
}

}  // namespace kora::kubo::python
