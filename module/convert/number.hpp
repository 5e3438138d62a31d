// module/convert/number.hpp: numbers in arrays by class, and conversions that are always defined.
#pragma once

#include "tessel/array.h"

#include <boost/numeric/conversion/cast.hpp>

#include <concepts>
#include <cstddef>
#include <cstdint>
#include <limits>
#include <optional>
#include <type_traits>

namespace tessel::netcdf {

/// The host class that holds elements of type T.
template <class T>
inline constexpr tsClassID classOf = tsUNKNOWN;
template <>
inline constexpr tsClassID classOf<double> = tsDOUBLE;
template <>
inline constexpr tsClassID classOf<float> = tsSINGLE;
template <>
inline constexpr tsClassID classOf<std::int8_t> = tsINT8;
template <>
inline constexpr tsClassID classOf<std::uint8_t> = tsUINT8;
template <>
inline constexpr tsClassID classOf<std::int16_t> = tsINT16;
template <>
inline constexpr tsClassID classOf<std::uint16_t> = tsUINT16;
template <>
inline constexpr tsClassID classOf<std::int32_t> = tsINT32;
template <>
inline constexpr tsClassID classOf<std::uint32_t> = tsUINT32;
template <>
inline constexpr tsClassID classOf<std::int64_t> = tsINT64;
template <>
inline constexpr tsClassID classOf<std::uint64_t> = tsUINT64;

/// The elements of an array whose class is known to be that of T.
template <class T>
const T *elements(const tsArray *array) {
    return static_cast<const T *>(tsGetData(array));
}

/// Calls `visit` with the elements of an array of a numeric class, whichever of the ten it is, as a
/// pointer of the class's type. False, and no call, for any other class.
template <class Visit>
bool visitNumeric(const tsArray *array, const Visit &visit) {
    const tsClassID found = tsGetClassID(array);
    const auto visitAs = [&]<class... T>(std::type_identity<T>...) {
        return ((found == classOf<T> && (visit(elements<T>(array)), true)) || ...);
    };
    return visitAs(std::type_identity<double>{}, std::type_identity<float>{},
                   std::type_identity<std::int8_t>{}, std::type_identity<std::uint8_t>{},
                   std::type_identity<std::int16_t>{}, std::type_identity<std::uint16_t>{},
                   std::type_identity<std::int32_t>{}, std::type_identity<std::uint32_t>{},
                   std::type_identity<std::int64_t>{}, std::type_identity<std::uint64_t>{});
}

/// Truncated toward zero; what does not fit, an infinity and a NaN give the smallest Integer.
template <std::signed_integral Integer>
Integer truncated(double value) {
    constexpr auto lowest = static_cast<double>(std::numeric_limits<Integer>::min());
    const bool fits = value > lowest - 1.0 && value < -lowest;
    return fits ? static_cast<Integer>(value) : std::numeric_limits<Integer>::min();
}

/// A number as 64 bits, without any test: a floating-point value is truncated toward zero, an
/// integer is widened with its sign. For an unsigned Wide a value below 2^63 keeps the bits of the
/// signed integer, so that -1 becomes 2^64-1; from 2^63 on the top bit is set.
template <class Wide, class T>
Wide widened(T value) {
    static_assert(sizeof(Wide) == sizeof(std::int64_t));
    if constexpr (std::is_floating_point_v<T>) {
        constexpr double half = 0x1p63;
        constexpr std::uint64_t topBit = std::uint64_t{1} << 63U;
        if (std::is_unsigned_v<Wide> && value >= static_cast<T>(half)) {
            const double rest = static_cast<double>(value) - half;
            return static_cast<Wide>(static_cast<std::uint64_t>(truncated<std::int64_t>(rest)) |
                                     topBit);
        }
        return static_cast<Wide>(truncated<std::int64_t>(static_cast<double>(value)));
    } else {
        return static_cast<Wide>(value);
    }
}

/// The value as a To, or nothing where it does not fit. The check throws, and an error must not be
/// raised while an exception is handled: hence the detour.
template <class To, class From>
std::optional<To> checkedCast(From value) {
    try {
        return boost::numeric_cast<To>(value);
    } catch (const boost::bad_numeric_cast &) {
        return std::nullopt;
    }
}

} // namespace tessel::netcdf
