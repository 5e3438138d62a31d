// guard/src/operations.hpp: what a call asks for, as far as the guard wants to know.
#pragma once

#include "tessel/runtime/watcher.hpp"

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace tessel::guard {

/// What the guard tells apart.
enum class Kind {
    other,
    open,
    create,
    close,
    abort,
    sync,
    redefine,
    endDefinition,
    tunedEndDefinition,
    defineDimension,
    defineVariable,
    rename, // a dimension or a variable
    renameAttribute,
    writeAttribute,
    setFill,
    setDefaultFormat,
    copyAttribute,
    writeElement,
    writeBlock,
    writeStrided,
};

/// The operation that the first input names, if the call has the inputs that the operation wants;
/// `other` for operations without interest, and for calls that the module refuses itself.
Kind kindOf(Inputs inputs);

/// Where a call has the name that it gives something; nothing for one that gives none.
std::optional<std::size_t> placeOfNewName(Kind kind) noexcept;

/// An element a dimension.
using Indices = std::vector<std::uint64_t>;

/// An argument as the module reads ids and flags: the first element of a double or int32 array.
/// Nothing for what the module refuses.
std::optional<int> integer(const tsArray *input);

/// A code, as the module reads it: the first eight bytes as a double, of which one int32 has half,
/// and the others are zero. Nothing for what the module refuses.
std::optional<int> code(const tsArray *input);

/// A size, as the module reads it: 0 where it is below 1. Nothing for what the module refuses.
std::optional<std::uint64_t> size(const tsArray *input);

/// Positions, counts or steps in the library's order, as the module reads them: fractions are
/// truncated and negative values wrap around. Nothing for what the module refuses.
std::optional<Indices> indices(const tsArray *input);

/// A file name, or the name of a mode, as the library gets it: up to the first zero. Nothing for
/// what is no text.
std::optional<std::string> text(const tsArray *input);

} // namespace tessel::guard
