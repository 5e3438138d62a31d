// tests/fuzz/files_mutator.cpp: how libFuzzer changes files: a field of the header at a time, which
// stays a header more often than not, or any bytes.
#include "change.hpp"
#include "fields.hpp"

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstring>

extern "C" std::size_t LLVMFuzzerMutate(std::uint8_t *data, std::size_t size, std::size_t most);

namespace fuzz {
namespace {

constexpr std::array<std::uint64_t, 22> oddValues = {
    0,          1,          2,          3,          5,          6,         7,    10,
    11,         12,         255,        256,        257,        1024,      1025, 0x7FFFFFFF,
    0x80000000, 0xFFFFFFFF, 0xFFFFFFFE, 0xFFFFFFFC, 0x3FFFFFFF, UINT64_MAX};
constexpr std::array<std::uint8_t, 16> versions = {1, 1, 1, 1, 1, 1, 1, 2, 2, 2, 2, 2, 2, 5, 5, 3};

std::uint64_t changed(std::uint64_t value, Chance &chance) {
    switch (chance.below(5)) {
    case 0:
        return value + 1;
    case 1:
        return value - 1;
    case 2:
        return value ^ std::uint64_t{1} << chance.below(34);
    case 3:
        return chance.below(16);
    default:
        return chance.oneOf(oddValues);
    }
}

/// Most of a name's letters are changed for one that a name may not have, or for another name's.
void changeName(std::span<std::uint8_t> file, const Field &field, Chance &chance) {
    for (std::size_t i = field.at; i < std::min(field.at + field.bytes, file.size()); ++i) {
        if (chance.percent(40)) {
            file[i] = static_cast<std::uint8_t>(chance.below(chance.percent(50) ? 256 : 'c'));
        }
    }
}

void changeHeader(std::span<std::uint8_t> file, Chance &chance) {
    for (std::size_t changes = 1 + chance.below(3); changes > 0; --changes) {
        const std::vector<Field> fields = fieldsOf(file);
        if (fields.empty()) {
            return;
        }
        const Field &field = chance.oneOf(fields);
        if (field.kind == Field::Kind::name) {
            changeName(file, field, chance);
            continue;
        }
        // A number of the file's own, of the same kind, makes sense where others do not.
        const Field &other = chance.oneOf(fields);
        const bool borrows = other.kind == field.kind && chance.percent(30);
        write(file, field, borrows ? read(file, other) : changed(read(file, field), chance));
    }
}

} // namespace
} // namespace fuzz

extern "C" std::size_t LLVMFuzzerCustomMutator(std::uint8_t *data, std::size_t size,
                                               std::size_t most, unsigned seed) {
    fuzz::Chance chance(seed);
    if (chance.percent(20)) {
        size = LLVMFuzzerMutate(data, size, most);
    } else if (chance.percent(8)) {
        size = chance.below(size + 1); // the file ends early
    } else {
        fuzz::changeHeader({data, size}, chance);
    }
    constexpr std::array<std::uint8_t, 4> magic = {'C', 'D', 'F', 1};
    if (size >= magic.size() && chance.percent(95)) {
        const bool known = data[3] == 1 || data[3] == 2 || data[3] == 5;
        std::memcpy(data, magic.data(), magic.size() - 1);
        if (!known || chance.percent(1)) {
            data[3] = chance.oneOf(fuzz::versions);
        }
    }
    return size;
}
