// The extension module kubo._kubo: registers every part of the binding.
#include "arrays.h"

PYBIND11_MODULE(_kubo, m) {
    namespace python = kora::kubo::python;
    m.doc() = "The kubo library's raster building blocks over numpy arrays (see the kubo package).";
    python::RegisterErrors(m);
    python::RegisterDataTypes(m);
    python::RegisterConversion(m);
    python::RegisterMasks(m);
    python::RegisterCompressed(m);
    python::RegisterRasterOps(m);
    python::RegisterTables(m);
    python::RegisterTiles(m);
    python::RegisterControlPoints(m);
    python::RegisterPieceLimit(m);
}
