// module/gateway/lookup.cpp: from the name of an operation to its row.
//
// The result is that of a walk through the table; the names are hashed when compiled, so that it
// takes one comparison as a rule.
#include "gateway/lookup.hpp"

#include "call/catalogue.hpp"
#include "gateway/operation_table.hpp"

#include <array>
#include <bit>
#include <cctype>
#include <cstdint>
#include <cstring>
#include <string_view>
#include <type_traits>

namespace tessel::netcdf {
namespace {

/// As many characters as the word has bytes.
template <class Word>
constexpr std::uint64_t wordAt(const char *at) {
    Word word = 0;
    if (std::is_constant_evaluated()) {
        for (unsigned i = 0; i < sizeof(Word); ++i) {
            word |= static_cast<Word>(Word{static_cast<unsigned char>(at[i])} << (8 * i));
        }
    } else {
        std::memcpy(&word, at, sizeof(Word));
    }
    return word;
}
static_assert(std::endian::native == std::endian::little, "both ways have to give the same word");

/// What a name begins and ends with, mixed into a number.
template <class Word>
constexpr std::uint64_t ends(std::string_view name) {
    return wordAt<Word>(name.data()) ^
           std::rotl(wordAt<Word>(name.data() + name.size() - sizeof(Word)), 29);
}

/// The slot that a name belongs into, by its length and what it begins and ends with. What names
/// have in common stands in their middle.
constexpr std::size_t slotOf(std::string_view name, std::size_t slots) {
    std::uint64_t value = name.size();
    if (name.size() >= 8) {
        value ^= ends<std::uint64_t>(name);
    } else if (name.size() >= 4) {
        value ^= ends<std::uint32_t>(name);
    } else if (!name.empty()) {
        value ^= ends<std::uint8_t>(name);
    }
    return ((value * 0x9E3779B97F4A7C15U) >> 32U) % slots;
}

struct Slot {
    std::string_view name;
    const OperationEntry *entry = nullptr;
};

/// An open hash table: a name is in the slot of its hash or in one that follows it without a gap.
/// A power of two, and sparse enough that gaps are frequent.
constexpr std::size_t slotCount = 1024;
static_assert(slotCount >= 4 * operationTable.size());

constexpr std::size_t next(std::size_t slot) {
    return (slot + 1) % slotCount;
}

constexpr void insert(std::array<Slot, slotCount> &slots, std::string_view name,
                      const OperationEntry &entry) {
    std::size_t at = slotOf(name, slotCount);
    while (!slots[at].name.empty()) {
        if (slots[at].name == name) {
            return; // the first row of a name is the one that counts
        }
        at = next(at);
    }
    slots[at] = {name, &entry};
}

constexpr std::array<Slot, slotCount> slots = [] {
    std::array<Slot, slotCount> filled;
    for (const OperationEntry &entry : operationTable) {
        insert(filled, entry.longName, entry);
        insert(filled, entry.shortName, entry);
    }
    return filled;
}();

/// As names are compared. The letters that they are made of do not depend on the locale, and what
/// else there is in ASCII has no case.
char lowerCase(char c) {
    const auto code = static_cast<unsigned char>(c);
    if (code >= 0x80) {
        return static_cast<char>(std::tolower(code));
    }
    return static_cast<char>(code + (code >= 'A' && code <= 'Z' ? 'a' - 'A' : 0));
}

/// The row of a name in lower case; nullptr for any other name.
const OperationEntry *rowOf(std::string_view name) {
    for (std::size_t at = slotOf(name, slotCount); !slots[at].name.empty(); at = next(at)) {
        if (slots[at].name == name) {
            return slots[at].entry;
        }
    }
    return nullptr;
}

} // namespace

const OperationEntry *findOperation(char *name) {
    const std::string_view text = name;
    // As a rule the name is in lower case already; the rows' names are, so that what is found
    // before it was made so is what would be found after.
    if (const OperationEntry *const entry = rowOf(text)) {
        return entry;
    }
    for (char *at = name; *at != '\0'; ++at) {
        *at = lowerCase(*at);
    }
    if (const OperationEntry *const entry = rowOf(text)) {
        return entry;
    }
    raise(catalogue::invalidOperation, name);
}

} // namespace tessel::netcdf
