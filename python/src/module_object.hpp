// python/src/module_object.hpp: the class `tessel._runtime.Module`.
#pragma once

#include "conversion.hpp"

namespace tessel::python {

/// Adds the class, and the functions that call its instances.
void addModuleClass(py::module_ &extension);

/// An instance of it.
py::object newModuleObject(Module module);

/// What an instance of it is of; Python's TypeError for anything else.
const Module &moduleOf(py::handle instance);

} // namespace tessel::python
