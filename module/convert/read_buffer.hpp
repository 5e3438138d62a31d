// module/convert/read_buffer.hpp: where the library puts what it reads.
//
// Numbers go straight into the storage of the result, which stands in its output slot before the
// library fills it. Text needs a buffer, because the library's characters are bytes and the host's
// have 16 bits; the result is made, and the buffer freed, before anyone looks at the status.
#pragma once

#include "call/operation.hpp"
#include "convert/memory.hpp"
#include "convert/text.hpp"
#include "tessel/create.h"
#include "tessel/memory.h"

#include <cstddef>
#include <span>

namespace tessel::netcdf {

/// How a family reads a block of text: the size of its buffer's units in bytes, and how many of n
/// characters it hands over.
struct TextBlock {
    std::size_t unit;
    std::size_t (*handedOver)(std::size_t n);
};

/// A zero-filled buffer of the host's. Raises where there is none, except for a request of no
/// bytes, which the host may answer with NULL.
char *allocateReadBuffer(std::size_t count, std::size_t unit, const OperationEntry *entry);

/// Creates a numeric result of the given dimensions in the slot and has `read` fill it. Gives back
/// the status of `read`.
template <class T, class Read>
int readNumbers(tsArray *&slot, std::span<const std::size_t> dims, const Read &read) {
    slot = tsCreateUninitNumericArray(dims.size(), dims.data(), memory<T>.hostClass);
    return read(static_cast<T *>(tsGetData(slot)));
}

/// Creates a result of the given dimensions in the slot, numeric or char, and has `read` fill it.
template <class T, class Read>
int readBlock(tsArray *&slot, std::span<const std::size_t> dims, const TextBlock & /*text*/,
              const OperationEntry * /*entry*/, const Read &read) {
    return readNumbers<T>(slot, dims, read);
}

template <std::same_as<char> T, class Read>
int readBlock(tsArray *&slot, std::span<const std::size_t> dims, const TextBlock &text,
              const OperationEntry *entry, const Read &read) {
    slot = tsCreateCharArray(dims.size(), dims.data());
    const std::size_t length = tsGetNumberOfElements(slot);
    char *const bytes = allocateReadBuffer(length + 1, text.unit, entry);
    const int status = read(bytes);
    widen(bytes, text.handedOver(length), static_cast<tsChar *>(tsGetData(slot)));
    tsFree(bytes);
    return status;
}

/// Creates a result in the slot that is numbers of the given dimensions, or for text a row of at
/// most `length` characters which ends before the first zero byte, and has `read` fill it.
template <class T, class Read>
int readRow(tsArray *&slot, std::span<const std::size_t> dims, std::size_t /*length*/,
            const OperationEntry * /*entry*/, const Read &read) {
    return readNumbers<T>(slot, dims, read);
}

template <std::same_as<char> T, class Read>
int readRow(tsArray *&slot, std::span<const std::size_t> /*dims*/, std::size_t length,
            const OperationEntry *entry, const Read &read) {
    char *const bytes = allocateReadBuffer(length, 2, entry);
    // Whether the host answers a request of no bytes with NULL or not, there is no room in it.
    char none = '\0';
    char *const text = length == 0 ? &none : bytes;
    const int status = read(text);
    text[length] = '\0';
    slot = tsCreateString(text);
    tsFree(bytes);
    return status;
}

} // namespace tessel::netcdf
