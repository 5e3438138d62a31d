// tests/support/text.cpp: values as texts that tell all of them apart, for comparing and for
// reading.
#include "support/text.hpp"

#include <array>
#include <cstdint>
#include <cstdio>

namespace tessel::test {
namespace {

template <class Character>
std::string quotedUnits(std::span<const Character> units) {
    std::string text = "\"";
    for (const Character unit : units) {
        const auto code = static_cast<unsigned>(static_cast<std::make_unsigned_t<Character>>(unit));
        if (code >= ' ' && code <= '~') {
            text += static_cast<char>(code);
        } else {
            std::array<char, 8> escape{};
            std::snprintf(escape.data(), escape.size(), "\\x%0*X",
                          static_cast<int>(2 * sizeof(Character)), code);
            text += escape.data();
        }
    }
    return text + "\"";
}

template <class T>
std::string shownElements(const Array &array) {
    std::string text = "[";
    for (const T value : array.elements<T>()) {
        text += (text.size() == 1 ? "" : " ") + shown(value);
    }
    return text + "]";
}

std::string shownCells(const Array &array) {
    std::string text = "{";
    for (std::size_t i = 0; i < array.size(); ++i) {
        const Array &value = array.cellAt(i);
        text += (i == 0 ? "" : ", ") + (value ? shown(value) : "nothing");
    }
    return text + "}";
}

std::string shownValues(const Array &array) {
    switch (array.classID()) {
    case tsDOUBLE:
        return shownElements<double>(array);
    case tsSINGLE:
        return shownElements<float>(array);
    case tsINT8:
        return shownElements<std::int8_t>(array);
    case tsUINT8:
    case tsLOGICAL:
        return shownElements<std::uint8_t>(array);
    case tsINT16:
        return shownElements<std::int16_t>(array);
    case tsUINT16:
        return shownElements<std::uint16_t>(array);
    case tsINT32:
        return shownElements<std::int32_t>(array);
    case tsUINT32:
        return shownElements<std::uint32_t>(array);
    case tsINT64:
        return shownElements<std::int64_t>(array);
    case tsUINT64:
        return shownElements<std::uint64_t>(array);
    case tsCHAR:
        return quoted(std::span<const tsChar>(array.elements<tsChar>()));
    case tsCELL:
        return shownCells(array);
    default:
        return "";
    }
}

} // namespace

std::string quoted(std::span<const tsChar> characters) {
    return quotedUnits(characters);
}

std::string quoted(std::span<const char> bytes) {
    return quotedUnits(bytes);
}

std::string shown(const Array &array) {
    std::string text;
    for (const std::size_t length : array.dims()) {
        text += (text.empty() ? "" : "x") + shown(length);
    }
    text += array.imaginary() == nullptr ? " " : " complex ";
    return text + array.className() + " " + shownValues(array);
}

std::string joined(std::span<const std::string> lines) {
    std::string text;
    for (const std::string &line : lines) {
        text += line + "\n";
    }
    return text;
}

} // namespace tessel::test
