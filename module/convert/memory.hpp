// module/convert/memory.hpp: the memory types, a row of facts each.
#pragma once

#include "tessel/class_id.h"

namespace tessel::netcdf {

/// A memory type: the class of host array that holds its values, and what messages call that class.
struct MemoryType {
    tsClassID hostClass;
    const char *description;
};

/// The facts of memory type T. Text is `char`, a type of its own beside the two small numbers
/// `signed char` and `unsigned char`.
template <class T>
extern const MemoryType memory;

// clang-format off
template <> inline constexpr MemoryType memory<double>        = {tsDOUBLE, "double precision"};
template <> inline constexpr MemoryType memory<float>         = {tsSINGLE, "single precision"};
template <> inline constexpr MemoryType memory<int>           = {tsINT32,  "int32"};
template <> inline constexpr MemoryType memory<short>         = {tsINT16,  "int16"};
template <> inline constexpr MemoryType memory<signed char>   = {tsINT8,   "int8"};
template <> inline constexpr MemoryType memory<unsigned char> = {tsUINT8,  "uint8"};
template <> inline constexpr MemoryType memory<char>          = {tsCHAR,   "char"};
// clang-format on

/// Some memory types, in an order.
template <class... T>
struct TypeList {
    static constexpr int size = sizeof...(T);
    template <class More>
    using with = TypeList<T..., More>;
};

/// The memory types in the order in which every family of the operation table has its rows.
using NumericMemoryTypes = TypeList<double, float, int, short, signed char, unsigned char>;
using MemoryTypes = NumericMemoryTypes::with<char>;

} // namespace tessel::netcdf
