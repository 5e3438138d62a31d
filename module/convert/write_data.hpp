// module/convert/write_data.hpp: the data that a write hands to the library.
//
// Nothing is converted between numeric classes: the data's class is the member's, or the write is
// refused. Numbers then go to the library from the host's own storage; text goes through a buffer,
// because the host's characters have 16 bits and the library's are bytes.
#pragma once

#include "call/operation.hpp"
#include "convert/memory.hpp"
#include "convert/number.hpp"
#include "tessel/memory.h"

#include <concepts>

namespace tessel::netcdf {

/// Returns if the data are what the member that the entry means can write: of its class, and not
/// empty unless it writes an attribute.
void validate_write_op_datatype(const tsArray *data, const OperationEntry *entry);

/// The low bytes of the characters, one each and no terminator, in memory of the host's that the
/// caller frees with tsFree. NULL for no characters.
char *make_text_write_buffer(const tsArray *data, const OperationEntry *entry);

/// Has `write` hand the data to the library as values of T, and gives back its status.
template <class T, class Write>
int writeBlock(const tsArray *data, const OperationEntry * /*entry*/, const Write &write) {
    return write(elements<T>(data));
}

template <std::same_as<char> T, class Write>
int writeBlock(const tsArray *data, const OperationEntry *entry, const Write &write) {
    char *const bytes = make_text_write_buffer(data, entry);
    const int status = write(bytes);
    tsFree(bytes);
    return status;
}

} // namespace tessel::netcdf
