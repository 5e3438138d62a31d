// tests/support/text.hpp: values as texts that tell all of them apart, for comparing and for
// reading.
#pragma once

#include "tessel/runtime.hpp"

#include <netcdf.h>

#include <charconv>
#include <cmath>
#include <concepts>
#include <span>
#include <string>

namespace tessel::test {

/// The shortest decimal text that gives the number back. "-0" is not "0".
template <class T>
requires std::integral<T> || std::floating_point<T> std::string shown(T value) {
    char text[64];
    return {text, std::to_chars(text, text + sizeof text, value).ptr};
}

/// Characters in quotes: printable ASCII as it is, all others as \x and four hexadecimal digits.
std::string quoted(std::span<const tsChar> characters);

/// Bytes in quotes: printable ASCII as it is, all others as \x and two hexadecimal digits.
std::string quoted(std::span<const char> bytes);

/// An array: its dimensions, its class and its values in storage order, as in "1x3 double [1 2 3]".
std::string shown(const Array &array);

/// The lines, one below the other.
std::string joined(std::span<const std::string> lines);

} // namespace tessel::test
