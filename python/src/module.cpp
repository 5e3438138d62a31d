// python/src/module.cpp: the extension `tessel._runtime`: loading modules and calling them.
#include "conversion.hpp"
#include "tessel/netcdf_guard.hpp"

#include <pybind11/stl/filesystem.h>

#include <filesystem>
#include <optional>

namespace tessel::python {
namespace {

void raiseInPython(const py::object &exception) {
    PyErr_SetObject(py::type::handle_of(exception).ptr(), exception.ptr());
}

void translate(std::exception_ptr exception) {
    try {
        std::rethrow_exception(std::move(exception));
    } catch (const Error &error) {
        raiseInPython(
            PythonClasses::get().error(toStr(error.identifier()), toStr(error.message())));
    }
}

py::object valueOf(Results results) {
    switch (results.size()) {
    case 0:
        return py::none();
    case 1:
        return toPython(std::move(results[0]));
    default: {
        py::tuple values(results.size());
        for (std::size_t i = 0; i < results.size(); ++i) {
            values[i] = toPython(std::move(results[i]));
        }
        return values;
    }
    }
}

py::object callUnexplained(const Module &module, const py::args &arguments,
                           const py::kwargs &named) {
    if (!named.empty()) {
        refuse("namedArgument", "Operations take their arguments by position.");
    }
    Lenders lenders;
    std::vector<Array> arrays;
    std::vector<const tsArray *> inputs;
    arrays.reserve(arguments.size());
    inputs.reserve(arguments.size());
    for (const py::handle argument : arguments) {
        arrays.push_back(toHost(argument, lenders));
        inputs.push_back(std::as_const(arrays.back()).get());
    }
    return valueOf([&] {
        const py::gil_scoped_release others;
        return module.call(inputs);
    }());
}

/// A call whose error Python makes, which adds what was called.
py::object call(const Module &module, const py::args &arguments, const py::kwargs &named) {
    std::optional<Error> failure;
    try {
        return callUnexplained(module, arguments, named);
    } catch (const Error &error) {
        failure = error;
    }
    // Outside of the handler, because Python asks the module, which raises in its turn.
    const py::object self = py::cast(module, py::return_value_policy::reference);
    raiseInPython(PythonClasses::get().raised(self, arguments, toStr(failure->identifier()),
                                              toStr(failure->message())));
    throw py::error_already_set();
}

Module loadFile(std::string_view path) {
    return Module(std::filesystem::path(path));
}

Module guarded(const Module &module, bool remote) {
    return module.watchedBy(netcdfGuard({.remote = remote}));
}

constexpr const char *callDoc = R"(Call an operation: its name, then its own arguments, by position.

Returns None, the one result, or a tuple of several; raises tessel.Error. The docstring of the
package has the table of what becomes what. Other threads run while the module works.)";

} // namespace

PYBIND11_MODULE(_runtime, extension) {
    extension.doc() = "Loading modules and calling them; use the package tessel.";
    PythonClasses::load();
    py::register_local_exception_translator(translate);

    py::class_<Module>(extension, "Module",
                       "A loaded module. Call it with the name of an operation and its arguments.")
        .def(py::init<const Module &>(), "The same module.", py::arg("module"))
        .def("__call__", call, callDoc)
        .def("__repr__",
             [](const Module &module) {
                 return py::str("<tessel.Module {}>").format(module.file());
             })
        .def_property_readonly("file", &Module::file, "The file that it was loaded from.");
    // Loading waits for calls in progress, and other threads need not wait with it.
    using OthersRun = py::call_guard<py::gil_scoped_release>;
    extension.def("load_file", loadFile, "The module in a file.", py::arg("path"), OthersRun());
    extension.def("find", &Module::find, "The module of a name.", py::arg("name"), OthersRun());
    extension.def("guarded", guarded,
                  "The same module, kept from the calls that the netCDF library does not survive,\n"
                  "and from addresses given as file names unless they are allowed.",
                  py::arg("module"), py::arg("remote"));
}

} // namespace tessel::python
