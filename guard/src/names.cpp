// guard/src/names.cpp: how long names become.
//
// Composing takes letters and marks apart first, puts the marks in order, and joins what can be
// joined. Joining never makes a text longer than its parts, and a letter comes out as it went in,
// but for two cases:
//
// - it is one of those that are always written in parts, which the first table has;
// - a mark below it follows, which comes before those above in that order, and so may be joined to
//   the bare letter in their place. The second table has the marks for which there are such
//   letters. ASCII letters have no parts.
//
// Both tables are compared with Python's normalisation in tests/python/test_names.py.
#include "names.hpp"

#include <algorithm>
#include <array>

namespace tessel::guard {
namespace {

/// First and last letter.
struct Range {
    char32_t first;
    char32_t last;
};

/// Letters that are longer when they are composed; three times as long at most.
constexpr std::array growing = {
    Range{0x0344, 0x0344}, Range{0x0958, 0x095F},   Range{0x09DC, 0x09DD},   Range{0x09DF, 0x09DF},
    Range{0x0A33, 0x0A33}, Range{0x0A36, 0x0A36},   Range{0x0A59, 0x0A5B},   Range{0x0A5E, 0x0A5E},
    Range{0x0B5C, 0x0B5D}, Range{0x0F43, 0x0F43},   Range{0x0F4D, 0x0F4D},   Range{0x0F52, 0x0F52},
    Range{0x0F57, 0x0F57}, Range{0x0F5C, 0x0F5C},   Range{0x0F69, 0x0F69},   Range{0x0F73, 0x0F73},
    Range{0x0F75, 0x0F76}, Range{0x0F78, 0x0F78},   Range{0x0F81, 0x0F81},   Range{0x0F93, 0x0F93},
    Range{0x0F9D, 0x0F9D}, Range{0x0FA2, 0x0FA2},   Range{0x0FA7, 0x0FA7},   Range{0x0FAC, 0x0FAC},
    Range{0x0FB9, 0x0FB9}, Range{0x2ADC, 0x2ADC},   Range{0xFA6C, 0xFA6C},   Range{0xFACF, 0xFAD1},
    Range{0xFAD5, 0xFAD7}, Range{0xFB1D, 0xFB1D},   Range{0xFB1F, 0xFB1F},   Range{0xFB2A, 0xFB36},
    Range{0xFB38, 0xFB3C}, Range{0xFB3E, 0xFB3E},   Range{0xFB40, 0xFB41},   Range{0xFB43, 0xFB44},
    Range{0xFB46, 0xFB4E}, Range{0x1D15E, 0x1D164}, Range{0x1D1BB, 0x1D1C0},
};

/// Marks that may part a letter before them from its own.
constexpr std::array parting = {
    Range{0x031B, 0x031B},
    Range{0x0323, 0x0328},
    Range{0x032D, 0x0331},
};

constexpr std::size_t mostGrowth = 3;

/// The bytes that the parts of a letter have more than the letter, where it is one that can be
/// parted: U+01D5 has 2, and parts of 5.
constexpr std::size_t mostParted = 3;

template <class Ranges>
bool isIn(const Ranges &ranges, char32_t letter) noexcept {
    const auto *const found =
        std::lower_bound(ranges.begin(), ranges.end(), letter,
                         [](const Range &range, char32_t value) { return range.last < value; });
    return found != ranges.end() && found->first <= letter;
}

/// The bytes of a letter in UTF-8, by the first of them.
std::size_t bytesOf(unsigned char first) noexcept {
    constexpr unsigned two = 0xC0;
    constexpr unsigned three = 0xE0;
    constexpr unsigned four = 0xF0;
    return first < two ? 1 : first < three ? 2 : first < four ? 3 : 4;
}

/// The letter that these bytes are.
char32_t letterOf(std::string_view bytes) noexcept {
    constexpr unsigned ends = 0x3F; // of a byte that is not the first
    constexpr unsigned bits = 6;
    char32_t letter = static_cast<unsigned char>(bytes[0]);
    if (bytes.size() > 1) {
        letter &= ends >> (bytes.size() - 1);
    }
    for (const char byte : bytes.substr(1)) {
        letter = letter << bits | (static_cast<unsigned char>(byte) & ends);
    }
    return letter;
}

} // namespace

std::size_t mostComposed(std::string_view utf8) noexcept {
    std::size_t most = utf8.size();
    bool mayPart = false; // the letter before
    for (std::size_t i = 0; i < utf8.size();) {
        const std::string_view bytes = utf8.substr(i, bytesOf(static_cast<unsigned char>(utf8[i])));
        const char32_t letter = letterOf(bytes);
        i += bytes.size();
        const bool parts = isIn(parting, letter);
        if (isIn(growing, letter)) {
            most += (mostGrowth - 1) * bytes.size();
        }
        if (parts && mayPart) {
            most += mostParted;
        }
        mayPart = bytes.size() > 1 && !parts; // what is parted is parted once
    }
    return most;
}

} // namespace tessel::guard
