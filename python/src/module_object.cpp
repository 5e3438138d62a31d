// python/src/module_object.cpp: the class `tessel._runtime.Module`, and calls.
//
// The class is made by hand, because a call through the module takes less time than it takes to
// find out, as pybind11 does for any class and function, which of them is meant by what.
#include "module_object.hpp"

#include "others_run.hpp"

#include <algorithm>
#include <array>
#include <cstddef>
#include <memory>
#include <memory_resource>
#include <optional>
#include <span>
#include <string>
#include <structmember.h>
#include <unordered_map>
#include <utility>
#include <vector>

namespace tessel::python {
namespace {

/// The arguments of a call of Python's, which are borrowed.
using Arguments = std::span<PyObject *const>;

/// The name of an operation: the host's array for it, made once.
struct Name {
    py::object str; ///< kept, so that no other object has its address
    Array text;
    py::object instead; ///< the function of Python's that takes the calls of this name, if any does
};

/// Names by the address of the str that they are. Constants of a program's that look like names
/// are interned, each of them one object, and only those are kept; never more than `most`, however
/// many a program makes. What is kept stays where it is, for calls that are in progress.
class Names {
  public:
    static constexpr std::size_t most = 512;

    /// nullptr for one that is not kept.
    [[nodiscard]] const Name *find(PyObject *str) const {
        const auto found = names.find(str);
        return found == names.end() ? nullptr : &found->second;
    }

    const Name *keep(Name name) {
        PyObject *const str = name.str.ptr();
        return &names.emplace(str, std::move(name)).first->second;
    }

    [[nodiscard]] bool mayKeep(PyObject *str) const {
        return PyUnicode_CHECK_INTERNED(str) != 0 && names.size() < most;
    }

    /// For Python's search for what nobody can reach: all objects of Python's that are in here.
    int visitEach(visitproc visit, void *arg) const {
        for (const auto &[address, name] : names) {
            Py_VISIT(name.str.ptr());
            Py_VISIT(name.instead.ptr());
        }
        return 0;
    }

    /// What it held, and nothing is left.
    [[nodiscard]] Names takeAll() { return std::exchange(*this, Names()); }

  private:
    std::unordered_map<PyObject *, Name> names;
};

/// What Python itself looks for in an instance, at the offsets that `members` tell it.
struct Head {
    PyObject object;
    PyObject *weakReferences;
    vectorcallfunc vectorcall;
};

/// What an instance of the class is.
struct ModuleObject {
    Head head;
    Module module;
    py::object instead; ///< a dict: functions of Python's by the names that they take the calls of
    Names names;
};

PyTypeObject *moduleClass = nullptr; ///< never freed: the interpreter may be gone before it

ModuleObject &of(PyObject *self) {
    return *reinterpret_cast<ModuleObject *>(self);
}

/// What `work` gives; an Error that leaves it is made Python's.
template <class Work>
py::object orError(const Work &work) {
    try {
        return work();
    } catch (const Error &error) {
        raiseInPython(error);
    }
    throw py::error_already_set();
}

/// What `work` gives to Python; nullptr with Python's exception for any that leaves it.
template <class Work>
PyObject *orException(const Work &work) {
    try {
        return orError(work).release().ptr();
    } catch (py::error_already_set &error) {
        error.restore();
    } catch (const py::builtin_exception &error) {
        error.set_error();
    } catch (const std::bad_alloc &) {
        PyErr_NoMemory();
    } catch (const std::exception &error) {
        PyErr_SetString(PyExc_RuntimeError, error.what());
    }
    return nullptr;
}

/// The arguments of a call as the host's arrays. Nearly all calls have so few that none of this
/// needs memory of its own.
class Inputs {
  public:
    Inputs(const Name *name, Arguments arguments) {
        made.reserve(arguments.size());
        inputs.reserve(arguments.size());
        if (name != nullptr) {
            inputs.push_back(name->text.get());
            arguments = arguments.subspan(1);
        }
        for (PyObject *argument : arguments) {
            made.push_back(toHost(argument, lenders));
            inputs.push_back(std::as_const(made.back()).get());
        }
    }

    std::span<const tsArray *> get() { return inputs; }

  private:
    static constexpr std::size_t usual = 8;
    std::array<std::byte, usual *(sizeof(Array) + sizeof(tsArray *))> room;
    std::pmr::monotonic_buffer_resource memory{room.data(), room.size()};
    Lenders lenders;
    std::pmr::vector<Array> made{&memory};
    std::pmr::vector<const tsArray *> inputs{&memory};
};

/// Makes the value of one result.
using ToPython = py::object (*)(Array array);

/// A whole double by itself as an int, where 64 bits hold it; anything else as always.
py::object toInt(Array array) {
    if (array && array.classID() == tsDOUBLE && array.size() == 1 && array.imaginary() == nullptr) {
        const double value = *static_cast<const double *>(array.data());
        const bool fits = value >= -0x1p63 && value < 0x1p63;
        const long long whole = fits ? static_cast<long long>(value) : 0;
        if (static_cast<double>(whole) == value) {
            PyObject *const number = PyLong_FromLongLong(whole);
            if (number == nullptr) {
                throw py::error_already_set();
            }
            return py::reinterpret_steal<py::object>(number);
        }
    }
    return toPython(std::move(array));
}

py::object valueOf(Results results, ToPython convert) {
    switch (results.size()) {
    case 0:
        return py::none();
    case 1:
        return convert(std::move(results[0]));
    default: {
        py::tuple values(results.size());
        for (std::size_t i = 0; i < results.size(); ++i) {
            values[i] = convert(std::move(results[i]));
        }
        return values;
    }
    }
}

/// The arguments, behind what is given first, if anything is.
py::tuple tupleOf(Arguments arguments, py::handle first = {}) {
    const std::size_t before = first ? 1 : 0;
    py::tuple tuple(before + arguments.size());
    if (first) {
        tuple[0] = first;
    }
    for (std::size_t i = 0; i < arguments.size(); ++i) {
        tuple[before + i] = py::handle(arguments[i]);
    }
    return tuple;
}

/// The name that is called as the module reads it, whatever it is given as: up to the first zero,
/// in any case. Nothing for what is no text.
py::object lowerCaseName(py::handle given) {
    Lenders lenders;
    Array name;
    try {
        name = toHost(given, lenders);
    } catch (const Error &) {
        return {}; // the call says it
    }
    if (name.classID() != tsCHAR) {
        return {};
    }
    std::string text = name.utf8();
    text.resize(std::min(text.size(), text.find('\0')));
    std::transform(text.begin(), text.end(), text.begin(), [](char c) {
        return c >= 'A' && c <= 'Z' ? static_cast<char>(c + ('a' - 'A')) : c;
    });
    return toStr(text);
}

/// The function of Python's that takes the calls of this name, if any does.
py::object insteadOf(const ModuleObject &self, Arguments arguments) {
    if (!self.instead || arguments.empty()) {
        return {};
    }
    const py::object name = lowerCaseName(arguments[0]);
    if (!name) {
        return {};
    }
    PyObject *const found = PyDict_GetItemWithError(self.instead.ptr(), name.ptr());
    if (found == nullptr && PyErr_Occurred() != nullptr) {
        throw py::error_already_set();
    }
    return py::reinterpret_borrow<py::object>(found);
}

/// The name that was called; nullptr where it is not kept.
const Name *nameOf(ModuleObject &self, Arguments arguments) {
    if (arguments.empty() || !PyUnicode_CheckExact(arguments[0])) {
        return nullptr;
    }
    PyObject *const str = arguments[0];
    if (const Name *const kept = self.names.find(str)) {
        return kept;
    }
    if (!self.names.mayKeep(str)) {
        return nullptr;
    }
    Lenders none;
    return self.names.keep(
        {py::reinterpret_borrow<py::object>(str), toHost(str, none), insteadOf(self, arguments)});
}

/// Refuses arguments that were given by the names in a tuple.
[[noreturn]] void refuseNamed(PyObject *names) {
    std::string given;
    for (const py::handle each : py::reinterpret_borrow<py::tuple>(names)) {
        given.append(given.empty() ? "" : ", ").append(toUtf8(each)).append("=");
    }
    refuse("namedArgument",
           "In this form, operations take their arguments by position, not as " + given + ".");
}

/// A call of the module; its error is one that Python makes, which adds what was called. `names`
/// are those of arguments that have one, or null.
py::object call(ModuleObject &self, const Name *name, Arguments arguments, PyObject *names,
                ToPython convert) {
    std::optional<Error> failure;
    try {
        if (names != nullptr) {
            refuseNamed(names);
        }
        Inputs inputs(name, arguments);
        return valueOf(
            [&] {
                const OthersRun others;
                return self.module.call(inputs.get());
            }(),
            convert);
    } catch (const Error &error) {
        failure = error;
    }
    // Outside of the handler, because Python asks the module, which raises in its turn.
    raiseInPython(called(PythonClasses::get().raised,
                         py::make_tuple(py::handle(&self.head.object), tupleOf(arguments),
                                        toStr(failure->identifier()), toStr(failure->message()))));
    throw py::error_already_set();
}

/// module(name, *arguments)
PyObject *callObject(PyObject *self, PyObject *const *given, std::size_t flags, PyObject *names) {
    return orException([&]() -> py::object {
        const Arguments arguments(given, static_cast<std::size_t>(PyVectorcall_NARGS(flags)));
        ModuleObject &module = of(self);
        const Name *const name = nameOf(module, arguments);
        const py::object instead = name != nullptr ? name->instead : insteadOf(module, arguments);
        if (names != nullptr && PyTuple_GET_SIZE(names) == 0) {
            names = nullptr;
        }
        if (instead && names == nullptr) {
            return called(instead, tupleOf(arguments, self));
        }
        return call(module, name, arguments, names, toPython);
    });
}

/// call(module, name, *arguments): the module itself, whatever else takes the calls of a name.
template <ToPython convert>
PyObject *callFunction(PyObject * /*extension*/, PyObject *const *given, Py_ssize_t count) {
    return orException([&] {
        static_cast<void>(moduleOf(count == 0 ? Py_None : given[0]));
        ModuleObject &module = of(given[0]);
        const Arguments arguments(given + 1, static_cast<std::size_t>(count - 1));
        return call(module, nameOf(module, arguments), arguments, nullptr, convert);
    });
}

/// A new instance of the class or of one that was derived from it.
py::object make(PyTypeObject *type, Module module, py::object instead) {
    PyObject *const self = type->tp_alloc(type, 0);
    if (self == nullptr) {
        throw py::error_already_set();
    }
    ModuleObject &made = of(self);
    made.head.vectorcall = callObject;
    std::construct_at(&made.module, std::move(module));
    std::construct_at(&made.instead, std::move(instead));
    std::construct_at(&made.names);
    return py::reinterpret_steal<py::object>(self);
}

PyObject *makeNew(PyTypeObject *type, PyObject *arguments, PyObject *named) {
    static const std::array<const char *, 3> keywords = {"module", "instead", nullptr};
    PyObject *module = nullptr;
    PyObject *instead = nullptr;
    if (PyArg_ParseTupleAndKeywords(arguments, named, "O!|O!:Module",
                                    const_cast<char **>(keywords.data()), moduleClass, &module,
                                    &PyDict_Type, &instead) == 0) {
        return nullptr;
    }
    return orException(
        [&] { return make(type, of(module).module, py::reinterpret_borrow<py::object>(instead)); });
}

int visit(PyObject *self, visitproc visit, void *arg) {
    Py_VISIT(Py_TYPE(self));
    Py_VISIT(of(self).instead.ptr());
    return of(self).names.visitEach(visit, arg);
}

/// Lets go of what may lead back here. What is let go of may run code of anybody's, which must not
/// find it in here any more.
int letGo(PyObject *self) {
    const py::object instead = std::exchange(of(self).instead, py::object());
    const Names names = of(self).names.takeAll();
    return 0;
}

void destroy(PyObject *self) {
    PyTypeObject *const type = Py_TYPE(self);
    PyObject_GC_UnTrack(self);
    ModuleObject &module = of(self);
    if (module.head.weakReferences != nullptr) {
        PyObject_ClearWeakRefs(self);
    }
    std::destroy_at(&module.names);
    std::destroy_at(&module.instead);
    {
        const OthersRun others; // the last one of a module waits for calls in progress
        std::destroy_at(&module.module);
    }
    type->tp_free(self);
    Py_DECREF(type);
}

py::object nameOfFile(PyObject *self) {
    const std::string &file = of(self).module.file().native();
    PyObject *const name =
        PyUnicode_DecodeFSDefaultAndSize(file.data(), static_cast<py::ssize_t>(file.size()));
    if (name == nullptr) {
        throw py::error_already_set();
    }
    return py::reinterpret_steal<py::object>(name);
}

PyObject *fileOf(PyObject *self, void * /*closure*/) {
    return orException(
        [&] { return called(PythonClasses::get().path, py::make_tuple(nameOfFile(self))); });
}

PyObject *represent(PyObject *self) {
    return orException(
        [&]() -> py::object { return py::str("<tessel.Module {}>").format(nameOfFile(self)); });
}

constexpr const char *classDoc = R"(Module(module, instead={})
--

A loaded module. Call it with the name of an operation, then the operation's own arguments, by
position: module("open", "new.nc", "NOWRITE").

A call returns None, the one result, or a tuple of several, and raises tessel.Error. The docstring
of the package has the table of what becomes what. Other threads run while the module works.

Module(module) is the same module. `instead` has functions by the lower-case names of operations:
such a function is given the module and the arguments when the module is called with that name.)";

constexpr const char *callDoc = R"(call(module, /, *arguments)
--

What module(*arguments) gives if nothing else takes the calls of that name.)";

constexpr const char *callIntsDoc = R"(call_ints(module, /, *arguments)
--

The same, with an int for each result that is a whole double of 64 bits by itself.)";

/// A function as Python's tables have it.
template <class Pointer, class Function>
Pointer as(Function *function) {
    return reinterpret_cast<Pointer>(reinterpret_cast<void (*)()>(function));
}

// What Python keeps pointers to for as long as it runs.

std::array<PyGetSetDef, 2> properties = {
    {{"file", fileOf, nullptr, "The file that it was loaded from.", nullptr}, {}}};

std::array<PyMemberDef, 3> members = {
    {{"__vectorcalloffset__", T_PYSSIZET, offsetof(Head, vectorcall), READONLY, nullptr},
     {"__weaklistoffset__", T_PYSSIZET, offsetof(Head, weakReferences), READONLY, nullptr},
     {}}};

std::array<PyMethodDef, 3> functions = {
    {{"call", as<PyCFunction>(callFunction<toPython>), METH_FASTCALL, callDoc},
     {"call_ints", as<PyCFunction>(callFunction<toInt>), METH_FASTCALL, callIntsDoc},
     {}}};

} // namespace

void addModuleClass(py::module_ &extension) {
    std::array<PyType_Slot, 10> slots = {{{Py_tp_doc, const_cast<char *>(classDoc)},
                                          {Py_tp_new, as<void *>(makeNew)},
                                          {Py_tp_dealloc, as<void *>(destroy)},
                                          {Py_tp_traverse, as<void *>(visit)},
                                          {Py_tp_clear, as<void *>(letGo)},
                                          {Py_tp_repr, as<void *>(represent)},
                                          {Py_tp_call, as<void *>(PyVectorcall_Call)},
                                          {Py_tp_getset, properties.data()},
                                          {Py_tp_members, members.data()},
                                          {0, nullptr}}};
    PyType_Spec type = {"tessel._runtime.Module", sizeof(ModuleObject), 0,
                        Py_TPFLAGS_DEFAULT | Py_TPFLAGS_BASETYPE | Py_TPFLAGS_HAVE_GC |
                            Py_TPFLAGS_HAVE_VECTORCALL,
                        slots.data()};
    moduleClass = reinterpret_cast<PyTypeObject *>(PyType_FromSpec(&type));
    if (moduleClass == nullptr || PyModule_AddFunctions(extension.ptr(), functions.data()) != 0) {
        throw py::error_already_set();
    }
    extension.add_object("Module", reinterpret_cast<PyObject *>(moduleClass));
}

py::object newModuleObject(Module module) {
    return make(moduleClass, std::move(module), {});
}

const Module &moduleOf(py::handle instance) {
    if (PyObject_TypeCheck(instance.ptr(), moduleClass) == 0) {
        throw py::type_error("the first argument is no Module");
    }
    return of(instance.ptr()).module;
}

} // namespace tessel::python
