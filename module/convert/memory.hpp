// module/convert/memory.hpp: the memory types, and the families of library functions over them.
//
// A memory type is a row of facts, a family a row of seven functions, and what differs for text is
// said once, in the buffers. The seven functions of a family have seven different types, so that a
// swapped column does not compile.
#pragma once

#include "call/error.hpp"
#include "call/operation.hpp"
#include "convert/number.hpp"

#include <tuple>
#include <utility>

namespace tessel::netcdf {

/// A memory type: the class of host array that holds its values. Text is `char`, which is a type of
/// its own beside the two small numbers `signed char` and `unsigned char`.
template <class T>
struct memory {
    static constexpr tsClassID hostClass = classOf<T>;
};
template <>
struct memory<char> {
    static constexpr tsClassID hostClass = tsCHAR;
};

/// One family of the operation table: the id of its first row, the error for an entry that is not
/// of it, and its library functions. Signature<T> is the type of the function for memory type T.
template <template <class T> class Signature>
struct Family {
    int firstID;
    Error<const char *> foreign;
    std::tuple<Signature<double> *, Signature<float> *, Signature<int> *, Signature<short> *,
               Signature<signed char> *, Signature<unsigned char> *, Signature<char> *>
        functions;
};

/// Calls `verb` with the family's library function that the entry means, and gives back the status.
/// Raises the family's own error for an entry that is not of the family.
template <template <class T> class Signature, class Verb>
int withMember(const Family<Signature> &family, const OperationEntry *entry, const Verb &verb) {
    const int member = entry->id - family.firstID;
    int status = 0;
    const auto tryEach = [&]<int... at>(std::integer_sequence<int, at...>) {
        return ((member == at && (status = verb(std::get<at>(family.functions)), true)) || ...);
    };
    constexpr int members = std::tuple_size_v<decltype(family.functions)>;
    if (!tryEach(std::make_integer_sequence<int, members>{})) {
        raise(family.foreign, entry->shortName);
    }
    return status;
}

} // namespace tessel::netcdf
