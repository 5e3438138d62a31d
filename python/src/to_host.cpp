// python/src/to_host.cpp: Python values as host arrays.
#include "conversion.hpp"
#include "others_run.hpp"
#include "plain_class.hpp"

#include <algorithm>
#include <array>
#include <complex>
#include <cstdint>
#include <limits>
#include <optional>
#include <span>

namespace tessel::python {
namespace {

// Flags of NumPy's that pybind11 has no names for.
constexpr int copyAlways = 0x0020;

constexpr std::array<std::size_t, 2> oneByOne = {1, 1};
constexpr std::array<std::size_t, 2> zeroByZero = {0, 0};

constexpr long long exactInDouble = 1LL << std::numeric_limits<double>::digits;

std::string typeName(py::handle value) {
    return Py_TYPE(value.ptr())->tp_name;
}

/// The object that a call of Python's returned; its exception when it returned none.
py::object steal(PyObject *made) {
    if (made == nullptr) {
        throw py::error_already_set();
    }
    return py::reinterpret_steal<py::object>(made);
}

/// The integer as a double when no digit is lost.
std::optional<double> exactDouble(py::handle integer) {
    int overflow = 0;
    const long long small = PyLong_AsLongLongAndOverflow(integer.ptr(), &overflow);
    if (overflow == 0 && small >= -exactInDouble && small <= exactInDouble) {
        return static_cast<double>(small);
    }
    const double rounded = PyLong_AsDouble(integer.ptr());
    if (PyErr_Occurred() != nullptr) {
        PyErr_Clear(); // beyond the largest double
        return std::nullopt;
    }
    const py::object back = steal(PyLong_FromDouble(rounded));
    return back.equal(integer) ? std::optional(rounded) : std::nullopt;
}

template <class T>
Array oneOf(tsClassID classID, T value) {
    Array array = Array::numeric(classID, oneByOne);
    array.elements<T>()[0] = value;
    return array;
}

Array complexScalar(std::complex<double> value) {
    Array array = Array::numeric(tsDOUBLE, oneByOne, true);
    *static_cast<double *>(array.data()) = value.real();
    *static_cast<double *>(array.imaginary()) = value.imag();
    return array;
}

Array fromInt(py::handle integer) {
    if (const std::optional<double> value = exactDouble(integer)) {
        return Array::scalar(*value);
    }
    int overflow = 0;
    const long long narrow = PyLong_AsLongLongAndOverflow(integer.ptr(), &overflow);
    if (overflow == 0) {
        return oneOf<std::int64_t>(tsINT64, narrow);
    }
    const unsigned long long wide = PyLong_AsUnsignedLongLong(integer.ptr());
    if (PyErr_Occurred() != nullptr) {
        PyErr_Clear();
        refuse("integerTooLarge", "An integer is beyond 64 bits and no double holds it exactly.");
    }
    return oneOf<std::uint64_t>(tsUINT64, wide);
}

Array fromBool(bool value) {
    Array array = Array::logical(oneByOne);
    array.elements<std::uint8_t>()[0] = value ? 1 : 0;
    return array;
}

Array characterRow(std::size_t length) {
    return Array::characters(std::array<std::size_t, 2>{1, length});
}

template <class Unit>
Array fromUnits(const Unit *units, std::size_t length) {
    Array array = characterRow(length);
    std::copy_n(units, length, array.elements<tsChar>().begin());
    return array;
}

/// Characters beyond the 16 bits of the host's become surrogate pairs.
Array fromCodePoints(std::span<const Py_UCS4> points) {
    constexpr Py_UCS4 beyond = 0x10000;
    const auto pairs =
        std::count_if(points.begin(), points.end(), [](Py_UCS4 point) { return point >= beyond; });
    Array array = characterRow(points.size() + static_cast<std::size_t>(pairs));
    auto out = array.elements<tsChar>().begin();
    for (const Py_UCS4 point : points) {
        if (point < beyond) {
            *out++ = static_cast<tsChar>(point);
        } else {
            *out++ = static_cast<tsChar>(0xD800U + ((point - beyond) >> 10U));
            *out++ = static_cast<tsChar>(0xDC00U + ((point - beyond) & 0x3FFU));
        }
    }
    return array;
}

Array fromStr(py::handle text) {
    PyObject *str = text.ptr();
    const auto length = static_cast<std::size_t>(PyUnicode_GetLength(str));
    switch (PyUnicode_KIND(str)) {
    case PyUnicode_1BYTE_KIND:
        return fromUnits(PyUnicode_1BYTE_DATA(str), length);
    case PyUnicode_2BYTE_KIND:
        return fromUnits(PyUnicode_2BYTE_DATA(str), length);
    default:
        return fromCodePoints({PyUnicode_4BYTE_DATA(str), length});
    }
}

Array fromBytes(py::handle value) {
    const auto bytes = value.cast<std::string_view>();
    Array array = characterRow(bytes.size());
    std::transform(bytes.begin(), bytes.end(), array.elements<tsChar>().begin(),
                   [](char byte) { return static_cast<unsigned char>(byte); });
    return array;
}

std::vector<std::size_t> hostDims(const py::array &array) {
    std::vector<std::size_t> dims(array.shape(), array.shape() + array.ndim());
    dims.resize(std::max<std::size_t>(dims.size(), 2), 1); // no dimension: 1-by-1; one: a column
    return dims;
}

/// The array itself where it is column-major, aligned, of this dtype and nothing more is asked for;
/// a copy of it otherwise.
py::array columnMajor(const py::array &array, py::dtype dtype, int more = 0) {
    return steal(NumPy::get().PyArray_FromAny_(array.ptr(), dtype.release().ptr(), 0, 0,
                                               NumPy::NPY_ARRAY_F_CONTIGUOUS_ |
                                                   NumPy::NPY_ARRAY_ALIGNED_ |
                                                   NumPy::NPY_ARRAY_ENSUREARRAY_ | more,
                                               nullptr));
}

template <class T>
std::span<const T> elementsOf(const py::array &array) {
    return {static_cast<const T *>(array.data()), static_cast<std::size_t>(array.size())};
}

Array fromPlain(const py::array &array, const PlainClass &row, Lenders &lenders) {
    const py::array lent = columnMajor(array, py::dtype(row.typenum));
    lenders.push_back(lent);
    // Inputs are read-only for a module, so read-only memory may be lent as well.
    return Array::borrowed(row.classID, hostDims(array), const_cast<void *>(lent.data()), nullptr);
}

template <class T>
Array fromComplex(const py::array &array, tsClassID classID, int typenum) {
    const py::array source = columnMajor(array, py::dtype(typenum));
    Array made = Array::numeric(classID, hostDims(array), true);
    auto *real = static_cast<T *>(made.data());
    auto *imaginary = static_cast<T *>(made.imaginary());
    for (const std::complex<T> value : elementsOf<std::complex<T>>(source)) {
        *real++ = value.real();
        *imaginary++ = value.imag();
    }
    return made;
}

Array fromCharacters(const py::array &array) {
    const py::array source = columnMajor(array, py::dtype("U1"));
    const auto points = elementsOf<Py_UCS4>(source);
    if (std::any_of(points.begin(), points.end(),
                    [](Py_UCS4 point) { return point > std::numeric_limits<tsChar>::max(); })) {
        refuse("characterTooLarge",
               "An element of a character array is beyond the 16 bits of a host character.");
    }
    Array made = Array::characters(hostDims(array));
    std::transform(points.begin(), points.end(), made.elements<tsChar>().begin(),
                   [](Py_UCS4 point) { return static_cast<tsChar>(point); });
    return made;
}

bool isPlainNumber(py::handle value) {
    PyObject *object = value.ptr();
    if (PyFloat_Check(object) || (PyLong_Check(object) && !PyBool_Check(object))) {
        return true;
    }
    if (!py::isinstance(value, PythonClasses::get().numpyScalar)) {
        return false;
    }
    const PlainClass *row = plainClassOf(value.attr("dtype").cast<py::dtype>());
    return row != nullptr && row->classID != tsLOGICAL;
}

double plainNumber(py::handle value) {
    if (PyFloat_Check(value.ptr())) {
        return PyFloat_AS_DOUBLE(value.ptr());
    }
    if (!PyIndex_Check(value.ptr())) { // a NumPy float
        return py::float_(py::reinterpret_borrow<py::object>(value));
    }
    const std::optional<double> number = PyLong_CheckExact(value.ptr())
                                             ? exactDouble(value)
                                             : exactDouble(steal(PyNumber_Index(value.ptr())));
    if (!number) {
        refuse("notRepresentable", "An integer in a list of numbers is not exact as a double; "
                                   "use a NumPy array of a 64-bit integer type.");
    }
    return *number;
}

/// A row of doubles from the items of a list that are all plain numbers.
Array fromNumbers(const py::tuple &items) {
    const std::array<std::size_t, 2> dims = {1, items.size()};
    Array row = Array::numeric(tsDOUBLE, items.empty() ? zeroByZero : dims);
    std::transform(items.begin(), items.end(), row.elements<double>().begin(), plainNumber);
    return row;
}

/// The row of a list of nothing but Python's own float and int; no array for any other. To convert
/// them runs no code of anybody's, and so neither a copy nor a level is needed.
Array fromOwnNumbers(py::handle list) {
    PyObject *const object = list.ptr();
    if (!PyList_CheckExact(object) && !PyTuple_CheckExact(object)) {
        return {};
    }
    const std::span<PyObject *const> items(
        PySequence_Fast_ITEMS(object), static_cast<std::size_t>(PySequence_Fast_GET_SIZE(object)));
    if (items.empty() || !std::all_of(items.begin(), items.end(), [](PyObject *item) {
            return PyFloat_CheckExact(item) || PyLong_CheckExact(item);
        })) {
        return {};
    }
    Array row = Array::numeric(tsDOUBLE, std::array<std::size_t, 2>{1, items.size()});
    std::transform(items.begin(), items.end(), row.elements<double>().begin(), plainNumber);
    return row;
}

Array fromUnknown(py::handle value) {
    std::vector<std::size_t> dims;
    for (const py::handle length : value.attr("shape")) {
        dims.push_back(PyLong_AsSize_t(length.ptr()));
        if (PyErr_Occurred() != nullptr) {
            PyErr_Clear();
            refuse("badShape", "The lengths of a shape are whole numbers from 0.");
        }
    }
    return Array::unknown(dims);
}

/// Converts values that may hold others, and remembers which it is inside of.
class Nest {
  public:
    explicit Nest(Lenders &lent) : lenders(lent) {}

    Array convert(py::handle value);

  private:
    class Level;

    /// An element of a cell or a field: None is one that nothing was put into.
    Array element(py::handle value) { return value.is_none() ? Array() : convert(value); }

    Array fromArray(const py::array &array);
    Array fromObjects(const py::array &array);
    Array fromList(py::handle list);
    Array structure(Dims dims, std::span<PyObject *const> dicts);

    Lenders &lenders;
    std::vector<PyObject *> inside;
};

/// One container entered.
class Nest::Level {
  public:
    Level(Nest &nest, py::handle container) : open(nest.inside) {
        if (open.size() == deepest ||
            std::find(open.begin(), open.end(), container.ptr()) != open.end()) {
            refuse("nestedTooDeeply", "A value contains itself or is nested more than " +
                                          std::to_string(deepest) + " levels deep.");
        }
        open.push_back(container.ptr());
    }
    ~Level() { open.pop_back(); }
    Level(const Level &) = delete;
    Level &operator=(const Level &) = delete;

  private:
    std::vector<PyObject *> &open;
};

Array Nest::convert(py::handle value) {
    PyObject *object = value.ptr();
    if (PyUnicode_Check(object)) {
        return fromStr(value);
    }
    if (PyFloat_Check(object)) {
        return Array::scalar(PyFloat_AS_DOUBLE(object));
    }
    if (PyBool_Check(object)) {
        return fromBool(object == Py_True);
    }
    if (PyLong_Check(object)) {
        return fromInt(value);
    }
    if (py::isinstance<py::array>(value)) {
        return fromArray(py::reinterpret_borrow<py::array>(value));
    }
    if (PyList_Check(object) || PyTuple_Check(object)) {
        return fromList(value);
    }
    if (PyBytes_Check(object)) {
        return fromBytes(value);
    }
    if (PyComplex_Check(object)) {
        return complexScalar({PyComplex_RealAsDouble(object), PyComplex_ImagAsDouble(object)});
    }
    if (PyDict_Check(object)) {
        return structure(oneByOne, {&object, 1});
    }
    if (py::isinstance(value, PythonClasses::get().numpyScalar)) {
        return fromArray(steal(NumPy::get().PyArray_FromAny_(object, nullptr, 0, 0, 0, nullptr)));
    }
    if (py::isinstance(value, PythonClasses::get().function)) {
        return Array::function(toUtf8(value.attr("name")));
    }
    if (py::isinstance(value, PythonClasses::get().unknown)) {
        return fromUnknown(value);
    }
    if (py::hasattr(value, "__fspath__")) {
        return convert(steal(orStop([&] { return PyOS_FSPath(object); })));
    }
    refuse("unsupportedType",
           "A value of type \"" + typeName(value) + "\" has no counterpart in the host.");
}

Array Nest::fromArray(const py::array &array) {
    if (py::isinstance(array, PythonClasses::get().maskedArray)) {
        refuse("maskedArray", "A masked array has no counterpart in the host; pass what its method "
                              "\"filled\" gives.");
    }
    const py::dtype dtype = array.dtype();
    if (const PlainClass *row = plainClassOf(dtype)) {
        return fromPlain(array, *row, lenders);
    }
    if (dtype.num() == NumPy::NPY_CDOUBLE_) {
        return fromComplex<double>(array, tsDOUBLE, NumPy::NPY_CDOUBLE_);
    }
    if (dtype.num() == NumPy::NPY_CFLOAT_) {
        return fromComplex<float>(array, tsSINGLE, NumPy::NPY_CFLOAT_);
    }
    if (dtype.num() == NumPy::NPY_UNICODE_ && dtype.itemsize() == sizeof(Py_UCS4)) {
        return fromCharacters(array);
    }
    if (dtype.num() == NumPy::NPY_OBJECT_) {
        return fromObjects(array);
    }
    refuse("unsupportedDtype", "A NumPy array of dtype \"" +
                                   dtype.attr("name").cast<std::string>() +
                                   "\" has no counterpart in the host.");
}

Array Nest::fromObjects(const py::array &array) {
    const Level level(*this, array);
    // A copy, because converting an element may run Python code that changes the array.
    const py::array snapshot = columnMajor(array, py::dtype(NumPy::NPY_OBJECT_), copyAlways);
    const auto objects = elementsOf<PyObject *>(snapshot);
    const std::vector<std::size_t> dims = hostDims(array);
    if (!objects.empty() && std::all_of(objects.begin(), objects.end(), [](PyObject *each) {
            return each != nullptr && PyDict_Check(each);
        })) {
        return structure(dims, objects);
    }
    Array cell = Array::cell(dims);
    for (std::size_t i = 0; i < objects.size(); ++i) {
        cell.setCell(i, element(objects[i] == nullptr ? Py_None : objects[i]));
    }
    return cell;
}

Array Nest::fromList(py::handle list) {
    if (Array row = fromOwnNumbers(list)) {
        return row;
    }
    const Level level(*this, list);
    // A copy, because converting an item may run Python code that changes the list.
    const py::tuple items = steal(PySequence_Tuple(list.ptr()));
    if (std::all_of(items.begin(), items.end(), isPlainNumber)) {
        return fromNumbers(items);
    }
    Array cell = Array::cell(std::array<std::size_t, 2>{1, items.size()});
    for (std::size_t i = 0; i < items.size(); ++i) {
        cell.setCell(i, element(items[i]));
    }
    return cell;
}

Array Nest::structure(Dims dims, std::span<PyObject *const> dicts) {
    const py::list keys = steal(PyDict_Keys(dicts.front()));
    std::vector<std::string> fields;
    for (const py::handle key : keys) {
        if (!PyUnicode_Check(key.ptr())) {
            refuse("badFieldName", "A field of a structure is named by a value of type \"" +
                                       typeName(key) + "\" instead of a str.");
        }
        fields.push_back(toUtf8(key));
    }
    Array made = Array::structure(dims, std::move(fields));
    std::size_t position = 0;
    for (PyObject *dict : dicts) {
        const Level level(*this, dict);
        if (static_cast<std::size_t>(PyDict_Size(dict)) != keys.size()) {
            refuse("differentFields", "The dicts of a structure array have different keys.");
        }
        for (const py::handle key : keys) {
            const auto value =
                py::reinterpret_borrow<py::object>(PyDict_GetItemWithError(dict, key.ptr()));
            if (!value) {
                refuse("differentFields", "The dicts of a structure array have different keys.");
            }
            made.setCell(position++, element(value));
        }
    }
    return made;
}

} // namespace

Array toHost(py::handle value, Lenders &lenders) {
    return Nest(lenders).convert(value);
}

} // namespace tessel::python
