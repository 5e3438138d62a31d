// runtime/src/array_storage.hpp: what a host array is made of.
#pragma once

#include "block.hpp"
#include "tessel/runtime/array.hpp"

#include <array>
#include <cstddef>
#include <memory>
#include <string>
#include <vector>

namespace tessel {

class CallFrame;

/// What few arrays have.
struct ArrayExtras {
    void *imaginary = nullptr;      ///< a block of its own
    std::vector<Array> cells;       ///< of a cell or structure
    std::vector<std::string> names; ///< the fields of a structure, or the name of a function
    std::shared_ptr<void> lender;   ///< keeps borrowed data alive
};

} // namespace tessel

/// A host array. While the call that made it has not handed it out, it is in that call's ring.
struct tsArray : tessel::Link {
    tessel::CallFrame *frame = nullptr; ///< the call that owns it; nullptr: somebody else does
    tsArray *holder = nullptr;          ///< the cell or structure that it is in
    tsClassID classID = tsUNKNOWN;
    std::size_t elements = 0;
    std::size_t ndim = 0;
    const std::size_t *dims = nullptr;
    void *data = nullptr;

    std::array<std::size_t, 4> fewDims{};
    std::unique_ptr<std::size_t[]> manyDims;
    void *block = nullptr; ///< the data, where they are neither borrowed nor small
    std::unique_ptr<tessel::ArrayExtras> extras;
    alignas(16) std::array<std::byte, 64> smallData;

    tsArray() = default;
    ~tsArray();
    tsArray(const tsArray &) = delete;
    tsArray &operator=(const tsArray &) = delete;

    /// A call makes arrays and sees others go, so each thread keeps the room of some that went.
    static void *operator new(std::size_t size);
    static void operator delete(void *room) noexcept;
};

namespace tessel {

using ArrayPointer = std::unique_ptr<tsArray>;

/// An array of the given class and dimensions with data of its own, for the classes that have plain
/// data, or without. Raises the errors that array.hpp lists.
ArrayPointer makeArray(tsClassID classID, Dims dims, Fill fill);

/// A 1-by-1 double.
ArrayPointer makeScalar(double value);

/// The same as makeArray without storage for data.
ArrayPointer makeShape(tsClassID classID, Dims dims);

/// The extras of an array, made when they are not there.
ArrayExtras &extrasOf(tsArray &array);

/// A 1-by-n row of characters from UTF-8.
ArrayPointer makeText(std::string_view utf8);

/// An array of empty cells.
ArrayPointer makeCell(Dims dims);

bool isNumericClass(tsClassID classID) noexcept;
const char *className(tsClassID classID) noexcept;

/// The place of a value in a cell or structure. Raises "TESSEL:host:badClass" or
/// "TESSEL:host:badIndex".
Array &placeInCell(tsArray &cell, std::size_t index);

/// Puts a value into such a place.
void putIntoCell(tsArray &cell, Array &place, Array &&value) noexcept;

inline tsArray &arrayOf(Link &link) noexcept {
    return static_cast<tsArray &>(link);
}

} // namespace tessel
