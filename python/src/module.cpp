// python/src/module.cpp: the extension `tessel._runtime`: loading modules and calling them.
#include "conversion.hpp"
#include "module_object.hpp"
#include "others_run.hpp"
#include "tessel/netcdf_guard.hpp"

#include <filesystem>

namespace tessel::python {
namespace {

void translate(std::exception_ptr exception) {
    try {
        std::rethrow_exception(std::move(exception));
    } catch (const Error &error) {
        raiseInPython(error);
    }
}

/// What `load` gives. Loading waits for calls in progress, and other threads need not wait with it.
template <class Load>
py::object loaded(const Load &load) {
    return newModuleObject([&] {
        const OthersRun others;
        return load();
    }());
}

py::object loadFile(std::string_view path) {
    return loaded([&] { return Module(std::filesystem::path(path)); });
}

py::object find(std::string_view name) {
    return loaded([&] { return Module::find(name); });
}

py::object guarded(py::handle module, bool remote) {
    return newModuleObject(moduleOf(module).watchedBy(netcdfGuard({.remote = remote})));
}

} // namespace

PYBIND11_MODULE(_runtime, extension) {
    extension.doc() = "Loading modules and calling them; use the package tessel.";
    extension.attr("version") = TESSEL_VERSION;
    PythonClasses::load();
    py::register_local_exception_translator(translate);
    addModuleClass(extension);
    extension.def("load_file", loadFile, "The module in a file.", py::arg("path"));
    extension.def("find", find, "The module of a name.", py::arg("name"));
    extension.def("guarded", guarded,
                  "The same module, kept from the calls that the netCDF library does not survive,\n"
                  "and from addresses given as file names unless they are allowed.",
                  py::arg("module"), py::arg("remote"));
}

} // namespace tessel::python
