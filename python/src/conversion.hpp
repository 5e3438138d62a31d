// python/src/conversion.hpp: between Python values and host arrays. The docstring of the package
// `tessel` has the table of what becomes what.
#pragma once

#include "tessel/runtime.hpp"

#include <pybind11/pybind11.h>

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace tessel::python {

namespace py = pybind11;

/// How deep lists, dicts, cells and structures may be nested, so that a cyclic one ends.
inline constexpr std::size_t deepest = 256;

/// The objects whose memory host arrays borrow: keep them as long as those arrays.
using Lenders = std::vector<py::object>;

/// The host's array for a Python value. Borrows the data of column-major NumPy arrays; any other
/// array costs one copy. Raises Error "TESSEL:python:..." for what has no counterpart.
Array toHost(py::handle value, Lenders &lenders);

/// The Python value for a host array, None for none. A NumPy array takes over the array's memory.
py::object toPython(Array array);

/// The class of the objects that keep the memory of results.
py::object makeOwnerClass();

/// Raises the Error "TESSEL:python:" + word.
[[noreturn]] void refuse(std::string_view word, const std::string &message);

/// Makes an instance of an exception class, or what it is for an error, the exception that Python
/// is raising.
void raiseInPython(const py::object &exception);
void raiseInPython(const Error &error);

/// The classes that the extension makes and recognises. All of them are there before the first
/// call: a thread that makes one when it is first wanted may let others run meanwhile, which would
/// wait for it and not let it run.
struct PythonClasses {
    py::object error;
    py::object raised; ///< makes the error of a call
    py::object function;
    py::object unknown;
    py::object numpyScalar;
    py::object maskedArray;
    py::object path; ///< Python's own, of a file
    py::object owner;

    /// Known once load has been called, by the extension's initialisation.
    static const PythonClasses &get();
    static void load();
};

/// Text of the host's or a module's as str; bytes that are not UTF-8 are shown as \xNN.
py::str toStr(std::string_view utf8);

/// str as text for the host; Error when it cannot be UTF-8 (half of a surrogate pair).
std::string toUtf8(py::handle str);

} // namespace tessel::python
