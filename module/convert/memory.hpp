// module/convert/memory.hpp: the memory types, and the families of library functions over them.
//
// A memory type is a row of facts, a family a row of library functions, and what differs for text
// is said once, in the buffers. The functions of a family all have different types, so that a
// swapped column does not compile.
#pragma once

#include "call/error.hpp"
#include "call/operation.hpp"
#include "convert/number.hpp"

#include <tuple>
#include <utility>

namespace tessel::netcdf {

/// A memory type: the class of host array that holds its values, and what messages call that class.
/// Text is `char`, a type of its own beside the two small numbers `signed char` and `unsigned
/// char`.
template <class T>
struct memory;

// clang-format off
template <> struct memory<double>        { static constexpr tsClassID hostClass = classOf<double>;           static constexpr const char *description = "double precision"; };
template <> struct memory<float>         { static constexpr tsClassID hostClass = classOf<float>;            static constexpr const char *description = "single precision"; };
template <> struct memory<int>           { static constexpr tsClassID hostClass = classOf<int>;              static constexpr const char *description = "int32"; };
template <> struct memory<short>         { static constexpr tsClassID hostClass = classOf<short>;            static constexpr const char *description = "int16"; };
template <> struct memory<signed char>   { static constexpr tsClassID hostClass = classOf<signed char>;      static constexpr const char *description = "int8"; };
template <> struct memory<unsigned char> { static constexpr tsClassID hostClass = classOf<unsigned char>;    static constexpr const char *description = "uint8"; };
template <> struct memory<char>          { static constexpr tsClassID hostClass = tsCHAR;                    static constexpr const char *description = "char"; };
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

/// One family of the operation table: the id of its first row, the error for an entry that is not
/// of it, and its library functions, of type Signature<T> for memory type T.
template <template <class T> class Signature, class Types = MemoryTypes>
struct Family;

template <template <class T> class Signature, class... T>
struct Family<Signature, TypeList<T...>> {
    int firstID;
    Error<const char *> foreign;
    std::tuple<Signature<T> *...> functions;
};

/// Calls `verb` with the family's library function that the entry means, and gives back the status.
/// Raises the family's own error for an entry that is not of the family.
template <template <class T> class Signature, class Types, class Verb>
int withMember(const Family<Signature, Types> &family, const OperationEntry *entry,
               const Verb &verb) {
    const int member = entry->id - family.firstID;
    int status = 0;
    const auto tryEach = [&]<int... at>(std::integer_sequence<int, at...>) {
        return ((member == at && (status = verb(std::get<at>(family.functions)), true)) || ...);
    };
    if (!tryEach(std::make_integer_sequence<int, Types::size>{})) {
        raise(family.foreign, entry->shortName);
    }
    return status;
}

} // namespace tessel::netcdf
