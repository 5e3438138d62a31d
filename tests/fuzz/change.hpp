// tests/fuzz/change.hpp: making sequences of calls, and changing them.
#pragma once

#include "sequence.hpp"

#include <cstdint>
#include <random>

namespace fuzz {

/// Random choices.
class Chance {
  public:
    explicit Chance(std::uint32_t seed) : source(seed) {}

    /// From 0 to n - 1.
    std::size_t below(std::size_t n) { return source() % n; }

    /// True so many times in a hundred.
    bool percent(std::size_t n) { return below(100) < n; }

    template <class List>
    const auto &oneOf(const List &list) {
        return *(std::begin(list) + static_cast<std::ptrdiff_t>(below(std::size(list))));
    }

  private:
    std::minstd_rand source;
};

/// One change: a call more, less or elsewhere, or another input.
void change(Sequence &sequence, Chance &chance);

} // namespace fuzz
