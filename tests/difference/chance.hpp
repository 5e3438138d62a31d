// tests/difference/chance.hpp: random choices.
#pragma once

#include <rapidcheck/Random.h>

#include <cstddef>
#include <cstdint>
#include <initializer_list>

namespace difference {

class Chance {
  public:
    explicit Chance(const rc::Random &random) : source(random) {}

    /// From 0 to n - 1.
    std::size_t below(std::size_t n) { return source.next() % n; }

    /// From `low` to `high`, both included.
    std::size_t between(std::size_t low, std::size_t high) { return low + below(high - low + 1); }

    /// True so many times in a hundred.
    bool percent(std::size_t n) { return below(100) < n; }

    /// One of a list, which is not empty.
    template <class List>
    const auto &oneOf(const List &list) {
        return *(std::begin(list) + static_cast<std::ptrdiff_t>(below(std::size(list))));
    }
    template <class T>
    T oneOf(std::initializer_list<T> list) {
        return *(list.begin() + below(list.size()));
    }

  private:
    rc::Random source;
};

} // namespace difference
