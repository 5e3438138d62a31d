// guard/src/names.hpp: how long names become.
#pragma once

#include <cstddef>
#include <string_view>

namespace tessel::guard {

/// The bytes that a name of the library's has at most (NC_MAX_NAME).
inline constexpr std::size_t longestName = 256;

/// The most bytes that a name may have once the library has composed its letters (Unicode's form
/// NFC). It is the name's own length but where a letter is in it whose composed form is longer, or
/// a mark that may part another letter from its own.
std::size_t mostComposed(std::string_view utf8) noexcept;

} // namespace tessel::guard
