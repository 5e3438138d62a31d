// guard/src/external_types.hpp: the types of values in files.
#pragma once

#include <array>

namespace tessel::guard {

/// The bytes of an element of each external type; the numbers of the types begin with 1. The last
/// one is no type of these formats, and known to the library all the same, which divides by its
/// size where it is a variable's. It refuses all beyond.
inline constexpr std::array<unsigned, 13> typeSizes = {0, 1, 1, 2, 4, 4, 8, 1, 2, 4, 8, 8, 0};

} // namespace tessel::guard
