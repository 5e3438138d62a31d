// python/src/to_python.cpp: host arrays as Python values.
#include "conversion.hpp"
#include "plain_class.hpp"

#include <algorithm>
#include <array>
#include <bit>
#include <complex>
#include <limits>
#include <memory>
#include <span>

namespace tessel::python {
namespace {

/// The most dimensions that a NumPy array can have.
constexpr std::size_t mostDimensions = 32;

/// An object of Python's that keeps a host array as long as anything looks at its memory.
struct Owner {
    PyObject base;
    Array array;
};

py::object ownerOf(Array array) {
    auto *const ownerClass = reinterpret_cast<PyTypeObject *>(PythonClasses::get().owner.ptr());
    Owner *const owner = PyObject_New(Owner, ownerClass);
    if (owner == nullptr) {
        throw py::error_already_set();
    }
    std::construct_at(&owner->array, std::move(array));
    return py::reinterpret_steal<py::object>(&owner->base);
}

/// A column-major NumPy array over memory that belongs to `owner`; over new memory without one.
py::array newArray(py::dtype dtype, Dims dims, void *data = nullptr, py::handle owner = {}) {
    std::array<Py_intptr_t, mostDimensions> shape{};
    if (dims.size() > shape.size()) {
        refuse("tooManyDimensions", "A result has " + std::to_string(dims.size()) +
                                        " dimensions; a NumPy array can have " +
                                        std::to_string(mostDimensions) + ".");
    }
    std::transform(dims.begin(), dims.end(), shape.begin(),
                   [](std::size_t length) { return static_cast<Py_intptr_t>(length); });
    NumPy &numpy = NumPy::get();
    auto made = py::reinterpret_steal<py::array>(numpy.PyArray_NewFromDescr_(
        numpy.PyArray_Type_, dtype.release().ptr(), static_cast<int>(dims.size()), shape.data(),
        nullptr, data, NumPy::NPY_ARRAY_F_CONTIGUOUS_ | NumPy::NPY_ARRAY_WRITEABLE_, nullptr));
    if (!made) {
        if (PyErr_ExceptionMatches(PyExc_ValueError) == 0) {
            throw py::error_already_set();
        }
        PyErr_Clear(); // no elements, and a length that NumPy cannot count with
        refuse("shapeTooLarge", "NumPy cannot represent the dimensions of a result.");
    }
    if (owner && data != nullptr) {
        if (numpy.PyArray_SetBaseObject_(made.ptr(), owner.inc_ref().ptr()) != 0) {
            throw py::error_already_set();
        }
    }
    return made;
}

template <class T>
py::array joinComplex(const Array &array, int typenum) {
    py::array made = newArray(py::dtype(typenum), array.dims());
    const auto *real = static_cast<const T *>(array.data());
    const auto *imaginary = static_cast<const T *>(array.imaginary());
    auto *out = static_cast<std::complex<T> *>(made.mutable_data());
    for (std::size_t i = 0; i < array.size(); ++i) {
        out[i] = {real[i], imaginary[i]};
    }
    return made;
}

py::object fromComplex(const Array &array) {
    switch (array.classID()) {
    case tsDOUBLE:
        return joinComplex<double>(array, NumPy::NPY_CDOUBLE_);
    case tsSINGLE:
        return joinComplex<float>(array, NumPy::NPY_CFLOAT_);
    default:
        refuse("unsupportedResult", std::string("A complex result of class \"") +
                                        array.className() + "\" has no counterpart in NumPy.");
    }
}

bool isRow(Dims dims) {
    return dims.size() == 2 && (dims[0] == 1 || (dims[0] == 0 && dims[1] == 0));
}

py::object fromCharacters(const Array &array) {
    const auto units = array.elements<const tsChar>();
    if (isRow(array.dims())) {
        int order = std::endian::native == std::endian::little ? -1 : 1;
        PyObject *text = PyUnicode_DecodeUTF16(static_cast<const char *>(array.data()),
                                               static_cast<py::ssize_t>(units.size_bytes()),
                                               "surrogatepass", &order);
        if (text == nullptr) {
            throw py::error_already_set();
        }
        return py::reinterpret_steal<py::object>(text);
    }
    py::array made = newArray(py::dtype("U1"), array.dims());
    std::copy(units.begin(), units.end(), static_cast<Py_UCS4 *>(made.mutable_data()));
    return made;
}

py::object fromUnknown(const Array &array) {
    const Dims dims = array.dims();
    py::tuple shape(dims.size());
    for (std::size_t i = 0; i < dims.size(); ++i) {
        shape[i] = py::int_(dims[i]);
    }
    return PythonClasses::get().unknown(shape);
}

/// Converts an array and those inside of it; `owner` keeps the memory of them all.
py::object convert(const Array &array, py::handle owner, std::size_t depth = 0);

/// An object array; element i is what `make` gives for it.
template <class Make>
py::object objectArray(const Array &array, const Make &make) {
    py::array made = newArray(py::dtype(NumPy::NPY_OBJECT_), array.dims());
    auto *out = static_cast<PyObject **>(made.mutable_data());
    for (std::size_t i = 0; i < array.size(); ++i) {
        Py_XSETREF(out[i], make(i).release().ptr());
    }
    return made;
}

py::object fromCell(const Array &array, py::handle owner, std::size_t depth) {
    return objectArray(array,
                       [&](std::size_t i) { return convert(array.cellAt(i), owner, depth + 1); });
}

py::object fromStructure(const Array &array, py::handle owner, std::size_t depth) {
    const std::vector<std::string> &fields = array.fields();
    const auto dictOf = [&](std::size_t element) -> py::object {
        py::dict dict;
        for (std::size_t i = 0; i < fields.size(); ++i) {
            dict[toStr(fields[i])] =
                convert(array.cellAt(element * fields.size() + i), owner, depth + 1);
        }
        return dict;
    };
    const Dims dims = array.dims();
    return dims.size() == 2 && array.size() == 1 ? dictOf(0) : objectArray(array, dictOf);
}

py::object convert(const Array &array, py::handle owner, std::size_t depth) {
    if (!array) {
        return py::none();
    }
    if (depth > deepest) {
        refuse("nestedTooDeeply",
               "A result is nested more than " + std::to_string(deepest) + " levels deep.");
    }
    switch (const tsClassID classID = array.classID()) {
    case tsCHAR:
        return fromCharacters(array);
    case tsCELL:
        return fromCell(array, owner, depth);
    case tsSTRUCT:
        return fromStructure(array, owner, depth);
    case tsFUNCTION:
        return PythonClasses::get().function(toStr(array.utf8()));
    case tsUNKNOWN:
        return fromUnknown(array);
    default:
        return array.imaginary() != nullptr ? fromComplex(array)
                                            : newArray(py::dtype(plainClassOf(classID)->typenum),
                                                       array.dims(), array.data(), owner);
    }
}

} // namespace

py::object makeOwnerClass() {
    const auto destroy = [](PyObject *self) {
        PyTypeObject *const type = Py_TYPE(self);
        std::destroy_at(&reinterpret_cast<Owner *>(self)->array);
        PyObject_Free(self);
        Py_DECREF(type);
    };
    std::array<PyType_Slot, 2> slots = {
        {{Py_tp_dealloc, reinterpret_cast<void *>(static_cast<destructor>(destroy))},
         {0, nullptr}}};
    PyType_Spec type = {"tessel._runtime.Owner", sizeof(Owner), 0,
                        Py_TPFLAGS_DEFAULT | Py_TPFLAGS_DISALLOW_INSTANTIATION, slots.data()};
    PyObject *const made = PyType_FromSpec(&type);
    if (made == nullptr) {
        throw py::error_already_set();
    }
    return py::reinterpret_steal<py::object>(made);
}

py::object toPython(Array array) {
    if (!array) {
        return py::none();
    }
    if (array.classID() == tsCHAR) { // always copied, so nothing needs to be kept
        return fromCharacters(array);
    }
    const py::object owner = ownerOf(std::move(array));
    return convert(reinterpret_cast<const Owner *>(owner.ptr())->array, owner);
}

} // namespace tessel::python
