// tests/fuzz/fields.hpp: where the numbers of a classic file's header are.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <vector>

namespace fuzz {

/// A big-endian number of the header, or a name.
struct Field {
    enum class Kind { tag, count, length, dimension, type, size, place, name };

    Kind kind;
    std::size_t at;
    std::size_t bytes;
};

/// The fields, as far as the header makes sense: one that was changed may end it early.
std::vector<Field> fieldsOf(std::span<const std::uint8_t> file);

std::uint64_t read(std::span<const std::uint8_t> file, const Field &field);
void write(std::span<std::uint8_t> file, const Field &field, std::uint64_t value);

} // namespace fuzz
