// python/src/plain_class.hpp: the host classes whose data NumPy holds in the very same form.
#pragma once

#include "tessel/class_id.h"

#include <pybind11/numpy.h>

#include <algorithm>
#include <array>
#include <cstddef>

namespace tessel::python {

/// What NumPy says of one class: the kind and size of its dtype, and the number of the dtype in the
/// machine's own byte order.
struct PlainClass {
    tsClassID classID;
    char kind;
    std::size_t size;
    int typenum;
};

using NumPy = pybind11::detail::npy_api;

inline constexpr std::array plainClasses = {
    PlainClass{tsLOGICAL, 'b', 1, NumPy::NPY_BOOL_},
    PlainClass{tsDOUBLE, 'f', 8, NumPy::NPY_DOUBLE_},
    PlainClass{tsSINGLE, 'f', 4, NumPy::NPY_FLOAT_},
    PlainClass{tsINT8, 'i', 1, NumPy::NPY_INT8_},
    PlainClass{tsUINT8, 'u', 1, NumPy::NPY_UINT8_},
    PlainClass{tsINT16, 'i', 2, NumPy::NPY_INT16_},
    PlainClass{tsUINT16, 'u', 2, NumPy::NPY_UINT16_},
    PlainClass{tsINT32, 'i', 4, NumPy::NPY_INT32_},
    PlainClass{tsUINT32, 'u', 4, NumPy::NPY_UINT32_},
    PlainClass{tsINT64, 'i', 8, NumPy::NPY_INT64_},
    PlainClass{tsUINT64, 'u', 8, NumPy::NPY_UINT64_},
};

/// The row of a dtype; nullptr for a dtype that no class holds as it is.
inline const PlainClass *plainClassOf(const pybind11::dtype &dtype) {
    const auto *row = std::find_if(plainClasses.begin(), plainClasses.end(), [&](const auto &each) {
        return each.kind == dtype.kind() && each.size == static_cast<std::size_t>(dtype.itemsize());
    });
    return row == plainClasses.end() ? nullptr : row;
}

/// The row of a class; nullptr for a class without one.
inline const PlainClass *plainClassOf(tsClassID classID) {
    const auto *row = std::find_if(plainClasses.begin(), plainClasses.end(),
                                   [&](const auto &each) { return each.classID == classID; });
    return row == plainClasses.end() ? nullptr : row;
}

} // namespace tessel::python
