// module/call/name_index.hpp: from a name to the row of a table.
#pragma once

#include <array>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <string_view>

namespace tessel::netcdf {

/// Finds what a walk through the table would find first, by either of a row's two names, and takes
/// one comparison as a rule: the names are hashed when compiled. A row has a `longName` and a
/// `shortName`.
template <typename Row, std::size_t rows>
class NameIndex {
  public:
    constexpr explicit NameIndex(const std::array<Row, rows> &table) {
        for (const Row &row : table) {
            insert(row.longName, row);
            insert(row.shortName, row);
        }
    }

    /// The row of exactly this name; nullptr for any other.
    [[nodiscard]] constexpr const Row *find(const char *name) const {
        return slots[slotOf(name)].row;
    }

  private:
    /// An open hash table: a name is in the slot of its hash or in one that follows it without a
    /// gap. A power of two, and sparse enough that gaps are frequent.
    static constexpr std::size_t slotCount = std::bit_ceil(8 * rows);

    struct Slot {
        std::string_view name;
        const Row *row = nullptr;
    };

    /// The slot of a name, or the gap where it would be. The hash is made a character at a time.
    /// What comes later waits for what came before, so each step is short, and the one
    /// multiplication stands at the end.
    [[nodiscard]] constexpr std::size_t slotOf(const char *name) const {
        std::uint64_t hash = 0;
        const char *end = name;
        for (; *end != '\0'; ++end) {
            hash = std::rotl(hash, 5) ^ static_cast<unsigned char>(*end);
        }
        const std::string_view wanted(name, end);
        std::size_t slot = ((hash * 0x9E3779B97F4A7C15U) >> 32U) % slotCount;
        while (!slots[slot].name.empty() && slots[slot].name != wanted) {
            slot = (slot + 1) % slotCount;
        }
        return slot;
    }

    constexpr void insert(const char *name, const Row &row) {
        Slot &slot = slots[slotOf(name)];
        if (slot.name.empty()) { // the first row of a name is the one that counts
            slot = {name, &row};
        }
    }

    std::array<Slot, slotCount> slots;
};

} // namespace tessel::netcdf
