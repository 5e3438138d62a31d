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
#include <string_view>

namespace tessel::netcdf {
namespace {

/// The hash of a name, a character at a time. What comes later waits for what came before, so each
/// step is short, and the one multiplication stands at the end.
class Hash {
  public:
    constexpr void add(char c) { value = std::rotl(value, 5) ^ static_cast<unsigned char>(c); }
    [[nodiscard]] constexpr std::size_t slotIn(std::size_t slots) const {
        return ((value * 0x9E3779B97F4A7C15U) >> 32U) % slots;
    }

  private:
    std::uint64_t value = 0;
};

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
    Hash hash;
    for (const char c : name) {
        hash.add(c);
    }
    std::size_t at = hash.slotIn(slotCount);
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
const OperationEntry *rowOf(const char *name) {
    Hash hash;
    const char *end = name;
    for (; *end != '\0'; ++end) {
        hash.add(*end);
    }
    const std::string_view wanted(name, end);
    for (std::size_t at = hash.slotIn(slotCount); !slots[at].name.empty(); at = next(at)) {
        if (slots[at].name == wanted) {
            return slots[at].entry;
        }
    }
    return nullptr;
}

} // namespace

const OperationEntry *findOperation(char *name) {
    // As a rule the name is in lower case already; the rows' names are, so that what is found
    // before it was made so is what would be found after. To make and compare it in one go takes
    // half as long again: the comparison waits for the letters that were just written.
    if (const OperationEntry *const entry = rowOf(name)) {
        return entry;
    }
    for (char *at = name; *at != '\0'; ++at) {
        *at = lowerCase(*at);
    }
    if (const OperationEntry *const entry = rowOf(name)) {
        return entry;
    }
    raise(catalogue::invalidOperation, name);
}

} // namespace tessel::netcdf
