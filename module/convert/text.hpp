// module/convert/text.hpp: between the library's characters, which are bytes, and the host's, which
// have 16 bits.
#pragma once

#include "tessel/array.h"

#include <cstddef>

namespace tessel::netcdf {

/// Copies bytes, each widened with its sign: 0xE9 becomes 0xFFE9.
void widen(const char *from, std::size_t count, tsChar *to) noexcept;

/// Copies the low bytes of characters.
void narrow(const tsChar *from, std::size_t count, char *to) noexcept;

} // namespace tessel::netcdf
