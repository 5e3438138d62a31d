// python/src/python_classes.cpp: what the conversions need of the Python side: classes, errors,
// text.
#include "conversion.hpp"
#include "plain_class.hpp"

namespace tessel::python {
namespace {

/// Never freed: the interpreter may be gone before this library is.
const PythonClasses *classes = nullptr;

} // namespace

const PythonClasses &PythonClasses::get() {
    return *classes;
}

void PythonClasses::load() {
    const py::module_ values = py::module_::import("tessel.values");
    const py::module_ numpy = py::module_::import("numpy");
    const py::module_ errors = py::module_::import("tessel.errors");
    classes = new PythonClasses{errors.attr("Error"),
                                errors.attr("raised"),
                                values.attr("Function"),
                                values.attr("Unknown"),
                                numpy.attr("generic"),
                                numpy.attr("ma").attr("MaskedArray"),
                                py::module_::import("pathlib").attr("Path"),
                                makeOwnerClass()};
    static_cast<void>(NumPy::get()); // looks NumPy's functions up, once
}

void refuse(std::string_view word, const std::string &message) {
    throw Error(std::string("TESSEL:python:").append(word), message);
}

void raiseInPython(const py::object &exception) {
    PyErr_SetObject(py::type::handle_of(exception).ptr(), exception.ptr());
}

void raiseInPython(const Error &error) {
    raiseInPython(PythonClasses::get().error(toStr(error.identifier()), toStr(error.message())));
}

py::str toStr(std::string_view utf8) {
    PyObject *text = PyUnicode_DecodeUTF8(utf8.data(), static_cast<py::ssize_t>(utf8.size()),
                                          "backslashreplace");
    if (text == nullptr) {
        throw py::error_already_set();
    }
    return py::reinterpret_steal<py::str>(text);
}

std::string toUtf8(py::handle str) {
    py::ssize_t length = 0;
    const char *utf8 = PyUnicode_AsUTF8AndSize(str.ptr(), &length);
    if (utf8 == nullptr) {
        PyErr_Clear();
        refuse("notText", "A name contains half of a surrogate pair.");
    }
    return {utf8, static_cast<std::size_t>(length)};
}

} // namespace tessel::python
