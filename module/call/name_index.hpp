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
        Hash hash;
        const char *end = name;
        for (; *end != '\0'; ++end) {
            hash.add(*end);
        }
        const std::string_view wanted(name, end);
        for (std::size_t at = hash.slot(); !slots[at].name.empty(); at = next(at)) {
            if (slots[at].name == wanted) {
                return slots[at].row;
            }
        }
        return nullptr;
    }

  private:
    /// An open hash table: a name is in the slot of its hash or in one that follows it without a
    /// gap. A power of two, and sparse enough that gaps are frequent.
    static constexpr std::size_t slotCount = std::bit_ceil(8 * rows);

    /// The hash of a name, a character at a time. What comes later waits for what came before, so
    /// each step is short, and the one multiplication stands at the end.
    class Hash {
      public:
        constexpr void add(char c) { value = std::rotl(value, 5) ^ static_cast<unsigned char>(c); }
        [[nodiscard]] constexpr std::size_t slot() const {
            return ((value * 0x9E3779B97F4A7C15U) >> 32U) % slotCount;
        }

      private:
        std::uint64_t value = 0;
    };

    struct Slot {
        std::string_view name;
        const Row *row = nullptr;
    };

    static constexpr std::size_t next(std::size_t slot) { return (slot + 1) % slotCount; }

    constexpr void insert(std::string_view name, const Row &row) {
        Hash hash;
        for (const char c : name) {
            hash.add(c);
        }
        std::size_t at = hash.slot();
        while (!slots[at].name.empty()) {
            if (slots[at].name == name) {
                return; // the first row of a name is the one that counts
            }
            at = next(at);
        }
        slots[at] = {name, &row};
    }

    std::array<Slot, slotCount> slots;
};

} // namespace tessel::netcdf
