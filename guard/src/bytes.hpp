// guard/src/bytes.hpp: numbers of bytes that may be too large: UINT64_MAX stands for those.
#pragma once

#include <cstdint>

namespace tessel::guard {

inline std::uint64_t sum(std::uint64_t a, std::uint64_t b) noexcept {
    std::uint64_t value = 0;
    return __builtin_add_overflow(a, b, &value) ? UINT64_MAX : value;
}

inline std::uint64_t product(std::uint64_t a, std::uint64_t b) noexcept {
    std::uint64_t value = 0;
    return __builtin_mul_overflow(a, b, &value) ? UINT64_MAX : value;
}

/// Filled up to whole words, as the formats have it.
inline std::uint64_t padded(std::uint64_t bytes) noexcept {
    return sum(bytes, 3) / 4 * 4;
}

} // namespace tessel::guard
