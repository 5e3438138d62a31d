// tests/python/conversions.cpp: the extension's conversions without a module between them, for the
// classes of which no module can make an array.
#include "conversion.hpp"

#include <pybind11/stl.h>

#include <array>
#include <memory>
#include <vector>

namespace tessel::python {
namespace {

/// The value of the array of a value, and what keeps the memory that the array borrows: nothing is
/// copied on either way, so the result may well be over the memory of the value.
py::tuple roundTrip(py::handle value) {
    auto lenders = std::make_unique<Lenders>();
    const py::object back = toPython(toHost(value, *lenders));
    const py::capsule keeper(lenders.get(),
                             [](void *kept) { delete static_cast<Lenders *>(kept); });
    static_cast<void>(lenders.release());
    return py::make_tuple(back, keeper);
}

void oneWay(py::handle value) {
    Lenders lenders;
    static_cast<void>(toHost(value, lenders));
}

/// An array of a numeric class whose elements have no defined values.
py::object ofDimensions(const std::vector<std::size_t> &dims, int classID, bool complex) {
    return toPython(Array::numeric(static_cast<tsClassID>(classID), dims, complex));
}

/// A number inside of so many cells.
py::object inCells(std::size_t levels) {
    Array array = Array::scalar(1);
    for (std::size_t i = 0; i < levels; ++i) {
        Array outer = Array::cell(std::array<std::size_t, 2>{1, 1});
        outer.setCell(0, std::move(array));
        array = std::move(outer);
    }
    return toPython(std::move(array));
}

void showIdentifier(std::exception_ptr raised) {
    try {
        std::rethrow_exception(std::move(raised));
    } catch (const Error &error) {
        PyErr_SetString(PyExc_RuntimeError, error.identifier().c_str());
    }
}

} // namespace

PYBIND11_MODULE(conversions, extension) {
    PythonClasses::load();
    py::register_local_exception_translator(showIdentifier);
    extension.def("round_trip", roundTrip);
    extension.def("to_host", oneWay);
    extension.def("of_dimensions", ofDimensions);
    extension.def("in_cells", inCells);
}

} // namespace tessel::python
