// tests/difference/text.hpp: host characters to UTF-8 and back.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace difference {

/// UTF-16 to UTF-8; half of a pair becomes the replacement character.
std::string toUtf8(const std::vector<double> &units);

/// UTF-8 to UTF-16; a byte that is not part of valid UTF-8 becomes the character of the same code.
std::vector<std::uint16_t> toUtf16(std::string_view bytes);

} // namespace difference
